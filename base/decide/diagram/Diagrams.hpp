// Decision diagrams over integer quantities.
//
// A diagram is a node that branches on the quantity of one level: its edges carry the intervals that the integers are
// cut into, each with the diagram that decides the rest.  Levels grow along every path, no two neighbouring edges lead
// to the same diagram, equal nodes are one node, and negation is a bit in the reference; so one Boolean function of
// quantities has one reference, negation is free, and comparing is comparing numbers.
//
// Cost: And of two diagrams is linear in the product of their edges at worst, in practice near their sum; a step is one
// edge.  Diagrams are made for one question, whose levels are in an order that suits it.  Some conditions have large
// diagrams whatever the order; the steps bound what is tried.
#pragma once

#include "base/decide/Steps.hpp"
#include "base/decide/circuit/Question.hpp"

#include <cstdint>
#include <span>
#include <vector>

namespace VT {

/// A reference to a diagram: the number of its node, doubled, plus 1 for its opposite; `always` and `never` have no
/// edges.
using Diagram = std::uint32_t;

class Diagrams {
public:
    /// An interval ends at `high`; it begins after the end of the edge before.
    struct Edge {
        std::int64_t high;
        Diagram child;
        bool operator==(const Edge&) const = default;
    };

    explicit Diagrams(Steps& steps);

    /// Makes the diagram of a question; those of earlier questions are gone.
    Diagram of(const Question& question);

    /// Begins with no diagrams; for each level, whether a path that restricts it has to be checked.
    void begin(std::span<const LevelInfo> levels);
    /// The quantity lies on the sides of the ends that the node of a comparison says.
    Diagram comparison(Level level, std::span<const std::int64_t> ends);
    Diagram both(Diagram a, Diagram b);

    Diagram either(Diagram a, Diagram b) { return opposite(both(opposite(a), opposite(b))); }

    /// All of them, which are joined with their neighbours first, so that a long row of similar conditions costs
    /// n log n, not n^2.  Uses up the row.
    Diagram all(std::vector<Diagram>& diagrams);

    [[nodiscard]] Level level(Diagram diagram) const { return nodes_[diagram >> 1U].level; }

    /// Nodes have numbers below it, and those below a node have smaller ones.
    [[nodiscard]] std::size_t nodeCount() const noexcept { return nodes_.size(); }

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

    /// Other nodes that were met where one was looked for.
    [[nodiscard]] std::uint64_t probes() const noexcept { return probes_; }

private:
    struct Node {
        Level level;
        std::uint32_t first; ///< of its edges
        std::uint32_t count;
        bool needsChecking;
    };

    struct Frame {
        Diagram a;
        Diagram b;
        Level level;
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
    [[nodiscard]] bool isReduced(Level level, std::size_t scratch) const;
    Diagram make(Level level, std::size_t scratch);
    Known& slotOf(Diagram a, Diagram b);
    void remember(Diagram a, Diagram b, Diagram result);
    void growIndex();

    Steps& steps_;
    std::span<const LevelInfo> levels_;
    std::vector<Node> nodes_;
    std::vector<Edge> edges_;
    std::uint64_t probes_ = 0;
    std::vector<std::uint32_t> index_; ///< of nodes by their edges; 0 is free
    std::vector<Known> known_;         ///< And of pairs in this question
    std::size_t knownCount_ = 0;
    std::uint32_t question_ = 0;
    std::vector<Frame> frames_;
    std::vector<Edge> scratch_; ///< edges of nodes that are being made
    std::vector<Diagram> made_; ///< by node of the question
    std::vector<Diagram> row_;
};

} // namespace VT
