// The unknowns of directives' conditions: questions about macros, each a symbol of a table.
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

/// An unknown: a question about macros in one state.
struct MacroUnknown {
    enum class Kind : std::uint8_t {
        Value,      ///< of a macro; 0 where it is not defined
        Defined,    ///< whether a macro is defined
        Comparison, ///< of two terms: negative, zero or positive
        Term,       ///< other arithmetic, a call, a condition that was not understood
    };

    Kind kind;
    MacroStates::Name subject; ///< the macro's name, or the text of the question
    MacroStates::State state;
    std::uint32_t group; ///< shared by all questions about one subject in one version
    SymbolicExprId node; ///< its symbol
    std::string left;    ///< how the terms are written; `right` for a comparison alone
    std::string right;
};

/// The unknowns of one file.
class MacroUnknowns {
public:
    MacroUnknowns(SymbolicExprTable& table, MacroStates& states) : table_(table), states_(states) {}

    MacroUnknownId value(MacroStates::Name macro);
    MacroUnknownId defined(MacroStates::Name macro);
    /// The same as value() or defined(), in a given state.
    MacroUnknownId asked(MacroUnknown::Kind kind, MacroStates::Name macro, const MacroStates::State& state);
    /// Comparisons, and terms, with one `key` and one state of their macros are equal.  `left`, `right` and `text` are
    /// how they are written.  Where one of the macros varies, a fresh unknown, equal to no other.
    MacroUnknownId comparison(const std::string& key, std::string left, std::string right,
                              const std::vector<MacroStates::Name>& macros);
    MacroUnknownId term(const std::string& key, std::string text, const std::vector<MacroStates::Name>& macros);
    /// A fresh unknown, equal to no other.
    MacroUnknownId unique(std::string text);

    /// Groups are numbered from 0.
    [[nodiscard]] std::size_t groups() const noexcept { return groups_.size(); }

    [[nodiscard]] const MacroUnknown& operator[](MacroUnknownId id) const { return unknowns_[id]; }

    /// Returns the unknown of a symbol, or nullptr.
    [[nodiscard]] const MacroUnknown* find(SymbolicExprId node) const;
    [[nodiscard]] std::optional<MacroUnknownId> idOf(SymbolicExprId node) const;

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
