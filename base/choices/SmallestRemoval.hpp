// The choices to remove from a set so that no two of the others overlap.
#pragma once

#include "base/choices/ChoiceAdvice.hpp"

#include <cstddef>
#include <span>
#include <utility>

namespace VT {

/// Returns a smallest set with one position of each pair, of two of the same pair the later one where that makes no
/// difference.  Takes limits::removalCases at most; beyond them the set is one that suffices.
ChoiceRemoval smallestRemoval(std::span<const std::pair<std::size_t, std::size_t>> pairs);

} // namespace VT
