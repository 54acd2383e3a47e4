// Computes single values as a witness needs them: exactly, or not at all.
//
// Sums and products are those of the unbounded integers as long as they fit 64 bits. Quotients truncate toward zero as
// in C. Bits are those of two's complement without an end. A comparison with a real literal never rounds the integer:
// it compares with the literal's whole part and then asks whether there is a fraction.
#include "base/integer/ExactArithmetic.hpp"

#include "base/core/Limits.hpp"
#include "base/integer/Int32.hpp"

#include <algorithm>
#include <cmath>

namespace VT {

namespace {

using Result = std::optional<std::int64_t>;

Result product(std::int64_t a, std::int64_t b) {
    std::int64_t result = 0;
    return __builtin_mul_overflow(a, b, &result) ? Result() : Result(result);
}

Result power(std::int64_t base, std::int64_t exponent) {
    if (exponent < 0)
        return std::nullopt;
    if (base == 0 || base == 1)
        return exponent == 0 ? 1 : base;
    if (base == -1)
        return exponent % 2 == 0 ? 1 : -1;
    Result result = 1;
    for (; exponent > 0 && result; --exponent) // at most 62 times before it overflows
        result = product(*result, base);
    return result;
}

/// A shift to the left, or to the right for a negative distance.
Result shifted(std::int64_t value, std::int64_t distance) {
    if (distance < 0)
        return value >> std::min<std::int64_t>(-distance, 63);
    if (distance < 63)
        return product(value, std::int64_t{1} << distance);
    return value == 0 ? Result(0) : std::nullopt;
}

} // namespace

Result integerResult(SymbolicOp op, std::int64_t a, std::int64_t b) {
    std::int64_t result = 0;
    switch (op) {
    case SymbolicOp::Plus:
        return __builtin_add_overflow(a, b, &result) ? Result() : Result(result);
    case SymbolicOp::Minus:
        return __builtin_sub_overflow(a, b, &result) ? Result() : Result(result);
    case SymbolicOp::Multiply:
    case SymbolicOp::DotMul:
        return product(a, b);
    case SymbolicOp::Power:
    case SymbolicOp::DotPower:
        return power(a, b);
    case SymbolicOp::Divide:
    case SymbolicOp::Modulo:
        if (b == 0 || b == -1) // the quotient of the smallest value by -1 has no 64 bits
            return b == 0 ? Result() : op == SymbolicOp::Modulo ? Result(0) : product(a, -1);
        return op == SymbolicOp::Divide ? a / b : a % b;
    case SymbolicOp::ShiftLeft:
    case SymbolicOp::ShiftRight:
        if (!fitsInt(b))
            return std::nullopt;
        return shifted(a, op == SymbolicOp::ShiftLeft ? b : -b);
    case SymbolicOp::BitAnd:
        return a & b;
    case SymbolicOp::BitOr:
        return a | b;
    case SymbolicOp::BitXOr:
        return a ^ b;
    default:
        return std::nullopt;
    }
}

Result integerResult(SymbolicOp op, std::int64_t a) {
    if (op == SymbolicOp::UnaryMinus)
        return product(a, -1);
    if (op == SymbolicOp::BitCompl)
        return ~a;
    return std::nullopt;
}

std::optional<RationalForm> exactResult(SymbolicOp op, const RationalForm& a, const RationalForm& b, bool isReal) {
    const auto left = a.integer();
    const auto right = b.integer();
    switch (op) {
    case SymbolicOp::Plus:
        return combine(a, 1, b, 1);
    case SymbolicOp::Minus:
        return combine(a, 1, b, -1);
    case SymbolicOp::Multiply:
    case SymbolicOp::DotMul:
        return multiply(a, b);
    case SymbolicOp::Divide:
        if (b.sign() == 0)
            return std::nullopt;
        if (isReal || !left || !right)
            return divide(a, b);
        return RationalForm(BigInteger(*left / *right));
    case SymbolicOp::Modulo:
        return left && right && !isReal && *right != 0 ? std::optional(RationalForm(BigInteger(*left % *right)))
                                                       : std::nullopt;
    default:
        break;
    }
    if (isReal || !left || !right)
        return std::nullopt;
    constexpr std::int64_t longest = limits::formBits;
    if (op == SymbolicOp::ShiftLeft && *right >= 0 && *right <= longest)
        return multiply(a, RationalForm(BigInteger(BigInteger(1) << static_cast<unsigned>(*right))));
    switch (op) {
    case SymbolicOp::ShiftRight:
        if (*right >= 0 && *right <= longest)
            return RationalForm(floorDivide(*left, BigInteger(BigInteger(1) << static_cast<unsigned>(*right))));
        break;
    case SymbolicOp::BitAnd: // of packaged integers too, bits are those of two's complement without an end
        return RationalForm(BigInteger(*left & *right));
    case SymbolicOp::BitOr:
        return RationalForm(BigInteger(*left | *right));
    case SymbolicOp::BitXOr:
        return RationalForm(BigInteger(*left ^ *right));
    default:
        break;
    }
    const LinearForm* smallA = a.small();
    const LinearForm* smallB = b.small();
    const Result value =
        smallA != nullptr && smallB != nullptr ? integerResult(op, smallA->constant, smallB->constant) : std::nullopt;
    return value ? std::optional(RationalForm(BigInteger(*value))) : std::nullopt;
}

std::optional<double> foldedReals(SymbolicOp op, double a, double b) {
    const auto finite = [](double value) { return std::isfinite(value) ? std::optional(value) : std::nullopt; };
    switch (op) {
    case SymbolicOp::Plus:
        return finite(a + b);
    case SymbolicOp::Minus:
        return finite(a - b);
    case SymbolicOp::Multiply:
        return finite(a * b);
    case SymbolicOp::Divide:
        return std::fabs(b) >= limits::zeroThreshold ? finite(a / b) : std::nullopt;
    default:
        return std::nullopt;
    }
}

bool compareExactly(SymbolicOp op, std::int64_t a, double b) {
    if (std::isnan(b))
        return op == SymbolicOp::NotEqual;
    constexpr double beyond = 9223372036854775808.0; // 2^63
    if (b >= beyond || b < -beyond)
        return compareNumbers(op, 0, b > 0 ? 1 : -1);
    const auto whole = static_cast<std::int64_t>(std::floor(b));
    if (static_cast<double>(whole) == b || a != whole)
        return compareNumbers(op, a, whole);
    return compareNumbers(op, 0, 1); // a is the whole part of b, which has a fraction
}

} // namespace VT
