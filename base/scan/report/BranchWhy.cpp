// Picks and writes the operands that force a finding.
//
// Method: conditions are split at && and at negated ||, then the judge picks a minimal part of the operands, as it
// picks directives.  What always holds (the laws) is no operand. Cost: at most limits::branchSteps for
// limits::whyOperands operands.
#include "base/scan/report/BranchWhy.hpp"

#include "base/core/Limits.hpp"
#include "base/scan/report/DirectiveTexts.hpp"

#include <algorithm>

namespace VT {

namespace {

struct Forcing {
    SymbolicExprId node;
    bool negated;
    std::size_t condition; ///< that it is of
};

/// Appends the operands of a condition, in its order; false where there are too many.
bool split(const SymbolicExprTable& table, std::size_t condition, SymbolicExprId id, std::vector<Forcing>& operands) {
    std::vector<Forcing> open{{id, false, condition}};
    while (!open.empty()) {
        const Forcing next = open.back();
        open.pop_back();
        const SymbolicExpr& node = *table.get(next.node);
        if (node.op() == SymbolicOp::Not) {
            open.push_back({node.getInput(0), !next.negated, condition});
        } else if (node.op() == (next.negated ? SymbolicOp::Or : SymbolicOp::And)) {
            open.push_back({node.getInput(1), next.negated, condition});
            open.push_back({node.getInput(0), next.negated, condition});
        } else if (operands.size() == limits::whyOperands) {
            return false;
        } else {
            operands.push_back(next);
        }
        if (open.size() > limits::whyOperands)
            return false;
    }
    return true;
}

std::string textOf(const SymbolicExprTable& table, const MacroUnknowns& unknowns, const SpelledCondition& condition,
                   const Forcing& operand) {
    const auto spelled = partText(table, unknowns, condition.spellings, condition.tokens, operand.node);
    std::string text;
    if (spelled)
        text = *spelled;
    else if (const MacroUnknown* const unknown = unknowns.find(operand.node))
        text = unknown->kind == MacroUnknown::Kind::Defined ? "defined(" + unknown->left + ")" : unknown->left;
    else
        text = spelledTokens(condition.tokens);
    return operand.negated ? negatedText(text) : text;
}

} // namespace

BranchWhy whyOf(const SymbolicExprTable& table, const MacroUnknowns& unknowns, BranchJudge& judge,
                SymbolicExprId condition, const BranchVerdict& verdict, const std::vector<SpelledCondition>& conditions,
                KnownConditions known) {
    std::vector<Forcing> operands;
    for (std::size_t i = 0; i < conditions.size(); ++i) {
        if (!conditions[i].texts.empty())
            operands.push_back({conditions[i].node, false, i});
        else if (!split(table, i, conditions[i].node, operands))
            return {};
    }
    if (operands.size() > limits::whyOperands)
        return {};
    known.facts.clear();
    for (const Forcing& operand : operands)
        known.facts.push_back(operand.negated ? judge.negated(operand.node) : operand.node);
    const MinimalSubset kept = judge.reasons(condition, verdict, known);
    BranchWhy why{{}, kept.isMinimal};
    for (const std::size_t at : kept.positions) {
        const SpelledCondition& of = conditions[operands[at].condition];
        const auto add = [&](const std::string& text) {
            if (std::ranges::find(why.operands, text) == why.operands.end())
                why.operands.push_back(quotedDirective(text));
        };
        if (of.texts.empty())
            add(textOf(table, unknowns, of, operands[at]));
        else
            std::ranges::for_each(of.texts, add);
    }
    return why;
}

std::vector<std::string> lostOperands(const SymbolicExprTable& table, const MacroUnknowns& unknowns,
                                      const SpelledCondition& condition, SymbolicExprId shorter) {
    const auto operandsOf = [&table](SymbolicExprId id) {
        std::vector<SymbolicExprId> operands;
        std::vector<SymbolicExprId> open{id};
        while (!open.empty() && operands.size() + open.size() <= limits::whyOperands) {
            const SymbolicExprId next = open.back();
            open.pop_back();
            const SymbolicExpr& node = *table.get(next);
            if (node.op() != SymbolicOp::And && node.op() != SymbolicOp::Or) {
                operands.push_back(next);
                continue;
            }
            open.push_back(node.getInput(1));
            open.push_back(node.getInput(0));
        }
        return open.empty() ? operands : std::vector<SymbolicExprId>();
    };
    std::vector<SymbolicExprId> kept = operandsOf(shorter);
    std::vector<std::string> lost;
    for (const SymbolicExprId operand : operandsOf(condition.node)) {
        const auto same = std::ranges::find(kept, operand);
        if (same == kept.end())
            lost.push_back(quotedDirective(textOf(table, unknowns, condition, {operand, false, 0})));
        else
            kept.erase(same);
    }
    return lost;
}

} // namespace VT
