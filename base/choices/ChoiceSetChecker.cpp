// Checks choice sets against exact decisions.
//
// Method: each choice by itself, then the gap that all leave, then overlaps by halves (ChoiceSetState).
// Cost: one node interned for each choice and each half; some n log n steps without overlaps, and a few decisions more
// for each level and each overlap.  limits::choiceSteps bounds all sets together.
#include "base/choices/ChoiceSetChecker.hpp"

#include "base/choices/ChoiceSetState.hpp"

#include <algorithm>

namespace VT {

ChoiceSetChecker::ChoiceSetChecker(VCService& service, const ChoiceSetOptions& options)
    : state_(std::make_unique<State>(service, options)) {}

ChoiceSetChecker::ChoiceSetChecker(ChoiceSetChecker&&) noexcept = default;
ChoiceSetChecker& ChoiceSetChecker::operator=(ChoiceSetChecker&&) noexcept = default;
ChoiceSetChecker::~ChoiceSetChecker() = default;

bool ChoiceSetChecker::stepsUsedUp() const noexcept {
    return state_->stepsLeft == 0;
}

Decision ChoiceSetChecker::canHold(SymbolicExprId condition) {
    return state_->ask(&Decider::canHold, state_->placeIn(condition, {}).context);
}

ChoiceSetReport ChoiceSetChecker::check(SymbolicExprId parent, std::span<const SymbolicExprId> choices,
                                        std::optional<std::size_t> defaultChoice, ChoicePolicy policy) {
    ChoiceSetReport report;
    State& state = *state_;
    const SymbolicExprTable& table = state.table;
    if (!table.has(parent) || !std::ranges::all_of(choices, [&](SymbolicExprId id) { return table.has(id); })) {
        State::add({.fault = ChoiceFault::Missing}, {Answer::Undecided, DecisionBound::NoCondition, std::nullopt},
                   report);
        return report;
    }
    State::Place place = state.placeIn(parent, choices);
    const SymbolicExprId context = place.context;
    state.questionSteps = limits::decisionSteps;
    const Decision parentHolds = state.ask(&Decider::canHold, context);
    report.parentNeverHolds = parentHolds.isNo();
    if (report.parentNeverHolds || choices.empty())
        return report;
    // Nothing is known of a context that may never hold.
    OrdinaryChoices ordinary = state.ordinaryIn(parentHolds.isYes() ? context : invalidId);
    std::vector<SymbolicExprId> holds(choices.size(), table.getIdFALSE()); // which overlaps nothing
    for (std::size_t i = 0; i < choices.size(); ++i)
        if (i != defaultChoice)
            holds[i] = state.both(context, state.toC(choices[i]));
    std::vector<bool> isDead(choices.size(), false);
    SymbolicExprId allBefore = table.getIdFALSE();
    std::vector<std::vector<SymbolicExprId>> hiding(policy == ChoicePolicy::First ? choices.size() : 0);
    const std::vector<ChoiceRun> inOrder =
        policy == ChoicePolicy::First ? joinedInHalves(state.table, holds) : std::vector<ChoiceRun>();
    for (std::size_t i = 0; i < choices.size(); ++i) {
        if (i == defaultChoice)
            continue;
        if (policy == ChoicePolicy::First) {
            state.placeAfter(place, choices, i, inOrder, isDead, allBefore);
            hiding[i] = place.earlierHold;
        }
        const SymbolicExprId condition = state.toC(choices[i]);
        isDead[i] = !(place.earlierHold.empty() && ordinary.contains(condition)) &&
                    !state.checkOne(i, place, choices[i], report);
        if (policy == ChoicePolicy::First && !isDead[i])
            allBefore = state.service.OR(allBefore, condition, false).id();
        if (isDead[i])
            holds[i] = table.getIdFALSE();
    }
    const std::vector<ChoiceRun> runs = joinedInHalves(state.table, holds);
    auto [gap, isExact] = state.findGap(context, runs);
    if (defaultChoice)
        state.checkDefault(*defaultChoice, context, runs, gap, report);
    if (policy == ChoicePolicy::Unique) {
        const std::size_t firstOverlap = report.findings.size();
        state.findOverlaps(runs, holds, report);
        std::sort(report.findings.begin() + static_cast<std::ptrdiff_t>(firstOverlap), report.findings.end(),
                  [](const ChoiceFinding& a, const ChoiceFinding& b) {
                      return std::pair(a.choice, a.other) < std::pair(b.choice, b.other);
                  });
        State::findRemoval(report);
    }
    if (!defaultChoice && !gap.isNo()) {
        const bool isFound = gap.isYes() && isExact;
        State::add({.fault = ChoiceFault::Missing,
                    .proposed = isFound ? state.missingChoice(context, choices, defaultChoice) : invalidId},
                   std::move(gap), report);
    }
    if (defaultChoice)
        isDead[*defaultChoice] = true;
    state.findMerges(place, choices, isDead, policy == ChoicePolicy::First, report);
    state.countAssignments(parent, choices, defaultChoice, hiding, report);
    return report;
}

ChoiceSetReport ChoiceSetChecker::checkCondition(SymbolicExprId parent, SymbolicExprId condition) {
    ChoiceSetReport report;
    State& state = *state_;
    if (!state.table.has(parent) || !state.table.has(condition)) {
        State::add({.fault = ChoiceFault::Dead}, {Answer::Undecided, DecisionBound::NoCondition, std::nullopt}, report);
        return report;
    }
    const State::Place place = state.placeIn(parent, std::span(&condition, 1));
    state.questionSteps = limits::decisionSteps;
    report.parentNeverHolds = state.ask(&Decider::canHold, place.context).isNo();
    if (!report.parentNeverHolds)
        state.checkOne(0, place, condition, report);
    return report;
}

} // namespace VT
