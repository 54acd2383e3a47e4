// The integers that a literal can have.
#pragma once

#include <cstdint>
#include <limits>

namespace VT {

/// Whether a value fits 32 bits, as every literal does.
constexpr bool fitsInt(std::int64_t value) noexcept {
    return value >= std::numeric_limits<std::int32_t>::min() && value <= std::numeric_limits<std::int32_t>::max();
}

} // namespace VT
