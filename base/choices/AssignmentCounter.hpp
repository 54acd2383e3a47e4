// Counts the assignments for which a condition holds.
#pragma once

#include "base/choices/ChoiceAdvice.hpp"
#include "base/decide/Decider.hpp"
#include "base/integer/IntegerSet.hpp"
#include "base/util/IdMap.hpp"

#include <cstdint>
#include <optional>
#include <span>
#include <vector>

namespace VT {

/// The values of a domain.
IntegerSet valuesOf(const SymbolDomain& domain);

/// Interns the condition that a symbol has one of its values.
SymbolicExprId conditionOf(SymbolicExprTable& table, const SymbolDomain& domain);

/// Counts assignments of names whose values are declared.  The table and the decider outlive the counter.
class AssignmentCounter {
public:
    AssignmentCounter(SymbolicExprTable& table, Decider& decider, std::span<const SymbolDomain> domains)
        : table_(table),
          decider_(decider) {
        for (const SymbolDomain& domain : domains)
            values_.insert(domain.symbol, valuesOf(domain));
    }

    /// The names in conditions, each once: symbols, and functions and owners of members, for which nothing is counted.
    [[nodiscard]] std::vector<SymbolicExprId> namesOf(std::span<const SymbolicExprId> conditions) const;

    /// The number of assignments of `names`, which are all names in the conditions at least, for which all conditions
    /// hold.  Nothing where a name has no declared values, where a call or a member takes part, where an operation has
    /// no value, beyond limits::countedAssignments for names that depend on each other, and beyond 64 bits.
    std::optional<std::uint64_t> count(std::span<const SymbolicExprId> conditions,
                                       std::span<const SymbolicExprId> names);

private:
    struct Part;
    struct Values;

    [[nodiscard]] const IntegerSet* boundedValuesOf(SymbolicExprId name) const;
    [[nodiscard]] std::optional<Values> classesOf(SymbolicExprId name, SymbolicExprId condition) const;
    std::optional<std::uint64_t> countPart(const Part& part);
    std::optional<std::uint64_t> countAssignments(const Part& part, SymbolicExprId condition);
    const std::vector<SymbolicExprId>* namesIfCountable(SymbolicExprId operand);

    SymbolicExprTable& table_;
    Decider& decider_;
    IdMap<IntegerSet> values_; ///< by symbol
    std::uint64_t workLeft_ = limits::countedNodes;
    IdMap<std::optional<std::uint64_t>> counted_; ///< by the And of a part's operands
    /// By operand: its names; nothing where it cannot be counted.
    IdMap<std::optional<std::vector<SymbolicExprId>>> operandNames_;
};

} // namespace VT
