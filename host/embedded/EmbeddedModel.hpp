// The embedded host's model: blocks in blocks, choice sets, and ports.
#pragma once

#include "host/Model.hpp"

#include <cstddef>
#include <cstdint>
#include <deque>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

class VTRootBD;

namespace VT::Embedded {

/// The place of a text in the file of the model.  Lines and columns begin at 1 and columns count code points; 0 is
/// unknown.  Quotes belong to the text.
struct TextPlace {
    std::uint64_t line = 0;
    std::uint64_t column = 0;
    std::uint64_t endColumn = 0; ///< after the last one
};

/// Bytes of a text, from `begin` to before `end`.
struct TextRange {
    std::size_t begin = 0;
    std::size_t end = 0;
};

/// Which choice of a block is the active one: the one whose condition holds, the first of those, or every one.
enum class ChoiceRule : std::uint8_t { Unique, First, Collect };

/// The values that a symbol of conditions is declared to have.
struct DeclaredSymbol {
    std::string name;
    TextPlace place;
    std::optional<std::vector<int>> values = {}; ///< all of them, in any order
    std::optional<int> min = {};
    std::optional<int> max = {};
};

} // namespace VT::Embedded

/// A block: a name, a parent, a variant condition, choices.  Made and owned by a VTRootBD.
class VTSYM_API VTBlock {
public:
    [[nodiscard]] const VTRootBD& root() const noexcept { return root_; }

    [[nodiscard]] const std::string& name() const noexcept { return name_; }

    /// The block that holds this one; nullptr at the top of the model.
    [[nodiscard]] const VTBlock* parent() const noexcept { return parent_; }

    /// Whether this block is a choice of its parent.
    [[nodiscard]] bool isChoice() const noexcept { return isChoice_; }

    /// The condition of this block alone, in the language of the model; empty without one.
    [[nodiscard]] const std::string& variantCondition() const noexcept { return condition_; }

    /// The choices of this block, in the order of the model.
    [[nodiscard]] std::span<const VTBlock* const> choices() const noexcept { return choices_; }

    /// The bytes of the block in the file of the model; none for a block that is not from a file.
    [[nodiscard]] const VT::Embedded::TextRange& textRange() const noexcept { return textRange_; }

    void setTextRange(const VT::Embedded::TextRange& range) noexcept { textRange_ = range; }

    [[nodiscard]] VT::Embedded::ChoiceRule choiceRule() const noexcept { return choiceRule_; }

    void setChoiceRule(VT::Embedded::ChoiceRule rule) noexcept { choiceRule_ = rule; }

    /// The names from the top of the model, separated by "/"; of more than eight the last eight, after ".../".
    /// Names are shown fit for a terminal, long ones cut.
    [[nodiscard]] std::string path() const;

    [[nodiscard]] const VT::Embedded::TextPlace& namePlace() const noexcept { return namePlace_; }

    [[nodiscard]] const VT::Embedded::TextPlace& conditionPlace() const noexcept { return conditionPlace_; }

    /// `place` is the place of the text, quotes included.
    void setVariantCondition(std::string condition, const VT::Embedded::TextPlace& place = {});

private:
    friend class VTRootBD;

    VTBlock(const VTRootBD& root, VTBlock* parent, bool isChoice) : root_(root), parent_(parent), isChoice_(isChoice) {}

    const VTRootBD& root_;
    VTBlock* parent_;
    bool isChoice_;
    std::string name_;
    std::string condition_;
    std::vector<const VTBlock*> choices_;
    VT::Embedded::ChoiceRule choiceRule_ = VT::Embedded::ChoiceRule::Unique;
    VT::Embedded::TextPlace namePlace_;
    VT::Embedded::TextPlace conditionPlace_;
    VT::Embedded::TextRange textRange_;
};

/// A port: a signal leaves one block for others.
class VTSYM_API vtPort {
public:
    vtPort(std::string name, const VTBlock& source, std::vector<const VTBlock*> destinations,
           const VT::Embedded::TextPlace& place = {})
        : name_(std::move(name)),
          source_(&source),
          destinations_(std::move(destinations)),
          place_(place) {}

    [[nodiscard]] const std::string& name() const noexcept { return name_; }

    [[nodiscard]] const VTBlock& source() const noexcept { return *source_; }

    [[nodiscard]] std::span<const VTBlock* const> destinations() const noexcept { return destinations_; }

    [[nodiscard]] const VT::Embedded::TextPlace& place() const noexcept { return place_; }

private:
    std::string name_;
    const VTBlock* source_;
    std::vector<const VTBlock*> destinations_;
    VT::Embedded::TextPlace place_;
};

/// The root diagram: owns the blocks and ports of a model.
class VTSYM_API VTRootBD {
public:
    VTRootBD() = default;
    VTRootBD(const VTRootBD&) = delete;
    VTRootBD& operator=(const VTRootBD&) = delete;

    [[nodiscard]] const std::string& name() const noexcept { return name_; }

    void setName(std::string name) { name_ = std::move(name); }

    /// Whether conditions are in Quill syntax; otherwise they are in C syntax.
    [[nodiscard]] bool isQuill() const noexcept { return isQuill_; }

    void setQuill(bool isQuill) noexcept { isQuill_ = isQuill; }

    /// Adds a block without a name and a condition to a block of this model, or to the top for nullptr.  A choice has a
    /// parent.
    VTBlock& addBlock(VTBlock* parent, bool isChoice);
    /// Names a block.  Returns what is wrong with the name, in words for its author; empty on success.  A name is not
    /// empty, holds no "/", and differs from those of its siblings.
    std::string nameBlock(VTBlock& block, std::string name, const VT::Embedded::TextPlace& place = {});
    void addPort(vtPort port);

    /// All blocks, each after its parent; siblings in the order in which they were added.
    [[nodiscard]] const std::deque<VTBlock>& blocks() const noexcept { return blocks_; }

    [[nodiscard]] const std::deque<vtPort>& ports() const noexcept { return ports_; }

    /// Symbols with declared values, in the order in which they were added.
    [[nodiscard]] const std::deque<VT::Embedded::DeclaredSymbol>& symbols() const noexcept { return symbols_; }

    /// Adds a symbol without values yet.
    VT::Embedded::DeclaredSymbol& addSymbol(std::string name, const VT::Embedded::TextPlace& place = {}) {
        return symbols_.emplace_back(VT::Embedded::DeclaredSymbol{std::move(name), place});
    }

    /// The symbol that was added last; there is one.
    [[nodiscard]] VT::Embedded::DeclaredSymbol& lastSymbol() { return symbols_.back(); }

    /// The block of a path, "Engine/Diesel", or nullptr.
    [[nodiscard]] const VTBlock* find(std::string_view path) const;

private:
    struct Key {
        const VTBlock* parent;
        std::string_view name; ///< of the block itself
        bool operator==(const Key&) const = default;
    };

    struct KeyHash {
        std::size_t operator()(const Key& key) const noexcept {
            return std::hash<std::string_view>()(key.name) * 31 + std::hash<const void*>()(key.parent);
        }
    };

    std::string name_;
    bool isQuill_ = false;
    std::deque<VTBlock> blocks_;
    std::deque<vtPort> ports_;
    std::deque<VT::Embedded::DeclaredSymbol> symbols_;
    std::unordered_map<Key, const VTBlock*, KeyHash> named_;
};
