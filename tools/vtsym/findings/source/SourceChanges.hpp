// What changed in a file between two of its states.
#pragma once

#include "tools/vtsym/findings/source/SourceChecker.hpp"

#include "base/scan/changes/BranchMeanings.hpp"

#include <string>
#include <string_view>
#include <vector>

namespace vtsym {

/// Two states of a file; one where it is not there is empty.
struct FileStates {
    std::string path; ///< afterwards
    std::string_view before;
    std::string_view after;
    std::vector<VT::ChangedLines> lines;
};

/// Returns the findings of both states, each with what became of it: those of the state afterwards that are new or
/// remain, those that are fixed, and branches that are built in other cases.
std::vector<Finding> changesOf(SourceChecker& checker, const FileStates& states);

} // namespace vtsym
