// Finds branches whose condition changed its meaning.
//
// Method: both states become lists of branches, each with the condition under which it is built, in one table, so that
// equal conditions are equal nodes.  Lines that the change leaves alone pair the innermost branches around them; each
// pair is decided once.
// Cost: linear in the texts, and at most limits::scanSteps for the decisions.
#include "base/scan/changes/BranchMeanings.hpp"

#include "base/core/Limits.hpp"
#include "base/core/Make.hpp"
#include "base/decide/Assumptions.hpp"
#include "base/decide/Decider.hpp"
#include "base/scan/facts/BranchContext.hpp"
#include "base/scan/DirectiveCondition.hpp"
#include "base/scan/report/DirectiveTexts.hpp"
#include "base/scan/report/SourcePlaces.hpp"
#include "base/scan/report/WitnessText.hpp"

#include <algorithm>
#include <array>
#include <set>

namespace VT {

namespace {

constexpr std::uint32_t outside = 0; ///< the branch that is all of the file

struct Branch {
    std::uint32_t parent = outside;
    SymbolicExprId built = invalidId;   ///< the condition of its lines
    SymbolicExprId entered = invalidId; ///< the same within its parent
    SourceRegion region{};
    std::string directive{};
};

/// The branches of one state, and the innermost one of each line.
struct State {
    std::vector<Branch> branches;
    std::vector<std::uint32_t> ofLine; ///< by line from 0
    std::vector<bool> hasText;         ///< whether a line is neither blank nor a directive of a branch
};

class Reader {
public:
    Reader(SymbolicExprTable& table, MacroStates& states, MacroUnknowns& unknowns, bool isCpp)
        : table_(table),
          conditions_(table, states, unknowns, isCpp) {}

    State read(std::string_view text);

    /// The unknowns of all conditions that were read.
    [[nodiscard]] const std::vector<MacroUnknownId>& asked() const noexcept { return asked_; }

private:
    struct Chain {
        std::uint32_t parent;
        std::uint32_t branch;
        SymbolicExprId left; ///< no branch so far is entered
    };

    SymbolicExprId both(SymbolicExprId a, SymbolicExprId b) {
        if (a == table_.getIdTRUE())
            return b;
        return b == table_.getIdTRUE() ? a : SymbolicAndExpr(table_, a, b).getId(table_);
    }

    SymbolicExprId opposite(SymbolicExprId id) { return SymbolicNotExpr(table_, id).getId(table_); }

    SymbolicExprId conditionOf(const Directive& directive) {
        if (directive.kind == DirectiveKind::Else)
            return table_.getIdTRUE();
        const DirectiveCondition condition = conditions_.read(directive);
        asked_.insert(asked_.end(), condition.unknowns.begin(), condition.unknowns.end());
        if (condition.constant)
            return *condition.constant ? table_.getIdTRUE() : table_.getIdFALSE();
        return condition.node;
    }

    SymbolicExprTable& table_;
    DirectiveConditionReader conditions_;
    std::vector<MacroUnknownId> asked_;
};

State Reader::read(std::string_view text) {
    State state;
    state.branches.push_back({outside, table_.getIdTRUE(), table_.getIdTRUE()});
    for (std::size_t at = 0; at < text.size();) {
        const std::size_t end = std::min(text.find('\n', at), text.size());
        state.hasText.push_back(text.substr(at, end - at).find_first_not_of(" \t\r\f\v") != std::string_view::npos);
        at = end + 1;
    }
    const std::size_t lines = state.hasText.size();
    state.ofLine.reserve(lines);
    std::vector<Chain> chains;
    const auto fill = [&](std::uint64_t line) { // up to before a line, from 1
        const std::uint32_t branch = chains.empty() ? outside : chains.back().branch;
        while (state.ofLine.size() + 1 < line && state.ofLine.size() < lines)
            state.ofLine.push_back(branch);
    };
    DirectiveReader reader(text);
    for (Directive directive; reader.next(directive);) {
        if (!belongsToChain(directive.kind, !chains.empty()))
            continue;
        fill(directive.line);
        const SourceRegion region = regionOf(text, directive.begin, directive.line, directive.begin, directive.end);
        for (std::uint64_t line = region.line; line <= region.endLine && line <= lines; ++line)
            state.hasText[line - 1] = false;
        if (directive.kind == DirectiveKind::Endif) {
            chains.pop_back();
            continue;
        }
        if (opensChain(directive.kind))
            chains.push_back({chains.empty() ? outside : chains.back().branch, outside, table_.getIdTRUE()});
        Chain& chain = chains.back();
        const SymbolicExprId own = conditionOf(directive);
        const SymbolicExprId entered = both(chain.left, own);
        chain.left = both(chain.left, opposite(own));
        chain.branch = static_cast<std::uint32_t>(state.branches.size());
        state.branches.push_back({chain.parent, both(state.branches[chain.parent].built, entered), entered, region,
                                  quotedDirective(directiveText(directive))});
    }
    fill(lines + 1);
    state.ofLine.resize(lines, outside);
    return state;
}

/// The comparison of two states.
class Comparison {
public:
    Comparison(SymbolicExprTable& table, const MacroUnknowns& unknowns, const Assumptions& laws, const State& before,
               const State& after)
        : table_(table),
          unknowns_(unknowns),
          laws_(laws),
          before_(before),
          after_(after),
          decider_(table, {.keywordsInForce = false, .steps = limits::branchDecisionSteps}) {}

