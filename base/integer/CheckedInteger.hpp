// Integers of 64 and 128 bits that report an overflow instead of wrapping, in the place of big integers while numbers
// are small.
#pragma once

#include "base/integer/BigInteger.hpp"

#include <compare>
#include <cstdint>

namespace VT {

/// Thrown where a number has too many bits.
struct Overflow {};

/// Adds, subtracts, multiplies and divides like an integer; throws Overflow where the result does not fit.
template <class Integer>
class Checked {
public:
    Checked(std::int64_t value = 0) // NOLINT(google-explicit-constructor): a number is a number
        : value_(value) {}

    explicit Checked(const BigInteger& value) {
        constexpr unsigned bits = 8 * sizeof(Integer) - 1; // without the sign
        if (value != 0 && msb(BigInteger(abs(value))) >= bits)
            throw Overflow{};
        value_ = static_cast<Integer>(value);
    }

    explicit operator BigInteger() const { return value_; }

    friend Checked operator+(Checked a, Checked b) {
        Integer result = 0;
        return __builtin_add_overflow(a.value_, b.value_, &result) ? throw Overflow{} : ofValue(result);
    }

    friend Checked operator-(Checked a, Checked b) {
        Integer result = 0;
        return __builtin_sub_overflow(a.value_, b.value_, &result) ? throw Overflow{} : ofValue(result);
    }

    friend Checked operator*(Checked a, Checked b) {
        Integer result = 0;
        return __builtin_mul_overflow(a.value_, b.value_, &result) ? throw Overflow{} : ofValue(result);
    }

    friend Checked operator/(Checked a, Checked b) {
        return b.value_ == -1 ? Checked(0) - a : ofValue(a.value_ / b.value_);
    }

    friend Checked operator-(Checked a) { return Checked(0) - a; }

    Checked& operator+=(Checked other) { return *this = *this + other; }

    friend auto operator<=>(Checked, Checked) = default; // NOLINT(modernize-use-nullptr): no pointer here

private:
    static Checked ofValue(Integer value) {
        Checked result;
        result.value_ = value;
        return result;
    }

    Integer value_ = 0;
};

__extension__ using Int128 = __int128;
using CheckedInteger = Checked<std::int64_t>;
using CheckedInt128 = Checked<Int128>;

} // namespace VT
