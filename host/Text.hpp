// Texts from outside: conversion, and showing them where anything may be in them.
#pragma once

#include "host/Export.hpp"

#include <cstddef>
#include <string>
#include <string_view>

/// UTF-16 to UTF-8.  A surrogate without its partner becomes U+FFFD.
VTSYM_API std::string cvt_ustring_string(std::u16string_view text);

namespace VT {

/// The beginning of a text, fit for a terminal or a log: about `bound` bytes at most, cut between characters and ended
/// by "..." where it goes on.  Control and direction characters, and bytes that are no UTF-8, are shown as \xNN.
VTSYM_API std::string shownText(std::string_view text, std::size_t bound);

} // namespace VT
