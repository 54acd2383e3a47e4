// What a condition comes to where something is known.
#pragma once

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

/// Judges conditions of one table and remembers what it judged.  Every verdict is proven; what cannot be decided within
/// the bound of steps is none.
class BranchJudge {
public:
    explicit BranchJudge(SymbolicExprTable& table);

    /// What holds never or always where nothing that is known can be so is not judged.
    BranchVerdict judge(SymbolicExprId condition, const KnownConditions& known);
    /// Positions of the facts that a verdict follows from, the fewest found.
    std::vector<std::size_t> reasons(SymbolicExprId condition, const BranchVerdict& verdict,
                                     const KnownConditions& known);

    [[nodiscard]] std::uint64_t undecided() const noexcept { return undecided_; }

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

    SymbolicExprId all(std::span<const SymbolicExprId> facts, std::span<const SymbolicExprId> laws,
                       std::span<const SymbolicExprId> further);
    bool proven(const Decision& decision);
    bool holds(BranchVerdict verdict, SymbolicExprId condition, SymbolicExprId known);
    BranchVerdict decide(const Question& question);
    SymbolicExprId shortened(SymbolicExprId condition, SymbolicExprId known);

    SymbolicExprTable& table_;
    Decider decider_;
    SymbolicExprPrinter printer_;
    std::unordered_map<Question, BranchVerdict, QuestionHash> verdicts_;
    std::uint64_t undecided_ = 0;
};

} // namespace VT
