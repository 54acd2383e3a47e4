// Facts around a branch, and laws about their macros.
//
// Method: a condition that holds is as many facts as its And has operands.  There is an index from groups of unknowns
// (those about one macro in one version) to facts.  related() collects facts in waves from the groups of the condition.
// laws() sorts the unknowns by macro, version and epoch and relates neighbours. Cost: push and pop O(unknowns of the
// fact); related() bounded by limits::factWeight and limits::factWindow.
#include "base/scan/facts/BranchContext.hpp"

#include "base/core/Limits.hpp"
#include "base/core/Walk.hpp"

#include <algorithm>
#include <tuple>

namespace VT {

std::vector<MacroUnknownId> BranchContext::unknownsIn(SymbolicExprId node) const {
    std::vector<MacroUnknownId> found;
    walkDistinct(
        table_, node,
        [&](SymbolicExprId id, const SymbolicExpr&) {
            if (const std::optional<MacroUnknownId> unknown = unknowns_.idOf(id))
                found.push_back(*unknown);
        },
        [](SymbolicExprId) {});
    return found;
}

void BranchContext::push(const BranchFact& fact) {
    std::vector<SymbolicExprId> operands{fact.node};
    for (std::size_t i = 0; i < operands.size() && operands.size() <= limits::factWindow;) {
        const SymbolicExpr* const node = table_.get(operands[i]);
        if (node->op() != SymbolicOp::And) {
            ++i;
            continue;
        }
        operands.insert(operands.begin() + static_cast<std::ptrdiff_t>(i) + 1, node->getInput(1));
        operands[i] = node->getInput(0);
    }
    if (operands.size() > limits::factWindow)
        operands = {fact.node};
    for (const SymbolicExprId operand : operands) {
        BranchFact part = fact;
        part.whole = fact.node;
        part.node = operand;
        if (operands.size() > 1)
            part.unknowns = unknownsIn(operand);
        add(std::move(part));
    }
}

void BranchContext::add(BranchFact fact) {
    const auto at = static_cast<std::uint32_t>(facts_.size());
    byGroup_.resize(unknowns_.groups());
    groupMarks_.resize(unknowns_.groups());
    for (const MacroUnknownId unknown : fact.unknowns)
        byGroup_[unknowns_[unknown].group].push_back(at);
    facts_.push_back(std::move(fact));
    marks_.push_back(0);
}

void BranchContext::negateFrom(std::size_t first) {
    BranchFact opposite = facts_[first];
    opposite.negated = true;
    opposite.node = SymbolicNotExpr(table_, opposite.whole).getId(table_);
    for (std::size_t i = first + 1; i < facts_.size(); ++i)
        opposite.unknowns.insert(opposite.unknowns.end(), facts_[i].unknowns.begin(), facts_[i].unknowns.end());
    std::ranges::sort(opposite.unknowns);
    opposite.unknowns.erase(std::unique(opposite.unknowns.begin(), opposite.unknowns.end()), opposite.unknowns.end());
    pop(first);
    add(std::move(opposite));
}

void BranchContext::pop(std::size_t size) {
    while (facts_.size() > size) {
        for (const MacroUnknownId unknown : facts_.back().unknowns)
            byGroup_[unknowns_[unknown].group].pop_back();
        facts_.pop_back();
        marks_.pop_back();
    }
}

std::vector<std::size_t> BranchContext::related(const std::vector<MacroUnknownId>& unknowns) {
    // Between one and two windows, so that neighbours in a long chain look at the same facts and share decisions.
    constexpr std::size_t window = limits::factWindow;
    std::vector<std::size_t> result;
    std::size_t weight = 0;
    ++question_;
    const auto add = [&](std::size_t fact) {
        if (marks_[fact] == question_)
            return;
        marks_[fact] = question_;
        const std::size_t about = facts_[fact].unknowns.size();
        const std::size_t own = about == 1 ? 1 : limits::compoundFactWeight + about / 4;
        if (own > limits::factWeight - weight)
            return;
        weight += own;
        result.push_back(fact);
    };
    const auto addAbout = [&](const std::vector<MacroUnknownId>& asked) {
        for (const MacroUnknownId unknown : asked) {
            const std::uint32_t group = unknowns_[unknown].group;
            if (group >= byGroup_.size() || groupMarks_[group] == question_)
                continue;
            groupMarks_[group] = question_;
            const std::vector<std::uint32_t>& about = byGroup_[group];
            const std::size_t first = about.size() > window ? (about.size() - window) / window * window : 0;
            for (std::size_t i = about.size(); i-- > first && weight < limits::factWeight;)
                add(about[i]);
        }
    };
    addAbout(unknowns);
    for (std::size_t i = 0; i < result.size() && weight < limits::factWeight; ++i)
        addAbout(facts_[result[i]].unknowns);
    std::ranges::sort(result);
    return result;
}

BranchContext::Laws BranchContext::laws(std::vector<MacroUnknownId> asked) {
    using Kind = MacroUnknown::Kind;
    std::erase_if(asked, [&](MacroUnknownId id) {
        return unknowns_[id].kind != Kind::Value && unknowns_[id].kind != Kind::Defined;
    });
    const auto order = [&](MacroUnknownId id) {
        const MacroUnknown& unknown = unknowns_[id];
        return std::tuple(unknown.subject, unknown.state.version, unknown.state.epoch, unknown.kind);
    };
    std::ranges::sort(asked, {}, order);
    asked.erase(std::unique(asked.begin(), asked.end()), asked.end());

    // One round for each macro in one version: its epochs from the first to the last.
    Laws laws;
    const auto equal = [&](SymbolicExprId a, SymbolicExprId b) {
        return SymbolicEqualExpr(table_, a, b).getId(table_);
    };
    const auto either = [&](SymbolicExprId a, SymbolicExprId b) { return SymbolicOrExpr(table_, a, b).getId(table_); };
    for (std::size_t i = 0; i < asked.size();) {
        const MacroUnknown first = unknowns_[asked[i]];
        std::vector<std::uint64_t> epochs;
        bool value = false;
        bool defined = false;
        for (; i < asked.size(); ++i) {
            const MacroUnknown& each = unknowns_[asked[i]];
            if (each.subject != first.subject || each.state.version != first.state.version)
                break;
            if (epochs.empty() || epochs.back() != each.state.epoch)
                epochs.push_back(each.state.epoch);
            (each.kind == Kind::Value ? value : defined) = true;
        }
        const auto at = [&](Kind kind, std::uint64_t epoch) {
            return unknowns_[unknowns_.asked(kind, first.subject, {first.state.version, epoch, first.state.derived})]
                .node;
        };
        for (std::size_t e = 0; e < epochs.size(); ++e) {
            const bool isLast = e + 1 == epochs.size();
            if (value && (defined || !isLast)) {
                const SymbolicExprId zero =
                    equal(at(Kind::Value, epochs[e]), SymbolicIntValue(table_, 0).getId(table_));
                (isLast ? laws.undefinedLaws : laws.includeLaws).push_back(either(at(Kind::Defined, epochs[e]), zero));
            }
            if (isLast || first.state.derived)
                continue;
            const SymbolicExprId undefined = SymbolicNotExpr(table_, at(Kind::Defined, epochs[e])).getId(table_);
            if (value)
                laws.includeLaws.push_back(
                    either(undefined, equal(at(Kind::Value, epochs[e]), at(Kind::Value, epochs[e + 1]))));
            laws.includeLaws.push_back(either(undefined, at(Kind::Defined, epochs[e + 1])));
        }
    }
    return laws;
}

} // namespace VT
