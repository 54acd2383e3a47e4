// Why a conclusion about conditions holds.
#pragma once

#include "base/core/Node.hpp"

#include <vector>

namespace VT {

/// Operands of premises that alone force a conclusion.
struct Reasons {
    bool isProven = false; ///< the operands force the conclusion; without it there are none
    /// Without any one of the operands the conclusion does not follow.  False too where a question on the way stayed
    /// undecided.
    bool isMinimal = false;
    std::vector<SymbolicExprId> operands = {}; ///< in the order of the premises, as written there
};

/// Why two conditions hold for the same assignments.
struct EquivalenceReasons {
    Reasons secondFromFirst; ///< operands of the first that force the second
    Reasons firstFromSecond; ///< and the other way round
};

/// An operand that a condition can lose where another one is known to hold.
struct LostOperand {
    SymbolicExprId operand; ///< as written
    Reasons because;        ///< known facts; none where the rest of the condition alone makes it redundant
};

/// Why a condition has a shorter form where another one is known to hold.
struct ShorteningReasons {
    Reasons because;                    ///< known facts for which the two forms agree
    std::vector<LostOperand> lost = {}; ///< each where those before it are gone; none where the form was rewritten
};

} // namespace VT
