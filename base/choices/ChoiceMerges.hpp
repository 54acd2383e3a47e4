// Choices that can be written as one.
#pragma once

#include "base/choices/ChoiceAdvice.hpp"
#include "base/core/Table.hpp"

#include <functional>
#include <span>
#include <vector>

namespace VT {

/// Finds choices that can be merged: their conditions are Ands that differ in what they say of one group of names.
class ChoiceMerges {
public:
    /// Returns the shortest form of a condition.
    using Shorten = std::function<SymbolicExprId(SymbolicExprId)>;

    ChoiceMerges(SymbolicExprTable& table, Shorten shorten) : table_(table), shorten_(std::move(shorten)) {}

    /// Returns merges of choices, each choice in one of them at most, the longest runs found first come first.  With
    /// `inOrder` only choices that follow each other directly are merged.  Tries limits::choiceMerges at most.
    std::vector<ChoiceMerge> find(std::span<const SymbolicExprId> choices, bool inOrder);

private:
    /// What an And says of one group of names.
    struct Group {
        std::vector<SymbolicExprId> names;
        SymbolicExprId says;
    };

    std::vector<Group> groupsOf(SymbolicExprId condition) const;
    SymbolicExprId asProduct(SymbolicExprId condition);

    SymbolicExprTable& table_;
    Shorten shorten_;
    std::size_t triesLeft_ = 0;
};

} // namespace VT
