// Writes JSON piece by piece into a text, so that nesting needs no stack and answers are never built twice.
// Only strings need a library; Json.cpp alone includes it.
#pragma once

#include <string>
#include <string_view>

namespace vtsym {

/// A text as a JSON string.  A character that a terminal would not show is written as \uNNNN; bytes that are not UTF-8
/// become U+FFFD.
std::string jsonString(std::string_view text);

/// A number.  JSON has no infinities and no NaN; they become the strings "Infinity", "-Infinity" and "NaN".
std::string jsonNumber(double value);

/// Appends `,"name":` and the value, which is already JSON.
void appendMember(std::string& json, std::string_view name, std::string_view value);

} // namespace vtsym
