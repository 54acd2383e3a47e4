// Under which condition the lines of a branch are built.
#pragma once

#include "base/scan/regions/ConditionalRegions.hpp"

#include <string>
#include <string_view>
#include <vector>

namespace VT {

/// A directive that decides whether a branch is built: one around it, or one before these in their chains.
struct BuiltPart {
    std::uint32_t region;
    bool holds; ///< its condition has to hold, or must not
};

/// The condition of a branch: that all parts are as they have to be.
struct BuiltCondition {
    std::vector<BuiltPart> parts; ///< from the outside to the inside
    /// All parts in one condition, the shortest form found: "1" for always, "0" for never.  Empty where no condition
    /// says it, since a macro changes between the directives, or since the branch is after #else.
    std::string condition;
    std::string witness; ///< values of macros for which it is built; empty where none are known
};

/// Finds the condition of a branch, whatever the build defines.  Linear in the text before the branch; decisions take
/// at most limits::branchDecisionSteps, and the search for a shorter form limits::shortenSteps.
VTSYM_API BuiltCondition builtCondition(std::string_view text, bool isCpp, const ConditionalRegions& regions,
                                        std::uint32_t region);

} // namespace VT
