// Finds the branches of a file as regions of its text.
//
// Method: one pass over the directives with a stack of open chains.  A branch extends to the line of the directive that
// ends it.  Constants without macros switch branches off; other conditions are not read.
// Cost: linear in the text.
#include "base/scan/regions/ConditionalRegions.hpp"

#include "base/core/Table.hpp"
#include "base/scan/DirectiveCondition.hpp"
#include "base/scan/report/DirectiveTexts.hpp"

#include <algorithm>
#include <optional>

namespace VT {

namespace {

struct Chain {
    std::uint32_t first;
    std::uint32_t last;
    bool hadElse = false;
    bool isSwitchedOn = false; ///< a branch so far is entered by a constant
};

std::size_t lineBegin(std::string_view text, std::size_t place) {
    const std::size_t before = place == 0 ? std::string_view::npos : text.rfind('\n', place - 1);
    return before == std::string_view::npos ? 0 : before + 1;
}

std::size_t nextLine(std::string_view text, std::size_t place) {
    const std::size_t end = text.find('\n', place);
    return end == std::string_view::npos ? text.size() : end + 1;
}

/// Whether a condition may be a constant that needs no macro.
bool mayBeConstant(const Directive& directive) {
    const auto isName = [](const DirectiveToken& token) { return token.kind == DirectiveTokenKind::Name; };
    return isExpression(directive.kind) && !directive.tokens.empty() && std::ranges::none_of(directive.tokens, isName);
}

/// Reads constants.
class Constants {
public:
    Constants() : unknowns_(table_, states_), conditions_(table_, states_, unknowns_, false) {
        table_.addBoolSymbols();
    }

    std::optional<bool> of(const Directive& directive) {
        return mayBeConstant(directive) ? conditions_.read(directive).constant : std::nullopt;
    }

private:
    SymbolicExprTable table_;
    MacroStates states_;
    MacroUnknowns unknowns_;
    DirectiveConditionReader conditions_;
};

} // namespace

ConditionalRegions::ConditionalRegions(std::string_view text) {
    if (hasManyReadings(text))
        return;
    Constants constants;
    std::vector<Chain> chains;
    DirectiveReader reader(text);
    for (Directive directive; reader.next(directive);) {
        if (!belongsToChain(directive.kind, !chains.empty()))
            continue;
        const bool opens = opensChain(directive.kind);
        const bool ends = directive.kind == DirectiveKind::Endif;
        if (!opens)
            regions_[chains.back().last].bodyEnd = lineBegin(text, directive.begin);
        if (ends) {
            const std::uint32_t first = chains.back().first;
            ends_.push_back({first, directive.begin, directive.end});
            chainEnds_[first] = directive.end;
            chains.pop_back();
            continue;
        }
        const auto number = static_cast<std::uint32_t>(regions_.size());
        const std::uint32_t around = chains.empty() ? none : chains.back().last;
        if (opens) {
            add(text, directive, around, number);
            chains.push_back({number, number});
        } else {
            add(text, directive, regions_[chains.back().first].parent, chains.back().first);
            chains.back().last = number;
        }
        Chain& chain = chains.back();
        ConditionalRegion& region = regions_.back();
        region.isAfterElse = chain.hadElse;
        const std::optional<bool> constant = constants.of(directive);
        region.isSwitchedOff = !chain.hadElse && (chain.isSwitchedOn || constant == false);
        chain.isSwitchedOn = chain.isSwitchedOn || constant == true;
        chain.hadElse = chain.hadElse || directive.kind == DirectiveKind::Else;
    }
}

void ConditionalRegions::add(std::string_view text, const Directive& directive, std::uint32_t parent,
                             std::uint32_t chain) {
    regions_.push_back({directive.kind, parent, chain, quotedDirective(directiveText(directive)), directive.line,
                        directive.begin, directive.end, nextLine(text, directive.end), text.size()});
    lineBegins_.push_back(lineBegin(text, directive.begin));
    chainEnds_.push_back(text.size());
}

std::uint32_t ConditionalRegions::at(std::size_t byte) const {
    const auto after = std::upper_bound(lineBegins_.begin(), lineBegins_.end(), byte);
    std::uint32_t region =
        after == lineBegins_.begin() ? none : static_cast<std::uint32_t>(after - lineBegins_.begin() - 1);
    const auto holds = [&](const ConditionalRegion& each) { return byte < std::max(each.bodyBegin, each.bodyEnd); };
    while (region != none && !holds(regions_[region]))
        region = regions_[region].parent;
    return region;
}

const ConditionalEnd* ConditionalRegions::endWithin(std::size_t begin, std::size_t end) const {
    const auto first = std::ranges::lower_bound(ends_, begin, {}, &ConditionalEnd::begin);
    return first == ends_.end() || first->begin >= end ? nullptr : &*first;
}

std::uint32_t ConditionalRegions::onLine(std::uint64_t line) const {
    const auto region = std::ranges::lower_bound(regions_, line, {}, &ConditionalRegion::line);
    return region == regions_.end() || region->line != line ? none
                                                            : static_cast<std::uint32_t>(region - regions_.begin());
}

} // namespace VT
