// A 64-bit integer that reports an overflow instead of wrapping, in the place of a big integer while numbers are small.
#pragma once

#include "base/integer/BigInteger.hpp"

#include <compare>
#include <cstdint>
#include <limits>

namespace VT {

/// Thrown where a number leaves 64 bits.
struct Overflow {};

/// Adds, subtracts, multiplies and divides like an integer; throws Overflow where the result has no 64 bits.
class CheckedInteger {
public:
    CheckedInteger(std::int64_t value = 0)
        : value_(value) {} // NOLINT(google-explicit-constructor): a number is a number

    explicit CheckedInteger(const BigInteger& value) {
        if (value < std::numeric_limits<std::int64_t>::min() || value > std::numeric_limits<std::int64_t>::max())
            throw Overflow{};
        value_ = static_cast<std::int64_t>(value);
    }

    explicit operator BigInteger() const { return value_; }

    friend CheckedInteger operator+(CheckedInteger a, CheckedInteger b) {
        std::int64_t result = 0;
        return __builtin_add_overflow(a.value_, b.value_, &result) ? throw Overflow{} : result;
    }

    friend CheckedInteger operator-(CheckedInteger a, CheckedInteger b) {
        std::int64_t result = 0;
        return __builtin_sub_overflow(a.value_, b.value_, &result) ? throw Overflow{} : result;
    }

    friend CheckedInteger operator*(CheckedInteger a, CheckedInteger b) {
        std::int64_t result = 0;
        return __builtin_mul_overflow(a.value_, b.value_, &result) ? throw Overflow{} : result;
    }

    friend CheckedInteger operator/(CheckedInteger a, CheckedInteger b) {
        return b.value_ == -1 ? CheckedInteger(0) - a : CheckedInteger(a.value_ / b.value_);
    }

    friend CheckedInteger operator-(CheckedInteger a) { return CheckedInteger(0) - a; }

    CheckedInteger& operator+=(CheckedInteger other) { return *this = *this + other; }

    friend auto operator<=>(CheckedInteger, CheckedInteger) = default;

private:
    std::int64_t value_ = 0;
};

} // namespace VT
