// The order of expressions by structure, for those whose texts agree.
#pragma once

#include "base/core/Node.hpp"

namespace VT {

/// Orders two expressions of a table by structure: operator, literal or name, number of operands, then the operands
/// from left to right.  Negative, zero or positive; zero for equal structure.  Identifiers have no say, so the order
/// does not depend on the table's history.  An identifier that is not of the table comes before every other one.
///
/// Linear in the depth of the first difference; linear in the size where copies of NaN make equal structures of several
/// nodes.
[[nodiscard]] VTSYM_API int compareStructure(const SymbolicExprTable& table, SymbolicExprId left, SymbolicExprId right);

} // namespace VT
