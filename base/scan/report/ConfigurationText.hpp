// Values of unknowns as definitions of macros.
#pragma once

#include "base/decide/Decision.hpp"
#include "base/scan/MacroUnknowns.hpp"

#include <functional>
#include <string>
#include <string_view>

namespace VT {

/// Writes a witness as settings of a configuration, ordered by name: "A=y, B=n, C=m, D=5".  A logical macro that is
/// defined is y, and m where that is so of its name with _MODULE; others have their value.  What is not defined is n.
/// Unknowns that are not macros as they are before the file are left out.  n log n in the unknowns.
std::string configurationText(const MacroUnknowns& unknowns, const Witness& witness,
                              const std::function<bool(std::string_view)>& isLogical);

} // namespace VT
