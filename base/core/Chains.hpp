// The one walk over the operands of a chain: of `a && (b && c) && d`, the operands a, b, c and d.
//
// The stack is explicit, so a chain may nest to any depth on either side.  An operand is missing where the table has no
// node for it (SymbolicExprTable::hasOperand).
#pragma once

#include "base/core/Table.hpp"
#include "base/util/IdSet.hpp"

#include <boost/container/small_vector.hpp>

#include <cstddef>
#include <limits>

namespace VT {

/// The number of operands of a walk without a limit.
inline constexpr std::size_t anyNumber = std::numeric_limits<std::size_t>::max();

/// The links of a chain: nodes of one operator, or of one of some.
class LinksOf {
public:
    explicit LinksOf(OperatorSet ops) noexcept : ops_(ops) {}

    explicit LinksOf(SymbolicOp op) noexcept : ops_{op} {}

    bool operator()(SymbolicExprId, const SymbolicExpr& node) const { return ops_.contains(node.op()); }

private:
    OperatorSet ops_;
};

namespace detail {

template <class Seen, class IsLink, class Visit>
bool walkChainUnseen(const SymbolicExprTable& table, SymbolicExprId root, std::size_t most, Seen&& seen,
                     IsLink&& isLink, Visit&& visit) {
    boost::container::small_vector<SymbolicExprId, 32> pending{root};
    for (std::size_t operands = 0; !pending.empty();) {
        if (operands >= most)
            return false;
        const SymbolicExprId id = pending.back();
        pending.pop_back();
        if (seen(id))
            continue;
        const SymbolicExpr* const node = id == invalidId ? nullptr : table.get(id);
        if (node == nullptr || !isLink(id, *node)) {
            ++operands;
            if (!visit(id, node))
                return false;
            continue;
        }
        for (std::size_t i = node->getNumInputs(); i-- > 0;) {
            const SymbolicExprId operand = node->getInput(i);
            pending.push_back(table.hasOperand(id, operand) ? operand : invalidId);
        }
        if (pending.size() > most)
            return false;
    }
    return true;
}

} // namespace detail

/// Visits the operands of the chain at `root` from left to right, each as often as it occurs.
///
/// A node for which `isLink(id, node)` holds is replaced by its inputs; any other is an operand, for which
/// `visit(id, node)` is called; it returns false to end the walk.  A missing operand has the invalid identifier and no
/// node.  The walk ends early when there are more than `most` operands, so it looks at no more than about twice as many
/// nodes.  Returns whether it reached the end.
template <class IsLink, class Visit>
bool walkChain(const SymbolicExprTable& table, SymbolicExprId root, std::size_t most, IsLink&& isLink, Visit&& visit) {
    return detail::walkChainUnseen(
        table, root, most, [](SymbolicExprId) { return false; }, isLink, visit);
}

/// The same, but each distinct link is entered and each distinct operand visited once; `again(id)` is called for each
/// further occurrence.  The walk also ends early when more than `most` nodes wait to be looked at, and when one waits
/// after `most` operands, even if it occurred before.  Linear in the distinct links.
template <class IsLink, class Visit, class Again>
bool walkDistinctChain(const SymbolicExprTable& table, SymbolicExprId root, std::size_t most, IsLink&& isLink,
                       Visit&& visit, Again&& again) {
    IdSet seen;
    const auto wasSeen = [&](SymbolicExprId id) {
        if (id == invalidId || seen.add(id)) // each missing operand counts for itself
            return false;
        again(id);
        return true;
    };
    return detail::walkChainUnseen(table, root, most, wasSeen, isLink, visit);
}

} // namespace VT
