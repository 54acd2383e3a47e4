// UTF-16 to UTF-8, one code point at a time; a surrogate without its partner becomes U+FFFD.
//
// Linear in the text.
#include "host/Text.hpp"

namespace {

constexpr char32_t replacement = 0xfffd;

bool isHighSurrogate(char16_t unit) {
    return unit >= 0xd800 && unit <= 0xdbff;
}

bool isLowSurrogate(char16_t unit) {
    return unit >= 0xdc00 && unit <= 0xdfff;
}

void appendUtf8(std::string& text, char32_t point) {
    const auto append = [&text](char32_t byte) { text.push_back(static_cast<char>(byte)); };
    const auto appendTail = [&](unsigned shift) { append(0x80U | (point >> shift & 0x3fU)); };
    if (point < 0x80) {
        append(point);
    } else if (point < 0x800) {
        append(0xc0U | point >> 6U);
        appendTail(0);
    } else if (point < 0x10000) {
        append(0xe0U | point >> 12U);
        appendTail(6);
        appendTail(0);
    } else {
        append(0xf0U | point >> 18U);
        appendTail(12);
        appendTail(6);
        appendTail(0);
    }
}

} // namespace

std::string cvt_ustring_string(std::u16string_view text) {
    std::string result;
    result.reserve(text.size());
    for (std::size_t at = 0; at < text.size(); ++at) {
        char32_t point = text[at];
        if (isHighSurrogate(text[at]) && at + 1 < text.size() && isLowSurrogate(text[at + 1]))
            point = 0x10000 + ((point - 0xd800) << 10U) + (text[++at] - 0xdc00U);
        else if (isHighSurrogate(text[at]) || isLowSurrogate(text[at]))
            point = replacement;
        appendUtf8(result, point);
    }
    return result;
}
