// How errors look.
#pragma once

#include "tools/vtsym/Console.hpp"

#include <cstddef>
#include <cstdint>
#include <exception>
#include <optional>
#include <string>
#include <string_view>

namespace vtsym {

/// What is told of a text that has no answer.
struct TextError {
    std::string id;                    ///< of the message
    std::string message;               ///< a sentence
    std::optional<std::size_t> offset; ///< byte of the text that it is about
};

/// The error that is being handled: to be called in a catch clause.  Rethrows what is no matter of the text.
TextError currentTextError();

/// A line, or the part of a long line around a byte of it, and below it a caret under that byte.  What a terminal would
/// not show as it is, is shown as \xNN.
std::string withCaret(std::string_view text, std::size_t offset, const Style& style);

/// The lines for standard error.
std::string errorLines(std::uint64_t line, std::string_view text, const TextError& error, const Style& style);

/// The line for standard error that warns of a text.
std::string warningLine(std::uint64_t line, std::string_view warning, const Style& style);

/// The member of a JSON answer.
std::string jsonOf(const TextError& error);

} // namespace vtsym
