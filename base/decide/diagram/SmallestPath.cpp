// Finds the smallest assignment bottom-up over the numbers of nodes, which grow upwards.
#include "base/decide/diagram/SmallestPath.hpp"

#include "base/core/Limits.hpp"
#include "base/util/Hash.hpp"

#include <algorithm>
#include <array>
#include <bit>
#include <optional>

namespace VT {

namespace {

constexpr std::size_t firstTreeSlots = 64;
constexpr std::size_t searchedValues = 16; ///< without a map
constexpr std::size_t rowLevels = 64;      ///< and values up to which they are kept in rows
constexpr std::size_t rowValues = std::size_t{1} << 16U;

/// No value has the number that IdMap keeps for itself.
std::uint64_t keyOf(std::int64_t value) {
    return static_cast<std::uint64_t>(value) << 1U ^ static_cast<std::uint64_t>(value >> 63U);
}

} // namespace

void SmallestPath::beginTrees() {
    branches_.assign(1, {});
    if (index_.size() > limits::keptSlots)
        std::vector<std::uint32_t>(firstTreeSlots).swap(index_);
    index_.resize(std::max(index_.size(), firstTreeSlots));
    std::ranges::fill(index_, 0);
    values_.assign(1, 0);
    leaves_.clear();
}

SmallestPath::Tree SmallestPath::leafOf(std::int64_t value) {
    if (value == 0)
        return 0;
    const std::size_t few = std::min(values_.size(), searchedValues);
    if (const auto at = std::find(values_.begin(), values_.begin() + static_cast<std::ptrdiff_t>(few), value);
        at != values_.begin() + static_cast<std::ptrdiff_t>(few))
        return static_cast<Tree>(at - values_.begin());
    if (few == searchedValues)
        if (const Tree* known = leaves_.find(keyOf(value)); known != nullptr)
            return *known;
    values_.push_back(value);
    const auto leaf = static_cast<Tree>(values_.size() - 1);
    if (few == searchedValues)
        leaves_.insert(keyOf(value), leaf);
    return leaf;
}

SmallestPath::Tree SmallestPath::treeOf(Branch branch) {
    if (branch == Branch{})
        return 0;
    const auto slotOf = [&](Branch each) {
        return static_cast<std::size_t>(hashStep(hashStep(0, each.left), each.right) >> 32U) & (index_.size() - 1);
    };
    if ((branches_.size() + 1) * 2 > index_.size()) {
        index_.assign(index_.size() * 2, 0);
        for (Tree tree = 1; tree < branches_.size(); ++tree) {
            std::size_t at = slotOf(branches_[tree]);
            while (index_[at] != 0)
                at = (at + 1) & (index_.size() - 1);
            index_[at] = tree;
        }
    }
    std::size_t at = slotOf(branch);
    for (; index_[at] != 0; at = (at + 1) & (index_.size() - 1))
        if (branches_[index_[at]] == branch)
            return index_[at];
    branches_.push_back(branch);
    return index_[at] = static_cast<Tree>(branches_.size() - 1);
}

/// The tree with another value at a position.
SmallestPath::Tree SmallestPath::with(Tree tree, std::uint32_t position, std::int64_t value) {
    std::array<Tree, 32> path{};
    for (unsigned level = height_; level-- > 0;) {
        path[level] = tree;
        tree = (position >> level & 1U) != 0 ? branches_[tree].right : branches_[tree].left;
    }
    Tree changed = leafOf(value);
    for (unsigned level = 0; level < height_; ++level) {
        Branch branch = branches_[path[level]];
        ((position >> level & 1U) != 0 ? branch.right : branch.left) = changed;
        changed = treeOf(branch);
    }
    return changed;
}

bool SmallestPath::isBetter(Tree a, Tree b) const {
    if (a == b)
        return false;
    for (unsigned level = height_; level-- > 0;) {
        const bool inLeft = branches_[a].left != branches_[b].left;
        a = inLeft ? branches_[a].left : branches_[a].right;
        b = inLeft ? branches_[b].left : branches_[b].right;
    }
    return isSmaller(values_[a], values_[b]);
}

std::int64_t SmallestPath::valueAt(Tree tree, std::uint32_t position) const {
    for (unsigned level = height_; level-- > 0;)
        tree = (position >> level & 1U) != 0 ? branches_[tree].right : branches_[tree].left;
    return values_[tree];
}

/// Marks what can be reached without `never`, and takes the steps for it.
void SmallestPath::reach(const Diagrams& diagrams, Diagram root) {
    isReached_.assign((root | 1U) + 1, 0);
    isReached_[root] = 1;
    for (Diagram diagram = root | 1U; diagram > never; --diagram) {
        if (isReached_[diagram] == 0)
            continue;
        const std::size_t count = diagrams.edgeCount(diagram);
        steps_.take(count * (height_ + 1));
        for (std::size_t i = 0; i < count; ++i)
            isReached_[diagrams.edge(diagram, i).child] = 1;
    }
}

/// Calls `offer` with the child and the value nearest to 0 of every edge that can hold.
template <class Offer>
void SmallestPath::forEachEdge(const Diagrams& diagrams, Diagram diagram, const LevelInfo& level, Offer offer) {
    std::int64_t low = level.low;
    for (std::size_t i = 0; i < diagrams.edgeCount(diagram); ++i) {
        const Diagrams::Edge edge = diagrams.edge(diagram, i);
        if (edge.child != never)
            offer(edge.child, std::clamp(std::int64_t{0}, low, std::min(edge.high, level.high)));
        low = edge.high == plusInfinite ? edge.high : edge.high + 1;
    }
}

const std::vector<std::int64_t>& SmallestPath::find(const Diagrams& diagrams, Diagram root,
                                                    std::span<const LevelInfo> levels,
                                                    std::span<const std::uint32_t> positions) {
    height_ = static_cast<unsigned>(std::bit_width(levels.empty() ? 0 : levels.size() - 1));
    reach(diagrams, root);
    result_.assign(levels.size(), 0);
    if (root == always)
        return result_;
    if (levels.size() <= rowLevels && levels.size() * isReached_.size() <= rowValues)
        findInRows(diagrams, root, levels, positions);
    else
        findInTrees(diagrams, root, levels, positions);
    return result_;
}

void SmallestPath::findInRows(const Diagrams& diagrams, Diagram root, std::span<const LevelInfo> levels,
                              std::span<const std::uint32_t> positions) {
    const std::size_t count = levels.size();
    rows_.resize(std::max(rows_.size(), isReached_.size() * count));
    std::fill_n(rows_.begin(), count, 0);
    for (Diagram diagram = never + 1; diagram <= root; ++diagram) {
        if (isReached_[diagram] == 0)
            continue;
        const std::uint32_t position = positions[diagrams.level(diagram)];
        std::int64_t* best = rows_.data() + diagram * count;
        bool isFirst = true;
        forEachEdge(diagrams, diagram, levels[diagrams.level(diagram)], [&](Diagram child, std::int64_t value) {
            const std::int64_t* row = rows_.data() + child * count;
            const auto valueAt = [&](std::size_t at) { return at == position ? value : row[at]; };
            std::size_t at = 0;
            while (!isFirst && at < count && valueAt(at) == best[at])
                ++at;
            if (!isFirst && (at == count || !isSmaller(valueAt(at), best[at])))
                return;
            std::copy_n(row, count, best);
            best[position] = value;
            isFirst = false;
        });
    }
    std::copy_n(rows_.data() + root * count, count, result_.data());
}

void SmallestPath::findInTrees(const Diagrams& diagrams, Diagram root, std::span<const LevelInfo> levels,
                               std::span<const std::uint32_t> positions) {
    beginTrees();
    best_.resize(std::max(best_.size(), isReached_.size()));
    best_[always] = 0;
    for (Diagram diagram = never + 1; diagram <= root; ++diagram) {
        if (isReached_[diagram] == 0)
            continue;
        const std::uint32_t position = positions[diagrams.level(diagram)];
        std::optional<Tree> best;
        forEachEdge(diagrams, diagram, levels[diagrams.level(diagram)], [&](Diagram child, std::int64_t value) {
            const Tree tree = with(best_[child], position, value);
            if (!best || isBetter(tree, *best))
                best = tree;
        });
        best_[diagram] = *best;
    }
    for (const std::uint32_t position : positions)
        result_[position] = valueAt(best_[root], position);
}

} // namespace VT
