// The doors of evaluation: eval() computes one value at once (SymbolicExprEvalImpl), prepare() flattens an expression
// for many evaluations with changing values (PreparedExpr).
#include "base/eval/Eval.hpp"

#include "base/eval/EvalVisitor.hpp"

namespace VT {

SymbolicValue SymbolicExprEval::eval(SymbolicExprId id) const {
    return SymbolicExprEvalImpl(table_).evaluate(id);
}

PreparedExpr SymbolicExprEval::prepare(SymbolicExprId id) const {
    return {table_, id};
}

} // namespace VT
