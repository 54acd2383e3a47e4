// What a condition may be reduced to.
//
// A condition that is reduced to a value, such as `x/y && 2` to `x/y`, becomes a dimension, whose quotients are exact:
// where x/y is between -1 and 1 the condition fails and the dimension is not 0.  It is written as `x/y ~= 0` then.
#pragma once

#include "base/core/Table.hpp"

namespace VT {

/// Whether a quotient takes part in the value of an expression other than through a truth value.  Linear in the
/// distinct nodes.
[[nodiscard]] bool hasQuotientOfItsOwn(const SymbolicExprTable& table, SymbolicExprId root);

/// Returns the condition that says what `reduced` says as a part of a condition: `reduced` itself, or its comparison
/// with 0 where it would be a dimension with a quotient.
[[nodiscard]] SymbolicExprId asConditionOfItsOwn(SymbolicExprTable& table, SymbolicExprId reduced);

} // namespace VT
