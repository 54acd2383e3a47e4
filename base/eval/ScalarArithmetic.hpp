// The arithmetic of evaluation: one function for each operator, over bool, 32-bit integers and doubles.
//
// It is total: every operator has a result for every pair of scalars.  Sums, differences and products of integers wrap,
// quotients truncate and saturate.  Sums, differences and products of doubles, and quotients by what does not count as
// zero, are those of IEEE 754: infinity minus infinity, zero times infinity and infinity by infinity are NaN.  A
// divisor that counts as zero (limits::zeroThreshold), or is NaN, makes an infinity.
//
// The functions know nothing of nodes.  The rows at the end name the operator of each; ScalarRules.hpp and Execute.cpp
// expand them.  Each function is O(1).
#pragma once

#include "base/core/Limits.hpp"

#include <cmath>
#include <cstdint>
#include <limits>
#include <type_traits>

namespace VT {

/// The functions.  Operands are bool, std::int32_t or double; the return type is the type of the result.
namespace rules {

inline constexpr std::int32_t greatest = std::numeric_limits<std::int32_t>::max();
inline constexpr std::int32_t least = std::numeric_limits<std::int32_t>::min();

template <class... T>
inline constexpr bool anyReal = (std::is_same_v<T, double> || ...);

/// The integer that operators on bits take for a value: a real is truncated, at most to the bounds, and NaN is 0.
template <class T>
std::int32_t integer(T value) {
    if constexpr (anyReal<T>) {
        if (value >= 2147483648.0)
            return greatest;
        if (value <= -2147483649.0)
            return least;
        return std::isnan(value) ? 0 : static_cast<std::int32_t>(value);
    } else {
        return static_cast<std::int32_t>(value);
    }
}

template <class T>
std::uint32_t bits(T value) {
    return static_cast<std::uint32_t>(integer(value));
}

/// Sums, differences and products of integers wrap.
constexpr std::int32_t wrapped(std::uint32_t bits) {
    return static_cast<std::int32_t>(bits);
}

template <class T>
double real(T value) {
    return static_cast<double>(value);
}

template <class L, class R>
auto add(L a, R b) {
    if constexpr (anyReal<L, R>)
        return real(a) + real(b);
    else
        return wrapped(bits(a) + bits(b));
}

template <class L, class R>
auto subtract(L a, R b) {
    if constexpr (anyReal<L, R>)
        return real(a) - real(b);
    else
        return wrapped(bits(a) - bits(b));
}

template <class L, class R>
auto multiply(L a, R b) {
    if constexpr (anyReal<L, R>)
        return real(a) * real(b);
    else
        return wrapped(bits(a) * bits(b));
}

/// The quotient of doubles; a divisor that counts as zero, or is NaN, makes an infinity of the dividend's sign, that of
/// zero included.  Divides in any case and chooses then, so that loops over it have no branch.
inline double quotient(double a, double b) {
    constexpr double infinity = std::numeric_limits<double>::infinity();
    const bool isDivisor = std::fabs(b) >= limits::zeroThreshold;
    const double quotient = a / (isDivisor ? b : 1.0);
    const double bound = a >= 0 ? infinity : a < 0 ? -infinity : a;
    return isDivisor ? quotient : bound;
}

/// Integers divide toward zero and saturate.  A zero divisor yields a bound by the dividend's sign; only 0/0 of two
/// ints is 0.
template <class L, class R>
auto divide(L a, R b) {
    if constexpr (anyReal<L, R>) {
        return quotient(real(a), real(b));
    } else {
        const std::int32_t dividend = integer(a);
        const std::int32_t divisor = integer(b);
        if (divisor == 0) {
            if constexpr (std::is_same_v<L, std::int32_t> && std::is_same_v<R, std::int32_t>)
                if (dividend == 0)
                    return 0;
            return dividend >= 0 ? greatest : least;
        }
        return divisor == -1 && dividend == least ? greatest : dividend / divisor;
    }
}

/// The remainder of the division toward zero; by zero it is the dividend.
template <class L, class R>
auto remainder(L a, R b) {
    if constexpr (anyReal<L, R>) {
        return std::fabs(real(b)) < limits::zeroThreshold ? real(a) : std::fmod(real(a), real(b));
    } else {
        const std::int32_t dividend = integer(a);
        const std::int32_t divisor = integer(b);
        if (divisor == 0)
            return dividend;
        return divisor == -1 ? 0 : dividend % divisor;
    }
}

/// Integers are compared exactly, doubles within the threshold; NaN equals NaN.
template <class L, class R>
bool equal(L a, R b) {
    if constexpr (anyReal<L, R>) {
        const double x = real(a);
        const double y = real(b);
        return x == y || std::fabs(x - y) < limits::zeroThreshold || (std::isnan(x) && std::isnan(y));
    } else {
        return integer(a) == integer(b);
    }
}

template <class L, class R>
bool notEqual(L a, R b) {
    return !equal(a, b);
}

/// Strict comparisons have no tolerance.
template <class L, class R>
bool less(L a, R b) {
    if constexpr (anyReal<L, R>)
        return real(a) < real(b);
    else
        return integer(a) < integer(b);
}

template <class L, class R>
bool greater(L a, R b) {
    return less(b, a);
}

template <class L, class R>
bool lessEqual(L a, R b) {
    if constexpr (anyReal<L, R>)
        return real(b) >= real(a) || equal(a, b);
    else
        return integer(a) <= integer(b);
}

template <class L, class R>
bool greaterEqual(L a, R b) {
    return lessEqual(b, a);
}

/// Every value but zero is true; so is NaN.
template <class T>
bool truth(T value) {
    return value != T{};
}

template <class L, class R>
bool both(L a, R b) {
    return truth(a) & truth(b);
}

template <class L, class R>
bool either(L a, R b) {
    return truth(a) | truth(b);
}

template <class L, class R>
std::int32_t bitAnd(L a, R b) {
    return wrapped(bits(a) & bits(b));
}

template <class L, class R>
std::int32_t bitOr(L a, R b) {
    return wrapped(bits(a) | bits(b));
}

template <class L, class R>
std::int32_t bitXOr(L a, R b) {
    return wrapped(bits(a) ^ bits(b));
}

/// To the left by a positive amount, with the sign to the right by a negative one.
inline std::int32_t shifted(std::int32_t value, std::int64_t amount) {
    if (amount > 31 || amount < -31)
        return value < 0 && amount < 0 ? -1 : 0;
    return amount >= 0 ? wrapped(bits(value) << static_cast<unsigned>(amount))
                       : value >> static_cast<unsigned>(-amount);
}

template <class L, class R>
std::int32_t shiftLeft(L a, R b) {
    return shifted(integer(a), integer(b));
}

template <class L, class R>
std::int32_t shiftRight(L a, R b) {
    return shifted(integer(a), -static_cast<std::int64_t>(integer(b)));
}

// Operators of one operand take it twice, so that one table holds all rules.

template <class T>
auto negate(T a, T) {
    if constexpr (anyReal<T>)
        return -a;
    else
        return wrapped(0U - bits(a));
}

template <class T>
bool negateTruth(T a, T) {
    return !truth(a);
}

template <class T>
std::int32_t complement(T a, T) {
    return wrapped(~bits(a));
}

} // namespace rules

// The rules by operator: VTSYM_RULE(operator, operands, function).
// clang-format off
#define VTSYM_SCALAR_RULES(VTSYM_RULE)             \
    VTSYM_RULE(Plus, 2, add)                       \
    VTSYM_RULE(Minus, 2, subtract)                 \
    VTSYM_RULE(UnaryMinus, 1, negate)              \
    VTSYM_RULE(Multiply, 2, multiply)              \
    VTSYM_RULE(Divide, 2, divide)                  \
    VTSYM_RULE(Modulo, 2, remainder)               \
    VTSYM_RULE(Equal, 2, equal)                    \
    VTSYM_RULE(NotEqual, 2, notEqual)              \
    VTSYM_RULE(LessThan, 2, less)                  \
    VTSYM_RULE(LessThanEqual, 2, lessEqual)        \
    VTSYM_RULE(GreaterThan, 2, greater)            \
    VTSYM_RULE(GreaterThanEqual, 2, greaterEqual)  \
    VTSYM_RULE(And, 2, both)                       \
    VTSYM_RULE(Or, 2, either)                      \
    VTSYM_RULE(Not, 1, negateTruth)                \
    VTSYM_RULE(BitAnd, 2, bitAnd)                  \
    VTSYM_RULE(BitOr, 2, bitOr)                    \
    VTSYM_RULE(BitXOr, 2, bitXOr)                  \
    VTSYM_RULE(BitCompl, 1, complement)            \
    VTSYM_RULE(ShiftLeft, 2, shiftLeft)            \
    VTSYM_RULE(ShiftRight, 2, shiftRight)
// clang-format on

} // namespace VT
