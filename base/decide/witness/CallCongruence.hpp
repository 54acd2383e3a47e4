// Calls as functions: equal arguments, equal values.
#pragma once

#include "base/decide/Decision.hpp"
#include "base/decide/LeafReader.hpp"
#include "base/decide/Steps.hpp"
#include "base/decide/diagram/Unknowns.hpp"

#include <optional>
#include <span>
#include <utility>

namespace VT {

/// Whether a node is a call whose value follows from those of its arguments.  `defined` and the preprocessor's
/// `__has_...` look at the spelling of theirs.
[[nodiscard]] bool isFunctionCall(const SymbolicExprTable& table, SymbolicExprId id);

class CallCongruence {
public:
    CallCongruence(const LeafReader& leaves, Unknowns& unknowns, Steps& steps)
        : leaves_(leaves),
          unknowns_(unknowns),
          steps_(steps) {}

    /// Two of the calls that a witness gives two values, though they call one function with arguments that are equal
    /// under the witness; unknowns that it does not name are 0.  A step for each node of the arguments.
    [[nodiscard]] std::optional<std::pair<SymbolicExprId, SymbolicExprId>>
    findViolation(std::span<const SymbolicExprId> calls, const Witness& witness);

private:
    const LeafReader& leaves_;
    Unknowns& unknowns_;
    Steps& steps_;
};

} // namespace VT
