// Changes of a file that write another condition.
#pragma once

#include "base/scan/DirectiveReader.hpp"

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

namespace VT {

/// Replaces the bytes from `begin` to before `end` by a text.
struct SourceEdit {
    std::size_t begin = 0;
    std::size_t end = 0;
    std::string text{};
};

/// Returns the change that gives a directive another condition.  What both conditions share stays as it is written,
/// with its blanks and line splices; every comment stays.  The directive has tokens and belongs to the text.  At most
/// limits::comparedTokens pairs of tokens are compared; the condition is written anew beyond.
SourceEdit conditionEdit(std::string_view text, const Directive& directive, const std::string& condition);

/// Returns a text with changes, which are in order and do not overlap.  Linear.
VTSYM_API std::string withEdits(std::string_view text, const std::vector<SourceEdit>& edits);

} // namespace VT
