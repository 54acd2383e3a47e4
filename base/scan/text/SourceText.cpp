// Passes over splices, comments and literals.
//
// Method: comments are searched for their last byte, which the standard library finds many bytes at a time; a block
// comment's is the slash, since lines of comments begin with stars.  What precedes it is read backwards.
#include "base/scan/text/SourceText.hpp"

#include <algorithm>

namespace VT {

std::size_t SourceText::afterBackslashes(std::size_t place) const {
    while (at(place) == '\\') {
        std::size_t end = place + 1;
        while (end < text_.size() && byteClass(text_[end]) == SourceByte::Blank)
            ++end;
        if (at(end) != '\n')
            break;
        place = end + 1;
    }
    return place;
}

namespace {

/// Returns the place of the backslash that splices a line end away; the line end's own place where none does.  Looks no
/// further back than `begin`.
std::size_t spliceAt(std::string_view text, std::size_t begin, std::size_t lineEnd) {
    std::size_t last = lineEnd;
    while (last > begin && byteClass(text[last - 1]) == SourceByte::Blank)
        --last;
    return last > begin && text[last - 1] == '\\' ? last - 1 : lineEnd;
}

/// Returns the place before the splices that end at a place.
std::size_t beforeSplices(std::string_view text, std::size_t begin, std::size_t place) {
    while (place > begin && text[place - 1] == '\n') {
        const std::size_t splice = spliceAt(text, begin, place - 1);
        if (splice == place - 1)
            break;
        place = splice;
    }
    return place;
}

} // namespace

std::uint64_t countLineEnds(std::string_view text) {
    constexpr std::size_t block = 128; // whose count fits a byte
    std::uint64_t count = 0;
    for (; text.size() >= block; text.remove_prefix(block)) {
        std::uint8_t inBlock = 0;
        for (std::size_t i = 0; i < block; ++i)
            inBlock = static_cast<std::uint8_t>(inBlock + (text[i] == '\n' ? 1 : 0));
        count += inBlock;
    }
    return count + static_cast<std::uint64_t>(std::ranges::count(text, '\n'));
}

bool SourceText::beginsComment(std::size_t place) const {
    if (at(place) != '/')
        return false;
    const char next = at(afterSplices(place + 1));
    return next == '/' || next == '*';
}

std::size_t SourceText::afterComment(std::size_t place) const {
    place = afterSplices(place + 1);
    const bool isBlock = at(place) == '*';
    const std::size_t begin = ++place;
    for (; (place = text_.find(isBlock ? '/' : '\n', place)) != std::string_view::npos; ++place) {
        if (!isBlock && spliceAt(text_, begin, place) == place)
            return place;
        if (isBlock) {
            const std::size_t star = beforeSplices(text_, begin, place);
            if (star > begin && text_[star - 1] == '*')
                return place + 1;
        }
    }
    return text_.size();
}

std::size_t SourceText::afterQuoted(std::size_t place) const {
    const char quote = text_[place++];
    while (place < text_.size() && text_[place] != quote && text_[place] != '\n') {
        if (text_[place] != '\\') {
            ++place;
            continue;
        }
        const std::size_t next = afterSplices(place);
        place = next != place ? next : afterSplices(place + 1) + 1; // a splice, or an escaped character
    }
    return at(place) == quote ? place + 1 : std::min(place, text_.size());
}

std::size_t SourceText::afterHeaderName(std::size_t place) const {
    for (std::size_t at = place; at < text_.size() && text_[at] != '\n'; at = std::max(at + 1, afterSplices(at)))
        if (text_[at] == '>')
            return at + 1;
    return place;
}

} // namespace VT
