// The search for the operands that force a conclusion.
#pragma once

#include "base/core/Limits.hpp"
#include "base/decide/Decider.hpp"
#include "base/decide/reasons/Reasons.hpp"

#include <functional>
#include <optional>
#include <span>
#include <vector>

namespace VT {

/// Finds minimal sets of operands that force what was proven.
///
/// The operands of a premise are those of its And, nested chains flattened; a premise with more than
/// limits::reasonOperands is an operand itself.  The same question has the same answer whatever was asked before.
///
/// All questions of one search share its steps; with the steps used up what is left stays in the set, and the set is
/// not known to be minimal.  Quill calls are decided as the operators that they stand for.  The table and the decider
/// outlive the search; nodes are interned on the way.
class VTSYM_API ReasonSearch {
public:
    ReasonSearch(SymbolicExprTable& table, Decider& decider, std::uint64_t steps = limits::reasonSteps);

    /// Why a conclusion holds wherever all premises do.
    Reasons whyImplied(std::span<const SymbolicExprId> premises, SymbolicExprId conclusion);
    /// Why the premises never hold together.
    Reasons whyNever(std::span<const SymbolicExprId> premises);
    /// Why two conditions agree wherever all premises hold.
    Reasons whyEqual(std::span<const SymbolicExprId> premises, SymbolicExprId a, SymbolicExprId b);
    /// Why `shorter` can be written for a condition wherever all premises hold, and what it lost.
    ShorteningReasons whyShorter(std::span<const SymbolicExprId> premises, SymbolicExprId condition,
                                 SymbolicExprId shorter);

    /// Steps that the questions took.
    [[nodiscard]] std::uint64_t stepsTaken() const noexcept { return steps_ - left_; }

private:
    /// The answer where the conjunction of the operands holds.
    using Question = std::function<Decision(SymbolicExprId known)>;

    std::optional<std::vector<SymbolicExprId>> operandsOf(std::span<const SymbolicExprId> premises);
    Answer ask(const Question& question, std::span<const SymbolicExprId> operands);
    Reasons find(std::span<const SymbolicExprId> premises, const Question& question);
    SymbolicExprId converted(SymbolicExprId condition);

    SymbolicExprTable& table_;
    Decider& decider_;
    std::uint64_t steps_;
    std::uint64_t left_;
    std::size_t solverQuestions_ = limits::searchSolverQuestions; ///< that may still go to another solver
};

} // namespace VT
