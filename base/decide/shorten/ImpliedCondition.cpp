// Shortens a condition by trial and proof.
//
// The condition is taken apart into chains once.  A trial marks an operand as removed, or a group as replaced,
// builds the text's length and asks for a proof only where that is shorter.
// Cost: limits::impliedTries proofs and limits::impliedNodes nodes.
#include "base/decide/shorten/ImpliedCondition.hpp"

#include "base/core/Chains.hpp"
#include "base/core/Limits.hpp"
#include "base/core/Make.hpp"
#include "base/core/Nodes.hpp"
#include "base/core/Walk.hpp"

#include <algorithm>
#include <numeric>
#include <set>

namespace VT {

SymbolicExprId compareWith(SymbolicExprTable& table, SymbolicOp op, SymbolicExprId operand, int literal) {
    return makeBinary(table, op, operand, SymbolicIntValue(table, literal).getId(table));
}

ImpliedCondition::ImpliedCondition(SymbolicExprTable& table, const SymbolicExprPrinter& printer, SymbolicExprId context,
                                   IsEqual isEqual)
    : table_(table),
      printer_(printer),
      context_(context),
      isEqual_(std::move(isEqual)),
      triesLeft_(limits::impliedTries),
      nodesLeft_(limits::impliedNodes) {}

SymbolicExprId ImpliedCondition::shorten(SymbolicExprId condition) {
    current_ = condition;
    if (!split(condition))
        return condition;
    collectComparisons(condition);
    while (removeOperands() || replaceGroups())
        continue;
    return current_;
}

/// Takes a condition apart into chains; false where it is too large.
bool ImpliedCondition::split(SymbolicExprId condition) {
    items_.assign(1, {SymbolicOp::None, condition, 0, {}});
    for (std::size_t i = 0; i < items_.size(); ++i) {
        const SymbolicExpr& node = *table_.get(items_[i].id);
        if (node.op() != SymbolicOp::And && node.op() != SymbolicOp::Or)
            continue;
        items_[i].op = node.op();
        const bool complete = walkChain(
            table_, items_[i].id, limits::chainOperands - std::min(items_.size(), limits::chainOperands),
            [&](SymbolicExprId, const SymbolicExpr& link) { return link.op() == node.op(); },
            [&](SymbolicExprId id, const SymbolicExpr* operand) {
                items_[i].operands.push_back(items_.size());
                items_.push_back({SymbolicOp::None, id, i, {}});
                return operand != nullptr;
            });
        if (!complete)
            return false;
    }
    return true;
}

/// The condition without what was removed.
SymbolicExprId ImpliedCondition::build() {
    built_.assign(items_.size(), invalidId);
    for (std::size_t i = items_.size(); i-- > 0;) {
        const Item& item = items_[i];
        if (item.op == SymbolicOp::None) {
            built_[i] = item.id;
            continue;
        }
        for (const std::size_t operand : item.operands) {
            if (items_[operand].removed)
                continue;
            const SymbolicExprId right = built_[operand];
            if (built_[i] == invalidId)
                built_[i] = right;
            else
                built_[i] = makeBinary(table_, item.op, built_[i], right);
            nodesLeft_ -= std::min<std::size_t>(nodesLeft_, 1);
        }
    }
    return built_.front();
}

/// Keeps a change that makes the condition shorter and leaves it equal.
template <class Change, class Undo>
bool ImpliedCondition::attempt(Change change, Undo undo) {
    if (triesLeft_ == 0 || nodesLeft_ == 0)
        return false;
    --triesLeft_;
    change();
    const SymbolicExprId candidate = build();
    if (printer_.textLength(candidate) < printer_.textLength(current_) && isEqual_(candidate)) {
        current_ = candidate;
        return true;
    }
    undo();
    return false;
}

std::size_t ImpliedCondition::operandsLeft(const Item& item) const {
    const auto left = std::ranges::count_if(item.operands, [&](std::size_t at) { return !items_[at].removed; });
    return static_cast<std::size_t>(left);
}

bool ImpliedCondition::removeOperands() {
    build();
    std::vector<std::size_t> order(items_.size());
    std::iota(order.rbegin(), order.rend(), std::size_t{0}); // of two equally long the later one goes
    std::vector<std::uint64_t> lengths;
    for (const SymbolicExprId id : built_)
        lengths.push_back(id == invalidId ? 0 : printer_.textLength(id));
    std::ranges::stable_sort(order, std::ranges::greater(), [&](std::size_t i) { return lengths[i]; });
    bool changed = false;
    for (const std::size_t i : order) {
        Item& item = items_[i];
        if (i == 0 || item.removed || operandsLeft(items_[item.parent]) < 2)
            continue;
        changed = attempt([&] { item.removed = true; }, [&] { item.removed = false; }) || changed;
    }
    return changed;
}

/// Replaces a whole group by one comparison.
bool ImpliedCondition::replaceGroups() {
    for (std::size_t i = 0; i < items_.size(); ++i) {
        Item& item = items_[i];
        if (item.op == SymbolicOp::None || item.removed || operandsLeft(item) < 2)
            continue;
        build();
        const std::uint64_t length = printer_.textLength(built_[i]);
        const SymbolicOp op = item.op;
        for (const SymbolicExprId comparison : candidates_) {
            if (printer_.textLength(comparison) >= length)
                break;
            const SymbolicExprId before = item.id;
            const auto replace = [&] {
                item.op = SymbolicOp::None;
                item.id = comparison;
            };
            const auto restore = [&] {
                item.op = op;
                item.id = before;
            };
            if (attempt(replace, restore))
                return true;
        }
    }
    return false;
}

/// Comparisons of what the condition compares with literals, with the literals that it or the context compares it with.
void ImpliedCondition::collectComparisons(SymbolicExprId condition) {
    std::vector<SymbolicExprId> operands;
    std::vector<std::set<int>> literals;
    for (const SymbolicExprId root : {condition, context_}) {
        walkDistinct(
            table_, root,
            [&](SymbolicExprId, const SymbolicExpr& node) {
                if (!comparisonOps.contains(node.op()))
                    return;
                for (const std::size_t side : {0U, 1U}) {
                    const SymbolicExprId operand = node.getInput(side);
                    const SymbolicExpr* literal = table_.get(node.getInput(1 - side));
                    if (literal == nullptr || literal->op() != SymbolicOp::IntValue)
                        continue;
                    auto at = std::ranges::find(operands, operand);
                    if (at == operands.end() && (root == context_ || operands.size() == limits::impliedOperands))
                        continue;
                    if (at == operands.end()) {
                        at = operands.insert(at, operand);
                        literals.emplace_back();
                    }
                    auto& known = literals[static_cast<std::size_t>(at - operands.begin())];
                    if (known.size() < limits::impliedLiterals)
                        known.insert(static_cast<const SymbolicIntValue*>(literal)->getValue());
                }
            },
            [](SymbolicExprId) {});
    }
    candidates_.clear();
    for (std::size_t i = 0; i < operands.size(); ++i) {
        for (const int literal : literals[i]) {
            for (const OperatorInfo& row : operatorTable())
                if (comparisonOps.contains(row.op))
                    candidates_.push_back(compareWith(table_, row.op, operands[i], literal));
        }
    }
    std::ranges::sort(candidates_, [&](SymbolicExprId a, SymbolicExprId b) {
        const auto lengthA = printer_.textLength(a);
        const auto lengthB = printer_.textLength(b);
        return lengthA != lengthB ? lengthA < lengthB : printer_.compareUsingCache(a, b) < 0;
    });
}

} // namespace VT
