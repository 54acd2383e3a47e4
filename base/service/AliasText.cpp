// Puts negative literals in parentheses, so that an alias means the same in every operand's place: `-1` after a minus,
// or before a power, would read differently.  Linear in the text.
#include "base/service/AliasText.hpp"

#include <algorithm>
#include <string_view>
#include <utility>

namespace VT {

namespace {

constexpr std::string_view blanks = " \t\r\n";
constexpr std::string_view digits = "0123456789";

std::string_view trimmed(std::string_view text) {
    text.remove_prefix(std::min(text.find_first_not_of(blanks), text.size()));
    return text.substr(0, text.find_last_not_of(blanks) + 1);
}

/// Whether a text is a preprocessing number of C, in any base and with any suffix.
bool isNumber(std::string_view text) {
    const std::string_view begin = text.substr(text.starts_with('.') ? 1 : 0);
    if (begin.empty() || digits.find(begin.front()) == std::string_view::npos)
        return false;
    char before = '\0';
    for (const char c : text) {
        const bool isLetter = (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z');
        const bool isSign = (c == '+' || c == '-') && std::string_view("eEpP").find(before) != std::string_view::npos;
        if (!isLetter && !isSign && c != '.' && c != '_' && c != '\'' && digits.find(c) == std::string_view::npos)
            return false;
        before = c;
    }
    return true;
}

bool isNegativeLiteral(std::string_view text) {
    text = trimmed(text);
    if (!text.starts_with('-'))
        return false;
    text = trimmed(text.substr(1));
    return isNumber(text) || text == "Inf" || text == "NaN";
}

} // namespace

std::string aliasText(std::string text) {
    return isNegativeLiteral(text) ? '(' + std::move(text) + ')' : text;
}

} // namespace VT
