// Calls as functions: equal arguments, equal values.
#pragma once

#include "base/decide/Decision.hpp"
#include "base/decide/LeafReader.hpp"
#include "base/decide/Steps.hpp"
#include "base/decide/witness/TermPlans.hpp"

#include <span>
#include <utility>
#include <vector>

namespace VT {

/// Whether a node is a call whose value follows from those of its arguments.  `defined` and the preprocessor's
/// `__has_...` look at the spelling of theirs.
[[nodiscard]] bool isFunctionCall(const SymbolicExprTable& table, SymbolicExprId id);

class CallCongruence {
public:
    CallCongruence(const LeafReader& leaves, const Unknowns& unknowns, TermPlans& plans, Steps& steps)
        : leaves_(leaves),
          unknowns_(unknowns),
          plans_(plans),
          steps_(steps) {}

    /// Calls that a witness gives two values, though they call one function with arguments that are equal under the
    /// witness: pairs that tie all such calls together.  Unknowns that the witness does not name are 0.  A step for
    /// each node of the arguments.
    [[nodiscard]] std::vector<std::pair<SymbolicExprId, SymbolicExprId>>
    findViolations(std::span<const SymbolicExprId> calls, const Witness& witness);

private:
    const LeafReader& leaves_;
    const Unknowns& unknowns_;
    TermPlans& plans_;
    Steps& steps_;
};

} // namespace VT
