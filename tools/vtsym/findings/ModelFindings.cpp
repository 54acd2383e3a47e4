// What the findings about a model say, and where.
//
// A finding lists the conditions of a bounded number of ancestors, so that nesting does not multiply the work.
#include "tools/vtsym/findings/ModelCheck.hpp"

#include "base/VCService.hpp"
#include "base/variants/VariantKeywords.hpp"
#include "host/Text.hpp"
#include "tools/vtsym/findings/UndecidedText.hpp"
#include "tools/vtsym/io/Json.hpp"

#include <array>

namespace vtsym {

namespace {

constexpr std::size_t visitedAncestors = 256; ///< in search of conditions that a finding follows from
constexpr std::size_t shownAncestors = 8;     ///< whose conditions a finding lists

/// In the order of VT::ChoiceFault.
constexpr std::array<std::string_view, 5> kinds{"dead", "always-active", "redundant", "overlapping", "missing"};

std::string_view kindOf(VT::ChoiceFault fault) {
    return kinds.at(static_cast<std::size_t>(fault));
}

/// "c0 hides it", "c0, c1 hide it"
std::string hidingText(std::span<const VTBlock* const> blocks, const std::vector<std::size_t>& hiding) {
    std::string names;
    for (const std::size_t choice : hiding)
        names.append(names.empty() ? "" : ", ").append(blocks[choice]->path());
    return VT::shownText(names, shownInSentence) + (hiding.size() == 1 ? " hides it" : " hide it");
}

} // namespace

/// A text as a sentence quotes it.
std::string ModelCheck::shown(const std::string& text) {
    return VT::shownText(text, shownInSentence);
}

std::string ModelCheck::furtherOverlaps(const VT::ChoiceSetReport& report) {
    if (report.furtherOverlaps == 0)
        return "perhaps more pairs";
    return (report.allCounted ? "" : "at least ") + std::to_string(report.furtherOverlaps) + " more pair" +
           (report.furtherOverlaps == 1 ? "" : "s");
}

bool ModelCheck::isUnconditional(const VTBlock& block) {
    return block.variantCondition().empty() ||
           VT::VariantKeywords::isInheritVariantKeyword(block.variantCondition(), true);
}

Finding ModelCheck::findingAt(Place place, VT::ChoiceFault fault, std::string message, std::string condition) {
    Finding finding;
    finding.place = std::move(place);
    finding.kind = kindOf(fault);
    finding.message = std::move(message);
    finding.condition = std::move(condition);
    return finding;
}

std::string ModelCheck::print(VT::SymbolicExprId condition) const {
    const std::string text = model_.isQuill() ? service_->printQExpr(condition) : service_->printCExpr(condition);
    return text.empty() ? "true" : text;
}

std::string ModelCheck::witnessText(const VT::Witness& witness) const {
    return witness.empty() ? "any values" : service_->printWitness(witness);
}

Place ModelCheck::regionOf(const VT::Embedded::TextPlace& place) const {
    return {file_, place.line, place.column, place.line, place.endColumn, {}};
}

Place ModelCheck::placeOf(const VTBlock& block) const {
    const bool hasCondition = block.conditionPlace().line != 0;
    Place place = regionOf(hasCondition ? block.conditionPlace() : block.namePlace());
    place.name = block.path();
    return place;
}

/// The conditions of a block and of its ancestors, the nearest first.
std::vector<RelatedPlace> ModelCheck::conditionsAround(const VTBlock* block) const {
    std::vector<RelatedPlace> around;
    for (std::size_t i = 0; block != nullptr && i < visitedAncestors && around.size() < shownAncestors;
         ++i, block = block->parent())
        if (!isUnconditional(*block))
            around.push_back({placeOf(*block), block->variantCondition()});
    return around;
}

void ModelCheck::explain(Finding& finding, const VT::Reasons& reasons) const {
    for (const VT::SymbolicExprId operand : reasons.operands)
        finding.because.push_back(shown(print(operand)));
}

Finding ModelCheck::findingOf(const VTBlock& set, std::span<const VTBlock* const> blocks,
                              const VT::ChoiceFinding& finding) {
    const bool isOfSet = finding.fault == VT::ChoiceFault::Missing;
    const bool isPair = finding.fault == VT::ChoiceFault::Overlap;
    const VTBlock& block = isOfSet ? set : *blocks[isPair ? finding.other : finding.choice];
    const VTBlock* const around = isOfSet ? &set : block.parent();
    Finding result = findingAt(placeOf(block), finding.fault, {}, block.variantCondition());
    result.follows = conditionsAround(around);
    const std::string path = block.path();
    const std::string where = result.follows.empty() ? "" : " where " + around->path() + " is";
    const std::string condition = shown(block.variantCondition());
    switch (finding.fault) {
    case VT::ChoiceFault::Dead:
        result.message = path + " is never active: ";
        if (!finding.hiddenBy.empty())
            result.message += hidingText(blocks, finding.hiddenBy);
        else if (finding.isHidden)
            result.message += "earlier choices hide it";
        else if (VT::BlockConditions::isDefault(block))
            result.message += "the other choices leave nothing to it";
        else if (checker_.canHold(conditions_.own(block).id()).isNo())
            result.message += condition + " never holds";
        else
            result.message += condition + " cannot hold" + where + " active";
        break;
    case VT::ChoiceFault::AlwaysActive:
        result.message = path + " is always active" + where;
        break;
    case VT::ChoiceFault::Redundant:
        describeShorter(result, block, finding.proposed);
        result.message += where.empty() ? "" : where + " active";
        break;
    case VT::ChoiceFault::Overlap: {
        const VTBlock& first = *blocks[finding.choice];
        result.message = first.path() + " and " + path + " are both active for " + witnessText(finding.witness);
        if (finding.firstCovered && finding.secondCovered)
            result.message += "; neither is ever active without the other";
        else if (finding.firstCovered || finding.secondCovered)
            result.message += "; " + (finding.firstCovered ? first.path() : path) + " is never active without " +
                              (finding.firstCovered ? path : first.path());
        result.follows.insert(result.follows.begin(), {placeOf(first), first.variantCondition()});
        break;
    }
    case VT::ChoiceFault::Missing:
        result.message = "no choice of " + path + " is active for " + witnessText(finding.witness);
        if (finding.proposed != VT::invalidId) {
            result.proposed = print(finding.proposed);
            result.message += "; " + shown(*result.proposed) + " closes the gap";
        }
        break;
    }
    explain(result, finding.reasons);
    if (finding.fault != VT::ChoiceFault::Dead)
        result.witness = service_->printWitness(finding.witness);
    return result;
}

/// No signal ever goes through a port.
Finding ModelCheck::findingOf(const vtPort& port) const {
    std::vector<RelatedPlace> follows = conditionsAround(&port.source());
    for (const VTBlock* const destination : port.destinations()) {
        for (RelatedPlace& each : conditionsAround(destination))
            if (follows.size() < 2 * shownAncestors)
                follows.push_back(std::move(each));
    }
    Finding result = findingAt(placeOf(port), VT::ChoiceFault::Dead,
                               "the port " + shown(port.name()) + " is never active: " + port.source().path() +
                                   " is never active together with a block that it goes to",
                               {});
    result.follows = std::move(follows);
    return result;
}

Place ModelCheck::placeOf(const vtPort& port) const {
    Place place = regionOf(port.place());
    place.name = port.name();
    return place;
}

void ModelCheck::describeShorter(Finding& finding, const VTBlock& block, VT::SymbolicExprId proposed) const {
    const std::string text = print(proposed);
    finding.message = finding.place.name + ": " + shown(block.variantCondition()) + " can be written " + shown(text);
    finding.proposed = text;
    if (block.conditionPlace().line != 0)
        finding.fix = Fix{"Remove the redundant operand.", regionOf(block.conditionPlace()), jsonString(text)};
}

void ModelCheck::reportUndecided(const VTBlock& set, std::span<const VTBlock* const> blocks,
                                 const VT::ChoiceFinding& finding) {
    if (checker_.stepsUsedUp())
        return; // reported once, for the whole check
    const bool isOfSet = finding.fault == VT::ChoiceFault::Missing;
    const VTBlock& block = isOfSet ? set : *blocks[finding.choice];
    const std::string path = block.path();
    std::string question;
    switch (finding.fault) {
    case VT::ChoiceFault::Overlap:
        question = path + " and " + blocks[finding.other]->path() + " can be active at once";
        break;
    case VT::ChoiceFault::Missing:
        question = "a choice of " + path + " is active for all values";
        break;
    default:
        question = path + (finding.fault == VT::ChoiceFault::Dead ? " can be active" : " is always active");
    }
    problem(placeOf(block), "Whether " + question + " stays undecided: it " + undecidedText(finding.bound) + ".");
}

} // namespace vtsym
