// Numbers as text and back through <charconv>, which is exact and knows no locale.
//
// Digits come from the shortest or the 17-digit scientific form and are laid out anew.  Linear in the text.
#include "host/Numbers.hpp"

#include <algorithm>
#include <array>
#include <charconv>
#include <cmath>

namespace {

constexpr int smallestFixedExponent = -5;
constexpr int largestFixedExponent = 20;

/// The digits of a finite number and the decimal exponent of the first of them.
struct Decimal {
    std::string digits;
    int exponent = 0;
};

Decimal decimalOf(double magnitude, bool shortest) {
    std::array<char, 32> buffer{};
    char* const end = buffer.data() + buffer.size();
    const auto written = shortest ? std::to_chars(buffer.data(), end, magnitude, std::chars_format::scientific)
                                  : std::to_chars(buffer.data(), end, magnitude, std::chars_format::scientific, 16);
    const std::string_view text(buffer.data(), static_cast<std::size_t>(written.ptr - buffer.data()));
    const std::size_t mark = text.find('e');
    Decimal decimal;
    for (const char c : text.substr(0, mark))
        if (c != '.')
            decimal.digits.push_back(c);
    decimal.digits.resize(std::max<std::size_t>(decimal.digits.find_last_not_of('0') + 1, 1));
    const bool plus = text[mark + 1] == '+'; // from_chars reads a minus sign only
    std::from_chars(text.data() + mark + (plus ? 2 : 1), text.data() + text.size(), decimal.exponent);
    return decimal;
}

std::string fixedText(Decimal decimal) {
    std::string& digits = decimal.digits;
    if (decimal.exponent < 0)
        return "0." + std::string(static_cast<std::size_t>(-decimal.exponent - 1), '0') + digits;
    const std::size_t whole = static_cast<std::size_t>(decimal.exponent) + 1;
    if (digits.size() <= whole)
        digits.append(whole - digits.size(), '0');
    else
        digits.insert(whole, 1, '.');
    return digits;
}

std::string scientificText(Decimal decimal) {
    if (decimal.digits.size() > 1)
        decimal.digits.insert(1, 1, '.');
    const std::string exponent = std::to_string(std::abs(decimal.exponent));
    return decimal.digits + (decimal.exponent < 0 ? "e-" : "e+") + (exponent.size() < 2 ? "0" : "") + exponent;
}

/// Whether a number that std::from_chars found out of range is too large rather than too small.
bool isTooLarge(std::string_view text) {
    const std::size_t mark = std::min(text.find_first_of("eE"), text.size());
    const std::string_view digits = text.substr(0, mark);
    const std::size_t point = std::min(digits.find('.'), digits.size());
    const std::size_t first = digits.find_first_of("123456789");
    if (first == std::string_view::npos)
        return false;
    // Decimal exponent of the first digit that is not zero.
    const auto position = static_cast<std::int64_t>(point) - static_cast<std::int64_t>(first) - (first < point ? 1 : 0);
    std::int64_t exponent = 0;
    if (mark < text.size()) {
        const std::size_t sign = text[mark + 1] == '+' ? 2 : 1;
        const auto read = std::from_chars(text.data() + mark + sign, text.data() + text.size(), exponent);
        if (read.ec == std::errc::result_out_of_range)
            return text[mark + 1] != '-';
    }
    return exponent > -position;
}

} // namespace

std::string vtsv_dtoa(double value, bool shortest) {
    if (std::isnan(value))
        return "NaN";
    if (std::isinf(value))
        return value < 0 ? "-Inf" : "Inf";
    Decimal decimal = decimalOf(std::fabs(value), shortest);
    const bool fixed = decimal.exponent >= smallestFixedExponent && decimal.exponent <= largestFixedExponent;
    std::string text = fixed ? fixedText(std::move(decimal)) : scientificText(std::move(decimal));
    if (std::signbit(value))
        text.insert(0, 1, '-');
    return text;
}

VT::ParsedNumber vtsv_strtod(std::string_view text) {
    VT::ParsedNumber result;
    const std::size_t sign = text.starts_with('-') ? 1 : 0;
    const char* const end = text.data() + text.size();
    const auto isDigitOrPoint = [](char c) { return (c >= '0' && c <= '9') || c == '.'; };
    double value = 0.0;
    const auto read = std::from_chars(text.data(), end, value);
    // from_chars also reads the names of infinity and NaN.
    if (text.size() == sign || !isDigitOrPoint(text[sign]) || read.ec == std::errc::invalid_argument || read.ptr != end)
        result.error = VT::NumberError::Syntax;
    else if (read.ec == std::errc{} && std::isfinite(value))
        result.value = value;
    else if (isTooLarge(text))
        result.error = VT::NumberError::Overflow;
    else
        result.value = sign == 1 ? -0.0 : 0.0;
    return result;
}
