// Why a question stayed undecided, and what to do.
#pragma once

#include "base/decide/Decision.hpp"

#include <string>

namespace vtsym {

/// Why a question is undecided, a main clause without a subject: "takes too many steps".  Names the package of a solver
/// where one may decide it, and says so where the steps of the whole command are used up.
std::string undecidedText(VT::DecisionBound bound, bool isCommandOver = false);

/// What to do so that a solver is asked what stays undecided, after a "; "; nothing where one was.
std::string solverAdvice();

} // namespace vtsym
