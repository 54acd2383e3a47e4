// The part of a circuit that a question is about, with the quantities that it restricts.
//
// Quantities become levels 0, 1, 2, ... in the order in which the question mentions them first, but for those that it
// mentions beside one that has its place already: they come after that one.  What ties quantities together is written
// together in most conditions, so this is an order in which diagrams stay small; and neither names nor earlier
// questions have a say in it.  A difference or a sum is turned round where its direction would depend on them: the
// unknown that is mentioned first counts negative in a difference, and positive in a sum.
//
// Cost: linear in the part of the circuit.
#pragma once

#include "base/decide/circuit/Circuit.hpp"

#include <cstdint>
#include <span>
#include <vector>

namespace VT {

using Level = std::uint32_t;

inline constexpr Level noLevel = ~Level{0};

struct LevelInfo {
    Quantity quantity;
    Unknown plus;
    Unknown minus;  ///< subtracted, or noUnknown
    bool opposed;   ///< the value is that of the sum `plus` with its sign turned
    bool isChecked; ///< a difference or a computed unknown: values of different levels depend on each other
    std::int64_t low;
    std::int64_t high;
};

class Question {
public:
    struct Node {
        Level level; ///< of a comparison
        std::uint32_t first;
        std::uint32_t count;
    };

    /// Begins a question; `met`, which stays where it is, follows for every condition that it asks about, in their
    /// order.
    void begin();
    /// Forgets the numbers of a circuit and of unknowns that were thrown away.
    void clear();

    void mention(std::span<const Unknown> met) { mentioned_.push_back(met); }

    void ask(const Circuit& circuit, const Unknowns& unknowns, Steps& steps, Gate root);

    /// Refers to the nodes of the question, not to those of the circuit it was made from.
    [[nodiscard]] Gate root() const noexcept { return root_; }

    /// Operands before what is made of them; the first is `always`.
    [[nodiscard]] const std::vector<Node>& nodes() const noexcept { return nodes_; }

    [[nodiscard]] bool isComparison(const Node& node) const noexcept { return node.level != noLevel; }

    [[nodiscard]] std::span<const std::int64_t> ends(const Node& node) const {
        return {ends_.data() + node.first, node.count};
    }

    [[nodiscard]] std::span<const Gate> operands(const Node& node) const {
        return {operands_.data() + node.first, node.count};
    }

    [[nodiscard]] const std::vector<LevelInfo>& levels() const noexcept { return levels_; }

    /// The level of a quantity, or noLevel.
    [[nodiscard]] Level levelOf(Quantity quantity) const {
        const bool isThere = quantity < byQuantity_.size() && byQuantity_[quantity].question == question_;
        return isThere ? byQuantity_[quantity].value : noLevel;
    }

    /// Whether some level depends on others.
    [[nodiscard]] bool needsChecking() const noexcept { return needsChecking_; }

    /// Whether every level is in one comparison and every node below one other node.
    [[nodiscard]] bool isReadOnce() const noexcept {
        return comparisons_ == levels_.size() && operands_.size() + 2 == nodes_.size();
    }

    /// The position of an unknown in the question; those that it mentions come before others.
    [[nodiscard]] std::uint32_t rankOf(Unknown unknown) const;

    /// Whether the question holds where each level has a value.  Linear in the nodes.
    template <class ValueOf>
    [[nodiscard]] bool holds(ValueOf valueOf) const {
        truths_.resize(nodes_.size());
        truths_[0] = 1;
        for (std::size_t i = 1; i < nodes_.size(); ++i)
            truths_[i] = isComparison(nodes_[i]) ? contains(nodes_[i], valueOf(nodes_[i].level)) : allHold(nodes_[i]);
        return (truths_[root_ >> 1U] ^ (root_ & 1U)) != 0;
    }

    /// Whether the comparison of a node holds for a value.
    [[nodiscard]] bool contains(const Node& node, std::int64_t value) const;

private:
    struct Mark {
        std::uint32_t question = 0;
        std::uint32_t value = 0;
    };

    struct Frame {
        Gate truth;
        std::size_t next;
    };

    [[nodiscard]] bool allHold(const Node& node) const;
    Level addLevel(const Unknowns& unknowns, Quantity quantity, Level after);
    void addComparisons(const Circuit& circuit, const Unknowns& unknowns, Gate conjunction);
    void sortLevels();
    void rankUnknowns();
    void addComparison(const Circuit& circuit, Level level, Gate truth);

    std::uint32_t question_ = 0;
    std::vector<std::span<const Unknown>> mentioned_;
    std::uint32_t ranked_ = 0;     ///< unknowns that have ranks, which are given where a level depends on others
    std::vector<Mark> ranks_;      ///< by unknown
    std::vector<Mark> byQuantity_; ///< its level
    std::vector<Mark> byNode_;     ///< of the circuit
    std::vector<bool> turned_;     ///< by level: whether the quantity has the opposite direction
    std::vector<Level> next_;      ///< by level, in the order that they are to have
    Level first_ = noLevel;
    Level last_ = noLevel;
    std::vector<Level> sorted_;
    std::vector<LevelInfo> unsorted_;
    std::vector<Frame> frames_;

    bool needsChecking_ = false;
    std::size_t comparisons_ = 0;
    Gate root_ = never;
    std::vector<Node> nodes_;
    std::vector<std::int64_t> ends_;
    std::vector<Gate> operands_;
    std::vector<LevelInfo> levels_;
    mutable std::vector<std::uint8_t> truths_;
};

} // namespace VT
