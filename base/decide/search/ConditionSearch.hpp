// Decides questions whose diagrams are too large.
//
// Every end of a comparison becomes a variable, "the quantity is at most so much", every And a variable for its truth,
// and clauses say how they hang together (Tseitin, with the polarity of Plaisted and Greenbaum).  Variables about
// quantities that depend on each other stand for bounds on differences.  An assignment of truth values leaves ranges of
// a few levels that suffice for the question to hold; those are a path, as those of diagrams are, for which the
// WitnessSearch finds values.  Where there are none the ranges that contradict each other become a clause, and the
// search goes on.  A path that takes many steps is postponed: another one may decide the question at once.
//
// The smallest witness is found by asking again for a smaller value of one unknown after the other, in the order of
// their texts.
#pragma once

#include "base/decide/search/ClauseSearch.hpp"
#include "base/decide/witness/WitnessSearch.hpp"

#include <optional>
#include <span>
#include <vector>

namespace VT {

class ConditionSearch {
public:
    ConditionSearch(const Unknowns& unknowns, WitnessSearch& witnesses, Steps& steps)
        : unknowns_(unknowns),
          witnesses_(witnesses),
          steps_(steps),
          clauses_(steps) {}

    /// Whether the question holds for some assignment, with a witness for `leaves`, which are in the order of their
    /// texts.
    Decision find(const Question& question, std::span<const UnknownLeaf> leaves);

private:
    using Vertex = DifferenceGraph::Vertex;
    using LevelRange = WitnessSearch::LevelRange;
    using PathEnd = WitnessSearch::PathEnd;

    /// The variables of a level: `literals[i]` holds where the quantity is at most `ends[i]`.
    struct LevelVariables {
        std::vector<std::int64_t> ends;
        std::vector<Literal> literals;
        bool isInGraph = false;
    };

    void encode();
    void encodeLevels();
    void encodeNodes();
    void addLevel(Level level);
    Literal addComparison(const Question::Node& node);
    Literal addAnd(const Question::Node& node, unsigned uses);
    void addBounds(const LevelInfo& level, std::int64_t end, Literal literal);
    void addVertex(Unknown unknown);

    [[nodiscard]] bool holdsAtZero(Gate gate) const { return (atZero_[gate >> 1U] ^ (gate & 1U)) != 0; }

    [[nodiscard]] Literal literalOf(Gate gate) const { return gates_[gate >> 1U] ^ (gate & 1U); }

    [[nodiscard]] Literal endLiteral(Level level, std::int64_t end) const;

    bool hasPath();
    std::optional<PathEnd> nextPath(std::span<const Literal> assumptions);
    PathEnd tryPath();
    void readPath();
    [[nodiscard]] LevelRange rangeOf(const Question::Node& node) const;
    void refute(std::uint64_t spent);

    void minimize(std::span<const UnknownLeaf> leaves);
    bool findSmaller(Unknown unknown, std::int64_t value);
    void fix(Unknown unknown, std::int64_t value);
    Literal within(Unknown unknown, std::int64_t low, std::int64_t high);

    const Unknowns& unknowns_;
    WitnessSearch& witnesses_;
    Steps& steps_;
    ClauseSearch clauses_;
    const Question* question_ = nullptr;
    std::vector<LevelVariables> levels_;
    std::vector<Literal> gates_;       ///< by node of the question
    std::vector<std::uint8_t> atZero_; ///< truth of the nodes where all quantities are 0
    std::vector<std::uint8_t> isOnPath_;
    IdMap<Vertex> vertices_;
    std::vector<LevelRange> path_; ///< one range for each level that it restricts
    std::vector<std::vector<LevelRange>> postponed_;
    std::uint64_t pathSteps_ = 0; ///< that one path may take
    std::vector<std::uint32_t> positions_;
    bool unconfirmed_ = false;
};

} // namespace VT
