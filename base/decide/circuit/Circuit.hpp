// Conditions as circuits: comparisons of quantities joined by And, with negation as a bit in the reference.
//
// Nodes are hashed, so equal circuits have one reference, and an And is simplified by what its operands show when they
// are looked at together: operands that are there twice or with their opposite, comparisons of one quantity, and
// operands of an Or that the other operands of the And decide.  So `C && !(C || Z)` is `never` whatever C is.
//
// What a circuit looks like depends on the condition alone, not on names or on what was read before: operands are in
// the order in which they were given, and references are compared for equality only.
//
// Cost: linear in the operands that are looked at, a step for each.
#pragma once

#include "base/decide/Steps.hpp"
#include "base/decide/diagram/Unknowns.hpp"

#include <cstdint>
#include <span>
#include <vector>

namespace VT {

/// A reference into a circuit: the number of its node, doubled, plus 1 for its opposite.
using Gate = std::uint32_t;

inline constexpr Gate always = 0;
inline constexpr Gate never = 1;

constexpr Gate opposite(Gate truth) noexcept {
    return truth ^ 1U;
}

class Circuit {
public:
    Circuit(const Unknowns& unknowns, Steps& steps);

    /// The quantity lies between two values, both included.
    Gate between(Quantity quantity, std::int64_t low, std::int64_t high);

    Gate both(Gate a, Gate b) {
        const Gate pair[] = {a, b};
        return all(pair);
    }

    Gate either(Gate a, Gate b) { return opposite(both(opposite(a), opposite(b))); }

    Gate all(std::span<const Gate> truths);
    Gate any(std::span<const Gate> truths);

    /// The And of two without a look at their operands, in constant time.
    Gate nested(Gate a, Gate b);

    [[nodiscard]] bool isComparison(Gate truth) const { return nodes_[truth >> 1U].quantity != noQuantity; }

    [[nodiscard]] bool isAnd(Gate truth) const { return truth > never && !isComparison(truth); }

    /// Of a comparison.
    [[nodiscard]] Quantity quantity(Gate truth) const { return nodes_[truth >> 1U].quantity; }

    /// The least and the greatest value for which a comparison holds.
    [[nodiscard]] std::pair<std::int64_t, std::int64_t> range(Gate truth) const;

    /// Of the node of a comparison: it holds up to the first end, fails from there to the second, and so on.
    [[nodiscard]] std::span<const std::int64_t> ends(Gate truth) const {
        const Node& node = nodes_[truth >> 1U];
        return {ends_.data() + node.first, node.count};
    }

    /// Of the node of an And.
    [[nodiscard]] std::span<const Gate> operands(Gate truth) const {
        const Node& node = nodes_[truth >> 1U];
        return {operands_.data() + node.first, node.count};
    }

    [[nodiscard]] std::size_t nodeCount() const noexcept { return nodes_.size(); }

    /// Ends and operands that are held.
    [[nodiscard]] std::size_t size() const noexcept { return ends_.size() + operands_.size(); }

    /// Other nodes that were met where one was looked for.
    [[nodiscard]] std::uint64_t probes() const noexcept { return probes_; }

    void clear();

private:
    static constexpr Quantity noQuantity = ~Quantity{0};

    struct Node {
        Quantity quantity; ///< of a comparison
        std::uint32_t first;
        std::uint32_t count;
    };

    /// A set of integers: whether the least ones are in it, and after which numbers that changes.
    struct Range {
        bool start = true;
        std::vector<std::int64_t> ends;
    };

    struct Mark {
        std::uint32_t gathering = 0;
        std::uint32_t value = 0;
    };

    enum class Known : std::uint8_t { True, False, Open };

    bool gather(Gate truth);
    void gatherOne(Gate truth, bool& possible);
    bool joinComparisons();
    bool resolveOrs(bool& foundUnit);
    [[nodiscard]] Gate gatheredAbout(Quantity quantity) const;
    [[nodiscard]] std::pair<std::int64_t, std::int64_t> gatheredRange(Unknown unknown) const;
    [[nodiscard]] Known knownOfDifference(Gate truth) const;
    [[nodiscard]] Known knownOf(Gate truth) const;

    [[nodiscard]] bool holdsAtStart(Gate truth) const { return (truth & 1U) == 0; }

    void assign(Range& range, Gate truth) const;
    static void intersect(Range& range, const Range& other, Range& scratch);
    Gate comparison(Quantity quantity, const Range& range);
    Gate andOf(std::span<const Gate> operands);
    template <class Values, class Value>
    Gate intern(Quantity quantity, std::span<const Value> values, Values& stored);
    [[nodiscard]] std::uint64_t hashOf(const Node& node) const;
    void growIndex();

    const Unknowns& unknowns_;
    Steps& steps_;
    std::vector<Node> nodes_;
    std::vector<std::int64_t> ends_;
    std::vector<Gate> operands_;
    std::vector<std::uint32_t> index_;
    std::uint64_t probes_ = 0;

    // The And that is being made.
    std::uint32_t gathering_ = 0;
    std::vector<Mark> marks_;      ///< by node: the sign with which it is an operand
    std::vector<Mark> byQuantity_; ///< the position of the comparison of a quantity
    std::vector<Gate> gathered_;
    std::vector<std::pair<std::uint32_t, Gate>> further_; ///< comparisons of a quantity that has a position already
    std::vector<Gate> rest_;
    std::vector<Range> ranges_;
    Range scratch_;
};

} // namespace VT
