// Branches of a file that two of its states build in different cases.
#pragma once

#include "base/scan/SourceScan.hpp"

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace VT {

/// Lines that a change replaces: `count` lines from `first` on (from 1), in the state before and after.  Without lines,
/// `first` is the one before them.
struct ChangedLines {
    std::uint64_t firstBefore = 0;
    std::uint64_t countBefore = 0;
    std::uint64_t firstAfter = 0;
    std::uint64_t countAfter = 0;
};

/// A branch whose lines stay, while the definitions that they are built for do not.
struct ChangedBranch {
    SourceRegion region;       ///< of the directive afterwards; of a line outside of all branches that was in one
    std::string directive;     ///< afterwards; empty outside of all branches
    std::string before;        ///< the directive before; empty outside of all branches
    std::string witness;       ///< definitions for which they differ: "A=1, defined(B)=0"
    bool isBuiltAfter = false; ///< for the witness
};

/// Compares the conditions of lines that two states of a file share, as formulas over the names of macros: what the
/// file defines on the way is not considered.  Of nested branches that change with the one around them, the outer is
/// reported.  The changes are in order.  About linear in the texts; each pair of branches is one decision, and
/// limits::scanSteps bounds all.
VTSYM_API std::vector<ChangedBranch> changedBranches(std::string_view before, std::string_view after, bool isCpp,
                                                     const std::vector<ChangedLines>& changes);

} // namespace VT
