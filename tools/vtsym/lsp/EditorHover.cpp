// What a hover says about a line.  Linear in the text before it.
#include "base/scan/regions/BuiltCondition.hpp"
#include "host/Text.hpp"
#include "tools/vtsym/lsp/EditorAnswers.hpp"
#include "tools/vtsym/lsp/ServerBounds.hpp"

#include "base/core/Limits.hpp"

#include <algorithm>

namespace vtsym {

namespace {

/// Texts of a hover, in Markdown or plain.
class HoverText {
public:
    explicit HoverText(bool markdown) : markdown_(markdown) {}

    /// Code in a line: between more backquotes than it has in a row.
    [[nodiscard]] std::string code(const std::string& text) const {
        std::string shown = VT::shownText(text, VT::limits::quotedBytes);
        if (!markdown_)
            return shown;
        std::size_t most = 0;
        std::size_t run = 0;
        for (const char c : shown) {
            run = c == '`' ? run + 1 : 0;
            most = std::max(most, run);
        }
        const std::string fence(most + 1, '`');
        const char* const blank = most > 0 ? " " : "";
        return fence + blank + shown + blank + fence;
    }

    /// A sentence that quotes a source, whose characters have no meaning in Markdown.
    [[nodiscard]] std::string plain(const std::string& text) const {
        std::string shown = VT::shownText(text, VT::limits::quotedBytes);
        if (!markdown_)
            return shown;
        std::string escaped;
        for (const char c : shown) {
            if (std::string_view("\\`*_{}[]<>()#+-.!|~&").find(c) != std::string_view::npos)
                escaped.push_back('\\');
            escaped.push_back(c);
        }
        return escaped;
    }

    void paragraph(const std::string& text) { text_.append(text_.empty() ? "" : "\n\n").append(text); }

    void item(const std::string& text) {
        text_.append(isInList_ ? "\n- " : "\n\n- ").append(text);
        isInList_ = true;
    }

    [[nodiscard]] Json value() const { return {{"kind", markdown_ ? "markdown" : "plaintext"}, {"value", text_}}; }

private:
    bool markdown_;
    bool isInList_ = false;
    std::string text_;
};

void describeCondition(HoverText& out, const VT::BuiltCondition& built, bool isAfterElse, const char* what) {
    if (isAfterElse) {
        out.paragraph("No condition: this branch is after #else.");
        return;
    }
    if (built.condition == "1")
        out.paragraph(std::string(what) + " always.");
    else if (built.condition == "0")
        out.paragraph(std::string(what) + " never.");
    else if (!built.condition.empty())
        out.paragraph(std::string(what) + " where " + out.code(built.condition));
    else
        out.paragraph(std::string(what) + " where all of these are so:");
}

void listDirectives(HoverText& out, const VT::ConditionalRegions& regions, const std::vector<VT::BuiltPart>& parts) {
    const std::size_t left = parts.size() - std::min(parts.size(), mostHoverDirectives);
    if (left > 0)
        out.item(std::to_string(left) + " more directives around these");
    for (std::size_t i = left; i < parts.size(); ++i) {
        const VT::ConditionalRegion& region = regions[parts[i].region];
        if (region.kind != VT::DirectiveKind::Else)
            out.item(out.code(region.directive) + " (line " + std::to_string(region.line) + ") " +
                     (parts[i].holds ? "holds" : "does not hold"));
    }
}

} // namespace

Json hoverAt(const OpenDocument& document, std::size_t byte, const EditorAbilities& abilities) {
    const DocumentAnalysis& analysis = *document.analysis;
    const VT::ConditionalRegions& regions = analysis.regions;
    const auto [lineBegin, lineEnd] = document.text.lineRange(document.text.lineOf(byte));
    const VT::ConditionalEnd* const ended = regions.endWithin(lineBegin, lineEnd);
    std::uint32_t region = regions.at(byte);
    if (ended != nullptr)
        region = regions[ended->chain].parent;
    if (region == VT::ConditionalRegions::none && ended == nullptr)
        return nullptr;
    HoverText out(abilities.markdown);
    if (ended != nullptr)
        out.paragraph("Ends " + out.code(regions[ended->chain].directive) + " (line " +
                      std::to_string(regions[ended->chain].line) + ")");
    std::vector<VT::BuiltPart> parts;
    if (region == VT::ConditionalRegions::none) {
        out.paragraph("What follows is built always.");
    } else {
        VT::BuiltCondition built =
            VT::builtCondition(document.text.text(), document.kind == DocumentKind::Cpp, regions, region);
        parts = std::move(built.parts);
        const bool isUnbuilt = std::ranges::any_of(analysis.marks, [&](const DocumentMark& mark) {
            return mark.isUnbuilt && mark.begin <= regions[region].bodyBegin && regions[region].bodyEnd <= mark.end;
        });
        if (isUnbuilt) // the build or an assumption may be why
            built.condition = "0";
        describeCondition(out, built, regions[region].isAfterElse,
                          ended != nullptr ? "What follows is built" : "Built");
        if (parts.size() > 1 || built.condition.empty())
            listDirectives(out, regions, parts);
        if (!built.witness.empty() && built.condition != "0" && built.condition != "1")
            out.paragraph("For example with " + out.code(built.witness));
    }
    for (const DocumentMark& mark : analysis.marks) {
        const bool isAround = std::ranges::any_of(
            parts, [&](const VT::BuiltPart& part) { return part.holds && part.region == mark.region; });
        if (isAround && !mark.isUnbuilt)
            out.paragraph(out.plain(mark.explanation));
    }
    Json hover{{"contents", out.value()}};
    if (ended != nullptr)
        hover["range"] = rangeOf(document.text, ended->begin, ended->end);
    else if (byte < regions[region].bodyBegin)
        hover["range"] = rangeOf(document.text, regions[region].begin, regions[region].end);
    return hover;
}

} // namespace vtsym
