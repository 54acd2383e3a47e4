// The tokens of Quill text.
//
// The meaning of a character depends on its place: a quote opens a text where an operand may start and transposes after
// one.  The parser knows the place and asks for the token that may be there.
#pragma once

#include "host/QuillParser.hpp"

#include <array>

namespace VT::Embedded {

using QuillNode = _Q_parse_tree_T<char>;

/// Binding strengths, loosest first.
enum class QuillLevel : std::uint8_t {
    Expression,
    Or,
    And,
    SingleOr,
    SingleAnd,
    Equality,
    Order,
    Range,
    Sum,
    Product,
    Prefix,
    Power,
};

/// An operator that follows an operand.
struct QuillOperator {
    std::string_view spelling;
    QuillToken token;
    QuillRule rule;
    QuillLevel level;
};

/// Reads a text from left to right.  After the end of the text it sees NUL.
class QuillLexer {
public:
    explicit QuillLexer(std::string_view text) : text_(text) {}

    std::size_t position() const { return position_; }

    bool atEnd() const { return position_ >= text_.size(); }

    char peek(std::size_t ahead = 0) const {
        return ahead < text_.size() - position_ ? text_[position_ + ahead] : '\0';
    }

    std::string_view rest() const { return text_.substr(position_); }

    /// Passes white space, comments and continuations.
    ///
    /// @return whether there were any
    bool skipBlanks() { return mayBeBlank(peek()) && skipMoreBlanks(); }

    /// Whether white space, a comment or a continuation begins `ahead` characters from here.
    bool isBlank(std::size_t ahead) const;

    static bool startsName(char c) { return classOf(c) == Class::Letter; }

    static bool isDigit(char c) { return classOf(c) == Class::Digit; }

    bool startsNumber() const { return isDigit(peek()) || (peek() == '.' && isDigit(peek(1))); }

    void skip(std::size_t length) { position_ += length; }

    /// Reads the token of `length` characters from here.
    QuillNode token(QuillToken code, std::size_t length) {
        const QuillNode node = here(code, length);
        position_ += length;
        return node;
    }

    /// An identifier, or `end`.
    QuillNode name();

    /// A number that starts here, imaginary or not.
    QuillNode number();

    /// A text in the quotes that start here; of length 0, and nothing is read, where they are not closed.
    QuillNode quotedText();

    /// The operator at this place, after an operand, or nullptr.  A quote counts as the transpose.
    const QuillOperator* operatorHere() const;

private:
    enum class Class : std::uint8_t { Other, Letter, Digit, Blank, Percent, Dot };

    static constexpr std::array<Class, 256> classes = [] {
        std::array<Class, 256> all{};
        for (unsigned c = 0; c < 26; ++c)
            all['a' + c] = all['A' + c] = Class::Letter;
        all['_'] = Class::Letter;
        for (unsigned c = '0'; c <= '9'; ++c)
            all[c] = Class::Digit;
        for (const char c : {' ', '\t', '\n', '\v', '\f', '\r'})
            all[static_cast<unsigned char>(c)] = Class::Blank;
        all['%'] = Class::Percent;
        all['.'] = Class::Dot;
        return all;
    }();

    static Class classOf(char c) { return classes[static_cast<unsigned char>(c)]; }

    static bool mayBeBlank(char c) { return classOf(c) >= Class::Blank; }

    bool skipMoreBlanks();

    std::size_t skipDigits(std::size_t ahead) const {
        while (isDigit(peek(ahead)))
            ++ahead;
        return ahead;
    }

    QuillNode here(QuillToken code, std::size_t length) const {
        return {.kind = QuillNode::terminal,
                .code = static_cast<std::int32_t>(code),
                .start = static_cast<std::uint32_t>(position_),
                .length = static_cast<std::uint32_t>(length),
                .text = text_.data() + position_};
    }

    std::string_view text_;
    std::size_t position_ = 0;
};

} // namespace VT::Embedded
