// Arithmetic of single values, exact or refused.
#pragma once

#include "base/core/Operators.hpp"

#include <cstdint>
#include <optional>

namespace VT {

/// `a op b` over the integers; quotients are cut toward zero, bits and shifts are those of 32-bit values.  Nothing
/// where the result leaves 64 bits, where the value is not an integer (a division by zero, a negative exponent, bits of
/// a value beyond 32 bits), and for operators that have no value here.
[[nodiscard]] std::optional<std::int64_t> integerResult(SymbolicOp op, std::int64_t a, std::int64_t b);
[[nodiscard]] std::optional<std::int64_t> integerResult(SymbolicOp op, std::int64_t a);

/// The comparison of an integer with a real number, exact; every comparison with NaN but the unequal one fails.
[[nodiscard]] bool compareExactly(SymbolicOp op, std::int64_t a, double b);

template <class Number>
[[nodiscard]] constexpr bool compareNumbers(SymbolicOp op, Number a, Number b) {
    switch (op) {
    case SymbolicOp::Equal:
        return a == b;
    case SymbolicOp::NotEqual:
        return a != b;
    case SymbolicOp::LessThan:
        return a < b;
    case SymbolicOp::LessThanEqual:
        return a <= b;
    case SymbolicOp::GreaterThan:
        return a > b;
    default:
        return a >= b;
    }
}

} // namespace VT
