// The families of rules, each in the file that holds its table.
//
// A rule is a function and a row; its row names the operators at whose nodes it is tried.  It goes into any table whose
// subject it fits, also where its operator has had no rule so far.
#pragma once

#include "base/simplify/Rule.hpp"
#include "base/simplify/RuleContext.hpp"

#include <span>
#include <vector>

namespace VT {

/// The operands of a node on its way through the rules.
struct RuleOperands {
    SymbolicOp op;
    SymbolicExprId a; ///< as the operands were rebuilt; b is the invalid identifier for one operand
    SymbolicExprId b;
    SymbolicExprId valueA; ///< with bound members resolved
    SymbolicExprId valueB;
};

/// A rule for a node of one or two operands: what it becomes, or the invalid identifier where the rule does not apply.
struct NodeRule {
    RuleInfo info;
    SymbolicExprId (*apply)(RuleContext& context, const RuleOperands& operands);
};

/// The tables: Not and comparisons, sums, products and quotients.
std::span<const NodeRule> comparisonRules();
std::span<const NodeRule> sumRules();
std::span<const NodeRule> productRules();

/// Tries the rules of an operator, table by table, from top to bottom; the invalid identifier where none applies.  `b`
/// is the invalid identifier for one operand.
SymbolicExprId applyRules(RuleContext& context, SymbolicOp op, SymbolicExprId a, SymbolicExprId b = invalidId);
/// What a node becomes by the rules of its operator: the node itself where none applies, or where it has more than two
/// operands.
SymbolicExprId applyRules(RuleContext& context, SymbolicExprId id);

/// Not of a simplified operand.
SymbolicExprId simplifyNot(RuleContext& context, SymbolicExprId operand);
/// A comparison of simplified operands.
SymbolicExprId simplifyComparison(RuleContext& context, SymbolicOp op, SymbolicExprId a, SymbolicExprId b);
/// An operand of a parent that counts with it: `rebuilt`, or a comparison of it with 0 where it is no truth value and
/// `source`, of which it was made, is one.
SymbolicExprId truthAsNumber(RuleContext& context, SymbolicExprId source, SymbolicExprId rebuilt);
/// A product, a quotient of simplified operands.
SymbolicExprId simplifyMultiply(RuleContext& context, SymbolicExprId a, SymbolicExprId b);
SymbolicExprId simplifyDivide(RuleContext& context, SymbolicExprId a, SymbolicExprId b);
/// A chain of +, - and unary minus whose other operands are simplified.
SymbolicExprId simplifySum(RuleContext& context, SymbolicExprId root);
/// The operators of such a chain.
inline constexpr OperatorSet sumOps{SymbolicOp::Plus, SymbolicOp::Minus, SymbolicOp::UnaryMinus};

/// Appends the rules of chains, which are tried in an order of their own, and those of whole sums.
void appendChainRules(std::vector<const RuleInfo*>& out);
void appendSumRules(std::vector<const RuleInfo*>& out);

} // namespace VT
