// The operands of conditions that force a finding.
#pragma once

#include "base/scan/BranchVerdict.hpp"
#include "base/scan/report/ConditionProposal.hpp"

#include <string>
#include <vector>

namespace VT {

/// A condition that holds, with the tokens and spellings of what its directive says.
struct SpelledCondition {
    SymbolicExprId node;
    std::vector<DirectiveToken> tokens;
    std::vector<PartSpelling> spellings;
    std::vector<std::string> texts{}; ///< written instead where there are any, one for all: "-DN=4"
};

/// Operands that force a finding.
struct BranchWhy {
    std::vector<std::string> operands; ///< as written, or negated
    bool isMinimal = false;            ///< without any one of them the finding does not follow
};

/// Picks the operands of && (and of negated ||) that a verdict follows from.  For Dead the condition is among
/// `conditions`, and `condition` is TRUE.
BranchWhy whyOf(const SymbolicExprTable& table, const MacroUnknowns& unknowns, BranchJudge& judge,
                SymbolicExprId condition, const BranchVerdict& verdict, const std::vector<SpelledCondition>& conditions,
                KnownConditions known);

/// The operands of && and || that a shorter form of a condition leaves out, as written; none of more than
/// limits::whyOperands.
std::vector<std::string> lostOperands(const SymbolicExprTable& table, const MacroUnknowns& unknowns,
                                      const SpelledCondition& condition, SymbolicExprId shorter);

} // namespace VT
