// One writer for each form.  Findings are written as soon as they are found, but for a SARIF log, which keeps what it
// may hold until the end: where there is more, notes are left out before warnings.
#include "tools/vtsym/findings/Findings.hpp"

#include "base/core/Limits.hpp"
#include "host/Text.hpp"
#include "tools/vtsym/io/CommandLine.hpp"
#include "tools/vtsym/io/Json.hpp"
#include "tools/vtsym/io/Uris.hpp"

#include <algorithm>
#include <array>

namespace vtsym {

namespace {

std::string placeText(const Place& place) {
    std::string text = VT::shownText(place.file);
    if (place.line != 0)
        text.append(":").append(std::to_string(place.line));
    return text;
}

class CompilerWriter : public FindingWriter {
public:
    explicit CompilerWriter(Console& console) : FindingWriter(console) {}

private:
    void add(const Finding& finding) override {
        console().out(console().outStyle().strong(placeText(finding.place) + ":") + " " +
                      VT::shownText(sentenceOf(finding)) + "\n");
    }

    void addRemark(const Place& place, std::span<const std::string> sentences, const std::string&) override {
        for (const std::string& sentence : sentences)
            console().out(console().outStyle().strong(placeText(place) + ":") + " " + VT::shownText(sentence) + "\n");
    }
};

class JsonWriter : public FindingWriter {
public:
    explicit JsonWriter(Console& console) : FindingWriter(console) {}

private:
    void add(const Finding& finding) override;

    void addRemark(const Place& place, std::span<const std::string>, const std::string& members) override {
        std::string out = "{\"file\":" + jsonString(place.file);
        appendMember(out, "line", std::to_string(place.line));
        console().out(out + members + "}\n");
    }
};

/// Appends a list of texts, where there are any.
void appendTexts(const char* name, const std::vector<std::string>& texts, std::string& json) {
    std::string list;
    for (const std::string& text : texts)
        list.append(list.empty() ? "" : ",").append(jsonString(text));
    if (!list.empty())
        appendMember(json, name, "[" + list + "]");
}

/// Appends the operands that a finding is about.
void appendReasons(const Finding& finding, std::string& json) {
    appendTexts("redundant", finding.redundant, json);
    appendTexts("because", finding.because, json);
    if (finding.mayNeedFewer)
        appendMember(json, "minimal", "false");
}

/// Appends what is known of a finding beyond one scan in one build.
void appendState(const Finding& finding, std::string& json) {
    if (!finding.state.empty())
        appendMember(json, "state", jsonString(finding.state));
    if (!finding.cause.empty())
        appendMember(json, "cause", jsonString(finding.cause));
    if (finding.configurations.empty())
        return;
    std::string list;
    for (const std::size_t configuration : finding.configurations)
        list.append(list.empty() ? "" : ",").append(std::to_string(configuration));
    if (!finding.configurationNames.empty()) {
        list.clear();
        for (const std::string& name : finding.configurationNames)
            list.append(list.empty() ? "" : ",").append(jsonString(name));
    }
    appendMember(json, "configurations", "[" + list + "]");
    appendMember(json, "of_configurations", std::to_string(finding.ofConfigurations));
}

std::string_view levelText(FindingLevel level) {
    return level == FindingLevel::Note ? "note" : "warning";
}

void JsonWriter::add(const Finding& finding) {
    std::string out = "{\"file\":" + jsonString(finding.place.file);
    appendMember(out, "line", std::to_string(finding.place.line));
    appendMember(out, "kind", jsonString(finding.kind));
    if (!finding.fingerprint.empty())
        appendMember(out, "fingerprint", jsonString(finding.fingerprint));
    if (!finding.place.name.empty())
        appendMember(out, "name", jsonString(finding.place.name));
    appendMember(out, "condition", jsonString(finding.condition));
    if (finding.proposed)
        appendMember(out, "proposed", jsonString(*finding.proposed));
    if (!finding.witness.empty())
        appendMember(out, "witness", jsonString(finding.witness));
    appendReasons(finding, out);
    appendState(finding, out);
    std::string follows;
    for (const RelatedPlace& related : finding.follows) {
        std::string place;
        if (related.place.file != finding.place.file && !related.place.file.empty())
            appendMember(place, "file", jsonString(related.place.file));
        if (related.place.line != 0)
            appendMember(place, "line", std::to_string(related.place.line));
        follows.append(follows.empty() ? "{" : ",{").append(place.empty() ? "\"build\":true" : place.substr(1));
        if (!related.place.name.empty())
            appendMember(follows, "name", jsonString(related.place.name));
        appendMember(follows, "text", jsonString(related.text));
        follows.push_back('}');
    }
    appendMember(out, "follows", "[" + follows + "]");
    console().out(out + "}\n");
}

std::string jsonMessage(std::string_view text) {
    return "{\"text\":" + jsonString(text) + "}";
}

class SarifWriter : public FindingWriter {
public:
    SarifWriter(Console& console, std::span<const FindingRule> rules);

private:
    void add(const Finding& finding) override;
    void addProblem(const Place& place, const std::string& sentence) override;
    void addNote(const std::string& sentence) override;
    void addRemark(const Place& place, std::span<const std::string> sentences, const std::string& members) override;
    void end() override;
    void addNotification(std::string_view level, const std::string& sentence, const std::string& further);

