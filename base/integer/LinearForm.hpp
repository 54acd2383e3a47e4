// Sums of integer multiples of unknowns, exact within a bound on every number in them.
#pragma once

#include "base/core/Limits.hpp"

#include <boost/container/small_vector.hpp>

#include <cstdint>
#include <limits>
#include <optional>

namespace VT {

using Unknown = std::uint32_t;

inline constexpr std::int64_t minusInfinite = std::numeric_limits<std::int64_t>::min();
inline constexpr std::int64_t plusInfinite = std::numeric_limits<std::int64_t>::max();

constexpr bool isWithinBound(std::int64_t value) noexcept {
    return value >= -limits::formNumber && value <= limits::formNumber;
}

struct LinearPart {
    Unknown unknown;
    std::int64_t factor; ///< never 0
    bool operator==(const LinearPart&) const = default;
};

using LinearParts = boost::container::small_vector<LinearPart, 2>;

/// parts + constant, parts in the order of their unknowns' numbers.
struct LinearForm {
    LinearParts parts;
    std::int64_t constant = 0;

    [[nodiscard]] bool isConstant() const noexcept { return parts.empty(); }

    bool operator==(const LinearForm&) const = default;
};

/// a * factorA + b * factorB; nothing where a number would leave the bound.
[[nodiscard]] std::optional<LinearForm> combine(const LinearForm& a, std::int64_t factorA, const LinearForm& b,
                                                std::int64_t factorB);

constexpr std::int64_t floorDivide(std::int64_t value, std::int64_t divisor) noexcept {
    const std::int64_t quotient = value / divisor;
    return value % divisor != 0 && (value < 0) != (divisor < 0) ? quotient - 1 : quotient;
}

} // namespace VT
