// JSON text, written piece by piece so that its nesting needs no stack.
#pragma once

#include <string>
#include <string_view>

namespace vtsym {

/// A text as a JSON string.  What a terminal would not show as a character is written as \uNNNN; bytes that are not
/// UTF-8 become U+FFFD.
std::string jsonString(std::string_view text);

/// A number; infinities and NaN, which JSON has not, become the texts "Infinity", "-Infinity" and "NaN".
std::string jsonNumber(double value);

/// Appends `,"name":` and the value, which is JSON already.
void appendMember(std::string& json, std::string_view name, std::string_view value);

} // namespace vtsym
