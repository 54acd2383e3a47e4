// Numbers as text and back, the same in every locale.
#pragma once

#include "host/Export.hpp"

#include <cstdint>
#include <string>
#include <string_view>

/// Writes a number: in fixed notation where the exponent of its first digit is -5 to 20 (`2`, `0.25`, `-0`), otherwise
/// in scientific notation (`1e+22`, `1.5e-07`); as `Inf`, `-Inf` or `NaN`.
///
/// @param shortest  the fewest digits that read back to the same value; otherwise 17 significant digits without
/// trailing zeros
VTSYM_API std::string vtsv_dtoa(double value, bool shortest);

namespace VT {

enum class NumberError : std::uint8_t {
    None,
    Syntax,   ///< not a decimal number from its first to its last character
    Overflow, ///< beyond the largest finite value
};

struct ParsedNumber {
    double value = 0.0; ///< 0 after an error
    NumberError error = NumberError::None;
};

} // namespace VT

/// Reads a text that is one decimal number (2, 2., .5 or -1.5e-7), rounded to the nearest value, ties to even.  A
/// number that is too small becomes zero.  Linear in the length of the text.
VTSYM_API VT::ParsedNumber vtsv_strtod(std::string_view text);
