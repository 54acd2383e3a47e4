// Shows texts in which anything may be: characters that a terminal would interpret, hide or reorder are escaped byte by
// byte.  Linear in the text.
#include "host/Text.hpp"

#include <algorithm>

namespace {

/// Controls, and what has no width or changes the direction of the text around it.
bool isInvisible(char32_t point) {
    const auto in = [point](char32_t first, char32_t last) { return point >= first && point <= last; };
    return in(0x80, 0x9f) || point == 0xad || point == 0x61c || point == 0x180e || in(0x200b, 0x200f) ||
           in(0x2028, 0x202e) || in(0x2060, 0x206f) || point == 0xfeff || in(0xfff9, 0xfffb) || in(0xe0000, 0xe007f);
}

} // namespace

std::size_t VT::plainCharacter(std::string_view text) {
    if (text.empty())
        return 0;
    const auto byte = [&text](std::size_t at) { return static_cast<unsigned char>(text[at]); };
    if (byte(0) < 0x80)
        return byte(0) >= 0x20 && byte(0) != 0x7f ? 1 : 0;
    const std::size_t length = byte(0) >= 0xf0 ? 4 : byte(0) >= 0xe0 ? 3 : 2;
    if (byte(0) < 0xc2 || byte(0) > 0xf4 || text.size() < length)
        return 0;
    char32_t point = byte(0) & (0x7fU >> length);
    for (std::size_t at = 1; at < length; ++at) {
        if ((byte(at) & 0xc0U) != 0x80U)
            return 0;
        point = point << 6U | (byte(at) & 0x3fU);
    }
    const bool overlong = (length == 3 && point < 0x800) || (length == 4 && point < 0x10000);
    const bool surrogate = point >= 0xd800 && point <= 0xdfff;
    return overlong || surrogate || point > 0x10ffff || isInvisible(point) ? 0 : length;
}

std::string VT::shownText(std::string_view text, std::size_t bound) {
    constexpr std::string_view digits = "0123456789abcdef";
    std::string shown;
    while (!text.empty()) {
        const std::size_t plain = plainCharacter(text);
        if (shown.size() + std::max<std::size_t>(plain, 1) > bound) {
            shown += "...";
            break;
        }
        if (plain > 0) {
            shown.append(text.substr(0, plain));
        } else {
            const auto byte = static_cast<unsigned char>(text.front());
            shown.append({'\\', 'x', digits[byte >> 4U], digits[byte & 15U]});
        }
        text.remove_prefix(std::max<std::size_t>(plain, 1));
    }
    return shown;
}
