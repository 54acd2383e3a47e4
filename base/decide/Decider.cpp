// What each question makes of its conditions: a && !b can hold unless a implies b, and so on.
//
// Questions about sets join neighbours first, so that n similar conditions cost n log n.  How a question is decided is
// in DeciderState.
#include "base/decide/Decider.hpp"

#include "base/core/Limits.hpp"
#include "base/decide/DeciderState.hpp"

#include <algorithm>
#include <utility>

namespace VT {

Decider::Decider(const SymbolicExprTable& table, const DecisionOptions& options)
    : state_(std::make_unique<State>(table, options)) {}

Decider::Decider(Decider&&) noexcept = default;
Decider& Decider::operator=(Decider&&) noexcept = default;
Decider::~Decider() = default;

Decision Decider::canHold(SymbolicExprId condition) {
    return state_->decide(AskedOf::Holds, std::span(&condition, 1), [](std::span<const Gate> c) { return c[0]; });
}

Decision Decider::mustHold(SymbolicExprId condition) {
    return state_
        ->decide(AskedOf::Fails, std::span(&condition, 1), [](std::span<const Gate> c) { return opposite(c[0]); })
        .opposite();
}

Decision Decider::overlaps(SymbolicExprId a, SymbolicExprId b) {
    const SymbolicExprId pair[] = {a, b};
    return state_->decide(AskedOf::Both, pair,
                          [&](std::span<const Gate> c) { return state_->circuit.both(c[0], c[1]); });
}

Decision Decider::disjoint(SymbolicExprId a, SymbolicExprId b) {
    return overlaps(a, b).opposite();
}

Decision Decider::implies(SymbolicExprId a, SymbolicExprId b) {
    if (a == b && state_->leafReader.table().has(a))
        return state_->same();
    const SymbolicExprId pair[] = {a, b};
    return state_
        ->decide(AskedOf::FirstAlone, pair,
                 [&](std::span<const Gate> c) { return state_->circuit.both(c[0], opposite(c[1])); })
        .opposite();
}

Decision Decider::equivalent(SymbolicExprId a, SymbolicExprId b) {
    if (a == b && state_->leafReader.table().has(a))
        return state_->same();
    const SymbolicExprId pair[] = {a, b};
    Circuit& circuit = state_->circuit;
    return state_
        ->decide(AskedOf::Differ, pair,
                 [&](std::span<const Gate> c) {
                     return circuit.either(circuit.both(c[0], opposite(c[1])), circuit.both(opposite(c[0]), c[1]));
                 })
        .opposite();
}

Decision Decider::equivalentGiven(SymbolicExprId a, SymbolicExprId b, SymbolicExprId known) {
    if (a == b && state_->leafReader.table().has(a) && state_->leafReader.table().has(known))
        return state_->same();
    const SymbolicExprId three[] = {a, b, known};
    Circuit& circuit = state_->circuit;
    return state_
        ->decide(AskedOf::DifferGiven, three,
                 [&](std::span<const Gate> c) {
                     const Gate onlyA = circuit.both(c[0], opposite(c[1]));
                     const Gate onlyB = circuit.both(opposite(c[0]), c[1]);
                     return circuit.both(c[2], circuit.either(onlyA, onlyB));
                 })
        .opposite();
}

Relation Decider::classify(SymbolicExprId a, SymbolicExprId b) {
    std::uint64_t taken = 0;
    const std::uint64_t allowed = state_->questionSteps;
    const auto counted = [&](Decision decision) {
        taken += state_->taken;
        if (decision.bound == DecisionBound::Steps)
            limitSteps(std::min(allowed, limits::furtherSteps));
        return decision;
    };
    Decision onlyA = counted(implies(a, b).opposite());
    Decision onlyB = counted(implies(b, a).opposite());
    Relation relation = Relation::of(std::move(onlyA), std::move(onlyB), counted(overlaps(a, b)));
    state_->taken = taken;
    limitSteps(allowed);
    return relation;
}

SetDecision Decider::covers(std::span<const SymbolicExprId> conditions) {
    return {state_
                ->decide(AskedOf::NoneHolds, conditions,
                         [&](std::span<const Gate> c) { return opposite(state_->circuit.any(c)); })
                .opposite(),
            std::nullopt};
}

SetDecision Decider::disjoint(std::span<const SymbolicExprId> conditions) {
    Circuit& circuit = state_->circuit;
    const auto either = [&](Gate a, Gate b) { return opposite(circuit.nested(opposite(a), opposite(b))); };
    // For halves of the set: where one holds, and where two do.
    const auto two = [&](std::span<const Gate> c) {
        std::vector<std::pair<Gate, Gate>> level;
        level.reserve(c.size());
        for (const Gate truth : c)
            level.emplace_back(truth, never);
        while (level.size() > 1) {
            for (std::size_t i = 0; i + 1 < level.size(); i += 2) {
                const auto [oneA, twoA] = level[i];
                const auto [oneB, twoB] = level[i + 1];
                const Gate twoAB = either(either(twoA, twoB), circuit.nested(oneA, oneB));
                level[i / 2] = {either(oneA, oneB), twoAB};
            }
            if (level.size() % 2 != 0)
                level[level.size() / 2] = level.back();
            level.resize((level.size() + 1) / 2);
        }
        return level.empty() ? never : level.front().second;
    };
    SetDecision decision{state_->decide(AskedOf::TwoHold, conditions, two).opposite(), std::nullopt};
    if (!decision.isNo() || !decision.witness)
        return decision;
    std::optional<std::size_t> first;
    for (std::size_t i = 0; i < conditions.size(); ++i) {
        if (!holds(conditions[i], *decision.witness).value_or(false))
            continue;
        if (first) {
            decision.members = {*first, i};
            break;
        }
        first = i;
    }
    return decision;
}

std::optional<bool> Decider::holds(SymbolicExprId condition, const Witness& witness) {
    return state_->isReadable(condition) ? state_->evaluate(condition, witness) : std::nullopt;
}

std::string Decider::nameOf(SymbolicExprId unknown) const {
    return state_->printer(unknown);
}

const DecisionOptions& Decider::options() const noexcept {
    return state_->options;
}

void Decider::limitSteps(std::uint64_t steps) noexcept {
    state_->questionSteps = std::min(steps, state_->options.steps);
}

std::size_t Decider::limitSolver(std::size_t questions) noexcept {
    return std::exchange(state_->solverQuestions, questions);
}

void Decider::share(Budget* budget) noexcept {
    state_->budget = budget;
}

std::uint64_t Decider::stepsTaken() const noexcept {
    return state_->taken;
}

void Decider::clear() {
    state_->clear();
}

} // namespace VT
