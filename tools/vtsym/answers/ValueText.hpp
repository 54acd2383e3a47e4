// Values of expressions as the program writes them.
#pragma once

#include "base/eval/Values.hpp"

#include <string>
#include <string_view>

namespace vtsym {

/// A value as text or as JSON; what JSON has no number for is named alike in both.
std::string valueText(const VT::SymbolicValue& value, bool json);

/// bool, int, double or vector.
std::string_view typeText(const VT::SymbolicValue& value);

} // namespace vtsym
