// The facts at the beginning of a branch: conditions of the branches around it, and opposites of those before it in its
// chain.
#pragma once

#include "base/scan/DirectiveCondition.hpp"

#include <cstdint>
#include <vector>

namespace VT {

/// A condition that holds, or does not, where a branch begins.
struct BranchFact {
    SymbolicExprId node; ///< the condition that holds, or an operand of its And
    bool negated;        ///< the directive's condition does not hold
    std::uint64_t line;
    std::size_t begin; ///< the directive, in bytes
    std::size_t end;
    std::vector<MacroUnknownId> unknowns;
    std::vector<PartSpelling> spellings{}; ///< in the directive's tokens; kept where reasons are written
    SymbolicExprId whole = invalidId;      ///< the directive's condition
};

/// The facts of the open chains of one file, found by the macros that they are about.
class BranchContext {
public:
    BranchContext(SymbolicExprTable& table, MacroUnknowns& unknowns) : table_(table), unknowns_(unknowns) {}

    [[nodiscard]] std::size_t size() const noexcept { return facts_.size(); }

    [[nodiscard]] const BranchFact& operator[](std::size_t at) const { return facts_[at]; }

    /// Adds the condition of a directive.  The operands of an And become facts of their own, each about its own macros,
    /// so that macros are related through those alone; an And of more than limits::factWindow stays one.
    void push(const BranchFact& fact);

    /// Turns the facts from a position on, which are those of one directive, into its opposite.
    void negateFrom(std::size_t first);
    void pop(std::size_t size);

    /// Returns the positions of the facts that are related to unknowns, in order: those about the same macros, those
    /// about the macros of these, and so on up to limits::factWeight.  Of more than limits::factWindow about one macro,
    /// the latest.
    std::vector<std::size_t> related(const std::vector<MacroUnknownId>& unknowns);

    /// How unknowns depend on each other.
    struct Laws {
        std::vector<SymbolicExprId> includeLaws;   ///< an #include leaves a macro that is defined as it is
        std::vector<SymbolicExprId> undefinedLaws; ///< a macro that is not defined is 0
    };

    /// Returns the laws about unknowns.  n log n in these.
    Laws laws(std::vector<MacroUnknownId> asked);

private:
    void add(BranchFact fact);
    /// The unknowns whose symbols a condition has.
    [[nodiscard]] std::vector<MacroUnknownId> unknownsIn(SymbolicExprId node) const;

    SymbolicExprTable& table_;
    MacroUnknowns& unknowns_;
    std::vector<BranchFact> facts_;
    std::vector<std::vector<std::uint32_t>> byGroup_; ///< facts by group of unknowns
    std::vector<std::uint64_t> marks_;                ///< by fact: the latest question that it was related to
    std::vector<std::uint64_t> groupMarks_;           ///< the same by group of unknowns
    std::uint64_t question_ = 0;
};

} // namespace VT