    std::span<const FindingRule> rules_;
    std::string notifications_;
    bool successful_ = true;
    std::array<std::vector<std::pair<std::uint64_t, std::string>>, 2> results_; ///< numbered, by level
    std::uint64_t added_ = 0;
};

std::string jsonRegion(const Place& place) {
    std::string json = "{\"startLine\":" + std::to_string(place.line);
    if (place.column != 0)
        appendMember(json, "startColumn", std::to_string(place.column));
    if (place.endLine != 0)
        appendMember(json, "endLine", std::to_string(place.endLine));
    if (place.endColumn != 0)
        appendMember(json, "endColumn", std::to_string(place.endColumn));
    return json + "}";
}

std::string jsonArtifact(const Place& place) {
    return R"("artifactLocation":{"uri":)" + jsonString(uriOf(place.file)) + "}";
}

/// A location; `further` are members to add to its place.
std::string jsonLocation(const Place& place, const std::string& further = {}) {
    std::string json = "{\"physicalLocation\":{" + jsonArtifact(place);
    if (place.line != 0)
        appendMember(json, "region", jsonRegion(place));
    json.push_back('}');
    if (!place.name.empty())
        appendMember(json, "logicalLocations", "[{\"fullyQualifiedName\":" + jsonString(place.name) + "}]");
    return json + further + "}";
}

std::string jsonFix(const Fix& fix) {
    std::string json = "{\"description\":" + jsonMessage(fix.description);
    json.append(",\"artifactChanges\":[{").append(jsonArtifact(fix.region)).append(",\"replacements\":[{");
    json.append("\"deletedRegion\":").append(jsonRegion(fix.region));
    appendMember(json, "insertedContent", jsonMessage(fix.text));
    return json + "}]}]}";
}

SarifWriter::SarifWriter(Console& console, std::span<const FindingRule> rules) : FindingWriter(console), rules_(rules) {
    std::string out = R"({"$schema":"https://json.schemastore.org/sarif-2.1.0.json","version":"2.1.0","runs":[{)"
                      R"("tool":{"driver":{"name":"vtsym","version":)" +
                      jsonString(VTSYM_VERSION) + R"(,"rules":[)";
    for (const FindingRule& rule : rules) {
        out.append(&rule == rules.data() ? "{" : ",{").append("\"id\":").append(jsonString(rule.kind));
        appendMember(out, "shortDescription", jsonMessage(rule.summary));
        appendMember(out, "fullDescription", jsonMessage(rule.help));
        appendMember(out, "help", jsonMessage(rule.help));
        appendMember(out, "defaultConfiguration", "{\"level\":" + jsonString(levelText(rule.level)) + "}");
        out.push_back('}');
    }
    console.out(out + R"(]}},"columnKind":"unicodeCodePoints","results":[)");
}

void SarifWriter::add(const Finding& finding) {
    const auto rule = std::ranges::find(rules_, finding.kind, &FindingRule::kind);
    std::vector<std::pair<std::uint64_t, std::string>>& results = results_.at(static_cast<std::size_t>(finding.level));
    ++added_;
    if (results.size() == VT::limits::sarifResults)
        return;
    std::string out = "{\"ruleId\":" + jsonString(finding.kind);
    appendMember(out, "ruleIndex", std::to_string(rule - rules_.begin()));
    appendMember(out, "level", jsonString(levelText(finding.level)));
    appendMember(out, "message", jsonMessage(finding.message + "."));
    appendMember(out, "locations", "[" + jsonLocation(finding.place) + "]");
    if (!finding.follows.empty()) {
        std::string related;
        for (const RelatedPlace& each : finding.follows) {
            if (!each.place.file.empty())
                related.append(related.empty() ? "" : ",")
                    .append(jsonLocation(each.place, ",\"message\":" + jsonMessage(each.text)));
        }
        if (!related.empty())
            appendMember(out, "relatedLocations", "[" + related + "]");
    }
    if (finding.fix)
        appendMember(out, "fixes", "[" + jsonFix(*finding.fix) + "]");
    if (!finding.fingerprint.empty())
        appendMember(out, "partialFingerprints", "{\"vtsym/v1\":" + jsonString(finding.fingerprint) + "}");
    if (!finding.state.empty())
        appendMember(out, "baselineState", jsonString(finding.state));
    std::string properties = "{\"condition\":" + jsonString(finding.condition);
    if (finding.proposed)
        appendMember(properties, "proposed", jsonString(*finding.proposed));
    if (!finding.witness.empty())
        appendMember(properties, "witness", jsonString(finding.witness));
    appendReasons(finding, properties);
    if (!finding.configurations.empty() || !finding.cause.empty())
        appendState(finding, properties);
    appendMember(out, "properties", properties + "}");
    results.emplace_back(added_, out + "}");
}

void SarifWriter::addProblem(const Place& place, const std::string& sentence) {
    successful_ = false;
    addNotification("error", sentence, ",\"locations\":[" + jsonLocation(place) + "]");
}

void SarifWriter::addNote(const std::string& sentence) {
    addNotification("note", sentence, {});
}

void SarifWriter::addRemark(const Place& place, std::span<const std::string> sentences, const std::string&) {
    for (const std::string& sentence : sentences)
        addNotification("note", sentence, ",\"locations\":[" + jsonLocation(place) + "]");
}

/// `further` are members to add to the level and the message.
void SarifWriter::addNotification(std::string_view level, const std::string& sentence, const std::string& further) {
    notifications_.append(notifications_.empty() ? "\n{" : ",\n{").append("\"level\":").append(jsonString(level));
    appendMember(notifications_, "message", jsonMessage(sentence));
    notifications_.append(further).append("}");
}

void SarifWriter::end() {
    constexpr std::size_t most = VT::limits::sarifResults;
    auto& [notes, warnings] = results_;
    notes.resize(std::min(notes.size(), most - warnings.size()));
    if (const std::uint64_t written = notes.size() + warnings.size(); written < added_) {
        note(std::to_string(added_ - written) + " of " + std::to_string(added_) +
             " results are left out, since a log holds " + std::to_string(most) +
             ": scan fewer folders at once, or fewer kinds");
    }
    const char* separator = "\n";
    for (auto a = notes.begin(), b = warnings.begin(); a != notes.end() || b != warnings.end();) {
        auto& next = b == warnings.end() || (a != notes.end() && a->first < b->first) ? a : b;
        console().out(separator + (next++)->second);
        separator = ",\n";
    }
    std::string out = "\n],\"invocations\":[{\"executionSuccessful\":";
    out.append(successful_ ? "true" : "false");
    if (!notifications_.empty())
        appendMember(out, "toolExecutionNotifications", "[" + notifications_ + "]");
    console().out(out + "}]}]}\n");
}

} // namespace

std::string sentenceOf(const Finding& finding) {
    std::string sentence = finding.state == "new"         ? "new: "
                           : finding.state == "unchanged" ? "remains: "
                           : finding.state == "absent"    ? "fixed: "
                                                          : "";
    sentence.append(finding.message);
    const auto append = [&sentence](const char* what, const std::vector<std::string>& texts) {
        for (const std::string& text : texts)
            sentence.append(&text == texts.data() ? what : ", ").append(text);
    };
    append("; redundant: ", finding.redundant);
    append(finding.mayNeedFewer ? "; because, perhaps of fewer: " : "; because: ", finding.because);
    return sentence;
}

std::string fixed(const std::string& text, std::vector<Fix> fixes, std::vector<Removal> removals) {
    std::ranges::sort(fixes, {}, [](const Fix& fix) { return std::pair(fix.region.line, fix.region.column); });
    std::ranges::sort(removals, {}, &Removal::begin);
    std::string result;
    std::uint64_t line = 1;
    std::uint64_t column = 0; // of the code point that the byte belongs to
    auto fix = fixes.begin();
    auto removal = removals.begin();
    for (std::size_t i = 0; i < text.size(); ++i) {
        const bool begins = (static_cast<unsigned char>(text[i]) & 0xc0U) != 0x80U;
        column += begins ? 1U : 0U;
        if (fix != fixes.end() && line == fix->region.line && column == fix->region.endColumn)
            ++fix;
        if (removal != removals.end() && i == removal->end)
            ++removal;
        const bool isRemoved = removal != removals.end() && i >= removal->begin;
        const bool isFixed = fix != fixes.end() && line == fix->region.line && column >= fix->region.column;
        if (isFixed && begins && column == fix->region.column)
            result.append(fix->text);
        if (!isRemoved && !isFixed)
            result.push_back(text[i]);
        if (text[i] == '\n') {
            ++line;
            column = 0;
        }
    }
    return result;
}

void FindingWriter::write(const Finding& finding) {
    add(finding);
    ++found_;
}

void FindingWriter::problem(const Place& place, const std::string& sentence) {
    console_.err("vtsym: " + placeText(place) + ": " + VT::shownText(sentence) + "\n");
    addProblem(place, sentence);
    failed_ = true;
}

void FindingWriter::note(const std::string& sentence) {
    console_.err("vtsym: " + VT::shownText(sentence) + "\n");
    addNote(sentence);
}

void FindingWriter::remark(const Place& place, std::span<const std::string> sentences, const std::string& members) {
    addRemark(place, sentences, members);
}

SearchResult FindingWriter::finish() {
    end();
    console_.flush();
    if (failed_)
        return SearchResult::Failed;
    return found_ != 0 ? SearchResult::Found : SearchResult::NothingFound;
}

std::unique_ptr<FindingWriter> makeFindingWriter(FindingForm form, Console& console,
                                                 std::span<const FindingRule> rules) {
    switch (form) {
    case FindingForm::Json:
        return std::make_unique<JsonWriter>(console);
    case FindingForm::Sarif:
        return std::make_unique<SarifWriter>(console, rules);
    default:
        return std::make_unique<CompilerWriter>(console);
    }
}

void addFormOptions(Command& command, FindingForm& form) {
    command.addFlag("--json", "Write one JSON object per finding", [&form] { form = FindingForm::Json; });
    command.addFlag("--sarif", "Write a SARIF 2.1.0 log with fixes", [&form] { form = FindingForm::Sarif; });
    command.exclude("--sarif", "--json");
}

} // namespace vtsym
