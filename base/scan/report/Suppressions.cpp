// Reads comments that suppress findings.
//
// Method: the reader of directives notes the comments that it passes.  One that begins with the mark belongs to the
// directive on whose line it is, or to the one that follows it after a line end and blanks.
// Cost: linear in the text; a file without the mark is only searched for it.
#include "base/scan/report/Suppressions.hpp"

#include "base/scan/report/DirectiveTexts.hpp"
#include "base/scan/report/SourcePlaces.hpp"

#include <algorithm>

namespace VT {

namespace {

constexpr std::string_view mark = "vtsym:";
constexpr std::string_view blanks = " \t\r\n\v\f";

std::string_view trimmed(std::string_view text) {
    const std::size_t first = text.find_first_not_of(blanks);
    return first == std::string_view::npos ? std::string_view()
                                           : text.substr(first, text.find_last_not_of(blanks) - first + 1);
}

/// Returns a comment without its marks.
std::string_view contentOf(std::string_view comment) {
    const bool isBlock = comment.starts_with("/*");
    comment.remove_prefix(std::min<std::size_t>(2, comment.size()));
    if (isBlock && comment.ends_with("*/"))
        comment.remove_suffix(2);
    return trimmed(comment);
}

/// Returns a text with one blank for any run of them.
std::string onOneLine(std::string_view text) {
    std::string line;
    for (const char c : text) {
        const bool isBlank = blanks.find(c) != std::string_view::npos;
        if (!isBlank)
            line.push_back(c);
        else if (!line.ends_with(' '))
            line.push_back(' ');
    }
    return line;
}

/// Reads what follows the mark: `keep KIND..., REASON`.
void readRequest(std::string_view request, Suppression& suppression) {
    const std::size_t comma = request.find(',');
    const std::string_view reason =
        comma == std::string_view::npos ? std::string_view() : trimmed(request.substr(comma + 1));
    std::string_view words = trimmed(request.substr(0, comma));
    bool isFirst = true;
    bool keeps = false;
    while (!words.empty()) {
        const std::size_t end = std::min(words.find_first_of(blanks), words.size());
        const std::string_view word = words.substr(0, end);
        if (isFirst)
            keeps = word == "keep";
        else
            suppression.kinds.emplace_back(word);
        isFirst = false;
        words = trimmed(words.substr(end));
    }
    suppression.reason = onOneLine(reason);
    suppression.asksToKeep = keeps;
    suppression.isMalformed = !keeps || reason.empty();
}

} // namespace

bool Suppression::covers(std::uint64_t directive, std::string_view kind) const {
    return !isMalformed && line == directive && (kinds.empty() || std::ranges::find(kinds, kind) != kinds.end());
}

std::vector<Suppression> readSuppressions(std::string_view text) {
    if (text.find(mark) == std::string_view::npos)
        return {};
    std::vector<CommentPlace> comments;
    std::vector<Suppression> found;
    std::vector<std::size_t> ends; // of the comments found
    std::size_t anchor = 0;        // a place of a known line
    std::uint64_t line = 1;
    std::size_t read = 0;    // comments
    std::size_t waiting = 0; // suppressions that no directive has taken
    DirectiveReader reader(text);
    reader.noteComments(&comments);
    const auto readUpTo = [&](std::size_t count) {
        for (; read < count; ++read) {
            const CommentPlace place = comments[read];
            const std::string_view content = contentOf(text.substr(place.begin, place.end - place.begin));
            if (!content.starts_with(mark))
                continue;
            Suppression suppression{regionOf(text, anchor, line, place.begin, place.end), onOneLine(content), {}};
            anchor = place.begin;
            line = suppression.region.line;
            readRequest(content.substr(mark.size()), suppression);
            found.push_back(std::move(suppression));
            ends.push_back(place.end);
        }
    };
    for (Directive directive; reader.next(directive);) {
        const auto isBefore = [&](const CommentPlace& place) { return place.begin < directive.begin; };
        const auto own = std::ranges::partition_point(comments, isBefore);
        readUpTo(static_cast<std::size_t>(own - comments.begin()));
        const std::size_t before = found.size();
        readUpTo(comments.size());
        const bool hasCondition = opensChain(directive.kind) || continuesChain(directive.kind);
        if (hasCondition) {
            for (std::size_t i = before; i < found.size(); ++i)
                found[i].line = directive.line;
            if (before > waiting) { // alone before the directive
                const std::string_view between = text.substr(ends[before - 1], directive.begin - ends[before - 1]);
                if (between.find_first_not_of(blanks) == std::string_view::npos &&
                    std::ranges::count(between, '\n') == 1)
                    found[before - 1].line = directive.line;
            }
        }
        waiting = found.size();
    }
    readUpTo(comments.size());
    std::erase_if(found, [](const Suppression& each) { return !each.line && !each.asksToKeep; }); // prose
    return found;
}

} // namespace VT
