// What a condition comes to where something is known.
#pragma once

#include "base/core/Limits.hpp"
#include "base/decide/Decider.hpp"
#include "base/print/ExpressionPrinter.hpp"

#include <functional>
#include <optional>
#include <span>
#include <unordered_map>
#include <vector>

namespace VT {

enum class BranchVerdictKind : std::uint8_t {
    None,
    Dead,       ///< the condition never holds
    AlwaysTrue, ///< it always holds
    Removable,  ///< a shorter one holds in the same cases
};

struct BranchVerdict {
    BranchVerdictKind kind = BranchVerdictKind::None;
    SymbolicExprId shorter = invalidId;
};

/// What is known where a condition stands, as nodes that all hold.
struct KnownConditions {
    std::vector<SymbolicExprId> facts;
    std::vector<SymbolicExprId> laws;      ///< that count for every verdict
    std::vector<SymbolicExprId> deathLaws; ///< that count for Dead and AlwaysTrue alone
};

/// Judges conditions of one table and remembers what it judged.  Every verdict is proven; where the steps for a
/// question or for its file are used up, the verdict is the one proven by then, or none.
class BranchJudge {
public:
    explicit BranchJudge(SymbolicExprTable& table);

    /// The questions that follow are about another file.
    void beginFile() noexcept { fileStepsLeft_ = limits::scanSteps; }

    /// The question that follows is about the next condition; false where no steps are left for one.
    bool beginBranch() noexcept;

    /// What holds never or always where nothing that is known can be so is not judged.
    BranchVerdict judge(SymbolicExprId condition, const KnownConditions& known);
    /// Positions of the facts that a verdict follows from, the fewest found within the steps.
    std::vector<std::size_t> reasons(SymbolicExprId condition, const BranchVerdict& verdict,
                                     const KnownConditions& known);

    /// Conditions about which something was not decided, and steps of all questions.
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
        bool gaveUp; ///< a decision on the way
    };

    void beginQuestion();
    void spend(std::uint64_t steps);
    void charge(std::uint64_t steps);
    SymbolicExprId all(std::span<const SymbolicExprId> facts, std::span<const SymbolicExprId> laws,
                       std::span<const SymbolicExprId> further);
    template <class Ask>
    bool proven(Ask ask);
    bool holds(BranchVerdict verdict, SymbolicExprId condition, SymbolicExprId known);
    BranchVerdict decide(const Question& question);
    SymbolicExprId shortened(SymbolicExprId condition, SymbolicExprId known);

    SymbolicExprTable& table_;
    Decider decider_;
    SymbolicExprPrinter printer_;
    std::unordered_map<Question, Judged, QuestionHash> judged_;
    std::int64_t fileStepsLeft_ = 0; ///< a question may leave a debt, which the conditions behind it pay off
    std::uint64_t stepsLeft_ = 0;    ///< of the question
    bool gaveUp_ = false;            ///< a decision of the question
    std::uint64_t givenUp_ = 0;
    std::uint64_t steps_ = 0;
};

} // namespace VT
