// Errors of single texts: what is known about them, and how they look on standard error and in JSON.
// An error of one text does not end the program; the next text is answered.
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

/// The reason why a text has no answer.
struct TextError {
    std::string id;                    ///< of the message
    std::string message;               ///< a sentence
    std::optional<std::size_t> offset; ///< of the byte that is wrong
    // The part of the text to show.
    std::size_t begin = 0;
    std::size_t end = std::string::npos;
};

/// A line of several parts, such as a command and its text, cannot be answered.
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

/// The errors of the exception being handled; to be called in a catch clause.  Rethrows an exception that is not about
/// the text.
std::vector<TextError> currentTextErrors();
/// The first of them.
TextError currentTextError();

/// A line, or the part of a long line around a byte of it, and below it a caret under that byte.  A byte that a
/// terminal would not show as a character is written as \xNN.
std::string withCaret(std::string_view text, std::size_t offset, const Style& style);

/// The lines for standard error, without the line number of the text or with it.
std::string errorText(std::string_view text, const TextError& error, const Style& style);
std::string errorLines(std::uint64_t line, std::string_view text, std::span<const TextError> errors,
                       const Style& style);

/// The line for standard error that warns about a text.
std::string warningLine(std::uint64_t line, std::string_view warning, const Style& style);

/// The member of a JSON answer: the first error, and a list of the others.
std::string jsonOf(std::span<const TextError> errors);

} // namespace vtsym
