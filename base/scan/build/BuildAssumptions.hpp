// Conditions that are assumed of every build.
#pragma once

#include "base/scan/DirectiveCondition.hpp"

#include <map>
#include <memory>
#include <optional>
#include <set>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

namespace VT {

/// Conditions that hold in every build, found by the macros that they name.
class BuildAssumptions {
public:
    struct Item {
        std::shared_ptr<const std::string> line; ///< as a directive
        std::vector<DirectiveToken> tokens;      ///< views of the line
        std::vector<std::string_view> names;     ///< of macros, each once
    };

    /// Assumes a condition as #if has them.  Returns what is wrong with it, a part of a sentence that follows its
    /// quotation; nothing where it was added.
    std::optional<std::string> add(std::string_view condition);

    /// Whether all can hold together, as far as that is decided.
    [[nodiscard]] bool canHold() const;

    [[nodiscard]] bool empty() const noexcept { return items_.empty(); }

    [[nodiscard]] const Item& operator[](std::size_t at) const { return items_[at]; }

    /// Returns the positions of assumptions that share a macro with the names, then those that share one with these,
    /// limits::relatedAssumptions at most.
    [[nodiscard]] std::vector<std::size_t> relatedTo(const std::set<std::string_view>& names) const;

private:
    std::vector<Item> items_;
    std::unordered_map<std::string_view, std::vector<std::size_t>> byName_;
};

/// The assumptions in one file: about macros that the file did not change, wherever they are read.
class FileAssumptions {
public:
    FileAssumptions(const BuildAssumptions& all, MacroStates& states, MacroUnknowns& unknowns,
                    DirectiveConditionReader& reader)
        : all_(all),
          states_(states),
          unknowns_(unknowns),
          reader_(reader) {}

    /// An assumption about macros as they are at some place.
    struct Fact {
        std::size_t assumption;
        DirectiveCondition condition;
    };

    /// Reads the assumptions that have to do with the macros of a condition where it is read.  Facts that are new are
    /// from `facts().size()` before on.
    void readFor(std::span<const DirectiveToken> condition);

    /// Everything that was read.
    [[nodiscard]] const std::vector<Fact>& facts() const noexcept { return facts_; }

    /// Returns the positions of the facts that have to do with some unknowns, limits::relatedAssumptions at most.
    [[nodiscard]] std::vector<std::size_t> relatedTo(const std::vector<MacroUnknownId>& unknowns) const;

private:
    const BuildAssumptions& all_;
    MacroStates& states_;
    MacroUnknowns& unknowns_;
    DirectiveConditionReader& reader_;
    std::vector<Fact> facts_;
    std::set<std::pair<std::size_t, std::uint64_t>> read_;                ///< assumption and epoch
    std::unordered_map<std::uint32_t, std::vector<std::size_t>> byGroup_; ///< facts by group of unknowns
};

} // namespace VT
