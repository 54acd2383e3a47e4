// What conditions of directives ask of macros, as unknowns of a table.
#pragma once

#include "base/core/Nodes.hpp"
#include "base/scan/MacroStates.hpp"

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

namespace VT {

using MacroUnknownId = std::uint32_t;

/// An unknown: something asked of macros in one state of theirs.
struct MacroUnknown {
    enum class Kind : std::uint8_t {
        Value,      ///< of a macro; 0 where it is not defined
        Defined,    ///< whether a macro is defined
        Comparison, ///< of two terms: negative, zero or positive
        Term,       ///< any other arithmetic, a call, a condition that was not understood
    };

    Kind kind;
    MacroStates::Name subject; ///< the macro's name, or the text of what is asked
    MacroStates::State state;
    std::uint32_t group; ///< of what is asked about one subject in one version
    SymbolicExprId node; ///< a symbol whose value it is
    std::string left;    ///< how the terms are written; `right` for a comparison alone
    std::string right;
};

/// The unknowns of one file.
class MacroUnknowns {
public:
    MacroUnknowns(SymbolicExprTable& table, MacroStates& states) : table_(table), states_(states) {}

    MacroUnknownId value(MacroStates::Name macro);
    MacroUnknownId defined(MacroStates::Name macro);
    /// The same as value() or defined(), as it was asked in another state.
    MacroUnknownId asked(MacroUnknown::Kind kind, MacroStates::Name macro, const MacroStates::State& state);
    /// What equals what has the same `key` and hangs on the same macros; the texts are how it is written.  Where one of
    /// the macros varies, like nothing else.
    MacroUnknownId comparison(const std::string& key, std::string left, std::string right,
                              const std::vector<MacroStates::Name>& macros);
    MacroUnknownId term(const std::string& key, std::string text, const std::vector<MacroStates::Name>& macros);
    /// Like nothing else.
    MacroUnknownId unique(std::string text);

    /// Groups are numbered from 0.
    [[nodiscard]] std::size_t groups() const noexcept { return groups_.size(); }

    [[nodiscard]] const MacroUnknown& operator[](MacroUnknownId id) const { return unknowns_[id]; }

    /// The unknown whose symbol is given, if it is one.
    [[nodiscard]] const MacroUnknown* find(SymbolicExprId node) const;

private:
    struct Key {
        MacroUnknown::Kind kind;
        MacroStates::Name subject;
        std::uint64_t version;
        std::uint64_t epoch;
        bool operator==(const Key&) const = default;
    };

    struct KeyHash {
        std::size_t operator()(const Key& key) const noexcept;
    };

    [[nodiscard]] MacroStates::State stateOf(const std::vector<MacroStates::Name>& macros);
    MacroStates::Name freshSubject(std::string_view text);
    MacroUnknownId add(MacroUnknown unknown);

    SymbolicExprTable& table_;
    MacroStates& states_;
    std::vector<MacroUnknown> unknowns_;
    std::unordered_map<Key, MacroUnknownId, KeyHash> ids_;
    std::unordered_map<Key, std::uint32_t, KeyHash> groups_; ///< by keys of values in no epoch
    std::unordered_map<SymbolicExprId, MacroUnknownId> byNode_;
    std::uint64_t unique_ = 0;
};

} // namespace VT
