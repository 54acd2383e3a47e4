// Takes conditions apart into chains and puts them together again.
//
// Method: items in one list, each chain before its operands, so that building runs once from the end.
// Cost: linear in the occurrences of operands, at most limits::chainOperands.
#include "base/decide/shorten/ChainTree.hpp"

#include "base/core/Chains.hpp"
#include "base/core/Limits.hpp"
#include "base/core/Make.hpp"

#include <algorithm>

namespace VT {

bool ChainTree::split(SymbolicExprId condition) {
    items_.assign(1, {.id = condition});
    for (std::size_t i = 0; i < items_.size(); ++i) {
        const SymbolicOp op = table_.get(items_[i].id)->op();
        if (op != SymbolicOp::And && op != SymbolicOp::Or)
            continue;
        items_[i].op = op;
        const bool complete = walkChain(
            table_, items_[i].id, limits::chainOperands - std::min<std::uint64_t>(items_.size(), limits::chainOperands),
            LinksOf(op), [&](SymbolicExprId id, const SymbolicExpr* operand) {
                items_[i].operands.push_back(items_.size());
                items_.push_back({.id = id, .parent = i});
                return operand != nullptr;
            });
        if (!complete)
            return false;
    }
    return true;
}

SymbolicExprId ChainTree::build(std::vector<SymbolicExprId>& built, std::size_t& nodesLeft) const {
    built.assign(items_.size(), invalidId);
    for (std::size_t i = items_.size(); i-- > 0;) {
        const Item& item = items_[i];
        if (item.op == SymbolicOp::None) {
            built[i] = item.id;
            continue;
        }
        for (const std::size_t operand : item.operands) {
            if (items_[operand].removed)
                continue;
            const SymbolicExprId right = built[operand];
            built[i] = built[i] == invalidId ? right : makeBinary(table_, item.op, built[i], right);
            nodesLeft -= std::min<std::size_t>(nodesLeft, 1);
        }
    }
    return built.front();
}

std::size_t ChainTree::operandsLeft(const Item& item) const {
    const auto left = std::ranges::count_if(item.operands, [&](std::size_t at) { return !items_[at].removed; });
    return static_cast<std::size_t>(left);
}

} // namespace VT
