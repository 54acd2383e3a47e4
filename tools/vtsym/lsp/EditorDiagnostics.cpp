// Diagnostics and the actions that resolve them.  Linear in the marks.
#include "tools/vtsym/io/Uris.hpp"
#include "tools/vtsym/lsp/EditorAnswers.hpp"
#include "tools/vtsym/lsp/ServerBounds.hpp"

#include <algorithm>
#include <filesystem>

namespace vtsym {

namespace {

constexpr int unnecessaryTag = 1;

Json positionOf(const TextDocument& text, std::size_t byte) {
    const TextPosition position = text.positionOf(byte);
    return {{"line", position.line}, {"character", position.character}};
}

/// The place of another directive: its range, or the line of another file.
Json locationOf(const OpenDocument& document, const MarkPlace& place) {
    if (place.file.empty())
        return {{"uri", document.uri}, {"range", rangeOf(document.text, place.begin, place.end)}};
    const Json start{{"line", place.line - 1}, {"character", 0}};
    std::error_code error;
    const std::filesystem::path path = std::filesystem::absolute(place.file, error);
    return {{"uri", uriOf(error ? place.file : path.lexically_normal().string())},
            {"range", {{"start", start}, {"end", start}}}};
}

Json diagnosticOf(const OpenDocument& document, const DocumentMark& mark, const EditorAbilities& abilities) {
    Json diagnostic{{"range", rangeOf(document.text, mark.begin, mark.end)},
                    {"severity", static_cast<int>(mark.level)},
                    {"code", mark.kind},
                    {"source", "vtsym"},
                    {"message", mark.sentence}};
    if (abilities.relatedPlaces && !mark.related.empty()) {
        Json& related = diagnostic["relatedInformation"] = Json::array();
        for (const MarkPlace& place : mark.related)
            related.push_back({{"location", locationOf(document, place)}, {"message", place.text}});
    }
    if (mark.isUnbuilt)
        diagnostic["tags"] = {unnecessaryTag};
    return diagnostic;
}

/// Whether an action of a kind is asked for: of that kind, or of one that it belongs to.
bool isWanted(const Json& only, std::string_view kind) {
    if (!only.is_array())
        return true;
    return std::ranges::any_of(only, [&](const Json& wanted) {
        const std::string name = wanted.is_string() ? wanted.get<std::string>() : "-";
        return name.empty() || (kind.starts_with(name) && (kind.size() == name.size() || kind[name.size()] == '.'));
    });
}

Json editOf(const OpenDocument& document, const std::vector<VT::SourceEdit>& edits, const EditorAbilities& abilities) {
    Json changes = Json::array();
    for (const VT::SourceEdit& edit : edits)
        changes.push_back({{"range", rangeOf(document.text, edit.begin, edit.end)}, {"newText", edit.text}});
    if (!abilities.versionedEdits)
        return {{"changes", {{document.uri, std::move(changes)}}}};
    const Json version = document.version ? Json(*document.version) : Json(nullptr);
    Json versioned{{"textDocument", {{"uri", document.uri}, {"version", version}}}, {"edits", std::move(changes)}};
    return {{"documentChanges", Json::array({std::move(versioned)})}};
}

/// All changes of a document that do not overlap: of those to one condition the last, which knows most of the build.
std::vector<VT::SourceEdit> allEdits(const OpenDocument& document) {
    std::vector<VT::SourceEdit> edits;
    for (const DocumentMark& mark : document.analysis->marks)
        if (mark.edit)
            edits.push_back(*mark.edit);
    std::ranges::stable_sort(edits, {}, &VT::SourceEdit::begin);
    std::vector<VT::SourceEdit> kept;
    for (VT::SourceEdit& edit : edits) {
        if (!kept.empty() && edit.begin < kept.back().end)
            kept.pop_back();
        kept.push_back(std::move(edit));
    }
    return kept;
}

} // namespace

Json rangeOf(const TextDocument& text, std::size_t begin, std::size_t end) {
    return {{"start", positionOf(text, begin)}, {"end", positionOf(text, end)}};
}

Json diagnosticsOf(const OpenDocument& document, const EditorAbilities& abilities) {
    Json diagnostics = Json::array();
    const std::vector<DocumentMark>& marks = document.analysis->marks;
    std::size_t left = 0;
    for (const DocumentMark& mark : marks) {
        if (mark.isUnbuilt && !abilities.tags)
            continue;
        if (diagnostics.size() == mostDiagnostics)
            ++left;
        else
            diagnostics.push_back(diagnosticOf(document, mark, abilities));
    }
    if (left > 0) {
        diagnostics.push_back({{"range", rangeOf(document.text, 0, 0)},
                               {"severity", static_cast<int>(MarkLevel::Information)},
                               {"code", "left-out"},
                               {"source", "vtsym"},
                               {"message", std::to_string(left) + " more findings are left out; vtsym scan has all"}});
    }
    Json params{{"uri", document.uri}, {"diagnostics", std::move(diagnostics)}};
    if (document.version)
        params["version"] = *document.version;
    return params;
}

Json actionsFor(const OpenDocument& document, std::size_t begin, std::size_t end, const Json& only,
                const EditorAbilities& abilities) {
    Json actions = Json::array();
    if (!abilities.literalActions)
        return actions;
    for (const DocumentMark& mark : document.analysis->marks) {
        if (!mark.edit || mark.begin > end || mark.end < begin || !isWanted(only, "quickfix"))
            continue;
        if (actions.size() == mostDiagnostics)
            break;
        actions.push_back({{"title", mark.action},
                           {"kind", "quickfix"},
                           {"isPreferred", true},
                           {"diagnostics", Json::array({diagnosticOf(document, mark, abilities)})},
                           {"edit", editOf(document, {*mark.edit}, abilities)}});
    }
    if (isWanted(only, "source.fixAll.vtsym")) {
        if (const std::vector<VT::SourceEdit> edits = allEdits(document); !edits.empty()) {
            actions.push_back({{"title", "Write all proposals of this file"},
                               {"kind", "source.fixAll.vtsym"},
                               {"edit", editOf(document, edits, abilities)}});
        }
    }
    return actions;
}

} // namespace vtsym
