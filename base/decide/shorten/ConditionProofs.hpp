// The proofs that one search for a shorter condition may ask for.
#pragma once

#include "base/core/Limits.hpp"
#include "base/decide/Decider.hpp"
#include "base/transform/QuillConversion.hpp"

#include <cstdint>
#include <optional>

namespace VT {

/// Proves forms of a condition equal to it where a known condition holds.
///
/// All proofs share one budget of steps.  A question that uses up what is left is the last one: further ones are
/// answered at once: not proven.  limits::searchSolverQuestions of them may go to another solver.
class ConditionProofs {
public:
    /// `known` is TRUE where nothing is known.  Quill calls are decided as the operators that they stand for.
    ConditionProofs(Decider& decider, const SymbolicExprQ2C& toC, SymbolicExprId condition, SymbolicExprId known,
                    bool isAnythingKnown, std::uint64_t steps = limits::shortenSteps);
    ConditionProofs(const ConditionProofs&) = delete;
    ConditionProofs& operator=(const ConditionProofs&) = delete;
    ~ConditionProofs();

    /// Whether a form is proven equal to the condition where the known one holds.
    bool isEqual(SymbolicExprId form);
    /// What the known condition alone proves a condition to be; nothing where it leaves it open.
    std::optional<bool> decided(SymbolicExprId condition);

    [[nodiscard]] bool usedUp() const noexcept { return left_ == 0; }

    /// Steps that the proofs took; one that gave up counts for what was left.
    [[nodiscard]] std::uint64_t stepsTaken() const noexcept { return steps_ - left_; }

private:
    template <class Ask>
    bool isYes(Ask ask);

    Decider& decider_;
    const SymbolicExprQ2C& toC_;
    SymbolicExprId condition_;
    SymbolicExprId known_;
    bool isAnythingKnown_;
    std::uint64_t steps_;
    std::uint64_t left_;
    std::size_t solverQuestions_; ///< that the decider may ask after the search
};

} // namespace VT
