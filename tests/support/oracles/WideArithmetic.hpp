// The value of every operator on two scalars, written down again over wide integers.
#pragma once

#include "base/core/Nodes.hpp"
#include "base/eval/Values.hpp"

#include <vector>

namespace VT::Testing {

/// Values at which something changes: bounds of int, of shifts and of the tolerance, signs, halves, what is no number.
const std::vector<SymbolicScalar>& cornerScalars();

/// Interns a literal, or a negated one, of this value.
SymbolicExprId scalarLiteral(SymbolicExprTable& table, const SymbolicScalar& value);

/// What an operator makes of two scalars; one of one operand ignores the second.
SymbolicScalar expectedScalar(SymbolicOp op, const SymbolicScalar& a, const SymbolicScalar& b);

} // namespace VT::Testing
