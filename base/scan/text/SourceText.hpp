// Bytes of C and C++ sources as the translation phases before directives see them: line splices, comments, literals.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <string_view>

namespace VT {

/// What a byte may begin.
enum class SourceByte : std::uint8_t { Plain, Name, Digit, Blank, NewLine, Slash, Quote, Backslash };

inline constexpr std::array<SourceByte, 256> sourceBytes = [] {
    std::array<SourceByte, 256> table{};
    for (unsigned c = 0; c < 256; ++c) {
        if ((c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || c == '_' || c == '$' || c >= 0x80)
            table[c] = SourceByte::Name;
        else if (c >= '0' && c <= '9')
            table[c] = SourceByte::Digit;
    }
    for (const unsigned char c : {' ', '\t', '\v', '\f', '\r', '\0'})
        table[c] = SourceByte::Blank;
    table['\n'] = SourceByte::NewLine;
    table['/'] = SourceByte::Slash;
    table['"'] = table['\''] = SourceByte::Quote;
    table['\\'] = SourceByte::Backslash;
    return table;
}();

inline SourceByte byteClass(char c) {
    return sourceBytes[static_cast<unsigned char>(c)];
}

inline bool isOfName(char c) {
    return byteClass(c) == SourceByte::Name || byteClass(c) == SourceByte::Digit;
}

/// Counts line ends.  Compares many bytes at a time.
std::uint64_t countLineEnds(std::string_view text);

/// A text that outlives this view of it.  Places are byte offsets; every operation is linear in the bytes it passes.
class SourceText {
public:
    explicit SourceText(std::string_view text) : text_(text) {}

    [[nodiscard]] std::string_view text() const noexcept { return text_; }

    [[nodiscard]] std::size_t size() const noexcept { return text_.size(); }

    /// The byte at a place; NUL after the end.
    [[nodiscard]] char at(std::size_t place) const { return place < text_.size() ? text_[place] : '\0'; }

    /// Returns the place after line splices, which may have blanks before their line ends.
    [[nodiscard]] std::size_t afterSplices(std::size_t place) const {
        return at(place) == '\\' ? afterBackslashes(place) : place;
    }

    [[nodiscard]] bool beginsComment(std::size_t place) const;
    /// Returns the place after the comment that begins here; of a line comment, that of its line end.
    [[nodiscard]] std::size_t afterComment(std::size_t place) const;
    /// Returns the place after the literal that begins here; the end of its line for a literal without an end.
    [[nodiscard]] std::size_t afterQuoted(std::size_t place) const;
    /// Returns the place after a header's name in angle brackets; its beginning where it does not end on its line.
    [[nodiscard]] std::size_t afterHeaderName(std::size_t place) const;

private:
    [[nodiscard]] std::size_t afterBackslashes(std::size_t place) const;

    std::string_view text_;
};

} // namespace VT
