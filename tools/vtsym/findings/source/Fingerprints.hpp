// Names of findings that do not depend on where in a file they are.
#pragma once

#include "tools/vtsym/findings/Findings.hpp"

#include <string>
#include <vector>

namespace vtsym {

/// Gives each finding of one file a fingerprint: of the file's name, the kind, the condition and its proposal, and of
/// what it follows from.  Equal ones are numbered in their order, so that no two of a file are equal.  A finding keeps
/// its fingerprint when lines move, from version to version of the program.
void addFingerprints(std::vector<Finding>& findings);

} // namespace vtsym
