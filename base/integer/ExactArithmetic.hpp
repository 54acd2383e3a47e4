// Arithmetic of single values, exact or refused.
#pragma once

#include "base/core/Operators.hpp"
#include "base/integer/RationalForm.hpp"

#include <cstdint>
#include <optional>

namespace VT {

/// The operators that have exact values here, beside those whose values are truth values.
inline constexpr OperatorSet exactOps{
    SymbolicOp::Plus,       SymbolicOp::Minus,    SymbolicOp::UnaryMinus, SymbolicOp::Multiply, SymbolicOp::DotMul,
    SymbolicOp::Power,      SymbolicOp::DotPower, SymbolicOp::Divide,     SymbolicOp::Modulo,   SymbolicOp::ShiftLeft,
    SymbolicOp::ShiftRight, SymbolicOp::BitAnd,   SymbolicOp::BitOr,      SymbolicOp::BitXOr,   SymbolicOp::BitCompl};

/// The operators written as a symbol that are unknowns of their own in decisions.
inline constexpr OperatorSet opaqueOps{SymbolicOp::DotDiv, SymbolicOp::LDiv, SymbolicOp::DotLDiv, SymbolicOp::Transpose,
                                       SymbolicOp::DotTranspose};

static_assert((exactOps | opaqueOps | booleanOps) == symbolOps,
              "give every operator that is written as a symbol an exact value, or name it in opaqueOps");

/// `a op b` over the integers; quotients are cut toward zero, shifts multiply and divide by powers of two (to the right
/// rounding down), bits are those of two's complement without an end.  Nothing where the result leaves 64 bits, where
/// the value is not an integer (a division by zero, a negative exponent), and for operators that have no value here.
[[nodiscard]] std::optional<std::int64_t> integerResult(SymbolicOp op, std::int64_t a, std::int64_t b);
[[nodiscard]] std::optional<std::int64_t> integerResult(SymbolicOp op, std::int64_t a);

/// The same for constants of any size; where `isReal` says that one of them is a real number, the quotient is exact.
/// Nothing beyond limits::formBits.
[[nodiscard]] std::optional<RationalForm> exactResult(SymbolicOp op, const RationalForm& a, const RationalForm& b,
                                                      bool isReal);

/// What two literals are folded to, one of them a real number; nothing where that is not finite.
[[nodiscard]] std::optional<double> foldedReals(SymbolicOp op, double a, double b);

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
