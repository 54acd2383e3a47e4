// The text of a document that an editor has open, and its places.
#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace vtsym {

/// A place as editors have it: a line, and UTF-16 code units before it on the line, both from 0.
struct TextPosition {
    std::uint64_t line = 0;
    std::uint64_t character = 0;
    bool operator==(const TextPosition&) const = default;
};

/// A text in UTF-8 and tables of its lines and characters.  Lines end with a line feed, a carriage return, or both.
class TextDocument {
public:
    explicit TextDocument(std::string text) : text_(std::move(text)) { measure(); }

    [[nodiscard]] const std::string& text() const noexcept { return text_; }

    /// Replaces what is between two positions.  Linear in the text.
    void replace(TextPosition begin, TextPosition end, std::string_view text);
    void replaceAll(std::string text);

    /// The byte of a position.  One after the end of its line is that end, one after the last line the end of the text;
    /// one inside of a character is its beginning.  Logarithmic.
    [[nodiscard]] std::size_t byteOf(TextPosition position) const;
    /// The position of a byte, at most that of the end.  Logarithmic.
    [[nodiscard]] TextPosition positionOf(std::size_t byte) const;
    /// The byte of a place as findings have it: a line of those that end with a line feed, and a column in code points,
    /// both from 1.  With `skipsMark`, a byte order mark is before the first column.  Logarithmic.
    [[nodiscard]] std::size_t byteOfPlace(std::uint64_t line, std::uint64_t column, bool skipsMark) const;
    /// The line of a byte, of those that end with a line feed, from 1; bytes of its beginning and of the next one.
    [[nodiscard]] std::uint64_t lineOf(std::size_t byte) const;
    [[nodiscard]] std::pair<std::size_t, std::size_t> lineRange(std::uint64_t line) const;

private:
    /// How much there is of something before each block of bytes.
    using Counts = std::vector<std::size_t>;

    void measure();
    [[nodiscard]] std::size_t before(const Counts& counts, bool inUnits, std::size_t byte) const;
    [[nodiscard]] std::size_t advanced(const Counts& counts, bool inUnits, std::size_t from, std::uint64_t by,
                                       std::size_t end) const;

    std::string text_;
    std::vector<std::size_t> lines_; ///< beginnings, for editors
    std::vector<std::size_t> feeds_; ///< beginnings after line feeds alone
    Counts units_;                   ///< UTF-16 code units
    Counts points_;                  ///< code points
};

} // namespace vtsym
