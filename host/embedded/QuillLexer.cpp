// Reads the tokens of Quill text.
//
// The first character selects the kind of token, at most two more settle it.  Linear in the text.
#include "host/embedded/QuillLexer.hpp"

#include <algorithm>

namespace VT::Embedded {

namespace {

using enum QuillLevel;

constexpr QuillOperator orOperator{"||", QuillToken::OrSign, QuillRule::Or, Or};
constexpr QuillOperator andOperator{"&&", QuillToken::AndSign, QuillRule::And, And};
constexpr QuillOperator singleOr{"|", QuillToken::SingleOrSign, QuillRule::SingleOr, SingleOr};
constexpr QuillOperator singleAnd{"&", QuillToken::SingleAndSign, QuillRule::SingleAnd, SingleAnd};
constexpr QuillOperator equal{"==", QuillToken::EqualSign, QuillRule::Equal, Equality};
constexpr QuillOperator notEqual{"~=", QuillToken::NotEqualSign, QuillRule::NotEqual, Equality};
constexpr QuillOperator less{"<", QuillToken::LessSign, QuillRule::LessThan, Order};
constexpr QuillOperator lessEqual{"<=", QuillToken::LessEqualSign, QuillRule::LessThanEqual, Order};
constexpr QuillOperator greater{">", QuillToken::GreaterSign, QuillRule::GreaterThan, Order};
constexpr QuillOperator greaterEqual{">=", QuillToken::GreaterEqualSign, QuillRule::GreaterThanEqual, Order};
constexpr QuillOperator plus{"+", QuillToken::PlusSign, QuillRule::Plus, Sum};
constexpr QuillOperator minus{"-", QuillToken::MinusSign, QuillRule::Minus, Sum};
constexpr QuillOperator times{"*", QuillToken::TimesSign, QuillRule::Multiply, Product};
constexpr QuillOperator divide{"/", QuillToken::DivideSign, QuillRule::Divide, Product};
constexpr QuillOperator leftDivide{"\\", QuillToken::LeftDivideSign, QuillRule::LeftDivide, Product};
constexpr QuillOperator dotTimes{".*", QuillToken::DotTimesSign, QuillRule::DotMultiply, Product};
constexpr QuillOperator dotDivide{"./", QuillToken::DotDivideSign, QuillRule::DotDivide, Product};
constexpr QuillOperator dotLeftDivide{".\\", QuillToken::DotLeftDivideSign, QuillRule::DotLeftDivide, Product};
constexpr QuillOperator power{"^", QuillToken::PowerSign, QuillRule::Power, Power};
constexpr QuillOperator dotPower{".^", QuillToken::DotPowerSign, QuillRule::DotPower, Power};
constexpr QuillOperator transpose{"'", QuillToken::TransposeSign, QuillRule::Transpose, Power};
constexpr QuillOperator dotTranspose{".'", QuillToken::DotTransposeSign, QuillRule::DotTranspose, Power};

/// The operator whose first character is a dot.
const QuillOperator* dottedOperator(char second) {
    switch (second) {
    case '*':
        return &dotTimes;
    case '/':
        return &dotDivide;
    case '\\':
        return &dotLeftDivide;
    case '^':
        return &dotPower;
    case '\'':
        return &dotTranspose;
    default:
        return nullptr;
    }
}

constexpr std::string_view continuation = "...";

bool isHexDigit(char c) {
    return (c >= '0' && c <= '9') || (c >= 'a' && c <= 'f') || (c >= 'A' && c <= 'F');
}

} // namespace

bool QuillLexer::isBlank(std::size_t ahead) const {
    const Class first = classOf(peek(ahead));
    if (first == Class::Dot)
        return text_.substr(position_ + ahead).starts_with(continuation);
    return first >= Class::Blank;
}

bool QuillLexer::skipMoreBlanks() {
    const std::size_t start = position_;
    while (!atEnd() && isBlank(0)) {
        const bool isWhiteSpace = classOf(peek()) == Class::Blank;
        position_ = isWhiteSpace ? position_ + 1 : std::min(text_.find_first_of("\r\n", position_), text_.size());
    }
    return position_ != start;
}

QuillNode QuillLexer::name() {
    std::size_t length = 1;
    for (Class next = classOf(peek(length)); next == Class::Letter || next == Class::Digit;
         next = classOf(peek(length)))
        ++length;
    const bool isEnd = rest().substr(0, length) == "end";
    return token(isEnd ? QuillToken::End : QuillToken::Identifier, length);
}

QuillNode QuillLexer::number() {
    std::size_t length = 0;
    if (peek() == '0' && (peek(1) | 0x20) == 'x' && isHexDigit(peek(2))) {
        length = 3;
        while (isHexDigit(peek(length)))
            ++length;
    } else {
        length = skipDigits(0);
        // The dot of an operator or of a continuation does not belong to the number: 5.^2 is 5 .^ 2.
        if (peek(length) == '.' && dottedOperator(peek(length + 1)) == nullptr && !isBlank(length))
            length = skipDigits(length + 1);
        if ((peek(length) | 0x20) == 'e') {
            const bool sign = peek(length + 1) == '+' || peek(length + 1) == '-';
            const std::size_t exponent = length + (sign ? 2 : 1);
            if (isDigit(peek(exponent)))
                length = skipDigits(exponent);
        }
    }
    const Class afterSuffix = classOf(peek(length + 1));
    if ((peek(length) == 'i' || peek(length) == 'j') && afterSuffix != Class::Letter && afterSuffix != Class::Digit)
        return token(QuillToken::ImaginaryNumber, length + 1);
    return token(QuillToken::Number, length);
}

QuillNode QuillLexer::quotedText() {
    const char quote = peek();
    std::size_t close = position_;
    do {
        close = text_.find(quote, close + 1);
        if (close == std::string_view::npos)
            return here(QuillToken::Text, 0);
        ++close;
    } while (close < text_.size() && text_[close] == quote);
    return token(QuillToken::Text, close - position_);
}

const QuillOperator* QuillLexer::operatorHere() const {
    const char second = peek(1);
    switch (peek()) {
    case '|':
        return second == '|' ? &orOperator : &singleOr;
    case '&':
        return second == '&' ? &andOperator : &singleAnd;
    case '=':
        return second == '=' ? &equal : nullptr;
    case '~':
    case '!':
        return second == '=' ? &notEqual : nullptr;
    case '<':
        return second == '=' ? &lessEqual : &less;
    case '>':
        return second == '=' ? &greaterEqual : &greater;
    case '+':
        return &plus;
    case '-':
        return &minus;
    case '*':
        return &times;
    case '/':
        return &divide;
    case '\\':
        return &leftDivide;
    case '^':
        return &power;
    case '\'':
        return &transpose;
    case '.':
        return dottedOperator(second);
    default:
        return nullptr;
    }
}

} // namespace VT::Embedded
