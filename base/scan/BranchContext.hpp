// What holds where a branch begins: conditions of the branches around it, and opposites of those before it in its
// chain.
#pragma once

#include "base/scan/DirectiveCondition.hpp"

#include <cstdint>
#include <vector>

namespace VT {

/// A condition that holds, or does not, where a branch begins.
struct BranchFact {
    SymbolicExprId node; ///< holds
    bool negated;        ///< the directive's condition does not hold
    std::uint64_t line;
    std::size_t begin; ///< the directive, in bytes
    std::size_t end;
    std::vector<MacroUnknownId> unknowns;
};

/// The facts of the open chains of one file, found by what they are about.
class BranchContext {
public:
    BranchContext(SymbolicExprTable& table, MacroUnknowns& unknowns) : table_(table), unknowns_(unknowns) {}

    [[nodiscard]] std::size_t size() const noexcept { return facts_.size(); }

    [[nodiscard]] const BranchFact& operator[](std::size_t at) const { return facts_[at]; }

    void push(BranchFact fact);
    /// Turns the last fact into its opposite.
    void negateLast();
    void pop(std::size_t size);

    /// The facts that have to do with a condition, in their order: those about the same macros, then those about the
    /// macros of these, and so on up to a bound.  Of very many about one macro the latest.
    std::vector<std::size_t> related(const DirectiveCondition& condition);

    /// What is known of how unknowns depend on each other.
    struct Laws {
        std::vector<SymbolicExprId> states;    ///< a macro that is defined is left as it is by an #include
        std::vector<SymbolicExprId> undefined; ///< a macro that is not defined is 0
    };

    /// The laws about the unknowns of a condition and of facts.
    Laws laws(const DirectiveCondition& condition, const std::vector<std::size_t>& facts);

private:
    SymbolicExprTable& table_;
    MacroUnknowns& unknowns_;
    std::vector<BranchFact> facts_;
    std::vector<std::vector<std::uint32_t>> byGroup_; ///< facts by what they are about
    std::vector<std::uint64_t> marks_;                ///< by fact: the latest question that it was related to
    std::vector<std::uint64_t> groupMarks_;           ///< the same by what it is about
    std::uint64_t question_ = 0;
};

} // namespace VT
