// Aliases as they are stored.
#pragma once

#include <string>

namespace VT {

/// A text as an alias that means the same in every operand's place: a negative literal in parentheses, every other text
/// as it is given.  Linear.
[[nodiscard]] std::string aliasText(std::string text);

} // namespace VT
