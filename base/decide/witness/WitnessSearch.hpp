// The smallest assignment for which a question's diagram holds.
//
// A diagram of unknowns alone holds somewhere unless it is `never`, and the smallest witness is found in one walk
// (SmallestPath).
//
// Where it branches on differences, a path is an assignment only if its bounds can be met together.  Paths are walked
// depth first; at every node the smallest solution of the bounds so far says which edge costs nothing.  The first path
// that can be met decides the question; unknowns are numbered as the question mentions them until then.  Then paths are
// walked again with the unknowns in the order of their texts: the smallest solution is now a lower bound for all below,
// so that a branch that cannot beat the witness at hand is left.  The number of paths is exponential in the number of
// differences at worst, and bounded by the steps.
//
// Where it branches on values of terms that are not understood, a path says what those values have to be but not
// whether they can.  Such a witness counts when evaluation confirms it.  If the smallest solution is not confirmed,
// other values for one or two of the symbols in those terms are tried: small ones and what the literals suggest, at
// most limits::confirmations in all.  Before that, the bounds of a path on unknowns, differences, sums and floors are
// solved together as a system of linear constraints (PathSystem), which excludes the path or yields its witness.
#pragma once

#include "base/decide/ConditionReader.hpp"
#include "base/decide/diagram/SmallestPath.hpp"
#include "base/decide/solver/DifferenceSystem.hpp"
#include "base/decide/witness/PathSystem.hpp"
#include "base/decide/witness/TermPlans.hpp"

#include <span>

namespace VT {

class WitnessSearch {
public:
    WitnessSearch(TermPlans& plans, Unknowns& unknowns, Diagrams& diagrams, Steps& steps);

    /// Whether the question, whose diagram it is, holds for some assignment, with the smallest as witness: values for
    /// `leaves`, which are in the order of their texts.
    Decision find(const Question& question, Diagram diagram, std::span<const UnknownLeaf> leaves);

    /// The same where no diagram is needed: where every comparison is independent of the others, or where the values
    /// that some comparisons force on it are enough.  Nothing elsewhere.
    std::optional<Decision> findAtOnce(const Question& question, std::span<const UnknownLeaf> leaves);

    // Paths that a search finds.

    /// In which order unknowns get their numbers.
    enum class Order : std::uint8_t { Mentioned, Texts };

    struct LevelRange {
        Level level;
        std::int64_t low;
        std::int64_t high;
    };

    enum class PathEnd : std::uint8_t {
        Met,      ///< the values at hand lie in the ranges, and the question holds for them
        Excluded, ///< no values do
        Open,     ///< not known
        Hard,     ///< not known after the steps that a path may take
    };

    /// Begins with a question whose paths follow; values at hand are kept.
    void beginPaths(const Question& question, std::span<const UnknownLeaf> leaves, Order order);
    /// Whether some values lie in the ranges, which suffice for the question to hold, in so many steps.  Those at hand
    /// are then the smallest, if nothing computed is among the unknowns.
    PathEnd tryPath(std::span<const LevelRange> ranges, std::uint64_t most);
    /// Whether so many steps suffice to prove that no values lie in the ranges.
    bool excludesPath(std::span<const LevelRange> ranges, std::uint64_t most);
    /// Restricts an unknown on all paths that follow.
    void restrictPaths(Unknown unknown, std::int64_t low, std::int64_t high);

    [[nodiscard]] std::size_t restrictions() const noexcept { return system_.size(); }

    /// Takes the latest restrictions back.
    void shrinkRestrictions(std::size_t size) { shrink(size); }

    /// Of the values at hand.
    [[nodiscard]] std::int64_t pathValue(Unknown unknown) const { return *pathValues_.find(unknown); }

    /// Nothing where a value has no 64 bits.
    [[nodiscard]] std::optional<Witness> pathWitness(std::span<const UnknownLeaf> leaves) const;

    /// Whether unknowns are computed from others, so that values have to be confirmed.
    [[nodiscard]] bool hasTerms() const noexcept { return !terms_.empty(); }

private:
    using Number = DifferenceSystem::Number;

    struct Frame {
        Diagram diagram;
        std::size_t origin;    ///< the edge that the solution lies on
        std::size_t next;      ///< how many edges were tried
        std::size_t bounds;    ///< in the system when the node was entered
        std::size_t solutions; ///< on the stack when the node was entered
    };

    /// Values of leaves from those of unknowns.
    template <class ValueOf>
    static Witness witness(std::span<const UnknownLeaf> leaves, ValueOf valueOf) {
        Witness result;
        result.reserve(leaves.size());
        for (const UnknownLeaf& leaf : leaves) {
            const std::int64_t value = valueOf(leaf.unknown);
            result.push_back({leaf.node, leaf.opposite ? 1 - value : value});
        }
        return result;
    }

    /// The value of a sum or floor, where its numbers have 64 bits.
    template <class ValueOf>
    static std::optional<std::int64_t> computedValue(const UnknownInfo& info, ValueOf valueOf) {
        std::int64_t sum = 0;
        bool fits = true;
        const auto small = [&](const BigInteger& number) {
            const bool isSmall = abs(number) <= plusInfinite;
            fits = fits && isSmall;
            return isSmall ? static_cast<std::int64_t>(number) : 1;
        };
        const auto add = [&](std::int64_t factor, std::int64_t value) {
            std::int64_t product = 0;
            const bool overflows =
                __builtin_mul_overflow(factor, value, &product) || __builtin_add_overflow(sum, product, &sum);
            fits = fits && !overflows;
        };
        for (const LinearPart& part : info.sum)
            add(part.factor, valueOf(part.unknown));
        if (info.floor == nullptr)
            return fits ? std::optional(sum) : std::nullopt;
        for (const WidePart& part : info.floor->form.parts)
            add(small(part.factor), valueOf(part.unknown));
        add(small(info.floor->form.constant), 1);
        const std::int64_t divisor = small(info.floor->divisor);
        return fits ? std::optional(floorDivide(sum, divisor)) : std::nullopt;
    }

