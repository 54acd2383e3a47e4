// Checks models for an editor.  A text that is not a model, which it mostly is while it is typed, is one error at the
// place where reading ended.  Costs mostModelSteps at most.
#include "tools/vtsym/findings/ModelRemovals.hpp"
#include "tools/vtsym/lsp/ServerBounds.hpp"
#include "tools/vtsym/lsp/SourceMarks.hpp"

#include "host/embedded/ModelFile.hpp"

#include <algorithm>

namespace vtsym {

namespace {

/// Collects what a check finds.
class MarkListener : public FindingListener {
public:
    explicit MarkListener(const TextDocument& text) : text_(text) {}

    void write(const Finding& finding) override {
        DocumentMark mark = at(finding.place);
        mark.level = finding.level == FindingLevel::Warning ? MarkLevel::Warning : MarkLevel::Information;
        mark.kind = finding.kind;
        mark.sentence = finding.message;
        mark.explanation = sentenceOf(finding);
        for (const RelatedPlace& related : finding.follows) {
            const DocumentMark place = at(related.place);
            mark.related.push_back({{}, 0, place.begin, place.end, related.text});
        }
        if (finding.fix) {
            const DocumentMark place = at(finding.fix->region);
            mark.edit = VT::SourceEdit{place.begin, place.end, finding.fix->text};
            mark.action = "Write '" + finding.proposed.value_or("") + "'";
        }
        marks_.push_back(std::move(mark));
    }

    void problem(const Place& place, const std::string& sentence) override {
        DocumentMark mark = at(place);
        mark.level = MarkLevel::Error;
        mark.kind = "unchecked";
        mark.sentence = sentence;
        marks_.push_back(std::move(mark));
    }

    void note(const std::string&) override {}

    void remark(const Place& place, std::span<const std::string> sentences, const std::string&) override {
        for (const std::string& sentence : sentences) {
            problem(place, sentence);
            marks_.back().level = MarkLevel::Information;
            marks_.back().kind = "advice";
        }
    }

    /// Adds an edit to the mark of a finding.
    void propose(const Finding& finding, const std::string& action, VT::SourceEdit edit) {
        const DocumentMark place = at(finding.place);
        const auto mark = std::ranges::find_if(marks_, [&](const DocumentMark& each) {
            return each.begin == place.begin && each.sentence == finding.message;
        });
        if (mark == marks_.end())
            return;
        mark->action = action;
        mark->edit = std::move(edit);
    }

    std::vector<DocumentMark> take() { return std::move(marks_); }

private:
    [[nodiscard]] DocumentMark at(const Place& place) const {
        DocumentMark mark;
        mark.begin = text_.byteOfPlace(place.line, place.column, false);
        const bool hasEnd = place.endColumn != 0;
        mark.end = hasEnd ? text_.byteOfPlace(place.endLine != 0 ? place.endLine : place.line, place.endColumn, false)
                          : text_.byteOfPlace(place.line, place.column + 1, false);
        return mark;
    }

    const TextDocument& text_;
    std::vector<DocumentMark> marks_;
};

/// Proposes to remove the dead choices that `vtsym check --fix` removes.
void proposeRemovals(const ModelCheck& check, const VTRootBD& model, const std::string& text, MarkListener& listener) {
    const auto joined = joinedBlocks(model);
    for (const ModelCheck::ChoiceSet& set : check.choiceSets())
        for (const auto& [finding, removal] : removableChoices(set, joined, text))
            listener.propose(set.findings[finding], "Remove the dead choice", {removal.begin, removal.end, ""});
}

} // namespace

DocumentAnalysis analyseModel(const OpenDocument& document) {
    MarkListener listener(document.text);
    try {
        VTRootBD model;
        VT::Embedded::readModel(document.text.text(), model);
        ModelCheckOptions options;
        options.steps = mostModelSteps;
        ModelCheck check(model, document.path, options);
        check.run(listener);
        proposeRemovals(check, model, document.text.text(), listener);
    } catch (const VT::Embedded::ModelError& error) {
        listener.problem({document.path, error.place().line, error.place().column, 0, error.place().endColumn, {}},
                         error.what());
    } catch (const std::runtime_error& error) {
        listener.problem({document.path, 1, 1, 0, 0, {}}, error.what());
    }
    return {VT::ConditionalRegions({}), listener.take()};
}

bool isModelText(std::string_view json) {
    std::size_t depth = 0;
    std::string_view name; // the latest string in the outer object
    for (std::size_t i = 0; i < json.size(); ++i) {
        const char c = json[i];
        if (c == '"') {
            const std::size_t begin = ++i;
            while (i < json.size() && json[i] != '"')
                i += json[i] == '\\' ? 2U : 1U;
            if (depth == 1)
                name = json.substr(begin, std::min(i, json.size()) - begin);
        } else if (c == '{' || c == '[') {
            if (depth == 0 && c == '[')
                return false;
            if (depth == 1 && c == '[' && name == "blocks")
                return true;
            ++depth;
        } else if (c == '}' || c == ']') {
            depth -= depth > 0 ? 1U : 0U;
        }
    }
    return false;
}

} // namespace vtsym
