// Searches for an assignment of truth values that satisfies clauses, where literals may also stand for bounds on
// differences of integers that have to be met together.
//
// Method: conflict-driven clause learning with two watched literals (Moskewicz et al., "Chaff", 2001; Eén and
// Sörensson, "An extensible SAT-solver", 2003): the first unique implication point is learnt, decisions follow the
// activity of variables in conflicts, phases are kept, restarts follow Luby's sequence, and learnt clauses that join
// many levels are thrown away from time to time.  Bounds of true literals are given to a DifferenceGraph; its
// contradictions are conflicts like those of clauses.
//
// Everything is deterministic and numbered in the order in which it was added.
//
// Cost: exponential at worst, bounded by the steps: one for each literal that is propagated and a few watches.
#pragma once

#include "base/decide/search/DifferenceGraph.hpp"

#include <cstdint>
#include <span>
#include <vector>

namespace VT {

/// A variable, doubled, plus 1 for its opposite.
using Literal = std::uint32_t;

constexpr Literal negated(Literal literal) noexcept {
    return literal ^ 1U;
}

class ClauseSearch {
public:
    explicit ClauseSearch(Steps& steps) : steps_(steps), graph_(steps) {}

    /// No variables and no clauses, and so many integers.
    void begin(std::size_t vertices);

    /// A new variable, as its positive literal, and the value that it is given first.
    Literal addVariable(bool first);
    /// Adds a clause, or a bound that holds while a literal is true.  What solve() found is gone.
    void addClause(std::span<const Literal> clause);
    void addBound(Literal literal, const DifferenceGraph::Bound& bound);

    /// Whether all clauses and bounds can be met while the assumptions are true.  Throws StepsUsedUp.
    bool solve(std::span<const Literal> assumptions = {});

    /// After solve() found an assignment.
    [[nodiscard]] bool holds(Literal literal) const { return values_[literal] > 0; }

private:
    using Variable = std::uint32_t;
    using Clause = std::uint32_t; ///< where it begins in arena_

    static constexpr Clause none = ~Clause{0};
    static constexpr std::uint32_t header =
        2; ///< of a clause: its size, and the levels that it joined, 0 if not learnt

    struct Watch {
        Clause clause;
        Literal other; ///< true for most clauses that need no look
    };

    struct BoundOf {
        Literal literal;
        DifferenceGraph::Bound bound;
    };

    [[nodiscard]] std::uint32_t level() const { return static_cast<std::uint32_t>(levels_.size()); }

    [[nodiscard]] Literal* literals(Clause clause) { return arena_.data() + clause + header; }

    Clause store(std::span<const Literal> literals, std::uint32_t joined);
    void watch(Clause clause);
    void assign(Literal literal, Clause reason);
    bool propagate();
    bool propagateClauses();
    bool propagateBounds();
    void analyze();
    [[nodiscard]] bool isImplied(Literal literal);
    void backtrack(std::uint32_t level);
    void learn();
    void bump(Variable variable);
    void forget();
    void newLevel();
    [[nodiscard]] Variable nextDecision();

    // A heap of variables, the most active first.
    [[nodiscard]] bool isAhead(Variable a, Variable b) const {
        return activity_[a] > activity_[b] || (activity_[a] == activity_[b] && a < b);
    }

    void siftUp(std::size_t at);
    void siftDown(std::size_t at);
    void pushHeap(Variable variable);

    Steps& steps_;
    DifferenceGraph graph_;
    bool contradicts_ = false; ///< without any decision

    std::vector<std::uint32_t> arena_;
    std::vector<Clause> learnt_;
    std::size_t mostLearnt_ = 0;
    std::vector<std::vector<Watch>> watches_;                 ///< by literal that becomes false
    std::vector<std::vector<DifferenceGraph::Bound>> bounds_; ///< by literal

    std::vector<std::int8_t> values_; ///< by literal: 1, -1, or 0 while it has none
    std::vector<std::uint32_t> levelOf_;
    std::vector<Clause> reasons_;
    std::vector<std::uint8_t> phases_;
    std::vector<double> activity_;
    double increment_ = 1;
    std::vector<Variable> heap_;
    std::vector<std::uint32_t> heapAt_;

    std::vector<Literal> trail_;
    std::vector<std::pair<std::size_t, std::size_t>> levels_; ///< sizes of trail and graph where each begins
    std::size_t clausesAt_ = 0;                               ///< in the trail
    std::size_t boundsAt_ = 0;

    std::vector<Literal> conflict_; ///< all false
    std::vector<Literal> learning_;
    std::uint32_t target_ = 0; ///< level to go back to
    std::vector<std::uint8_t> isSeen_;
    std::vector<Variable> seen_;
};

} // namespace VT
