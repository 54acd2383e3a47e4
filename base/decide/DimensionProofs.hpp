// Proofs about dimension expressions.
#pragma once

#include "base/decide/Assumptions.hpp"
#include "base/decide/Decider.hpp"

namespace VT {

/// How two dimensions stand to each other wherever the assumptions hold.
enum class DimensionOrder : std::uint8_t { Equal, Less, LessOrEqual, Greater, GreaterOrEqual, Different, Open };

/// Proves claims about dimension expressions under assumptions.
///
/// Symbols stand for integers, and quotients are exact: N/2*2 is N, and N/2 >= 1 is N >= 2.  A claim whose quotients
/// have divisors other than positive integers is undecided (DecisionBound::Terms).  Assumptions are conditions, whose
/// quotients are cut.  The table, the decider and the assumptions outlive the proofs; nodes are interned on the way.
class VTSYM_API DimensionProofs {
public:
    DimensionProofs(SymbolicExprTable& table, Decider& decider, const Assumptions& assumptions)
        : table_(table),
          decider_(decider),
          assumptions_(assumptions) {}

    /// Whether a claim, comparisons of dimensions joined by && || !, holds wherever the assumptions do; the witness of
    /// "no" breaks it.
    Decision holds(SymbolicExprId claim);
    Decision isNonNegative(SymbolicExprId dimension);
    Decision isEqual(SymbolicExprId a, SymbolicExprId b);
    /// Whether a dimension is a multiple of a positive integer; undecided of any other divisor.
    Decision isDivisible(SymbolicExprId dimension, int divisor);
    /// The strongest order that is proven; Open where none is.
    DimensionOrder compare(SymbolicExprId a, SymbolicExprId b);

private:
    SymbolicExprId withoutQuotients(SymbolicExprId claim);
    Decision holds(SymbolicOp op, SymbolicExprId a, SymbolicExprId b);

    SymbolicExprTable& table_;
    Decider& decider_;
    const Assumptions& assumptions_;
};

} // namespace VT
