// How errors look.
#pragma once

#include "tools/vtsym/io/Console.hpp"

#include <cstddef>
#include <cstdint>
#include <exception>
#include <optional>
#include <span>
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

namespace vtsym {

/// What is told of a text that has no answer.
struct TextError {
    std::string id;                    ///< of the message
    std::string message;               ///< a sentence
    std::optional<std::size_t> offset; ///< byte of the text that it is about
    // The part of the text that is shown.
    std::size_t begin = 0;
    std::size_t end = std::string::npos;
};

/// A line that mixes commands and texts cannot be followed.
class CommandError : public std::runtime_error {
public:
    explicit CommandError(const std::string& sentence) : CommandError(TextError{"vtsym:Command", sentence, {}}) {}

    /// Errors in parts of a line, one at least.
    explicit CommandError(std::vector<TextError> errors)
        : std::runtime_error(errors.front().message),
          errors_(std::move(errors)) {}

    /// An error in a text that begins at a byte of the line.
    CommandError(TextError error, std::size_t begin) : CommandError(std::move(error)) {
        if (errors_.front().offset)
            *errors_.front().offset += begin;
    }

    [[nodiscard]] const std::vector<TextError>& errors() const noexcept { return errors_; }

private:
    explicit CommandError(TextError error) : CommandError(std::vector{std::move(error)}) {}

    std::vector<TextError> errors_;
};

/// The errors that are being handled: to be called in a catch clause.  Rethrows what is no matter of the text.
std::vector<TextError> currentTextErrors();
/// The first of them.
TextError currentTextError();

/// A line, or the part of a long line around a byte of it, and below it a caret under that byte.  What a terminal would
/// not show as it is, is shown as \xNN.
std::string withCaret(std::string_view text, std::size_t offset, const Style& style);

/// The lines for standard error, without the number of the text and with it.
std::string errorText(std::string_view text, const TextError& error, const Style& style);
std::string errorLines(std::uint64_t line, std::string_view text, std::span<const TextError> errors,
                       const Style& style);

/// The line for standard error that warns of a text.
std::string warningLine(std::uint64_t line, std::string_view warning, const Style& style);

/// The member of a JSON answer: the first error, with a list of those further on.
std::string jsonOf(std::span<const TextError> errors);

} // namespace vtsym
