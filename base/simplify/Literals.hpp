// Literals combined to literals.
//
// Integer arithmetic wraps at 32 bits.  Adding and multiplying integers modulo 2^32 is associative, commutative and
// distributive, so terms may be gathered in any order; what a rule writes down is exact in 64 bits and written only
// where it fits 32.  Reals are rounded at each step, so sums of them are folded pair by pair and never regrouped; a
// real factor is multiplied into a constant next to it, which may round once where evaluation rounds twice.
#pragma once

#include "base/simplify/RuleTables.hpp"

namespace VT {

/// An integer literal; the invalid identifier where the value does not fit.
SymbolicExprId integerIfFits(RuleContext& context, std::int64_t value);

/// Two literals combined: integers exactly, and only where the result fits; others as reals, and only to finite values.
/// The invalid identifier where one of them is no literal or there is no such result.
SymbolicExprId foldNumbers(RuleContext& context, SymbolicOp op, SymbolicExprId a, SymbolicExprId b);

/// The same as a rule.
inline SymbolicExprId foldedNumbers(RuleContext& context, const RuleOperands& x) {
    return foldNumbers(context, x.op, x.valueA, x.valueB);
}

/// The operands of a node of a binary operator, or nullptr.
inline const SymbolicBinaryExpr* binary(const RuleContext& context, SymbolicExprId id, SymbolicOp op) {
    const SymbolicExpr& node = context.node(id);
    return node.op() == op ? static_cast<const SymbolicBinaryExpr*>(&node) : nullptr;
}

} // namespace VT
