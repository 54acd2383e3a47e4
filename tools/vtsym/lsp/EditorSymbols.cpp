// The branches of a document as symbols.
//
// Method: branches are in the order of the text, so that each is after the one around it.  Going back, a branch takes
// its own symbols along when it becomes one of another.  Nesting beyond deepestSymbol is flat, since values are written
// recursively.
// Cost: linear, up to mostSymbols.
#include "host/Text.hpp"
#include "tools/vtsym/lsp/EditorAnswers.hpp"
#include "tools/vtsym/lsp/ServerBounds.hpp"

#include <algorithm>

namespace vtsym {

namespace {

constexpr int namespaceSymbol = 3;
constexpr std::size_t shownName = 200; ///< bytes of a directive in a list of symbols

} // namespace

Json symbolsOf(const OpenDocument& document, const EditorAbilities& abilities) {
    const VT::ConditionalRegions& regions = document.analysis->regions;
    const auto count = static_cast<std::uint32_t>(std::min(regions.all().size(), mostSymbols));
    std::vector<std::uint32_t> parents(count);
    std::vector<std::size_t> depths(count, 0);
    std::vector<Json> symbols(count);
    for (std::uint32_t i = 0; i < count; ++i) {
        const VT::ConditionalRegion& region = regions[i];
        parents[i] = region.parent;
        if (region.parent != VT::ConditionalRegions::none) {
            depths[i] = depths[region.parent] + 1;
            if (depths[i] > deepestSymbol) {
                depths[i] = deepestSymbol;
                parents[i] = parents[region.parent];
            }
        }
        const Json range = rangeOf(document.text, region.begin, std::max(region.bodyEnd, region.end));
        symbols[i] = {{"name", VT::shownText(region.directive, shownName)}, {"kind", namespaceSymbol}};
        if (abilities.nestedSymbols) {
            symbols[i]["range"] = range;
            symbols[i]["selectionRange"] = rangeOf(document.text, region.begin, region.end);
        } else {
            symbols[i]["location"] = {{"uri", document.uri}, {"range", range}};
        }
    }
    if (!abilities.nestedSymbols)
        return symbols;
    std::vector<Json> nested; // the last first
    std::vector<std::vector<Json>> children(count);
    for (std::uint32_t i = count; i-- > 0;) {
        if (!children[i].empty()) {
            std::ranges::reverse(children[i]);
            symbols[i]["children"] = std::move(children[i]);
        }
        (parents[i] == VT::ConditionalRegions::none ? nested : children[parents[i]]).push_back(std::move(symbols[i]));
    }
    std::ranges::reverse(nested);
    return nested;
}

} // namespace vtsym
