// Conditions that are known to hold wherever questions are asked.
#pragma once

#include "base/core/Table.hpp"

#include <boost/unordered_map.hpp>

#include <span>
#include <vector>

namespace VT {

/// A set of conditions that are assumed, of which a question uses those that have to do with it.
///
/// An assumption has to do with a question where they share a name, be it of a symbol or a function, or where both
/// share one with a third assumption, and so on.  An And is assumed operand by operand.  Quill calls are assumed as the
/// operators that they stand for, and both variant keywords count as one name.
///
/// What has nothing to do with a question has no say in its answer, unless it contradicts itself: assumptions are
/// expected to hold together for some assignment, which whyNever() or canHold() of all() can check.  The table outlives
/// the set.
class VTSYM_API Assumptions {
public:
    explicit Assumptions(SymbolicExprTable& table) : table_(table) {}

    /// Assumes a condition from now on; false, without effect, for an identifier that is not of the table, or one that
    /// lacks an operand.  Linear in its distinct nodes.
    bool add(SymbolicExprId condition);
    void clear();
    /// Forgets all but the first operands of all(), so that assumptions can follow a path through a tree.
    void shrink(std::size_t operands);

    [[nodiscard]] bool empty() const noexcept { return operands_.empty(); }

    /// What is assumed, in the order in which it was added.
    [[nodiscard]] const std::vector<SymbolicExprId>& all() const noexcept { return operands_; }

    /// The assumptions that have to do with some conditions.  Linear in the conditions' distinct nodes and the names of
    /// the result.
    [[nodiscard]] std::vector<SymbolicExprId> relevantTo(std::span<const SymbolicExprId> conditions) const;
    /// Their And, which is TRUE of none.
    [[nodiscard]] SymbolicExprId knownOf(std::span<const SymbolicExprId> conditions) const;

private:
    [[nodiscard]] std::vector<SymbolicExprId> namesOf(std::span<const SymbolicExprId> conditions) const;

    SymbolicExprTable& table_;
    std::vector<SymbolicExprId> operands_;
    std::vector<std::vector<SymbolicExprId>> names_;                      ///< by operand
    std::vector<std::size_t> constants_;                                  ///< operands without names
    boost::unordered_map<SymbolicExprId, std::vector<std::size_t>> uses_; ///< operands by name
};

} // namespace VT
