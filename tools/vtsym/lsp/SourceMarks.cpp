// Scans sources for an editor.
//
// Method: the findings of SourceChecker, as bytes of the document.  A dead branch, and one that a constant switches
// off, is marked from its first line to its last as what no build has; of nested ones the outer. Cost: that of the
// scan, which answers from memory what did not change since the last one.
#include "tools/vtsym/lsp/SourceMarks.hpp"

#include <utility>

namespace vtsym {

namespace {

/// The place of another directive, or of a definition.
MarkPlace placeOf(const OpenDocument& document, const RelatedPlace& related) {
    if (related.place.file != document.path)
        return {related.place.file, related.place.line, 0, 0, related.text};
    return {{},
            0,
            document.text.byteOfPlace(related.place.line, related.place.column, true),
            document.text.byteOfPlace(related.place.endLine, related.place.endColumn, true),
            related.text};
}

DocumentMark markOf(const OpenDocument& document, const VT::ConditionalRegions& regions, FileFinding&& found) {
    const Finding& finding = found.finding;
    const Place& place = finding.place;
    DocumentMark mark;
    mark.begin = document.text.byteOfPlace(place.line, place.column, true);
    mark.end = document.text.byteOfPlace(place.endLine, place.endColumn, true);
    mark.level = finding.level == FindingLevel::Warning ? MarkLevel::Warning : MarkLevel::Information;
    mark.kind = finding.kind;
    mark.sentence = finding.message;
    mark.explanation = sentenceOf(finding);
    for (const RelatedPlace& related : finding.follows)
        if (!related.place.file.empty() && related.place.line > 0)
            mark.related.push_back(placeOf(document, related));
    mark.region = regions.onLine(place.line);
    if (found.edit && finding.proposed)
        mark.action = "Write '" + *finding.proposed + "'";
    mark.edit = std::move(found.edit);
    return mark;
}

/// Whether a finding holds in every build that is known.
bool isInEveryBuild(const Finding& finding) {
    return finding.configurations.empty() || finding.configurations.size() == finding.ofConfigurations;
}

/// The marks of branches that no build has.
std::vector<DocumentMark> unbuiltMarks(const VT::ConditionalRegions& regions, const std::vector<bool>& isDead) {
    std::vector<DocumentMark> marks;
    std::size_t marked = 0; // up to here
    for (std::uint32_t i = 0; i < regions.all().size(); ++i) {
        const VT::ConditionalRegion& region = regions[i];
        if ((!isDead[i] && !region.isSwitchedOff) || region.bodyBegin >= region.bodyEnd || region.begin < marked)
            continue;
        DocumentMark mark;
        mark.begin = region.bodyBegin;
        mark.end = region.bodyEnd;
        mark.level = MarkLevel::Hint;
        mark.kind = "unbuilt";
        mark.sentence = "'" + region.directive + "' (line " + std::to_string(region.line) + ") is never built";
        mark.region = i;
        mark.isUnbuilt = true;
        marks.push_back(std::move(mark));
        marked = region.bodyEnd;
    }
    return marks;
}

} // namespace

DocumentAnalysis analyseSource(SourceChecker& checker, const OpenDocument& document, const IsAccepted& isAccepted) {
    const std::string& text = document.text.text();
    DocumentAnalysis analysis{VT::ConditionalRegions(text), {}};
    const VT::ConditionalRegions& regions = analysis.regions;
    std::vector<bool> isDead(regions.all().size(), false);
    for (FileFinding& found : checker.check(document.path, text)) {
        if (isAccepted(found.finding))
            continue;
        const bool isUnbuilt = found.finding.kind == "dead" && isInEveryBuild(found.finding);
        DocumentMark mark = markOf(document, regions, std::move(found));
        if (isUnbuilt && mark.region != VT::ConditionalRegions::none)
            isDead[mark.region] = true;
        analysis.marks.push_back(std::move(mark));
    }
    for (DocumentMark& mark : unbuiltMarks(regions, isDead))
        analysis.marks.push_back(std::move(mark));
    return analysis;
}

} // namespace vtsym
