// Real literals become integers: one rebuilding pass with a hook for real literals.
//
// Values beyond 32 bits become the least integer, as the conversion instruction of common processors yields.  Linear in
// the distinct nodes.
#include "base/transform/Cast2Int.hpp"

#include <cmath>
#include <limits>

namespace VT {

namespace {

int rounded(double value) {
    const double nearest = std::round(value);
    // Every double between the bounds is an int once it is rounded; NaN is in no order.
    if (nearest >= -2147483648.0 && nearest <= 2147483647.0)
        return static_cast<int>(nearest);
    return std::numeric_limits<int>::min();
}

} // namespace

SymbolicExprId SymbolicExprCast2IntVisitor::buildExpr(OpTag<SymbolicOp::DoubleValue>, double value) {
    return factory_.make<SymbolicIntValue>(rounded(value));
}

SymbolicExprId SymbolicExprCast2Int::cast2Int(SymbolicExprId id) const {
    return SymbolicExprCast2IntVisitor(table_).rebuild(table_, id);
}

} // namespace VT
