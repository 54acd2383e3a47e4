// Values of expressions: a scalar of one of three types, or a vector of scalars.
//
// A scalar is a cell of eight bytes and its type; prepared expressions keep cells and types apart.
#pragma once

#include <bit>
#include <cmath>
#include <cstddef>
#include <cstdint>
#include <limits>
#include <type_traits>
#include <utility>
#include <variant>
#include <vector>

namespace VT {

/// The type of a scalar; the order is part of the interface.
enum class ScalarType : std::uint8_t { Bool, Int, Double };

inline constexpr std::uint32_t scalarTypes = 3;

/// What a scalar of known type holds: `integer` for an int, and 0 or 1 in it for a bool; `real` for a double.
union ScalarCell {
    std::int32_t integer = 0;
    double real;
};

/// A truth value, a signed integer of 32 bits, or a double.
class SymbolicScalar {
public:
    // NOLINTBEGIN(google-explicit-constructor): a value stands for its scalar
    template <class T>

    requires(std::is_same_v<T, bool> || std::is_same_v<T, std::int32_t> || std::is_same_v<T, double>)
        SymbolicScalar(T value) {
        if constexpr (std::is_same_v<T, double>) {
            cell_.real = value;
            type_ = ScalarType::Double;
        } else {
            cell_.integer = value;
            type_ = std::is_same_v<T, bool> ? ScalarType::Bool : ScalarType::Int;
        }
    }

    // NOLINTEND(google-explicit-constructor)

    SymbolicScalar() : SymbolicScalar(false) {}

    SymbolicScalar(ScalarType type, ScalarCell cell) : cell_(cell), type_(type) {}

    [[nodiscard]] ScalarType type() const noexcept { return type_; }

    /// The number of the type: 0 for bool, 1 for int, 2 for double.
    [[nodiscard]] std::size_t index() const noexcept { return static_cast<std::size_t>(type_); }

    [[nodiscard]] ScalarCell cell() const noexcept { return cell_; }

    /// The value, for the type that the scalar has.
    [[nodiscard]] bool getBool() const noexcept { return cell_.integer != 0; }

    [[nodiscard]] std::int32_t getInt() const noexcept { return cell_.integer; }

    [[nodiscard]] double getDouble() const noexcept { return cell_.real; }

    /// The value as a double, whichever type the scalar has.
    [[nodiscard]] double toDouble() const noexcept {
        return type_ == ScalarType::Double ? cell_.real : static_cast<double>(cell_.integer);
    }

    /// Whether type and value are the same, bit for bit: zeros of both signs differ, NaN is itself.
    [[nodiscard]] friend bool operator==(const SymbolicScalar& a, const SymbolicScalar& b) noexcept {
        if (a.type_ != b.type_)
            return false;
        return a.type_ == ScalarType::Double
                   ? std::bit_cast<std::uint64_t>(a.cell_) == std::bit_cast<std::uint64_t>(b.cell_)
                   : a.cell_.integer == b.cell_.integer;
    }

private:
    ScalarCell cell_;
    ScalarType type_ = ScalarType::Bool;
};

/// The value of an expression: one scalar, or the vector of scalars that a list of dimensions is.
class SymbolicValue {
public:
    using Elements = std::vector<SymbolicScalar>;

    // NOLINTBEGIN(google-explicit-constructor): a scalar, and a vector, is a value
    template <class T>

    requires std::is_constructible_v<SymbolicScalar, T> SymbolicValue(T scalar) : value_(SymbolicScalar(scalar)) {}

    SymbolicValue(Elements elements) : value_(std::move(elements)) {}

    // NOLINTEND(google-explicit-constructor)

    [[nodiscard]] bool isVector() const noexcept { return value_.index() == 1; }

    /// The scalar; throws std::bad_variant_access for a vector.
    [[nodiscard]] const SymbolicScalar& scalar() const { return std::get<0>(value_); }

    /// The elements of a vector; throws std::bad_variant_access for a scalar.
    [[nodiscard]] const Elements& elements() const { return std::get<1>(value_); }

    /// Whether shape, types and values are the same, bit for bit.
    [[nodiscard]] friend bool operator==(const SymbolicValue&, const SymbolicValue&) = default;

private:
    std::variant<SymbolicScalar, Elements> value_;
};

/// Returns the scalar as callers see it: every NaN is the same, because which of two a processor keeps depends on their
/// order.
inline SymbolicScalar visibleScalar(const SymbolicScalar& scalar) {
    if (scalar.type() == ScalarType::Double && std::isnan(scalar.getDouble()))
        return std::numeric_limits<double>::quiet_NaN();
    return scalar;
}

} // namespace VT
