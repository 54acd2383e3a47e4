// Finds and reads the assumptions that have to do with a condition.
//
// Method: breadth first through shared names.  An assumption is read again after each #include, so that it is about
// macros as they are there; never where the file changed one of its macros.
// Cost: at most limits::relatedAssumptions for each condition; each is read once for each epoch.
#include "base/scan/build/BuildAssumptions.hpp"

#include "base/core/Limits.hpp"
#include "base/core/Make.hpp"
#include "base/decide/Decider.hpp"

#include <algorithm>

namespace VT {

std::optional<std::string> BuildAssumptions::add(std::string_view condition) {
    Item item;
    item.line = std::make_shared<const std::string>("#if " + std::string(condition));
    DirectiveReader reader(*item.line);
    Directive directive{};
    if (condition.find('\n') != std::string_view::npos)
        return "has several lines";
    if (!reader.next(directive) || directive.tokens.empty())
        return "holds no condition";
    item.tokens.assign(directive.tokens.begin(), directive.tokens.end());
    SymbolicExprTable table;
    table.addBoolSymbols();
    MacroStates states;
    MacroUnknowns unknowns(table, states);
    const DirectiveCondition read = DirectiveConditionReader(table, states, unknowns, false).read(directive);
    if (!read.understood)
        return "is not a condition that #if can have";
    for (const DirectiveToken& token : item.tokens) {
        const bool isMacro = token.kind == DirectiveTokenKind::Name && token.text != "defined";
        if (isMacro && std::ranges::find(item.names, token.text) == item.names.end())
            item.names.push_back(token.text);
    }
    for (const std::string_view name : item.names)
        byName_[name].push_back(items_.size());
    items_.push_back(std::move(item));
    return std::nullopt;
}

bool BuildAssumptions::canHold() const {
    SymbolicExprTable table;
    table.addBoolSymbols();
    MacroStates states;
    MacroUnknowns unknowns(table, states);
    DirectiveConditionReader reader(table, states, unknowns, false);
    std::vector<SymbolicExprId> all;
    for (const Item& item : items_) {
        Directive directive{};
        directive.kind = DirectiveKind::If;
        directive.tokens = item.tokens;
        all.push_back(reader.read(directive).node);
    }
    if (all.empty())
        return true;
    Decider decider(table, {.keywordsInForce = false});
    return !decider.canHold(makeChain(table, SymbolicOp::And, all)).isNo();
}

std::vector<std::size_t> BuildAssumptions::relatedTo(const std::set<std::string_view>& names) const {
    std::vector<std::size_t> found;
    std::set<std::string_view> seen;
    const auto addAbout = [&](std::string_view name) {
        const auto about = byName_.find(name);
        if (!seen.insert(name).second || about == byName_.end())
            return;
        for (const std::size_t item : about->second) {
            if (found.size() == limits::relatedAssumptions)
                return;
            if (std::ranges::find(found, item) == found.end())
                found.push_back(item);
        }
    };
    std::ranges::for_each(names, addAbout);
    std::size_t next = 0;
    while (next < found.size()) // which grows
        std::ranges::for_each(items_[found[next++]].names, addAbout);
    return found;
}

void FileAssumptions::readFor(std::span<const DirectiveToken> condition) {
    if (all_.empty())
        return;
    std::set<std::string_view> names;
    for (const DirectiveToken& token : condition)
        if (token.kind == DirectiveTokenKind::Name)
            names.insert(token.text);
    for (const std::size_t item : all_.relatedTo(names)) {
        const BuildAssumptions::Item& assumed = all_[item];
        std::uint64_t epoch = 0;
        const bool isChanged = std::ranges::any_of(assumed.names, [&](std::string_view name) {
            const MacroStates::State state = states_.stateOf(states_.nameOf(name));
            epoch = state.epoch;
            return state.version != 0 || state.derived || state.varies;
        });
        if (isChanged || !read_.emplace(item, epoch).second)
            continue;
        Directive directive{};
        directive.kind = DirectiveKind::If;
        directive.tokens = assumed.tokens;
        facts_.push_back({item, reader_.read(directive)});
        for (const MacroUnknownId unknown : facts_.back().condition.unknowns)
            byGroup_[unknowns_[unknown].group].push_back(facts_.size() - 1);
    }
}

std::vector<std::size_t> FileAssumptions::relatedTo(const std::vector<MacroUnknownId>& unknowns) const {
    std::vector<std::size_t> found;
    const auto addAbout = [&](MacroUnknownId unknown) {
        const auto about = byGroup_.find(unknowns_[unknown].group);
        if (about == byGroup_.end())
            return;
        for (const std::size_t fact : about->second)
            if (found.size() < limits::relatedAssumptions && std::ranges::find(found, fact) == found.end())
                found.push_back(fact);
    };
    std::ranges::for_each(unknowns, addAbout);
    std::size_t next = 0;
    while (next < found.size()) // which grows
        std::ranges::for_each(facts_[found[next++]].condition.unknowns, addAbout);
    return found;
}

} // namespace VT
