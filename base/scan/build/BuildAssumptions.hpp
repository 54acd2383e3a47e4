// Conditions that are assumed of every build.
//
// A line is a condition as #if has them, or one of these:
//   #define F(x) body      what a call of F with one name means where code asks for it:
//                          `x##_A` is the name with a suffix
//   #pragma closed PREFIX  macros that begin with it, and are longer, are settled before a file
//                          begins, and those that no line names are not defined
//   #pragma open NAME      but for this one, which sources define themselves
#pragma once

#include "base/scan/DirectiveCondition.hpp"

#include <map>
#include <memory>
#include <optional>
#include <set>
#include <string>
#include <string_view>
#include <unordered_map>
#include <utility>
#include <vector>

namespace VT {

/// Conditions that hold in every build, found by the macros that they name.  Copies share the lines that both have, and
/// are added to by one thread at a time.
class BuildAssumptions {
public:
    struct Item {
        enum class Kind : std::uint8_t {
            Condition, ///< a line
            Meaning,   ///< of a call, by a #define
            Absence,   ///< of a macro that no line names
        };

        std::shared_ptr<const std::string> line; ///< as a directive
        std::vector<std::string_view> names;     ///< of macros, each once, in their order
        Kind kind = Kind::Condition;
        std::string shown{}; ///< what it follows from, where that is not the line itself
    };

    /// Adds a line.  Returns what is wrong with it, a part of a sentence that follows its quotation; nothing where it
    /// was added.
    std::optional<std::string> add(std::string_view condition);

    /// Whether all can hold together, as far as that is decided: true for more than limits::assumptionsTogether.
    [[nodiscard]] bool canHold() const;

    [[nodiscard]] bool empty() const noexcept { return items_.empty() && closed_.empty() && meanings_.empty(); }

    /// Whether some text may have a macro that is settled; true where no prefix is closed.
    [[nodiscard]] bool mayConcern(std::string_view text) const;

    [[nodiscard]] const Item& operator[](std::size_t at) const { return *items_[at]; }

    /// Returns the positions of assumptions that share a macro with the names, then those that share one with these,
    /// limits::relatedAssumptions at most.
    [[nodiscard]] std::vector<std::size_t> relatedTo(const std::set<std::string_view>& names) const;

    /// Whether a name leads to an assumption that has it.  A name that more than limits::assumptionsAboutName share
    /// leads to those that begin with it alone.
    [[nodiscard]] bool leadsTo(std::string_view name, const Item& item) const;

    /// Whether a macro is settled before a file begins.
    [[nodiscard]] bool isSettled(std::string_view name) const;
    /// Whether assumptions say that a macro is 1 wherever it is defined.
    [[nodiscard]] bool isLogical(std::string_view name) const;
    /// Returns the condition that a settled macro that no line names is not defined; nothing for others.  That is an
    /// Absence where the code has the name; a name that a call makes of one that lines have is as good as named.
    [[nodiscard]] std::optional<Item> absenceOf(std::string_view name, bool isWritten) const;
    /// Returns what the call of a macro with a settled name means; nothing where no line says so.
    [[nodiscard]] std::optional<Item> meaningOf(std::string_view macro, std::string_view argument) const;

    /// The tokens of an item: views of its line.
    static std::vector<DirectiveToken> tokensOf(const Item& item);

private:
    /// What calls of a macro mean.
    struct Meaning {
        std::shared_ptr<const std::string> line;
        std::string_view parameter;
        std::vector<DirectiveToken> body;
    };

    struct Lines;

    static std::shared_ptr<Lines> newLines();
    [[nodiscard]] bool isClosed(std::string_view name) const;
    std::optional<std::string> addMeaning(std::string_view line);
    std::optional<std::string> addPragma(std::string_view line);

    std::vector<std::shared_ptr<const Item>> items_;
    std::unordered_map<std::string_view, std::vector<std::size_t>> byName_;
    std::unordered_map<std::string_view, std::vector<std::size_t>> byFirst_;
    std::vector<std::string> closed_; ///< prefixes
    std::set<std::string, std::less<>> open_;
    std::map<std::string, Meaning, std::less<>> meanings_;
    std::shared_ptr<Lines> lines_ = newLines(); ///< that were read, of all copies
};

/// The assumptions in one file: about macros that the file did not change, wherever they are read.
class FileAssumptions {
public:
    FileAssumptions(const BuildAssumptions& all, MacroStates& states, MacroUnknowns& unknowns,
                    DirectiveConditionReader& reader);

    /// An assumption about macros as they are at some place.
    struct Fact {
        const BuildAssumptions::Item* assumption;
        DirectiveCondition condition;
    };

    /// Reads the assumptions that have to do with the macros of a condition where it is read.  Facts that are new are
    /// from `facts().size()` before on.
    void readFor(std::span<const DirectiveToken> condition);

    /// Everything that was read.
    [[nodiscard]] const std::vector<Fact>& facts() const noexcept { return facts_; }

    /// Whether a fact is about one of the unknowns.
    [[nodiscard]] bool concern(const std::vector<MacroUnknownId>& unknowns) const;

    /// Returns the positions of the facts that have to do with some unknowns, limits::relatedAssumptions at most.
    [[nodiscard]] std::vector<std::size_t> relatedTo(const std::vector<MacroUnknownId>& unknowns) const;

private:
    void read(const BuildAssumptions::Item& item);
    const BuildAssumptions::Item* readMade(std::optional<BuildAssumptions::Item> item);

    const BuildAssumptions& all_;
    MacroStates& states_;
    MacroUnknowns& unknowns_;
    DirectiveConditionReader& reader_;
    std::vector<Fact> facts_;
    std::map<std::string, BuildAssumptions::Item, std::less<>> made_; ///< for names and calls of the file, by line
    std::set<std::pair<const BuildAssumptions::Item*, std::uint64_t>> read_; ///< and epoch
    std::unordered_map<std::uint32_t, std::vector<std::size_t>> byGroup_;    ///< facts by group of unknowns
};

} // namespace VT
