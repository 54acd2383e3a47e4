// What a decider keeps from question to question, and the way of one question.
#pragma once

#include "base/decide/ConditionReader.hpp"
#include "base/decide/Decider.hpp"
#include "base/decide/circuit/Question.hpp"
#include "base/decide/external/ExternalSolver.hpp"
#include "base/decide/search/ConditionSearch.hpp"
#include "base/decide/witness/TermPlans.hpp"
#include "base/decide/witness/WitnessSearch.hpp"

#include <functional>
#include <limits>
#include <map>
#include <utility>

namespace VT {

/// What conditions become, and the ways to decide a question about them.
struct DecisionParts {
    DecisionParts(const SymbolicExprTable& symbols, bool keywordsInForce, std::int64_t low, std::int64_t high)
        : printer(symbols, false),
          leafReader(symbols, keywordsInForce),
          unknowns(symbols, printer, low, high),
          circuit(unknowns, steps),
          reader(leafReader, unknowns, circuit, steps),
          diagrams(steps),
          plans(leafReader, unknowns),
          witnesses(plans, unknowns, diagrams, steps),
          search(unknowns, witnesses, steps) {}

    SymbolicExprPrinter printer;
    LeafReader leafReader;
    Steps steps;
    Unknowns unknowns;
    Circuit circuit;
    ConditionReader reader;
    Question question;
    Diagrams diagrams;
    TermPlans plans;
    WitnessSearch witnesses;
    ConditionSearch search;
};

struct Decider::State : DecisionParts {
    State(const SymbolicExprTable& symbols, const DecisionOptions& asked)
        : DecisionParts(symbols, asked.keywordsInForce,
                        asked.bits32 ? std::numeric_limits<std::int32_t>::min() : minusInfinite,
                        asked.bits32 ? std::numeric_limits<std::int32_t>::max() : plusInfinite),
          options{asked.keywordsInForce, asked.bits32, std::min(asked.steps, limits::settableSteps), asked.solver},
          questionSteps(options.steps) {}

    struct Read {
        ReadCondition condition;
        std::uint64_t steps = 0; ///< that reading took
    };

    using Leaves = std::vector<UnknownLeaf>;
    using Conditions = std::span<const ReadCondition* const>;
    using Combine = std::function<Gate(std::span<const Gate>)>; ///< of the conditions' truths

    const Read& read(SymbolicExprId id);
    const Read& congruence(SymbolicExprId a, SymbolicExprId b);
    bool isReadable(SymbolicExprId id);
    const Leaves& leavesOf(Conditions conditions);
    Decision hold(Gate truth, Conditions conditions);
    void confine(Decision& decision, Gate truth, Conditions conditions);
    void makeSmallest(Decision& decision, Gate truth, Conditions conditions);
    void keepFunctions(Decision& decision, Gate truth, Conditions conditions);
    Decision withDifferentArguments(std::span<const SymbolicExprId> calls, Gate truth, Conditions conditions);
    Decision decide(AskedOf asked, std::span<const SymbolicExprId> ids, const Combine& combine);
    void askSolver(AskedOf asked, std::span<const SymbolicExprId> ids, Decision& decision);
    std::optional<bool> evaluate(SymbolicExprId condition, const Witness& witness);
    Decision same();
    void begin();
    std::uint64_t end();
    void clear();

    DecisionOptions options;
    std::uint64_t questionSteps;                                           ///< that a question may cost
    Budget* budget = nullptr;                                              ///< of several questions
    std::size_t solverQuestions = std::numeric_limits<std::size_t>::max(); ///< that may go to the solver
    IdMap<std::unique_ptr<Read>> known;
    std::map<std::pair<SymbolicExprId, SymbolicExprId>, std::unique_ptr<Read>> congruences; ///< of calls
    Leaves joined;
    bool isSmallest = true; ///< the latest witness, by the way in which it was found
    std::uint64_t taken = 0;
};

} // namespace VT
