// Interns syntax values as nodes.
#pragma once

#include "base/core/Table.hpp"
#include "parser/SyntaxValue.hpp"

namespace VT::Parser {

/// Interns a syntax value and returns its identifier.  Operands are interned before their operator: the right one
/// before the left one, elements of a list and arguments of a call in order after the callee.  An empty value, and an
/// operator that no condition has, yield the invalid identifier.  ~ becomes the complement with C operators and the
/// logical not without.
///
/// Linear in the size of the value, which is a tree; the stack does not grow with its depth.  Throws std::bad_alloc.
SymbolicExprId convertSyntax(SymbolicExprTable& table, const expression_ast& value, bool cOperators);

} // namespace VT::Parser
