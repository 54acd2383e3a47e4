// The search for a minimal part of a list that still suffices.
#pragma once

#include "base/decide/Decision.hpp"

#include <cstddef>
#include <functional>
#include <span>
#include <vector>

namespace VT {

/// Whether the elements at some positions, in ascending order, suffice.
using SubsetQuestion = std::function<Answer(std::span<const std::size_t> positions)>;

struct MinimalSubset {
    std::vector<std::size_t> positions; ///< in ascending order; they suffice
    bool isMinimal = true;              ///< without any one of them the rest was shown not to suffice
};

/// Returns a minimal subset of a list of `count` elements, of which all together suffice.  What suffices does so with
/// further elements too.  Elements at the end of the list are preferred.
///
/// Where an answer is undecided the elements in question stay, and the subset is not known to be minimal.
VTSYM_API MinimalSubset minimalSubset(std::size_t count, const SubsetQuestion& suffices);

} // namespace VT
