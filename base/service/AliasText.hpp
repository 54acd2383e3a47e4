// The stored form of aliases.
#pragma once

#include <string>

namespace VT {

/// Returns the text of an alias that means the same in every operand's place: a negative literal in parentheses, every
/// other text unchanged.  Linear.
[[nodiscard]] std::string aliasText(std::string text);

} // namespace VT
