// Lines and columns of a file.  Columns are counted from the beginning of the line, in code points; a byte that is not
// UTF-8 counts as one.  Nothing is kept: findings are few.
#include "base/scan/report/SourcePlaces.hpp"

#include <algorithm>

namespace VT {

namespace {

/// Returns the length of the character at a place in bytes; 1 for a byte that is not UTF-8.
std::size_t characterLength(std::string_view text, std::size_t at) {
    const auto lead = static_cast<unsigned char>(text[at]);
    const std::size_t length = lead < 0xC2 ? 1 : lead < 0xE0 ? 2 : lead < 0xF0 ? 3 : lead < 0xF5 ? 4 : 1;
    for (std::size_t i = 1; i < length; ++i)
        if (at + i >= text.size() || (static_cast<unsigned char>(text[at + i]) & 0xC0U) != 0x80U)
            return 1;
    return length;
}

std::size_t lineStart(std::string_view text, std::size_t place) {
    const std::size_t before = place == 0 ? std::string_view::npos : text.rfind('\n', place - 1);
    const std::size_t start = before == std::string_view::npos ? 0 : before + 1;
    return start == 0 && text.starts_with("\xEF\xBB\xBF") ? std::min<std::size_t>(3, place) : start;
}

std::uint64_t columnOf(std::string_view text, std::size_t place) {
    std::uint64_t column = 1;
    for (std::size_t at = lineStart(text, place); at < place; at += characterLength(text, at))
        ++column;
    return column;
}

} // namespace

SourceRegion regionOf(std::string_view text, std::size_t anchor, std::uint64_t line, std::size_t begin,
                      std::size_t end) {
    const auto lines = [&](std::size_t from, std::size_t to) {
        const std::string_view between = text.substr(from, to - from);
        return static_cast<std::uint64_t>(std::ranges::count(between, '\n'));
    };
    SourceRegion region;
    region.line = line + lines(anchor, begin);
    region.column = columnOf(text, begin);
    region.endLine = region.line + lines(begin, end);
    region.endColumn = columnOf(text, end);
    return region;
}

} // namespace VT
