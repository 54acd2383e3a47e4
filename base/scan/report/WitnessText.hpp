// Values of macros that show something, as texts.
#pragma once

#include "base/decide/Decider.hpp"
#include "base/scan/MacroUnknowns.hpp"

#include <string>

namespace VT {

/// Returns the values of a witness about the unknowns of a file: "A=1, defined(B)=0, A < C".  Linear.
std::string witnessText(const MacroUnknowns& unknowns, const Decider& decider, const Witness& witness);

} // namespace VT
