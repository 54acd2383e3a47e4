// Writes unified diffs.
//
// Method: each change covers whole lines; changes whose contexts meet become one hunk.  A name with bytes that the
// format would not keep is quoted as git does.
// Cost: linear in the text.
#include "tools/vtsym/findings/source/Patch.hpp"

#include <algorithm>
#include <cstdint>

namespace vtsym {

namespace {

constexpr std::size_t context = 3;

/// The lines of a text, each with its end.
std::vector<std::string_view> linesOfText(std::string_view text) {
    std::vector<std::string_view> lines;
    while (!text.empty()) {
        const std::size_t end = std::min(text.find('\n'), text.size() - 1);
        lines.push_back(text.substr(0, end + 1));
        text.remove_prefix(end + 1);
    }
    return lines;
}

/// A name in a header of a patch.
std::string headerName(std::string_view side, std::string_view path) {
    std::string name(side);
    bool isQuoted = false;
    for (const char c : path) {
        const auto byte = static_cast<unsigned char>(c);
        if (c == '"' || c == '\\') {
            name.append("\\").push_back(c);
        } else if (byte < 0x20 || byte >= 0x7f) {
            name.append("\\");
            for (const unsigned shift : {6U, 3U, 0U})
                name.push_back(static_cast<char>('0' + ((byte >> shift) & 7U)));
        } else {
            name.push_back(c);
            continue;
        }
        isQuoted = true;
    }
    return isQuoted ? "\"" + name + "\"" : name;
}

void appendLines(std::string& patch, char mark, const std::vector<std::string_view>& lines, std::size_t begin,
                 std::size_t end) {
    for (std::size_t i = begin; i < end; ++i) {
        patch.append(1, mark).append(lines[i]);
        if (!lines[i].ends_with('\n'))
            patch.append("\n\\ No newline at end of file\n");
    }
}

/// Lines that change: from `begin` to before `end`, and what they become.
struct Change {
    std::size_t begin;
    std::size_t end;
    std::string text;
};

/// Returns the changes by whole lines; those of one line are joined.
std::vector<Change> changesOf(const std::vector<std::string_view>& lines, std::string_view text,
                              const std::vector<VT::SourceEdit>& edits) {
    std::vector<Change> changes;
    std::size_t line = 0;
    for (std::size_t first = 0; first < edits.size();) {
        const auto offset = [&](std::size_t at) {
            return at < lines.size() ? static_cast<std::size_t>(lines[at].data() - text.data()) : text.size();
        };
        while (offset(line + 1) <= edits[first].begin && line + 1 < lines.size())
            ++line;
        std::size_t end = line + 1;
        std::size_t last = first;
        for (; last < edits.size() && edits[last].begin < offset(end); ++last)
            while (offset(end) < edits[last].end)
                ++end;
        std::vector<VT::SourceEdit> own(edits.begin() + static_cast<std::ptrdiff_t>(first),
                                        edits.begin() + static_cast<std::ptrdiff_t>(last));
        const std::size_t begin = offset(line);
        for (VT::SourceEdit& edit : own) {
            edit.begin -= begin;
            edit.end -= begin;
        }
        std::string written = VT::withEdits(text.substr(begin, offset(end) - begin), own);
        std::size_t same = 0; // lines at the beginning
        while (same < end - line && std::string_view(written).starts_with(lines[line + same])) {
            written.erase(0, lines[line + same].size());
            ++same;
        }
        changes.push_back({line + same, end, std::move(written)});
        line = end - 1;
        first = last;
    }
    return changes;
}

std::string rangeText(std::size_t begin, std::size_t count) {
    return std::to_string(count == 0 ? begin : begin + 1) + "," + std::to_string(count);
}

} // namespace

std::string patchOf(std::string_view path, std::string_view text, const std::vector<VT::SourceEdit>& edits) {
    if (edits.empty())
        return {};
    path.remove_prefix(std::min(path.find_first_not_of('/'), path.size()));
    const std::vector<std::string_view> lines = linesOfText(text);
    const std::vector<Change> changes = changesOf(lines, text, edits);
    std::string patch = "diff --git " + headerName("a/", path) + " " + headerName("b/", path) + "\n--- " +
                        headerName("a/", path) + "\n+++ " + headerName("b/", path) + "\n";
    std::ptrdiff_t grown = 0; // lines, by the hunks before
    for (std::size_t first = 0; first < changes.size();) {
        std::size_t last = first + 1;
        while (last < changes.size() && changes[last].begin <= changes[last - 1].end + 2 * context)
            ++last;
        const std::size_t begin = changes[first].begin - std::min(context, changes[first].begin);
        const std::size_t end = std::min(changes[last - 1].end + context, lines.size());
        std::string body;
        std::size_t at = begin;
        std::ptrdiff_t growth = 0;
        for (std::size_t i = first; i < last; ++i) {
            const std::vector<std::string_view> written = linesOfText(changes[i].text);
            appendLines(body, ' ', lines, at, changes[i].begin);
            appendLines(body, '-', lines, changes[i].begin, changes[i].end);
            appendLines(body, '+', written, 0, written.size());
            at = changes[i].end;
            growth += static_cast<std::ptrdiff_t>(written.size()) -
                      static_cast<std::ptrdiff_t>(changes[i].end - changes[i].begin);
        }
        appendLines(body, ' ', lines, at, end);
        const auto moved = [](std::size_t number, std::ptrdiff_t by) {
            return static_cast<std::size_t>(static_cast<std::ptrdiff_t>(number) + by);
        };
        patch.append("@@ -").append(rangeText(begin, end - begin)).append(" +");
        patch.append(rangeText(moved(begin, grown), moved(end - begin, growth))).append(" @@\n").append(body);
        grown += growth;
        first = last;
    }
    return patch;
}

} // namespace vtsym
