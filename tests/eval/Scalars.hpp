// Scalars of every type as literals.
#pragma once

#include "base/eval/Eval.hpp"
#include "tests/support/AnyNode.hpp"

#include <cmath>
#include <limits>
#include <vector>

namespace VT::Testing {

/// Values at which something changes: bounds of int, of shifts and of the tolerance, signs, halves, what is no number.
inline const std::vector<SymbolicScalar>& corners() {
    static const std::vector<SymbolicScalar> all = [] {
        std::vector<SymbolicScalar> values{false, true, std::numeric_limits<double>::quiet_NaN()};
        for (const int value :
             {-2147483647 - 1, -2147483647, -33, -32, -31, -7, -1, 0, 1, 2, 31, 32, 33, 46341, 2147483646, 2147483647})
            values.emplace_back(value);
        const double tolerance = 1.4901161193847656e-08;
        for (const double value : {tolerance, std::nextafter(tolerance, 0.0), std::nextafter(tolerance, 1.0), 0.0, 0.5,
                                   0.3, 0.1 + 0.2, 1.0, 1.0 + tolerance, 31.9, 32.0, 2147483647.5, 2147483648.0,
                                   2147483648.5, 2147483649.0, 1e300, 5e-324, std::numeric_limits<double>::infinity()})
            values.insert(values.end(), {value, -value});
        return values;
    }();
    return all;
}

inline SymbolicExprId literal(SymbolicExprTable& table, const SymbolicScalar& value) {
    if (value.type() == ScalarType::Bool)
        return SymbolicString(table, value.getBool() ? "true" : "false").getId(table);
    if (value.type() == ScalarType::Int)
        return SymbolicIntValue(table, value.getInt()).getId(table);
    if (value == SymbolicScalar(-0.0)) // as a literal it is that of 0
        return SymbolicUnaryMinusExpr(table, literal(table, 0.0)).getId(table);
    const SymbolicExprId found = SymbolicDoubleValue(table, value.getDouble()).getId(table);
    return found != invalidId ? found : table.size() - 1; // NaN is not found
}

} // namespace VT::Testing