    Witness byLevels(std::span<const UnknownLeaf> leaves, std::span<const std::int64_t> values) const;
    void placeLevels(std::span<const UnknownLeaf> leaves);
    void valuesOfReadOnce();
    void forcedValues();
    bool computeLevels();
    [[nodiscard]] std::int64_t nearest(Gate gate) const;
    Witness smallestOf(Diagram diagram, std::span<const UnknownLeaf> leaves);

    void collect(Diagram diagram, std::span<const UnknownLeaf> leaves, Order order);
    void beginNumbers();
    void meet(Unknown unknown);
    void number(std::span<const UnknownLeaf> leaves, Order order);
    void restrict(const LevelInfo& level, std::int64_t low, std::int64_t high);
    void restrict(Unknown plus, Unknown minus, std::int64_t low, std::int64_t high);
    void restrictSystem(Unknown plus, Unknown minus, std::int64_t low, std::int64_t high);
    void findTermRanges();
    [[nodiscard]] bool isOpposed(Unknown unknown) const;
    void shrink(std::size_t size);
    [[nodiscard]] bool comesBefore(Unknown a, Unknown b, Order order) const;
    void walkPaths(Diagram diagram);
    void enter(Diagram diagram);
    bool take(const Frame& frame, std::size_t edge);
    PathEnd reachedTruth();
    PathEnd reachedTruth(std::uint64_t most);
    [[nodiscard]] bool improves(const std::vector<std::int64_t>& values) const;

    [[nodiscard]] Number numberOf(Unknown unknown) const { return *numbers_.find(unknown); }

    /// What it takes that a gate holds: the first position whose value cannot be 0, and the operand that is cheapest.
    struct Cheapest {
        std::uint32_t first;
        Gate operand;
    };

    /// Bounds that the path at hand adds to those of the unknowns.
    struct PathRange {
        Unknown plus; ///< or noUnknown
        Unknown minus;
        std::int64_t low;
        std::int64_t high;
        std::size_t bounds; ///< in the system before
    };

    // Confirmation.
    struct Term {
        Number number;
        TermPlan* plan; ///< none for a sum or a floor
    };

    template <class Integer>
    [[nodiscard]] bool holds(const std::vector<Integer>& values) const;
    bool computeTerms(std::vector<std::int64_t>& values);
    bool computeExactly(std::vector<BigInteger>& values);
    bool confirm(const std::vector<std::int64_t>& values);
    bool confirmExactly(std::vector<BigInteger> values);
    /// Another value for the unknown at a position of movable_.
    using Change = std::pair<std::size_t, std::int64_t>;

    bool confirmWith(std::span<const Change> changes);
    bool confirmNear(const std::vector<std::int64_t>& solution);
    enum class SumsOnPath : std::uint8_t { Unsolvable, Solved, Open };
    SumsOnPath solveSums();
    std::optional<PathSystem::Values> solvePath(bool smallest);
    [[nodiscard]] std::vector<std::int64_t> candidates(const std::vector<std::int64_t>& solution) const;

    TermPlans& plans_;
    Unknowns& unknowns_;
    Diagrams& diagrams_;
    Steps& steps_;
    DifferenceSystem system_;

    const Question* question_ = nullptr;
    SmallestPath smallest_;
    std::vector<std::uint32_t> positions_; ///< by level
    std::vector<std::int64_t> byLevel_;    ///< values
    std::vector<std::uint8_t> wanted_;     ///< by gate: whether it has to hold
    std::vector<Cheapest> cheapest_;       ///< by gate
    IdMap<std::int64_t> pathValues_;
    bool wantsSmallest_ = false; ///< rather than any solution of sums
    bool first_ = false;         ///< whether the first path that can be met is enough
    std::vector<Unknown> order_; ///< of the question, by number - 1
    IdMap<Number> numbers_;
    PathSystem pathSystem_;
    std::vector<Term> terms_;                                       ///< operands before what is computed from them
    std::vector<Unknown> free_;                                     ///< unknowns that terms depend on
    std::vector<Number> movable_;                                   ///< their numbers
    std::vector<std::pair<std::int64_t, std::int64_t>> termRanges_; ///< by position in terms_
    std::vector<Frame> frames_;
    std::vector<PathRange> path_;
    std::vector<std::vector<std::int64_t>> solutions_;
    std::vector<std::pair<Number, std::int64_t>> base_; ///< values to try for movable_
    std::vector<std::int64_t> trial_;
    std::optional<std::vector<std::int64_t>> best_;
    std::size_t triesLeft_ = 0;
    bool isPathWide_ = false;  ///< of the path at hand
    bool isWide_ = false;      ///< whether the latest trial has a value without 64 bits
    bool isLarge_ = false;     ///< whether that, or a term computed from it, has one
    bool unconfirmed_ = false; ///< whether a path was left that may hold
    bool tooHard_ = false;     ///< whether one was left that took too many steps
};

} // namespace VT
