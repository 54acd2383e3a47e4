// The errors of evaluation, thrown as host diagnostics.  They name the symbol or the sub-expression as C text.
#pragma once

#include "base/core/Table.hpp"

#include <cstddef>

namespace VT::detail {

/// "Vantor:SymbolicDims:UnboundSymbol": no value is bound to a symbol.
[[noreturn]] void throwUnboundSymbol(const SymbolicExprTable& table, const SymbolicExpr& symbol);
/// "Vantor:SymbolicDims:CyclicValue": the value of a symbol needs that value.
[[noreturn]] void throwCyclicValue(const SymbolicExprTable& table, const SymbolicExpr& symbol);
/// "Vantor:SymbolicDims:NotEvaluable": a node of this kind, or on these operands, has no value.
[[noreturn]] void throwNotEvaluable(const SymbolicExprTable& table, const SymbolicExpr& node);
/// The same for an identifier without a node, an operand of `parent` unless that is nullptr.
[[noreturn]] void throwMissingNode(const SymbolicExprTable& table, SymbolicExprId id, const SymbolicExpr* parent);
/// "Vantor:SymbolicDims:SizeMismatch": the operands of a node are vectors of different lengths.
[[noreturn]] void throwSizeMismatch(const SymbolicExprTable& table, const SymbolicExpr& node, std::size_t left,
                                    std::size_t right);

} // namespace VT::detail
