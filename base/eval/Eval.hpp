// The value of an expression.
#pragma once

#include "base/eval/Prepared.hpp"
#include "base/eval/Values.hpp"

namespace VT {

/// Evaluates expressions of one table.
class VTSYM_API SymbolicExprEval {
public:
    /// `table` outlives the evaluator.
    explicit SymbolicExprEval(const SymbolicExprTable& table) : table_(table) {}

    /// The value of an expression under the values that are bound to symbols in the table.  Throws the host diagnostics
    /// that SymbolicExprEvalImpl names, and std::length_error beyond limits::evaluatedElements.  No operation on
    /// scalars fails: integers wrap or saturate, doubles become infinities, or NaN as in IEEE 754 (see Values.hpp).
    ///
    /// Linear in the distinct nodes of the expression and of the values it needs, times the length of the vectors.
    [[nodiscard]] SymbolicValue eval(SymbolicExprId id) const;

    /// Prepares the expression for many evaluations with changing values.  Linear in its distinct nodes.  Throws
    /// "Vantor:SymbolicDims:NotEvaluable" for a node that has no value whatever its symbols are.
    [[nodiscard]] PreparedExpr prepare(SymbolicExprId id) const;

private:
    const SymbolicExprTable& table_;
};

} // namespace VT
