// Computes single values as a witness needs them: exactly, or not at all.
//
// Sums and products are those of the unbounded integers as long as they fit 64 bits. Quotients truncate toward zero as
// in C. Bits and shifts are those of 32-bit values. A comparison with a real literal never rounds the integer: it
// compares with the literal's whole part and then asks whether there is a fraction.
#include "base/integer/ExactArithmetic.hpp"

#include <cmath>
#include <limits>

namespace VT {

namespace {

using Result = std::optional<std::int64_t>;

constexpr bool fits32(std::int64_t value) noexcept {
    return value >= std::numeric_limits<std::int32_t>::min() && value <= std::numeric_limits<std::int32_t>::max();
}

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
std::int64_t shifted(std::int64_t value, std::int64_t distance) {
    if (distance > 31 || distance < -31)
        return value < 0 && distance < 0 ? -1 : 0;
    if (distance < 0)
        return value >> -distance;
    return static_cast<std::int32_t>(static_cast<std::uint32_t>(value) << distance);
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
    case SymbolicOp::BitAnd:
    case SymbolicOp::BitOr:
    case SymbolicOp::BitXOr:
    case SymbolicOp::ShiftLeft:
    case SymbolicOp::ShiftRight:
        break;
    default:
        return std::nullopt;
    }
    if (!fits32(a) || !fits32(b))
        return std::nullopt;
    switch (op) {
    case SymbolicOp::BitAnd:
        return a & b;
    case SymbolicOp::BitOr:
        return a | b;
    case SymbolicOp::BitXOr:
        return a ^ b;
    default:
        return shifted(a, op == SymbolicOp::ShiftLeft ? b : -b);
    }
}

Result integerResult(SymbolicOp op, std::int64_t a) {
    if (op == SymbolicOp::UnaryMinus)
        return product(a, -1);
    if (op == SymbolicOp::BitCompl && fits32(a))
        return ~a;
    return std::nullopt;
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
