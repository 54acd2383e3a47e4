// Ranges that conditions confine names to.  They often show, without a decision, that two conditions never hold
// together.
#pragma once

#include "base/core/Table.hpp"

#include <cstddef>
#include <cstdint>
#include <optional>
#include <vector>

namespace VT {

/// Whether an expression is a name of an integer: not a truth constant, not a variant keyword.
bool isIntegerName(const SymbolicExprTable& table, SymbolicExprId id);

/// The operands of a chain of one operator; nothing where one is missing or there are more than `most`.
std::optional<std::vector<SymbolicExprId>> operandsOf(const SymbolicExprTable& table, SymbolicExprId chain,
                                                      SymbolicOp op, std::size_t most);

/// The integers from `low` to `high` that a name is confined to.
struct NameRange {
    SymbolicExprId name;
    std::int64_t low;
    std::int64_t high;
};

/// Names and the ranges outside of which a condition does not hold; in the order of identifiers.
using NameRanges = std::vector<NameRange>;

/// Returns the ranges from the comparisons of names with integers in a condition that is an And, or an Or of Ands.
/// Looks at limits::rangeOperands operands; those left out make the ranges wider.
NameRanges rangesOf(const SymbolicExprTable& table, SymbolicExprId condition);

/// Ranges that hold wherever one of two conditions does.
NameRanges joined(const NameRanges& a, const NameRanges& b);

/// Whether ranges show that two conditions never hold together.
bool areApart(const NameRanges& a, const NameRanges& b);

/// Positions of conditions, sorted by the range of the name that most of them confine.
std::vector<std::size_t> sortedByRange(const std::vector<NameRanges>& ranges);

} // namespace VT
