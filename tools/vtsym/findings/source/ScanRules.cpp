// Describes the findings of a scan in words.
#include "tools/vtsym/findings/source/ScanRules.hpp"

#include "host/Text.hpp"

#include <algorithm>
#include <array>

namespace vtsym {

namespace {

constexpr std::array<std::string_view, 3> causes{"", "configuration", "undefined-name"}; // as VT::BranchCause

constexpr auto rules = std::to_array<FindingRule>({
    {"dead", "A branch is never entered.",
     "The condition contradicts a directive around the branch or before it in its chain, so that no definition of the "
     "macros enters the branch. Correct the condition, or remove the branch."},
    {"always-true", "A condition always holds.",
     "The directives around the branch and before it in its chain imply the condition, so that later branches of the "
     "chain are dead. Correct the condition, or remove it."},
    {"removable", "A condition has a shorter text that enters the branch in the same cases.",
     "The directives around the branch and before it in its chain make a part of the condition redundant. Correct the "
     "condition, or write the shorter one.",
     FindingLevel::Note},
    {"spelled-out", "A condition repeats that those before it in its chain do not hold.",
     "An #elif is reached only where the conditions before it in its chain do not hold, so that a part of its "
     "condition "
     "says so again. That is a matter of taste: keep it, or write the shorter condition.",
     FindingLevel::Note},
    {"malformed-suppression", "A comment that is to suppress findings cannot be read.",
     "A suppression is a comment on the line of a directive, or alone on the line before it: vtsym: keep, REASON, or "
     "vtsym: keep KIND..., REASON for findings of some kinds."},
    {"stale-suppression", "A comment suppresses nothing.",
     "Nothing is found any more at the directive of the comment. Remove the comment."},
    {"changed", "A branch is built in other cases than before.",
     "The condition of the branch, together with those around it, holds for other definitions of the macros than it "
     "did "
     "in the older state of the file. Check that this is meant.",
     FindingLevel::Note},
});

Place placeOf(const std::string& file, const VT::SourceRegion& region) {
    return {file, region.line, region.column, region.endLine, region.endColumn, {}};
}

std::string reasonText(const VT::BranchReason& reason) {
    std::string text = "'" + reason.directive + "'";
    switch (reason.kind) {
    case VT::BranchReasonKind::Build:
        if (!reason.file.empty())
            text.append(" (").append(reason.file).append(":").append(std::to_string(reason.region.line)).append(")");
        return text.append(" is given");
    case VT::BranchReasonKind::Assumption:
        return text.append(" is assumed");
    case VT::BranchReasonKind::Absence:
        return text.append(" is defined nowhere");
    default:
        text.append(" (line ").append(std::to_string(reason.region.line)).append(")");
        return text.append(reason.holds ? " holds" : " does not hold");
    }
}

/// "since '#if A' (line 1) holds and '#if B' (line 2) does not hold here".
std::string reasonsText(const VT::BranchFinding& found) {
    const std::vector<VT::BranchReason>& reasons = found.reasons;
    std::string text = "since ";
    for (std::size_t i = 0; i < reasons.size(); ++i)
        text.append(i == 0 ? "" : i + 1 == reasons.size() ? " and " : ", ").append(reasonText(reasons[i]));
    text.append(reasons.back().kind == VT::BranchReasonKind::Directive ? " here" : "");
    return found.hasOtherReasons ? text + " or for other reasons" : text;
}

/// Whether a finding is what the definitions of a build decide, as they are meant to, and not conditions alone that are
/// assumed.
bool isDecidedByBuild(const VT::BranchFinding& found) {
    return found.cause == VT::BranchCause::Configuration && found.needsDefinitions;
}

/// The settings of "A=y, B=n, C=m" that are not n.
std::string settingsOn(const std::string& settings) {
    std::string on;
    for (std::size_t at = 0; at < settings.size();) {
        const std::size_t end = std::min(settings.find(", ", at), settings.size());
        const std::string setting = settings.substr(at, end - at);
        if (!setting.ends_with("=n"))
            on.append(on.empty() ? "" : ", ").append(setting);
        at = end + 2;
    }
    return on;
}

std::string messageOf(const VT::BranchFinding& found) {
    std::string text = "'" + found.directive + "' ";
    const char* alone = "";
    if (found.kind == VT::BranchFindingKind::Dead) {
        text.append("is dead");
        alone = ", the condition contradicts itself";
    } else if (found.kind != VT::BranchFindingKind::Removable && found.proposed == "1") {
        text.append("always holds");
        alone = ", whatever the macros are";
    } else {
        text.append("can be '").append(found.directive, 0, found.directive.find(' ') + 1).append(found.proposed);
        text.append("'");
    }
    return found.reasons.empty() ? text + alone : text + ", " + reasonsText(found);
}

/// Whether a log, which holds UTF-8, can hold a text.
bool isText(std::string text) {
    std::erase_if(text, [](char c) { return c == '\n' || c == '\r' || c == '\t'; });
    return VT::shownText(text) == text;
}

Finding suppressionFinding(const std::string& file, const VT::Suppression& suppression, std::string_view kind,
                           const std::string& message) {
    Finding finding;
    finding.place = placeOf(file, suppression.region);
    finding.kind = kind;
    finding.level = scanRule(kind)->level;
    finding.message = message;
    finding.condition = suppression.text;
    return finding;
}

} // namespace

std::span<const FindingRule> scanRules() {
    return rules;
}

const FindingRule* scanRule(std::string_view kind) {
    const auto* const rule = std::ranges::find(rules, kind, &FindingRule::kind);
    return rule == rules.end() ? nullptr : rule;
}

std::optional<std::string_view> findingCause(std::string_view text) {
    const auto* const known = std::ranges::find(causes, text);
    return known == causes.end() ? std::nullopt : std::optional(*known);
}

Finding findingOf(const std::string& file, const VT::BranchFinding& found, std::size_t configurations) {
    const FindingRule& rule = rules.at(static_cast<std::size_t>(found.kind));
    Finding finding;
    finding.place = placeOf(file, found.region);
    finding.kind = rule.kind;
    finding.level = isDecidedByBuild(found) ? FindingLevel::Note : rule.level;
    finding.message = messageOf(found);
    finding.condition = found.condition;
    finding.because = found.because;
    finding.redundant = found.redundant;
    finding.mayNeedFewer = !found.because.empty() && !found.isMinimal;
    if (!found.proposed.empty())
        finding.proposed = found.proposed;
    for (const VT::BranchReason& reason : found.reasons) {
        const bool isHere = reason.kind == VT::BranchReasonKind::Directive;
        finding.follows.push_back({placeOf(isHere ? file : reason.file, reason.region), reason.directive});
    }
    if (!found.configurations.empty() && configurations > 1) {
        const bool isInAll = found.configurations.size() == configurations;
        const std::string all = std::to_string(configurations);
        finding.message.append(isInAll ? ", in all " + all
                                       : ", in " + std::to_string(found.configurations.size()) + " of " + all);
        finding.message.append(" configurations");
        if (!isInAll)
            finding.level = FindingLevel::Note;
    }
    if (!found.configurations.empty()) {
        for (const std::size_t configuration : found.configurations)
            finding.configurations.push_back(configuration + 1);
        finding.ofConfigurations = configurations;
    }
    finding.cause = causes.at(static_cast<std::size_t>(found.cause));
    finding.witness = found.witness;
    if (const std::string on = settingsOn(found.witness); !on.empty())
        finding.message.append("; built with ").append(on);
    const bool isInEvery = found.configurations.empty() || found.configurations.size() == configurations;
    if (found.replaced && isInEvery && isText(found.edit.text))
        finding.fix = Fix{"Write the shorter condition.", placeOf(file, *found.replaced), found.edit.text};
    return finding;
}

Finding malformedSuppression(const std::string& file, const VT::Suppression& suppression, const std::string& problem) {
    return suppressionFinding(file, suppression, "malformed-suppression",
                              "'" + suppression.text + "' suppresses nothing: " + problem);
}

Finding staleSuppression(const std::string& file, const VT::Suppression& suppression) {
    return suppressionFinding(file, suppression, "stale-suppression",
                              "'" + suppression.text + "' is stale: nothing is found there, remove it");
}

Finding changedBranch(const std::string& file, const VT::ChangedBranch& branch) {
    const auto quoted = [](const std::string& directive) {
        return directive.empty() ? "no condition" : "'" + directive + "'";
    };
    Finding finding;
    finding.place = placeOf(file, branch.region);
    finding.kind = "changed";
    finding.level = FindingLevel::Note;
    finding.condition = branch.directive;
    finding.witness = branch.witness;
    finding.message = branch.directive == branch.before ? quoted(branch.directive) + " is reached in other cases"
                                                        : quoted(branch.directive) + " instead of " +
                                                              quoted(branch.before) + " changes what is built";
    if (!branch.witness.empty()) {
        finding.message.append(": with ").append(branch.witness);
        finding.message.append(branch.isBuiltAfter ? " the code is in now" : " the code is not in any more");
    }
    return finding;
}

} // namespace vtsym
