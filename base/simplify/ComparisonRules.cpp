// Rules for Not and the comparisons.
//
// Literals are compared as integers where both are, otherwise as doubles.  NaN is ordered in a way that hosts rely
// on: a < b is the opposite of b <= a and so true where one of them is NaN, all other comparisons with NaN but ~=
// are false; Not of NaN is true.  Operands come first: a comparison of literals is a constant before a Not above it
// could turn it round.  A symbol is an integer, so a comparison of an operand with itself is a constant.
#include "base/integer/ExactArithmetic.hpp"
#include "base/integer/IntegerSet.hpp"
#include "base/simplify/LogicalChain.hpp"
#include "base/simplify/RuleTables.hpp"

#include <utility>

namespace VT {

namespace {

// Not.

SymbolicExprId negatedConstant(RuleContext& context, const RuleOperands& x) {
    if (context.isTrue(x.valueA) || context.isFalse(x.valueA))
        return context.truth(context.isFalse(x.valueA));
    if (!context.isNumber(x.valueA))
        return invalidId;
    const double value = context.node(x.valueA).getNumValue();
    return context.truth(!(value > 0 || value < 0)); // also what is not a number
}

SymbolicExprId negatedComparison(RuleContext& context, const RuleOperands& x) {
    if (!comparisonOps.contains(context.op(x.a)))
        return invalidId;
    const auto& comparison = static_cast<const SymbolicBinaryExpr&>(context.node(x.a));
    return context.makeBinary(operatorInfo(comparison.op()).negated, comparison.left(), comparison.right());
}

SymbolicExprId doubleNegation(RuleContext& context, const RuleOperands& x) {
    if (context.op(x.a) != SymbolicOp::Not)
        return invalidId;
    const SymbolicExprId inner = static_cast<const SymbolicNotExpr&>(context.node(x.a)).operand();
    return context.isBoolean(inner) ? inner : invalidId;
}

SymbolicExprId deMorgan(RuleContext& context, const RuleOperands& x) {
    const SymbolicOp op = context.op(x.a);
    return op == SymbolicOp::And || op == SymbolicOp::Or ? negateChain(context, x.a) : invalidId;
}

// Comparisons.

/// A comparison of an operand with itself.  Where the rewrite is refused, the opposite constant takes its place.
SymbolicExprId selfComparison(RuleContext& context, const RuleOperands& x) {
    if (x.valueA != x.valueB)
        return invalidId;
    const bool value = operatorInfo(x.op).onEqual == 1;
    const SymbolicExprId expression = context.makeBinary(x.op, x.valueA, x.valueA);
    return context.truth(context.confirmRewrite(expression, context.truth(value)) == value);
}

/// A truth value is 0 or 1, so a comparison with an integer is a constant, the value or its negation.
SymbolicExprId truthAgainstInteger(RuleContext& context, const RuleOperands& x) {
    const bool onLeft = context.isBoolean(x.valueA);
    const std::optional<int> constant = context.integer(onLeft ? x.valueB : x.valueA);
    if (!constant || (!onLeft && !context.isBoolean(x.valueB)))
        return invalidId;
    const SymbolicOp op = onLeft ? x.op : operatorInfo(x.op).mirrored;
    const IntegerSet set = IntegerSet::satisfying(op, *constant);
    if (set.contains(0) == set.contains(1))
        return context.truth(set.contains(0));
    const SymbolicExprId value = onLeft ? x.a : x.b;
    return set.contains(1) ? value : simplifyNot(context, value);
}

template <class Number>
bool holds(SymbolicOp op, Number a, Number b) {
    // What is not a number is less.
    return op == SymbolicOp::LessThan ? !compareNumbers(SymbolicOp::GreaterThanEqual, a, b) : compareNumbers(op, a, b);
}

SymbolicExprId comparedNumbers(RuleContext& context, const RuleOperands& x) {
    if (!context.isNumber(x.valueA) || !context.isNumber(x.valueB))
        return invalidId;
    const std::optional<int> a = context.integer(x.valueA);
    const std::optional<int> b = context.integer(x.valueB);
    if (a && b)
        return context.truth(holds(x.op, *a, *b));
    return context.truth(holds(x.op, context.node(x.valueA).getNumValue(), context.node(x.valueB).getNumValue()));
}

/// An integer literal, or a truth constant as 1 or 0.
std::optional<int> constantValue(const RuleContext& context, SymbolicExprId id) {
    if (context.isTrue(id) || context.isFalse(id))
        return context.isTrue(id) ? 1 : 0;
    return context.integer(id);
}

SymbolicExprId comparedConstants(RuleContext& context, const RuleOperands& x) {
    const std::optional<int> a = constantValue(context, x.valueA);
    const std::optional<int> b = constantValue(context, x.valueB);
    return a && b ? context.truth(holds(x.op, *a, *b)) : invalidId;
}

/// Constants stand on the right, members on the right of what is no constant, other operands in the order of their
/// texts.
bool isOriented(const RuleContext& context, const RuleOperands& x) {
    if (context.isNumber(x.b) || context.isNumber(x.a))
        return context.isNumber(x.b);
    return context.op(x.b) == SymbolicOp::MemberValue || !context.sortsBefore(x.b, x.a);
}

SymbolicExprId orientation(RuleContext& context, const RuleOperands& x) {
    return isOriented(context, x) ? invalidId : context.makeBinary(operatorInfo(x.op).mirrored, x.b, x.a);
}

constexpr OperatorSet notOnly{SymbolicOp::Not};
constexpr NodeRule comparisonTable[] = {
    {{notOnly, "negated constant", "~2", "false"}, negatedConstant},
    {{notOnly, "negated comparison", "~(A < 3)", "A >= 3"}, negatedComparison},
    {{notOnly, "double negation", "~~~N", "~N"}, doubleNegation},
    {{notOnly, "De Morgan", "~(A == 1 && B)", "A ~= 1 || ~B"}, deMorgan},
    {{comparisonOps, "comparison with itself", "A <= A", "true"}, selfComparison},
    {{comparisonOps, "truth value against integer", "(A == 1) < 2", "true"}, truthAgainstInteger},
    {{comparisonOps, "compared numbers", "2 < 3", "true"}, comparedNumbers},
    {{comparisonOps, "compared constants", "true > 0", "true"}, comparedConstants},
    {{comparisonOps, "orientation", "3 < A", "A > 3"}, orientation},
};

} // namespace

std::span<const NodeRule> comparisonRules() {
    return comparisonTable;
}

SymbolicExprId simplifyNot(RuleContext& context, SymbolicExprId operand) {
    const SymbolicExprId result = applyRules(context, SymbolicOp::Not, operand);
    return result != invalidId ? result : context.make<SymbolicNotExpr>(operand);
}

SymbolicExprId simplifyComparison(RuleContext& context, SymbolicOp op, SymbolicExprId a, SymbolicExprId b) {
    const SymbolicExprId result = applyRules(context, op, a, b);
    return result != invalidId ? result : context.makeBinary(op, a, b);
}

} // namespace VT
