// Changes of files as patches.
#pragma once

#include "base/scan/report/ConditionEdit.hpp"

#include <string>
#include <string_view>
#include <vector>

namespace vtsym {

/// Returns the changes of a file as a unified diff that `git apply` takes, with three lines of context; an empty text
/// for no changes.  The changes are in order and do not overlap.  The path is relative, or its root is left out. Linear
/// in the text.
std::string patchOf(std::string_view path, std::string_view text, const std::vector<VT::SourceEdit>& edits);

} // namespace vtsym
