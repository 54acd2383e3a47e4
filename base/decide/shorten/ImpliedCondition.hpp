// Conditions made shorter where something is known.
#pragma once

#include "base/core/Table.hpp"
#include "base/decide/shorten/ChainTree.hpp"
#include "base/print/ExpressionPrinter.hpp"

#include <functional>
#include <vector>

namespace VT {

/// Interns the comparison of an operand with an integer.
SymbolicExprId compareWith(SymbolicExprTable& table, SymbolicOp op, SymbolicExprId operand, int literal);

/// Shortens a condition by what keeps it equal in a context: operands of && and || taken away, the longest first, and
/// groups replaced by one comparison with a literal that the condition or the context mentions.  Every change is proven
/// by the caller's `isEqual` before it stays, so the result is right whatever is tried; it need not be the shortest
/// that there is.
///
/// Cost: a proof for every change tried, at most limits::impliedTries, and nodes for every text compared, at most
/// limits::impliedNodes.
class ImpliedCondition {
public:
    using IsEqual = std::function<bool(SymbolicExprId candidate)>;

    /// `context` is where further literals are taken from.
    ImpliedCondition(SymbolicExprTable& table, const SymbolicExprPrinter& printer, SymbolicExprId context,
                     IsEqual isEqual);

    /// The shortest form found of a condition that `isEqual` accepts; the condition itself where nothing is shorter.
    SymbolicExprId shorten(SymbolicExprId condition);

private:
    using Item = ChainTree::Item;

    SymbolicExprId build();
    template <class Change, class Undo>
    bool attempt(Change change, Undo undo);
    bool removeOperands();
    bool replaceGroups();
    void collectComparisons(SymbolicExprId condition);

    SymbolicExprTable& table_;
    const SymbolicExprPrinter& printer_;
    SymbolicExprId context_;
    IsEqual isEqual_;
    ChainTree tree_;
    std::vector<SymbolicExprId> built_;      ///< by item, as of the last build
    std::vector<SymbolicExprId> candidates_; ///< comparisons, the shortest first
    SymbolicExprId current_ = invalidId;
    std::size_t triesLeft_ = 0;
    std::size_t nodesLeft_ = 0;
};

} // namespace VT
