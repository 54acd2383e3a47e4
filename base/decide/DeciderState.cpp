// Conditions are read into a circuit, once, which is kept.  A question makes of them what has to hold (a && !b), which
// the circuit simplifies while it is made: conditions that share operands are often decided by that.  What is left gets
// its levels in the order in which the question mentions them, and is decided by the first of three ways that can: a
// look at the comparisons, where they are independent; diagrams, for a share of the steps; a search over the
// comparisons.  What stays undecided goes to another solver, if there is one.  A question is charged what reading its
// conditions cost even where they were read before: that makes answers, undecided ones too, independent of earlier
// questions.
#include "base/decide/DeciderState.hpp"

#include "base/core/Limits.hpp"
#include "base/decide/witness/CallCongruence.hpp"

#include <boost/container/small_vector.hpp>

#include <algorithm>
#include <iterator>

namespace VT {

// Numbers of nodes and edges have 31 bits.
static_assert(limits::decisionSteps <= limits::settableSteps);

void Decider::State::clear() {
    known.clear();
    congruences.clear();
    plans.clear();
    circuit.clear();
    unknowns.clear();
    question.clear();
}

/// Begins a question with the steps that it may cost.
void Decider::State::begin() {
    steps.refill(budget == nullptr ? questionSteps : std::min(questionSteps, budget->left()));
}

/// Ends it; returns the steps that it took.
std::uint64_t Decider::State::end() {
    const std::uint64_t all = steps.total() - steps.left();
    if (budget != nullptr)
        budget->take(all + 1);
    return all;
}

/// Reads a condition, or charges what reading it cost.
const Decider::State::Read& Decider::State::read(SymbolicExprId id) {
    static const Read missing = [] {
        Read none;
        none.condition.bound = DecisionBound::NoCondition;
        return none;
    }();
    if (!leafReader.table().has(id))
        return missing;
    if (const auto* before = known.find(id); before != nullptr) {
        steps.take((*before)->steps);
        return **before;
    }
    const std::uint64_t available = steps.left();
    auto fresh = std::make_unique<Read>();
    fresh->condition = reader.read(id);
    fresh->steps = available - steps.left();
    return *known.insert(id, std::move(fresh));
}

/// The same for what two calls of one function say about each other.
const Decider::State::Read& Decider::State::congruence(SymbolicExprId a, SymbolicExprId b) {
    std::unique_ptr<Read>& kept = congruences[{a, b}];
    if (kept != nullptr) {
        steps.take(kept->steps);
        return *kept;
    }
    const std::uint64_t available = steps.left();
    auto fresh = std::make_unique<Read>();
    fresh->condition = reader.readCongruence(a, b);
    fresh->steps = available - steps.left();
    kept = std::move(fresh);
    return *kept;
}

bool Decider::State::isReadable(SymbolicExprId id) {
    begin();
    try {
        const bool isRead = read(id).condition.bound == DecisionBound::None;
        end();
        return isRead;
    } catch (const StepsUsedUp&) {
        end();
        return false;
    } catch (...) {
        clear();
        throw;
    }
}

/// The leaves of several conditions, each once.
const Decider::State::Leaves& Decider::State::leavesOf(Conditions conditions) {
    if (conditions.size() == 1)
        return conditions.front()->leaves;
    joined.clear();
    const auto before = [&](const UnknownLeaf& a, const UnknownLeaf& b) { return comesBefore(unknowns, a, b); };
    if (conditions.size() == 2) {
        std::ranges::merge(conditions[0]->leaves, conditions[1]->leaves, std::back_inserter(joined), before);
    } else {
        for (const ReadCondition* read : conditions)
            joined.insert(joined.end(), read->leaves.begin(), read->leaves.end());
        std::ranges::sort(joined, before);
    }
    joined.erase(std::unique(joined.begin(), joined.end()), joined.end());
    return joined;
}

/// Whether what was made of the conditions can hold.
Decision Decider::State::hold(Gate truth, Conditions conditions) {
    if (truth == never)
        return {Answer::No, DecisionBound::None, std::nullopt};
    question.begin();
    for (const ReadCondition* condition : conditions)
        question.mention(condition->met);
    question.ask(circuit, unknowns, steps, truth);
    const Leaves& leaves = leavesOf(conditions);
    isSmallest = true;
    if (auto atOnce = witnesses.findAtOnce(question, leaves))
        return *std::move(atOnce);
    try {
        const Steps::Share share(steps, std::max(steps.total() / limits::diagramShare, limits::diagramSteps));
        Decision decision = witnesses.find(question, diagrams.of(question), leaves);
        isSmallest = !witnesses.hasTerms();
        if (decision.bound != DecisionBound::Steps)
            return decision;
    } catch (const StepsUsedUp&) { // the search may take fewer
    }
    Decision decision = search.find(question, leaves);
    isSmallest = !witnesses.hasTerms();
    return decision;
}

/// Asks another solver what stayed undecided.
void Decider::State::askSolver(AskedOf asked, std::span<const SymbolicExprId> ids, Decision& decision) {
    if (options.solver == nullptr || solverQuestions == 0)
        return;
    if (budget != nullptr && budget->left() < limits::solverSteps)
        return;
    --solverQuestions;
    if (budget != nullptr)
        budget->take(limits::solverSteps);
    const auto confirms = [&](const Witness& witness, std::span<const SymbolicExprId> calls) {
        std::vector<bool> truths;
        for (const SymbolicExprId id : ids) {
            const auto truth = evaluate(id, witness);
            if (!truth)
                return false;
            truths.push_back(*truth);
        }
        begin();
        const bool isConfirmed =
            isAsAsked(asked, truths) &&
            CallCongruence(leafReader, unknowns, plans, steps).findViolations(calls, witness).empty();
        taken += end();
        return isConfirmed;
    };
    Decision other = decideExternally(*options.solver, {leafReader, ids, asked, options.bits32,
                                                        [&](SymbolicExprId id) { return printer(id); }, confirms});
    if (!other.isUndecided())
        decision = std::move(other);
}

/// Asks whether what `combine` makes of the conditions, which is what `asked` says, can hold.
Decision Decider::State::decide(AskedOf asked, std::span<const SymbolicExprId> ids, const Combine& combine) {
    if (circuit.size() > limits::circuitSize || plans.size() > limits::keptPlannedNodes)
        clear();
    begin();
    Decision decision;
    try {
        boost::container::small_vector<const ReadCondition*, 4> conditions;
        conditions.reserve(ids.size());
        for (const SymbolicExprId id : ids) {
            conditions.push_back(&read(id).condition);
            if (conditions.back()->bound != DecisionBound::None)
                decision.bound = conditions.back()->bound;
        }
        if (decision.bound == DecisionBound::None) {
            boost::container::small_vector<Gate, 4> truths(ids.size(), always);
            std::ranges::transform(conditions, truths.begin(), &ReadCondition::truth);
            const Gate truth = combine(std::span<const Gate>(truths.data(), truths.size()));
            const Conditions all(conditions.data(), conditions.size());
            decision = hold(truth, all);
            if (decision.isYes() && !decision.witness)
                confine(decision, truth, all);
            if (decision.isYes() && decision.witness && !isSmallest)
                makeSmallest(decision, truth, all);
            if (decision.isYes())
                keepFunctions(decision, truth, all);
        }
    } catch (const StepsUsedUp&) {
        decision = {Answer::Undecided, DecisionBound::Steps, std::nullopt};
    } catch (...) { // memory ran out somewhere between two structures that go together
        clear();
        throw;
    }
    taken = end();
    if (decision.isUndecided() && decision.bound != DecisionBound::NoCondition) {
        try {
            askSolver(asked, ids, decision);
        } catch (const StepsUsedUp&) { // stays undecided
        } catch (...) {
            clear();
            throw;
        }
    }
    return decision;
}

/// What needs no reading: a condition agrees with itself.
Decision Decider::State::same() {
    taken = 0;
    return {Answer::Yes, DecisionBound::None, std::nullopt};
}

/// The same for a condition without missing operands.
std::optional<bool> Decider::State::evaluate(SymbolicExprId condition, const Witness& witness) {
    IdMap<std::int64_t> values;
    std::int64_t simulation = 0;
    for (const UnknownValue& each : witness) {
        values.insert(each.unknown, each.value);
        if (!leafReader.table().has(each.unknown))
            continue;
        const LeafMeaning::Kind kind = leafReader(each.unknown).kind;
        if (kind == LeafMeaning::Kind::Simulation || kind == LeafMeaning::Kind::CodeGeneration)
            simulation = (kind == LeafMeaning::Kind::Simulation) == (each.value != 0) ? 1 : 0;
    }
    TermPlan plan(leafReader, unknowns, condition);
    const auto valueOf = [&](Unknown unknown) {
        const UnknownInfo& info = unknowns[unknown];
        if (info.kind == UnknownKind::Simulation)
            return simulation;
        const std::int64_t* found = values.find(info.node);
        return found != nullptr ? *found : std::int64_t{0};
    };
    if (const auto value = plan.value(valueOf))
        return *value != 0;
    const auto exact = plan.exactValue(valueOf); // beyond 64 bits, or with real literals
    return exact ? std::optional(exact->sign() != 0) : std::nullopt;
}

} // namespace VT
