// Values of expressions as `eval` and `dims` print them.
// Infinities and NaN have the same names in text and in JSON.
#pragma once

#include "base/eval/Values.hpp"

#include <string>
#include <string_view>

namespace vtsym {

/// A value as text or as JSON.
std::string valueText(const VT::SymbolicValue& value, bool json);

/// The type of a value: bool, int, double or vector.
std::string_view typeText(const VT::SymbolicValue& value);

} // namespace vtsym
