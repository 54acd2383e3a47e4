// The families of rules, each table in the file that holds its rules.
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

/// Tries rules from top to bottom; the invalid identifier where none applies.
SymbolicExprId applyFirst(std::span<const NodeRule> rules, RuleContext& context, const RuleOperands& operands);

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
/// One + or - of two literals as a literal, anything else as it is.
SymbolicExprId foldSum(RuleContext& context, SymbolicExprId root);
/// The operators of such a chain.
inline constexpr OperatorSet sumOps{SymbolicOp::Plus, SymbolicOp::Minus, SymbolicOp::UnaryMinus};

/// Appends what the rows of a table tell of themselves.
template <class Rule>
void appendInfo(std::span<const Rule> rules, std::vector<const RuleInfo*>& out) {
    for (const Rule& rule : rules)
        out.push_back(&rule.info);
}

void appendNotRules(std::vector<const RuleInfo*>& out);
void appendComparisonRules(std::vector<const RuleInfo*>& out);
void appendLogicalRules(std::vector<const RuleInfo*>& out);
void appendSumRules(std::vector<const RuleInfo*>& out);
void appendProductRules(std::vector<const RuleInfo*>& out);

} // namespace VT
