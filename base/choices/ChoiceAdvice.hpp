// What is declared for a set of choices, and what the set can do about its faults.
#pragma once

#include "base/core/Node.hpp"

#include <cstddef>
#include <optional>
#include <vector>

namespace VT {

/// The values that a symbol is declared to have: those listed, those from `min` to `max`, or those that are both.
struct SymbolDomain {
    SymbolicExprId symbol;
    std::optional<std::vector<int>> values = {};
    std::optional<int> min = {};
    std::optional<int> max = {};
};

/// Choices without which no two of the others overlap.
struct ChoiceRemoval {
    std::vector<std::size_t> choices = {}; ///< positions, in ascending order; one of each pair at least
    bool isSmallest = true;                ///< no smaller set has one of each pair
};

/// Choices whose conditions together are one product: a comparison, or an And.
struct ChoiceMerge {
    std::vector<std::size_t> choices; ///< positions, in ascending order
    SymbolicExprId merged;            ///< holds where one of them does
};

} // namespace VT