    /// Compares the branches around a line that both states have.
    void compare(std::uint64_t lineBefore, std::uint64_t lineAfter) {
        if (lineBefore >= before_.ofLine.size() || lineAfter >= after_.ofLine.size() || !after_.hasText[lineAfter])
            return;
        compareBranches(before_.ofLine[lineBefore], after_.ofLine[lineAfter], lineAfter + 1);
    }

    std::vector<ChangedBranch> take() { return std::move(changed_); }

private:
    void compareBranches(std::uint32_t a, std::uint32_t b, std::uint64_t line) {
        if (a == lastBefore_ && b == lastAfter_)
            return;
        lastBefore_ = a;
        lastAfter_ = b;
        if (!seen_.emplace(a, b).second || left_ == 0)
            return;
        const Branch& old = before_.branches[a];
        const Branch& fresh = after_.branches[b];
        // A chain within one that changed as a whole changes with it.
        const Decision same = old.built == fresh.built ? yes() : decide(old.built, fresh.built);
        if (!same.isNo())
            return;
        differ_.emplace(a, b);
        if (differ_.contains({old.parent, fresh.parent}) && !differsWithin(old, fresh))
            return;
        ChangedBranch changed{fresh.region, fresh.directive, old.directive, {}};
        if (b == outside)
            changed.region = {line, 1, line, 1};
        if (same.witness) {
            changed.witness = witnessText(unknowns_, decider_, *same.witness);
            changed.isBuiltAfter = decider_.holds(fresh.built, *same.witness).value_or(false);
        }
        changed_.push_back(std::move(changed));
    }

    /// Whether two branches are entered in other cases, where those around both are built.
    bool differsWithin(const Branch& old, const Branch& fresh) {
        const SymbolicExprId around[] = {before_.branches[old.parent].built, after_.branches[fresh.parent].built};
        const auto within = [&](SymbolicExprId entered) {
            const std::array all{around[0], around[1], entered};
            return makeChain(table_, SymbolicOp::And, all);
        };
        return decide(within(old.entered), within(fresh.entered)).isNo();
    }

    static Decision yes() {
        Decision decision;
        decision.answer = Answer::Yes;
        return decision;
    }

    Decision decide(SymbolicExprId a, SymbolicExprId b) {
        const std::array both{a, b};
        Decision decision = decider_.equivalentGiven(a, b, laws_.knownOf(both));
        left_ -= std::min(left_, decider_.stepsTaken() + 1);
        return decision;
    }

    SymbolicExprTable& table_;
    const MacroUnknowns& unknowns_;
    const Assumptions& laws_;
    const State& before_;
    const State& after_;
    Decider decider_;
    std::uint64_t left_ = limits::scanSteps;
    std::set<std::pair<std::uint32_t, std::uint32_t>> seen_;
    std::set<std::pair<std::uint32_t, std::uint32_t>> differ_;
    std::uint32_t lastBefore_ = ~0U;
    std::uint32_t lastAfter_ = ~0U;
    std::vector<ChangedBranch> changed_;
};

} // namespace

std::vector<ChangedBranch> changedBranches(std::string_view before, std::string_view after, bool isCpp,
                                           const std::vector<ChangedLines>& changes) {
    if (hasManyReadings(before) || hasManyReadings(after))
        return {};
    SymbolicExprTable table;
    table.addBoolSymbols();
    MacroStates states;
    MacroUnknowns unknowns(table, states);
    Reader reader(table, states, unknowns, isCpp);
    const State old = reader.read(before);
    const State fresh = reader.read(after);
    Assumptions laws(table); // a macro that is not defined is 0
    for (const SymbolicExprId law : BranchContext(table, unknowns).laws(reader.asked()).undefinedLaws)
        laws.add(law);
    Comparison comparison(table, unknowns, laws, old, fresh);
    std::uint64_t lineBefore = 0; // from 0
    std::uint64_t lineAfter = 0;
    const auto compareUpTo = [&](std::uint64_t end) {
        for (; lineBefore < end && lineBefore < old.ofLine.size(); ++lineBefore, ++lineAfter)
            comparison.compare(lineBefore, lineAfter);
    };
    for (const ChangedLines& change : changes) {
        compareUpTo(change.countBefore == 0 ? change.firstBefore : change.firstBefore - 1);
        lineBefore += change.countBefore;
        lineAfter = (change.countAfter == 0 ? change.firstAfter : change.firstAfter - 1) + change.countAfter;
    }
    compareUpTo(old.ofLine.size());
    return comparison.take();
}

} // namespace VT
