// What a set of choices can do about its faults, in words: choices to remove or to merge, and counted assignments.
//
// A removal is worth a line where several pairs overlap; of a single pair either choice will do.
#include "tools/vtsym/findings/ModelCheck.hpp"
#include "tools/vtsym/io/Json.hpp"

#include <algorithm>

namespace vtsym {

namespace {

std::string jsonCount(const std::optional<std::uint64_t>& count) {
    return count ? std::to_string(*count) : "null";
}

} // namespace

/// Reports which choices to remove, and with reasons how many assignments each one has.
void ModelCheck::writeAdvice(ChoiceSet& set) {
    const auto& choices = set.block->choices();
    const VT::ChoiceSetReport& report = set.report;
    std::string members;
    appendMember(members, "kind", jsonString("choices"));
    appendMember(members, "name", jsonString(set.block->path()));
    const std::size_t known = members.size();
    std::string removed;
    std::string removedJson;
    for (const std::size_t choice : report.removal.choices) {
        removed.append(removed.empty() ? "" : ", ").append(choices[choice]->name());
        removedJson.append(removedJson.empty() ? "" : ",").append(jsonString(choices[choice]->path()));
    }
    if (std::ranges::count(report.findings, VT::ChoiceFault::Overlap, &VT::ChoiceFinding::fault) > 1) {
        set.advice.push_back("no choices overlap without " + shown(removed) +
                             (report.removal.isSmallest ? "" : ", which may be more than needed"));
        if (!report.allOverlaps)
            set.advice.back() = "of the pairs reported none overlaps without " + shown(removed);
        appendMember(members, "remove", "[" + removedJson + "]");
        appendMember(members, "smallest", report.removal.isSmallest ? "true" : "false");
        if (!report.allOverlaps) {
            appendMember(members, "further_overlaps", std::to_string(report.furtherOverlaps));
            appendMember(members, "all_counted", report.allCounted ? "true" : "false");
        }
    }
    if (options_.why && report.parentAssignments) {
        std::string counts;
        std::string countsJson;
        for (std::size_t i = 0; i < report.assignments.size(); ++i) {
            const std::optional<std::uint64_t>& count = report.assignments[i];
            if (count)
                counts.append(", ").append(choices[i]->name()).append(" ").append(std::to_string(*count));
            countsJson.append(countsJson.empty() ? "" : ",").append(jsonString(choices[i]->path()));
            countsJson.append(":").append(jsonCount(count));
        }
        set.advice.push_back(std::to_string(*report.parentAssignments) + " assignments" + shown(counts));
        appendMember(members, "assignments", jsonCount(report.parentAssignments));
        appendMember(members, "by_choice", "{" + countsJson + "}");
    }
    if (members.size() == known)
        return;
    std::vector<std::string> sentences;
    for (const std::string& advice : set.advice)
        sentences.push_back(set.block->path() + ": " + advice);
    writer_->remark(placeOf(*set.block), sentences, members);
}

void ModelCheck::writeMerges(const VTBlock& set, const VT::ChoiceSetReport& report, std::vector<Finding>& findings) {
    for (const VT::ChoiceMerge& merge : report.merges) {
        const VTBlock& first = *set.choices()[merge.choices.front()];
        Finding finding;
        finding.place = placeOf(first);
        finding.kind = mergeable;
        finding.condition = first.variantCondition();
        finding.proposed = print(merge.merged);
        for (const std::size_t choice : merge.choices) {
            const VTBlock& block = *set.choices()[choice];
            finding.message += (finding.message.empty() ? "" : ", ") + block.path();
            if (&block != &first)
                finding.follows.push_back({placeOf(block), block.variantCondition()});
        }
        finding.message = shown(finding.message) + " can be one choice: " + shown(*finding.proposed);
        write(findings, std::move(finding));
    }
}

} // namespace vtsym
