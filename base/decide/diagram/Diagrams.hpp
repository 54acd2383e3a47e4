// Decision diagrams over integer quantities.
//
// A diagram is a node that branches on one quantity: its edges carry the intervals that the integers are cut into, each
// with the diagram that decides the rest.  Quantities stand in one order along every path, no two neighbouring edges
// lead to the same diagram, equal nodes are one node, and negation is a bit in the reference; so one Boolean function
// of quantities has one reference, negation is free, and comparing is comparing numbers.
//
// Cost: And of two diagrams is linear in the product of their edges at worst, in practice near their sum; a step is one
// edge.  The order is that of the texts, which makes the smallest witness the first path that leads to true, for the
// price of more nodes where a condition ties symbols that are far apart by name: (a1 && b1) || (a2 && b2) || ... with
// all a before all b doubles with every term.  Conditions of at most 32 comparisons stay far below the bound; what does
// not is answered undecided.  Nodes are kept between questions and thrown away together when they become too many.
#pragma once

#include "base/decide/Steps.hpp"
#include "base/decide/diagram/Unknowns.hpp"

#include <cstdint>
#include <span>
#include <vector>

namespace VT {

/// A reference to a diagram: the number of its node, doubled, plus 1 for its opposite.
using Diagram = std::uint32_t;

inline constexpr Diagram always = 0;
inline constexpr Diagram never = 1;

constexpr Diagram opposite(Diagram diagram) noexcept {
    return diagram ^ 1U;
}

class Diagrams {
public:
    /// An interval ends at `high`; it begins behind the end of the edge before.
    struct Edge {
        std::int64_t high;
        Diagram child;
        bool operator==(const Edge&) const = default;
    };

    Diagrams(const Unknowns& unknowns, Steps& steps);

    /// The quantity lies between two values, both included.
    Diagram between(Quantity quantity, std::int64_t low, std::int64_t high);
    Diagram both(Diagram a, Diagram b);

    Diagram either(Diagram a, Diagram b) { return opposite(both(opposite(a), opposite(b))); }

    /// All of them.  Neighbours are joined first, so that a long row of similar conditions costs n log n, not n^2.
    Diagram all(std::span<const Diagram> diagrams);
    Diagram any(std::span<const Diagram> diagrams);

    [[nodiscard]] Quantity quantity(Diagram diagram) const { return nodes_[diagram >> 1U].quantity; }

    [[nodiscard]] std::size_t edgeCount(Diagram diagram) const { return nodes_[diagram >> 1U].count; }

    /// An edge as seen through the reference.
    [[nodiscard]] Edge edge(Diagram diagram, std::size_t at) const {
        const Edge& stored = edges_[nodes_[diagram >> 1U].first + at];
        return {stored.high, stored.child ^ (diagram & 1U)};
    }

    /// Whether the diagram, or one below it, branches on a difference or on the value of a term: a path to true is then
    /// not yet an assignment.
    [[nodiscard]] bool needsChecking(Diagram diagram) const { return nodes_[diagram >> 1U].needsChecking; }

    /// The edge on which a value lies.
    [[nodiscard]] std::size_t edgeOf(Diagram diagram, std::int64_t value) const;

    /// Forgets the And of pairs, so that what a question costs does not depend on those before.
    void beginQuestion();

    [[nodiscard]] std::size_t edgesHeld() const noexcept { return edges_.size(); }

    /// Other nodes that were met where one was looked for.
    [[nodiscard]] std::uint64_t probes() const noexcept { return probes_; }

    void clear();

private:
    static constexpr Quantity noQuantity = ~Quantity{0};

    struct Node {
        Quantity quantity;
        std::uint32_t first; ///< of its edges
        std::uint32_t count;
        bool needsChecking;
    };

    struct Frame {
        Diagram a;
        Diagram b;
        Quantity quantity;
        std::uint32_t nextA; ///< edge of a, or none where a does not branch here
        std::uint32_t nextB;
        std::uint32_t scratch; ///< where the frame's edges begin
        std::int64_t high;     ///< of the edge that is being joined
    };

    struct Known {
        Diagram a = 0;
        Diagram b = 0;
        Diagram result = 0;
        std::uint32_t question = 0;
    };

    static constexpr std::uint32_t none = ~std::uint32_t{0};

    [[nodiscard]] bool isTerminal(Diagram diagram) const noexcept { return diagram <= never; }

    bool resolve(Diagram a, Diagram b, Diagram& result);
    void enter(Diagram a, Diagram b);
    void append(std::size_t scratch, std::int64_t high, Diagram child);
    [[nodiscard]] bool isReduced(Quantity quantity, std::size_t scratch) const;
    Diagram make(Quantity quantity, std::size_t scratch);
    Known& slotOf(Diagram a, Diagram b);
    void remember(Diagram a, Diagram b, Diagram result);
    void growIndex();
    Diagram fold(std::span<const Diagram> diagrams, Diagram flip);

    const Unknowns& unknowns_;
    Steps& steps_;
    std::vector<Node> nodes_;
    std::vector<Edge> edges_;
    std::uint64_t probes_ = 0;
    std::vector<std::uint32_t> index_; ///< of nodes by their edges; 0 is free
    std::vector<Known> known_;         ///< And of pairs in this question
    std::size_t knownCount_ = 0;
    std::uint32_t question_ = 1;
    std::vector<Frame> frames_;
    std::vector<Edge> scratch_; ///< edges of nodes that are being made
};

} // namespace VT
