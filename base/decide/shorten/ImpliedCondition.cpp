// Shortens a condition by trial and proof.
//
// The condition is taken apart into chains once.  A trial marks an operand as removed, or a group as replaced,
// builds the text's length and asks for a proof only where that is shorter.
// Cost: limits::impliedTries proofs and limits::impliedNodes nodes.
#include "base/decide/shorten/ImpliedCondition.hpp"

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
      tree_(table),
      triesLeft_(limits::impliedTries),
      nodesLeft_(limits::impliedNodes) {}

SymbolicExprId ImpliedCondition::shorten(SymbolicExprId condition) {
    current_ = condition;
    if (!tree_.split(condition))
        return condition;
    collectComparisons(condition);
    while (removeOperands() || replaceGroups())
        continue;
    return current_;
}

SymbolicExprId ImpliedCondition::build() {
    return tree_.build(built_, nodesLeft_);
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

bool ImpliedCondition::removeOperands() {
    std::vector<Item>& items = tree_.items();
    build();
    std::vector<std::size_t> order(items.size());
    std::iota(order.rbegin(), order.rend(), std::size_t{0}); // of two equally long the later one goes
    std::vector<std::uint64_t> lengths;
    for (const SymbolicExprId id : built_)
        lengths.push_back(id == invalidId ? 0 : printer_.textLength(id));
    std::ranges::stable_sort(order, std::ranges::greater(), [&](std::size_t i) { return lengths[i]; });
    bool changed = false;
    for (const std::size_t i : order) {
        Item& item = items[i];
        if (i == 0 || item.removed || tree_.operandsLeft(items[item.parent]) < 2)
            continue;
        changed = attempt([&] { item.removed = true; }, [&] { item.removed = false; }) || changed;
    }
    return changed;
}

/// Replaces a whole group by one comparison.
bool ImpliedCondition::replaceGroups() {
    std::vector<Item>& items = tree_.items();
    for (std::size_t i = 0; i < items.size(); ++i) {
        Item& item = items[i];
        if (item.op == SymbolicOp::None || item.removed || tree_.operandsLeft(item) < 2)
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
