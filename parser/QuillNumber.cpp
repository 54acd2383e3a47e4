// Values of number tokens.  Short decimal integers, which are most of them, are computed directly and exactly; all
// others go through <charconv>.  Linear in the token.
#include "parser/QuillNumber.hpp"

#include <algorithm>
#include <charconv>
#include <cmath>

namespace VT {

namespace {

bool isDigit(char c) {
    return c >= '0' && c <= '9';
}

bool isHexDigit(char c) {
    return isDigit(c) || (c >= 'a' && c <= 'f') || (c >= 'A' && c <= 'F');
}

ParsedNumber hexadecimal(std::string_view digits) {
    ParsedNumber number;
    if (digits.empty() || !std::ranges::all_of(digits, isHexDigit)) {
        number.error = NumberError::Syntax;
        return number;
    }
    const auto read =
        std::from_chars(digits.data(), digits.data() + digits.size(), number.value, std::chars_format::hex);
    if (read.ec != std::errc{} || !std::isfinite(number.value))
        number = {0.0, NumberError::Overflow};
    return number;
}

} // namespace

ParsedNumber quillNumber(std::string_view token) {
    constexpr std::size_t exactDigits = 15;
    if (token.size() <= exactDigits && !token.empty() && std::ranges::all_of(token, isDigit)) {
        double value = 0;
        for (const char digit : token)
            value = 10 * value + (digit - '0');
        return {value, NumberError::None};
    }
    if (token.starts_with("0x") || token.starts_with("0X"))
        return hexadecimal(token.substr(2));
    return vtsv_strtod(token);
}

} // namespace VT
