// The smallest assignment for which a diagram holds.
//
// A diagram of unknowns alone holds somewhere unless it is `never`, and since it branches in the order of texts, taking
// the edge nearest to 0 at every node gives the smallest witness: linear in the path.
//
// Where it branches on differences, a path is an assignment only if its bounds can be met together.  Paths are walked
// depth first; at every node the smallest solution of the bounds so far tells which edge costs nothing, and is a lower
// bound for all below, so that a branch that cannot beat the witness at hand is left.  The number of paths is
// exponential in the number of differences at worst, and bounded by the steps.
//
// Where it branches on values of terms that are not understood, a path says what those values have to be but not
// whether they can.  Such a witness counts when evaluation confirms it.  If the smallest solution is not confirmed,
// other values for one or two of the symbols in those terms are tried: small ones and what the literals suggest, at
// most limits::confirmations in all.  A path whose sums lie outside what the bounds of their parts allow is excluded;
// otherwise the sums of a path are solved together with its bounds as a system of linear constraints (LinearSolver).
#pragma once

#include "base/decide/ConditionReader.hpp"
#include "base/decide/solver/DifferenceSystem.hpp"
#include "base/decide/witness/TermPlan.hpp"

#include <cstdlib>
#include <memory>
#include <span>

namespace VT {

/// Whether a is nearer to 0 than b; of two equally near the positive one is.
inline bool isSmaller(std::int64_t a, std::int64_t b) {
    return std::abs(a) != std::abs(b) ? std::abs(a) < std::abs(b) : a > b;
}

class WitnessSearch {
public:
    WitnessSearch(const LeafReader& leaves, Unknowns& unknowns, Diagrams& diagrams, Steps& steps);

    /// Whether the diagram holds for some assignment, with the smallest as witness: values for `leaves`, which are in
    /// the order of their texts.
    Decision find(Diagram diagram, std::span<const UnknownLeaf> leaves);

private:
    using Number = DifferenceSystem::Number;

    struct Frame {
        Diagram diagram;
        std::size_t origin;    ///< the edge that the solution lies on
        std::size_t next;      ///< how many edges were tried
        std::size_t bounds;    ///< in the system when the node was entered
        std::size_t solutions; ///< on the stack when the node was entered
    };

    Witness walkDown(Diagram diagram, std::span<const UnknownLeaf> leaves) const;
    Witness witness(const std::vector<std::int64_t>& values, std::span<const UnknownLeaf> leaves) const;

    void collect(Diagram diagram, std::span<const UnknownLeaf> leaves);
    void walkPaths(Diagram diagram);
    void enter(Diagram diagram);
    bool take(const Frame& frame, std::size_t edge);
    void reachedTruth();
    [[nodiscard]] bool improves(const std::vector<std::int64_t>& values) const;

    [[nodiscard]] Number numberOf(Unknown unknown) const { return *numbers_.find(unknown); }

    // Confirmation.
    struct Term {
        Number number;
        std::unique_ptr<TermPlan> plan; ///< none for a sum
    };

    struct Followed {
        Diagram end; ///< `always` or `never`
        std::size_t edges;
    };

    [[nodiscard]] Followed follow(const std::vector<std::int64_t>& values) const;
    bool computeTerms(std::vector<std::int64_t>& values);
    bool confirm(const std::vector<std::int64_t>& values);
    /// Another value for the unknown at a position of movable_.
    using Change = std::pair<std::size_t, std::int64_t>;

    bool confirmWith(std::span<const Change> changes);
    bool confirmNear(const std::vector<std::int64_t>& solution);
    bool isExcluded();
    enum class SumsOnPath : std::uint8_t { Unsolvable, Solved, Open };
    SumsOnPath solveSums();
    [[nodiscard]] std::vector<std::int64_t> candidates(const std::vector<std::int64_t>& solution) const;

    const LeafReader& leafReader_;
    Unknowns& unknowns_;
    Diagrams& diagrams_;
    Steps& steps_;
    DifferenceSystem system_;

    Diagram root_ = never;
    std::vector<Unknown> order_; ///< of the question, by number - 1
    IdMap<Number> numbers_;
    std::vector<Term> terms_;     ///< operands before what is computed from them
    std::vector<Number> movable_; ///< free unknowns that terms depend on
    std::vector<Frame> frames_;
    std::vector<std::vector<std::int64_t>> solutions_;
    std::vector<std::pair<Number, std::int64_t>> base_; ///< values to try for movable_
    std::vector<std::int64_t> trial_;
    std::optional<std::vector<std::int64_t>> best_;
    std::size_t triesLeft_ = 0;
    bool unconfirmed_ = false; ///< whether a path was left that may hold
};

} // namespace VT
