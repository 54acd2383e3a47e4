// Numbers the states of macros in the course of a file.
//
// Method: a counter of changes.  Each macro has the number of its last change, and everything together has a floor,
// raised where any macro may have changed; the state of a macro is the larger of the two, and of those that its
// definition names.  Chains of branches keep the numbers at their beginning on a stack.
// Cost: O(1) for each change; stateOf() is linear in the macros followed, bounded by limits::macrosFollowed.
#include "base/scan/MacroStates.hpp"

#include "base/core/Limits.hpp"

#include <algorithm>
#include <functional>

namespace VT {

MacroStates::Name MacroStates::nameOf(std::string_view text, bool lasting) {
    std::uint64_t hash = std::hash<std::string_view>()(text);
    hash -= hash == IdMap<Name>::noId ? 1U : 0U; // which is not a key
    const auto name = static_cast<Name>(texts_.size());
    Name before = name;
    if (const Name* latest = byHash_.find(hash)) {
        for (Name known = before = *latest;; known = sameHash_[known]) {
            if (texts_[known] == text)
                return known;
            if (sameHash_[known] == known)
                break;
        }
    }
    texts_.push_back(lasting ? text : copies_.emplace_back(text));
    macros_.push_back({.version = 0, .varies = variesByItself(text), .settled = isSettled_ && isSettled_(text)});
    sameHash_.push_back(before);
    byHash_.insert(hash, name);
    return name;
}

void MacroStates::change(Name name) {
    macros_[name].version = ++latest_;
}

void MacroStates::addBody(Name name, const MacroBody& body, std::span<const Name> names) {
    if (body.form == MacroBody::Form::Alias) {
        const Name alias = nameOf(body.alias); // among the names, which are known
        macros_[name].aliases.push_back(alias);
    }
    Macro& macro = macros_[name];
    macro.names.insert(macro.names.end(), names.begin(), names.end());
    macro.varies = macro.varies || body.varies;
    macro.open = macro.open || body.form == MacroBody::Form::Open;
}

void MacroStates::open() {
    chains_.push_back({floor_, epoch_, latestFloor_, latestEpoch_});
}

void MacroStates::nextBranch() {
    floor_ = chains_.back().floor;
    epoch_ = chains_.back().epoch;
}

void MacroStates::close() {
    const Chain chain = chains_.back();
    chains_.pop_back();
    if (latestFloor_ != chain.latestFloor)
        changeAll();
    if (latestEpoch_ != chain.latestEpoch)
        include();
}

/// Fills reached_ with a name and all that it leads to; false beyond the bounds.
template <class Names>
bool MacroStates::reach(Name name, Names namesOf) {
    reached_.assign(1, name);
    std::size_t followed = 0;
    for (std::size_t i = 0; i < reached_.size(); ++i) {
        for (const Name next : namesOf(macros_[reached_[i]])) {
            if (++followed > limits::macroNamesFollowed || reached_.size() > limits::macrosFollowed)
                return false;
            if (std::ranges::find(reached_, next) == reached_.end())
                reached_.push_back(next);
        }
    }
    return true;
}

MacroStates::State MacroStates::stateOf(Name name) {
    const Macro& macro = macros_[name];
    const std::uint64_t version = std::max(macro.version, floor_);
    State state{version, macro.settled && version == 0 ? 0 : epoch_, !macro.names.empty(), macro.varies};
    if (!state.derived)
        return state;
    if (!reach(
            name, [](const Macro& each) -> const auto& { return each.names; })) {
        state.version = ++latest_;
        state.varies = true;
        return state;
    }
    for (const Name each : reached_) {
        state.version = std::max(state.version, macros_[each].version);
        state.varies = state.varies || macros_[each].varies;
    }
    return state;
}

bool MacroStates::isOpen(Name name) {
    if (macros_[name].aliases.empty())
        return macros_[name].open;
    return !reach(
               name, [](const Macro& each) -> const auto& { return each.aliases; }) ||
           std::ranges::any_of(reached_, [&](Name each) { return macros_[each].open; });
}

} // namespace VT
