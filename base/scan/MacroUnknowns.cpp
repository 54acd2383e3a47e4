// The unknowns of conditions: one symbol for each question about a macro in one state.
//
// Method: hash maps from question and state to the unknown, and from node to unknown.  A symbol's name is the macro's,
// with its state after a line break where that is not the first one, so that no macro of the file can have the same
// name.
// Cost: O(1) on average for each question, plus the length of the name.
#include "base/scan/MacroUnknowns.hpp"

#include <boost/container_hash/hash.hpp>

#include <algorithm>

namespace VT {

namespace {

/// Macros that no file may define.
bool isFixed(std::string_view name) {
    return name == "__cplusplus" || name == "__STDC__" || name == "__STDC_VERSION__" || name == "__STDC_HOSTED__";
}

} // namespace

std::size_t MacroUnknowns::KeyHash::operator()(const Key& key) const noexcept {
    auto seed = static_cast<std::size_t>(key.kind);
    boost::hash_combine(seed, key.subject);
    boost::hash_combine(seed, key.version);
    boost::hash_combine(seed, key.epoch);
    return seed;
}

MacroUnknownId MacroUnknowns::add(MacroUnknown unknown) {
    const Key key{unknown.kind, unknown.subject, unknown.state.version, unknown.state.epoch};
    if (const auto known = ids_.find(key); known != ids_.end())
        return known->second;
    const std::string_view subject = states_.textOf(unknown.subject);
    std::string name;
    if (unknown.kind == MacroUnknown::Kind::Defined)
        name.append("defined(").append(subject).append(")");
    else
        name = subject;
    // A line break is in no name, and keeps names of macros apart from the truth constants.
    if (unknown.state.version != 0 || unknown.state.epoch != 0 || name == "true" || name == "false") {
        name.append("\n")
            .append(std::to_string(unknown.state.version))
            .append(".")
            .append(std::to_string(unknown.state.epoch));
    }
    unknown.node = SymbolicString(table_, name).getId(table_);
    const Key group{MacroUnknown::Kind::Value, key.subject, key.version, 0};
    unknown.group = groups_.emplace(group, static_cast<std::uint32_t>(groups_.size())).first->second;
    const auto id = static_cast<MacroUnknownId>(unknowns_.size());
    byNode_.emplace(unknown.node, id);
    unknowns_.push_back(std::move(unknown));
    ids_.emplace(key, id);
    return id;
}

MacroUnknownId MacroUnknowns::asked(MacroUnknown::Kind kind, MacroStates::Name macro, const MacroStates::State& state) {
    const std::string_view name = states_.textOf(macro);
    MacroUnknown unknown{kind, macro, state, 0, invalidId, std::string(name), {}};
    if (isFixed(name))
        unknown.state.epoch = 0;
    return add(std::move(unknown));
}

MacroUnknownId MacroUnknowns::value(MacroStates::Name macro) {
    const MacroStates::State state = states_.stateOf(macro);
    if (state.varies)
        return unique(std::string(states_.textOf(macro)));
    return asked(MacroUnknown::Kind::Value, macro, state);
}

MacroUnknownId MacroUnknowns::defined(MacroStates::Name macro) {
    return asked(MacroUnknown::Kind::Defined, macro, states_.stateOf(macro));
}

MacroStates::State MacroUnknowns::stateOf(const std::vector<MacroStates::Name>& macros) {
    MacroStates::State all{0, 0, false, false};
    for (const MacroStates::Name macro : macros) {
        const MacroStates::State state = states_.stateOf(macro);
        all.version = std::max(all.version, state.version);
        all.epoch = std::max(all.epoch, state.epoch);
        all.derived = all.derived || state.derived;
        all.varies = all.varies || state.varies;
    }
    return all;
}

/// Returns a subject of its own.
MacroStates::Name MacroUnknowns::freshSubject(std::string_view text) {
    return states_.nameOf(std::string(text).append("\n").append(std::to_string(++unique_)));
}

MacroUnknownId MacroUnknowns::comparison(const std::string& key, std::string left, std::string right,
                                         const std::vector<MacroStates::Name>& macros) {
    const MacroStates::State state = stateOf(macros);
    return add({MacroUnknown::Kind::Comparison, state.varies ? freshSubject(key) : states_.nameOf(key), state, 0,
                invalidId, std::move(left), std::move(right)});
}

MacroUnknownId MacroUnknowns::term(const std::string& key, std::string text,
                                   const std::vector<MacroStates::Name>& macros) {
    const MacroStates::State state = stateOf(macros);
    return add({MacroUnknown::Kind::Term,
                state.varies ? freshSubject(key) : states_.nameOf(key),
                state,
                0,
                invalidId,
                std::move(text),
                {}});
}

MacroUnknownId MacroUnknowns::unique(std::string text) {
    const MacroStates::Name subject = freshSubject(text);
    return add({MacroUnknown::Kind::Term, subject, {0, 0, false, true}, 0, invalidId, std::move(text), {}});
}

std::optional<MacroUnknownId> MacroUnknowns::idOf(SymbolicExprId node) const {
    const auto known = byNode_.find(node);
    return known == byNode_.end() ? std::nullopt : std::optional(known->second);
}

const MacroUnknown* MacroUnknowns::find(SymbolicExprId node) const {
    const auto known = byNode_.find(node);
    return known == byNode_.end() ? nullptr : &unknowns_[known->second];
}

} // namespace VT
