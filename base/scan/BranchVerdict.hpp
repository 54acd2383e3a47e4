// Judges a condition under known facts: dead, always true, or equivalent to a shorter one.
#pragma once

#include "base/core/Limits.hpp"
#include "base/core/Nodes.hpp"
#include "base/decide/Decider.hpp"
#include "base/decide/reasons/MinimalSubset.hpp"
#include "base/print/ExpressionPrinter.hpp"
#include "base/scan/facts/KnownValues.hpp"

#include <functional>
#include <optional>
#include <span>
#include <unordered_map>
#include <vector>

namespace VT {

/// What is proven about a condition where known ones hold.
enum class BranchVerdictKind : std::uint8_t {
    None,       ///< nothing
    Dead,       ///< the condition never holds
    AlwaysTrue, ///< it always holds
    Removable,  ///< a shorter one holds in the same cases
};

/// A verdict and, for Removable, the condition to write instead.
struct BranchVerdict {
    BranchVerdictKind kind = BranchVerdictKind::None;
    SymbolicExprId shorter = invalidId;
};

/// The conditions that hold where another one is judged.
struct KnownConditions {
    std::vector<SymbolicExprId> facts;
    std::vector<SymbolicExprId> includeLaws;   ///< used for every verdict
    std::vector<SymbolicExprId> undefinedLaws; ///< used for Dead and AlwaysTrue alone
};

/// Judges conditions of one table and remembers its verdicts.  Every verdict is proven; where the steps for a question
/// or for its file are used up, the verdict is the one proven by then, or None.
class BranchJudge {
public:
    explicit BranchJudge(SymbolicExprTable& table);

    /// Starts the budget of another file.
    void beginFile() noexcept { fileStepsLeft_ = limits::scanSteps; }

    /// Adds the budget of the next condition; false where no steps are left for it.
    bool beginBranch() noexcept;

    /// Judges a condition under known ones.  Yields None where the known ones contradict each other.
    BranchVerdict judge(SymbolicExprId condition, const KnownConditions& known);
    /// Returns the positions of the facts that a verdict follows from, the fewest found within the steps.  The verdict
    /// that a condition is dead may be about TRUE, where the condition is among the facts.
    MinimalSubset reasons(SymbolicExprId condition, const BranchVerdict& verdict, const KnownConditions& known);

    /// Returns values of unknowns for which a condition and the known ones hold; none where that is not decided.
    Witness witness(SymbolicExprId condition, const KnownConditions& known);

    /// Interns the opposite of a condition.
    SymbolicExprId negated(SymbolicExprId condition) { return SymbolicNotExpr(table_, condition).getId(table_); }

    /// Number of conditions with an undecided question, and steps of all questions.
    [[nodiscard]] std::uint64_t givenUp() const noexcept { return givenUp_; }

    [[nodiscard]] std::uint64_t steps() const noexcept { return steps_; }

private:
    struct Question {
        SymbolicExprId condition;
        SymbolicExprId known;
        SymbolicExprId knownToShorten;
        bool operator==(const Question&) const = default;
    };

    struct QuestionHash {
        std::size_t operator()(const Question& question) const noexcept;
    };

    struct Judged {
        BranchVerdict verdict;
        std::uint64_t steps;
        bool isUndecided; ///< a decision on the way was
    };

    void beginQuestion();
    void spend(std::uint64_t steps);
    void charge(std::uint64_t steps);
    SymbolicExprId all(std::span<const SymbolicExprId> facts, std::span<const SymbolicExprId> laws,
                       std::span<const SymbolicExprId> further);
    template <class Ask>
    bool proven(Ask ask);
    bool holds(BranchVerdict verdict, SymbolicExprId condition, SymbolicExprId known);
    BranchVerdictKind statedBy(std::span<const SymbolicExprId> facts, SymbolicExprId condition);
    std::optional<BranchVerdict> judgeByValues(SymbolicExprId condition, const KnownConditions& known);
    BranchVerdict decide(const Question& question, std::span<const SymbolicExprId> facts);
    SymbolicExprId shortened(SymbolicExprId condition, SymbolicExprId known);

    SymbolicExprTable& table_;
    Decider decider_;
    SymbolicExprPrinter printer_;
    KnownValues values_;
    std::unordered_map<Question, Judged, QuestionHash> judged_;
    std::int64_t fileStepsLeft_ = 0; ///< a question may leave a debt, which later conditions pay off
    std::uint64_t stepsLeft_ = 0;    ///< of the question
    bool isUndecided_ = false;       ///< a decision of the question was
    std::uint64_t givenUp_ = 0;
    std::uint64_t steps_ = 0;
};

} // namespace VT
