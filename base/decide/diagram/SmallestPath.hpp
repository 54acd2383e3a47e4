// The smallest assignment for which a diagram of independent levels holds, in an order of its own.
//
// Every node below the root is looked at once, lowest first: the smallest values of the levels below a node do not
// depend on those above it, so the best way on from a node is the best of its edges.  Values are kept in trees that
// share their equal parts, which makes two of them comparable in a logarithmic number of looks.
//
// Cost: edges times the logarithm of the number of levels, whatever the order.
#pragma once

#include "base/decide/diagram/Diagrams.hpp"

#include <cstdint>
#include <cstdlib>
#include <span>
#include <vector>

namespace VT {

/// Whether a is nearer to 0 than b; of two equally near the positive one is.
inline bool isSmaller(std::int64_t a, std::int64_t b) {
    return std::abs(a) != std::abs(b) ? std::abs(a) < std::abs(b) : a > b;
}

class SmallestPath {
public:
    explicit SmallestPath(Steps& steps) : steps_(steps) {}

    /// Returns the value of each position where the diagram, which is not `never`, holds: the first as near to 0 as it
    /// can be, then the second, and so on.
    ///
    /// @param positions  of the levels, from 0 on, each once
    const std::vector<std::int64_t>& find(const Diagrams& diagrams, Diagram root, std::span<const LevelInfo> levels,
                                          std::span<const std::uint32_t> positions);

private:
    /// A tree of values of one height: 0 is a tree of zeros.
    using Tree = std::uint32_t;

    struct Branch {
        Tree left = 0;
        Tree right = 0;
        bool operator==(const Branch&) const = default;
    };

    void reach(const Diagrams& diagrams, Diagram root);
    template <class Offer>
    static void forEachEdge(const Diagrams& diagrams, Diagram diagram, const LevelInfo& level, Offer offer);
    void findInRows(const Diagrams& diagrams, Diagram root, std::span<const LevelInfo> levels,
                    std::span<const std::uint32_t> positions);
    void findInTrees(const Diagrams& diagrams, Diagram root, std::span<const LevelInfo> levels,
                     std::span<const std::uint32_t> positions);
    void beginTrees();
    Tree treeOf(Branch branch);
    Tree leafOf(std::int64_t value);
    Tree with(Tree tree, std::uint32_t position, std::int64_t value);
    [[nodiscard]] bool isBetter(Tree a, Tree b) const;
    [[nodiscard]] std::int64_t valueAt(Tree tree, std::uint32_t position) const;

    Steps& steps_;
    unsigned height_ = 0;
    std::vector<Branch> branches_;     ///< by tree of a height above 0
    std::vector<std::uint32_t> index_; ///< of branches; 0 is free
    std::vector<std::int64_t> values_; ///< by tree of height 0
    IdMap<Tree> leaves_;
    std::vector<std::int64_t> rows_; ///< of values, by diagram
    std::vector<Tree> best_;         ///< by diagram
    std::vector<std::uint8_t> isReached_;
    std::vector<std::int64_t> result_;
};

} // namespace VT
