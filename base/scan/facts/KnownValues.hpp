// The values that one symbol may have where facts compare it with constants.
#pragma once

#include "base/core/Nodes.hpp"
#include "base/integer/IntegerSet.hpp"

#include <optional>
#include <span>
#include <vector>

namespace VT {

/// How the values for which a condition holds are related to those that are known.
enum class ValueVerdict : std::uint8_t {
    Contradiction, ///< there are no known ones
    Never,         ///< it holds for none of them
    Always,        ///< for all
    Sometimes,
};

/// Judges conditions of one table that compare one symbol with a constant, under facts that do so, too: the questions
/// of long chains.  Remembers the facts of the last question, so that a further one costs as much as the set is long.
class KnownValues {
public:
    explicit KnownValues(const SymbolicExprTable& table) : table_(table) {}

    /// Nothing where the condition or a fact is anything else, or about another symbol.
    std::optional<ValueVerdict> judge(SymbolicExprId condition, std::span<const SymbolicExprId> facts);

private:
    struct Values {
        SymbolicExprId symbol;
        IntegerSet set;
    };

    [[nodiscard]] std::optional<Values> valuesOf(SymbolicExprId condition) const;

    const SymbolicExprTable& table_;
    std::vector<SymbolicExprId> facts_; ///< that known_ follows from
    Values known_{invalidId, IntegerSet::all()};
};

} // namespace VT
