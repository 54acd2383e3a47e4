// Tries rules by the operators in their rows.
//
// The rows of all tables are sorted by operator once, so that a node costs the rules of its own operator only.
#include "base/simplify/RuleTables.hpp"

#include <array>

namespace VT {

namespace {

using RulesOfOperator = std::vector<const NodeRule*>;

const std::array<RulesOfOperator, operatorCount>& nodeRules() {
    static const auto rules = [] {
        std::array<RulesOfOperator, operatorCount> byOperator;
        for (const std::span<const NodeRule> family : {comparisonRules(), sumRules(), productRules()}) {
            for (const NodeRule& rule : family) {
                for (int code = 0; code < operatorCount; ++code)
                    if (rule.info.operators.contains(static_cast<SymbolicOp>(code)))
                        byOperator[static_cast<std::size_t>(code)].push_back(&rule);
            }
        }
        return byOperator;
    }();
    return rules;
}

const RulesOfOperator& nodeRules(SymbolicOp op) {
    return nodeRules()[static_cast<std::size_t>(op)];
}

SymbolicExprId makeNode(RuleContext& context, const RuleOperands& operands) {
    return operands.b == invalidId ? makeUnary(context.table(), operands.op, operands.a)
                                   : context.makeBinary(operands.op, operands.a, operands.b);
}

} // namespace

SymbolicExprId applyRules(RuleContext& context, SymbolicOp op, SymbolicExprId a, SymbolicExprId b) {
    const RuleOperands operands{op, a, b, context.resolve(a), b == invalidId ? invalidId : context.resolve(b)};
    for (const NodeRule* rule : nodeRules(op)) {
        const SymbolicExprId after = rule->apply(context, operands);
        if (after == invalidId)
            continue;
        if (context.explaining())
            context.fired(rule->info, makeNode(context, operands), after);
        return after;
    }
    return invalidId;
}

SymbolicExprId applyRules(RuleContext& context, SymbolicExprId id) {
    const SymbolicExpr& node = context.node(id);
    if (nodeRules(node.op()).empty())
        return id;
    const std::size_t operands = node.getNumInputs();
    if (operands < 1 || operands > 2)
        return id;
    const SymbolicExprId after =
        applyRules(context, node.op(), node.getInput(0), operands == 2 ? node.getInput(1) : invalidId);
    return after != invalidId ? after : id;
}

std::span<const RuleInfo* const> simplificationRules() {
    static const std::vector<const RuleInfo*> rules = [] {
        std::vector<const RuleInfo*> all;
        for (const NodeRule& rule : comparisonRules())
            all.push_back(&rule.info);
        appendChainRules(all);
        for (const std::span<const NodeRule> family : {sumRules(), productRules()})
            for (const NodeRule& rule : family)
                all.push_back(&rule.info);
        appendSumRules(all);
        return all;
    }();
    return rules;
}

} // namespace VT
