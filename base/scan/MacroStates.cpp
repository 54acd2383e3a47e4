#include "base/scan/MacroStates.hpp"

#include <algorithm>
#include <functional>

namespace VT {

namespace {

constexpr std::size_t mostReached = 64;    ///< names that one macro is followed through
constexpr std::size_t mostFollowed = 1024; ///< times that one of them stands in a definition

} // namespace

MacroStates::Name MacroStates::nameOf(std::string_view text, bool lasting) {
    SymbolicExprId hash = std::hash<std::string_view>()(text);
    hash -= hash == invalidId ? 1U : 0U; // which is no key
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
    versions_.push_back(0);
    bodies_.emplace_back();
    sameHash_.push_back(before);
    byHash_.insert(hash, name);
    return name;
}

void MacroStates::change(Name name) {
    versions_[name] = ++latest_;
}

void MacroStates::addBody(Name name, std::span<const Name> body) {
    bodies_[name].insert(bodies_[name].end(), body.begin(), body.end());
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

MacroStates::State MacroStates::stateOf(Name name) {
    State state{std::max(versions_[name], floor_), epoch_, !bodies_[name].empty()};
    if (!state.derived)
        return state;
    reached_.assign(1, name);
    std::size_t followed = 0;
    for (std::size_t i = 0; i < reached_.size(); ++i) {
        state.version = std::max(state.version, versions_[reached_[i]]);
        for (const Name next : bodies_[reached_[i]]) {
            if (++followed > mostFollowed || reached_.size() > mostReached) {
                state.version = ++latest_;
                return state;
            }
            if (std::ranges::find(reached_, next) == reached_.end())
                reached_.push_back(next);
        }
    }
    return state;
}

} // namespace VT
