// Asks the decider for proofs until the steps are used up.
//
// A condition is converted once; equal identifiers need no proof.
#include "base/decide/shorten/ConditionProofs.hpp"

#include <algorithm>

namespace VT {

ConditionProofs::ConditionProofs(Decider& decider, const SymbolicExprQ2C& toC, SymbolicExprId condition,
                                 SymbolicExprId known, bool isAnythingKnown, std::uint64_t steps)
    : decider_(decider),
      toC_(toC),
      condition_(toC(condition)),
      known_(toC(known)),
      isAnythingKnown_(isAnythingKnown),
      steps_(steps),
      left_(steps),
      solverQuestions_(decider.limitSolver(limits::searchSolverQuestions)) {}

ConditionProofs::~ConditionProofs() {
    decider_.limitSteps(decider_.options().steps);
    decider_.limitSolver(solverQuestions_);
}

template <class Ask>
bool ConditionProofs::isYes(Ask ask) {
    if (left_ == 0)
        return false;
    decider_.limitSteps(std::min(left_, decider_.options().steps));
    const Decision decision = ask();
    left_ -= std::min(left_, decider_.stepsTaken() + 1);
    if (decision.bound == DecisionBound::Steps)
        left_ = 0;
    return decision.isYes();
}

bool ConditionProofs::isEqual(SymbolicExprId form) {
    const SymbolicExprId converted = toC_(form);
    if (converted == condition_)
        return true;
    return isYes([&] {
        return isAnythingKnown_ ? decider_.equivalentGiven(converted, condition_, known_)
                                : decider_.equivalent(converted, condition_);
    });
}

std::optional<bool> ConditionProofs::decided(SymbolicExprId condition) {
    const SymbolicExprId converted = toC_(condition);
    if (isYes([&] { return decider_.implies(known_, converted); }))
        return true;
    if (isYes([&] { return decider_.disjoint(known_, converted); }))
        return false;
    return std::nullopt;
}

} // namespace VT
