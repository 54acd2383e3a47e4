// Combines two literals: exactly in 64 bits for integers, in doubles otherwise.
//
// A result that does not fit 32 bits, or is not finite, leaves the expression as it is.
#include "base/simplify/Literals.hpp"

#include "base/core/Limits.hpp"
#include "base/integer/IntegerSet.hpp"

#include <cmath>

namespace VT {

namespace {

SymbolicExprId realIfFinite(RuleContext& context, double value) {
    return std::isfinite(value) ? context.make<SymbolicDoubleValue>(value) : invalidId;
}

} // namespace

SymbolicExprId integerIfFits(RuleContext& context, std::int64_t value) {
    return fitsInt(value) ? context.make<SymbolicIntValue>(static_cast<int>(value)) : invalidId;
}

SymbolicExprId foldNumbers(RuleContext& context, SymbolicOp op, SymbolicExprId a, SymbolicExprId b) {
    if (!context.isNumber(a) || !context.isNumber(b))
        return invalidId;
    const std::optional<int> left = context.integer(a);
    const std::optional<int> right = context.integer(b);
    if (left && right) {
        const std::int64_t x = *left;
        const std::int64_t y = *right;
        switch (op) {
        case SymbolicOp::Plus:
            return integerIfFits(context, x + y);
        case SymbolicOp::Minus:
            return integerIfFits(context, x - y);
        case SymbolicOp::Multiply:
            return integerIfFits(context, x * y);
        default:
            return y != 0 && x % y == 0 ? integerIfFits(context, x / y) : invalidId;
        }
    }
    const double x = context.node(a).getNumValue();
    const double y = context.node(b).getNumValue();
    switch (op) {
    case SymbolicOp::Plus:
        return realIfFinite(context, x + y);
    case SymbolicOp::Minus:
        return realIfFinite(context, x - y);
    case SymbolicOp::Multiply:
        return realIfFinite(context, x * y);
    default:
        return std::fabs(y) >= limits::zeroThreshold ? realIfFinite(context, x / y) : invalidId;
    }
}

} // namespace VT
