// Number tokens of Quill text.
#pragma once

#include "host/Numbers.hpp"

#include <string_view>

namespace VT {

/// Returns the value of a number token: decimal as vtsv_strtod() reads it, or hexadecimal after 0x, rounded to the
/// nearest.  Linear in its length.
ParsedNumber quillNumber(std::string_view token);

} // namespace VT
