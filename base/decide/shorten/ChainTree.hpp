// A condition as a tree of And and Or chains from which operands can be taken.
#pragma once

#include "base/core/Table.hpp"

#include <cstddef>
#include <vector>

namespace VT {

/// The chains of a condition, each as often as it occurs, so that an operand may go at one place and stay at another.
class ChainTree {
public:
    /// An operand of a chain: a chain itself, or anything else as written.
    struct Item {
        SymbolicOp op = SymbolicOp::None;       ///< And or Or of a chain
        SymbolicExprId id = invalidId;          ///< as written
        std::size_t parent = 0;                 ///< position, smaller than its own
        std::vector<std::size_t> operands = {}; ///< positions, greater than its own
        bool removed = false;
    };

    explicit ChainTree(SymbolicExprTable& table) : table_(table) {}

    /// Takes a condition apart; false where it has more operands than limits::chainOperands or lacks one.
    bool split(SymbolicExprId condition);

    /// Makes the condition without what was removed.  `built` receives the node of each item, chains grouped to the
    /// left; `nodesLeft` is lowered by one for each operand joined, to 0 at most.  Linear in the items.
    SymbolicExprId build(std::vector<SymbolicExprId>& built, std::size_t& nodesLeft) const;

    /// How many operands of a chain are left.
    [[nodiscard]] std::size_t operandsLeft(const Item& item) const;

    /// The condition itself comes first, chains before their operands.
    [[nodiscard]] std::vector<Item>& items() noexcept { return items_; }

    [[nodiscard]] const std::vector<Item>& items() const noexcept { return items_; }

private:
    SymbolicExprTable& table_;
    std::vector<Item> items_;
};

} // namespace VT
