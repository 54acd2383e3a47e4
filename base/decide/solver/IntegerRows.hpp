// Rows of integers, of 64 or 128 bits or of any size, and what the solvers of linear constraints do with them.
#pragma once

#include "base/decide/Steps.hpp"
#include "base/integer/BigInteger.hpp"
#include "base/integer/CheckedInteger.hpp"

#include <cstddef>
#include <utility>
#include <vector>

namespace VT::IntegerRows {

/// Factors of variables, or these and a constant.
template <class Number>
using Row = std::vector<Number>;

template <class Number>
Number magnitude(const Number& value) {
    return value < Number(0) ? Number(-value) : value;
}

template <class Number>
Number floorDivide(const Number& value, const Number& divisor) { // the divisor is positive
    Number quotient = value / divisor;
    if (Number(quotient * divisor) > value)
        quotient = quotient - Number(1);
    return quotient;
}

template <class Number>
Number ceilDivide(const Number& value, const Number& divisor) { // the divisor is positive
    return -floorDivide(Number(-value), divisor);
}

/// The integer nearest to a quotient; the divisor is positive.
template <class Number>
Number nearestQuotient(const Number& value, const Number& divisor) {
    return floorDivide(Number(value + value + divisor), Number(divisor + divisor));
}

template <class Number>
Number gcdOf(Number a, Number b) {
    a = magnitude(a);
    b = magnitude(b);
    while (b != Number(0)) {
        Number rest = a - Number(a / b) * b;
        a = std::move(b);
        b = std::move(rest);
    }
    return a;
}

/// What a product costs, in those of 64 bits.
inline std::size_t costOf(CheckedInteger) noexcept {
    return 1;
}

inline std::size_t costOf(CheckedInt128) noexcept {
    return 2;
}

inline std::size_t costOf(const BigInteger& value) noexcept {
    constexpr std::size_t call = 8;
    constexpr std::size_t pairsOfWords = 4; // whose product is added in the time of a product that is checked
    const std::size_t words = value.backend().size();
    return call + words * words / pairsOfWords;
}

/// Takes steps for arithmetic on so many numbers that are about as long as `typical`.
template <class Number>
void charge(Steps& steps, std::size_t numbers, const Number& typical) {
    constexpr std::size_t productsPerStep = 16;
    steps.take(1 + numbers * costOf(typical) / productsPerStep);
}

} // namespace VT::IntegerRows
