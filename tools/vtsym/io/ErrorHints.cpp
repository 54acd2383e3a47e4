// Recognises common slips by the characters at which reading a condition ends.
//
// Method: a table of beginnings, the first of which counts; brackets are counted over the whole text.  Linear in the
// text.
#include "tools/vtsym/io/ErrorHints.hpp"

#include <algorithm>
#include <array>
#include <cctype>

namespace vtsym {

namespace {

struct Slip {
    std::string_view beginning;
    std::string_view hint;
};

constexpr auto slips = std::to_array<Slip>({
    {"===", "write == to compare"},
    {"=>", "write >="},
    {"=<", "write <="},
    {":=", "write == to compare"},
    {"<>", "write != for different"},
    {"~=", "C text writes != for different"},
    {"\xE2\x89\xA0", "write != for different"},
    {"\xE2\x89\xA5", "write >="},
    {"\xE2\x89\xA4", "write <="},
    {"and ", "write &&"},
    {"or ", "write ||"},
    {"AND ", "write &&"},
    {"OR ", "write ||"},
    {")", "no bracket is open here"},
    {"#", "write the condition without the directive"},
    {"?", "write a condition without ?:"},
    {";", "write the condition alone"},
    {"//", "write the condition without a comment"},
});

bool isDigitAt(std::string_view text, std::size_t at) {
    return at < text.size() && std::isdigit(static_cast<unsigned char>(text[at])) != 0;
}

/// Whether a text opens more brackets than it closes.
bool isOpen(std::string_view text) {
    return std::ranges::count(text, '(') > std::ranges::count(text, ')');
}

/// Whether nothing but white space follows an operator of two characters.
bool endsAfterOperator(std::string_view rest) {
    return (rest.starts_with("&&") || rest.starts_with("||")) && rest.find_first_not_of(" \t\r\n", 2) == rest.npos;
}

} // namespace

std::string_view errorHint(std::string_view text, std::size_t offset) {
    const std::string_view rest = text.substr(std::min(offset, text.size()));
    for (const Slip& slip : slips)
        if (rest.starts_with(slip.beginning))
            return slip.hint;
    if (rest.starts_with("=") && !rest.starts_with("=="))
        return "write == to compare";
    if (endsAfterOperator(rest))
        return "write an operand after it";
    if (rest.starts_with("(") && isOpen(rest))
        return "this bracket is not closed";
    if (isDigitAt(rest, 0))
        return "integers have 32 bits";
    if (offset > 0 && isDigitAt(text, offset - 1)) {
        if (rest.starts_with("x") || rest.starts_with("X"))
            return "write integers in decimal";
        if (rest.find_first_of("uUlL") == 0)
            return "write integers without a suffix";
    }
    return {};
}

} // namespace vtsym
