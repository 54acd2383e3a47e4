#include "base/decide/shorten/ImpliedCondition.hpp"

#include "base/core/Limits.hpp"
#include "base/core/Make.hpp"
#include "base/core/Nodes.hpp"
#include "base/core/Walk.hpp"

#include <algorithm>
#include <numeric>
#include <set>

namespace VT {

namespace {

constexpr std::size_t mostOperands = 8;  ///< that comparisons are made of
constexpr std::size_t mostLiterals = 12; ///< that each of them is compared with

} // namespace

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
        std::vector<SymbolicExprId> pending{items_[i].id};
        while (!pending.empty()) {
            const SymbolicExprId id = pending.back();
            pending.pop_back();
            const SymbolicExpr* operand = table_.get(id);
            if (operand == nullptr || items_.size() + pending.size() > limits::chainOperands)
                return false;
            if (operand->op() == node.op()) {
                pending.push_back(operand->getInput(1));
                pending.push_back(operand->getInput(0));
                continue;
            }
            items_[i].operands.push_back(items_.size());
            items_.push_back({SymbolicOp::None, id, i, {}});
        }
    }
    return true;
}

/// The condition as it stands, without what was removed.
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

/// Puts one comparison in the place of a whole group.
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
                    if (at == operands.end() && (root == context_ || operands.size() == mostOperands))
                        continue;
                    if (at == operands.end()) {
                        at = operands.insert(at, operand);
                        literals.emplace_back();
                    }
                    auto& known = literals[static_cast<std::size_t>(at - operands.begin())];
                    if (known.size() < mostLiterals)
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
