// Texts from outside: conversion, and showing texts that may hold anything.
#pragma once

#include "host/Export.hpp"

#include <cstddef>
#include <string>
#include <string_view>

/// UTF-16 to UTF-8.  A surrogate without its partner becomes U+FFFD.
VTSYM_API std::string cvt_ustring_string(std::u16string_view text);

namespace VT {

/// Bytes of the character at the front of a text, where a terminal shows it as a character: 0 for controls, invisible
/// and direction characters, for bytes that are not UTF-8, and for an empty text.
VTSYM_API std::size_t plainCharacter(std::string_view text);

/// The beginning of a text, fit for a terminal or a log: about `bound` bytes at most, cut between characters and ended
/// by "..." where it goes on.  Bytes that are not part of a plainCharacter() are shown as `\xNN`.
VTSYM_API std::string shownText(std::string_view text, std::size_t bound = std::string_view::npos);

} // namespace VT
