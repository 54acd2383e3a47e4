// Makes nodes of operators that are known at run time only.
//
// The functions are expanded from operators.def: each looks up the constructor of the operator's class in an array, so
// that a new operator needs no line here.
#pragma once

#include "base/core/Operators.hpp"
#include "base/core/Table.hpp"

#include <span>
#include <vector>

namespace VT {

/// Interns the node of an operator with these operands and returns its identifier.
///
/// Returns the invalid identifier for an operator whose class takes another number of operands, or more than operands
/// (a member takes its name).  O(1) on average; in the number of operands for a list.
VTSYM_API SymbolicExprId makeUnary(SymbolicExprTable& table, SymbolicOp op, SymbolicExprId operand);
VTSYM_API SymbolicExprId makeBinary(SymbolicExprTable& table, SymbolicOp op, SymbolicExprId left, SymbolicExprId right);
VTSYM_API SymbolicExprId makeTernary(SymbolicExprTable& table, SymbolicOp op, SymbolicExprId first,
                                     SymbolicExprId second, SymbolicExprId third);
/// The same for the classes that take any number of operands; a call's name comes first.
VTSYM_API SymbolicExprId makeMulti(SymbolicExprTable& table, SymbolicOp op, std::vector<SymbolicExprId> operands);
/// A chain of an operator with two operands, folded from the left; a single operand is its own chain, and no operands
/// yield the invalid identifier.
VTSYM_API SymbolicExprId makeChain(SymbolicExprTable& table, SymbolicOp op, std::span<const SymbolicExprId> operands);

} // namespace VT
