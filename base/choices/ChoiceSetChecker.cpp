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
    state.begin(choices.size());
    const Decision parentHolds = state.ask(&Decider::canHold, context);
    report.parentNeverHolds = parentHolds.isNo();
    if (report.parentNeverHolds || choices.empty())
        return report;
    // Nothing is known of a context that may never hold.
    OrdinaryChoices ordinary = state.ordinaryIn(parentHolds.isYes() ? context : invalidId);
    const std::size_t left = defaultChoice.value_or(choices.size());       // no condition of its own
    std::vector<SymbolicExprId> holds(choices.size(), table.getIdFALSE()); // which overlaps nothing
    for (std::size_t i = 0; i < choices.size(); ++i)
        if (i != left)
            holds[i] = state.both(context, state.toC(choices[i]));
    std::vector<SymbolicExprId> conditions(choices.size());
    std::ranges::transform(choices, conditions.begin(), [&](SymbolicExprId id) { return state.toC(id); });
    ChoiceBoxes boxes(table, parentHolds.isYes() ? context : invalidId, conditions, state.options.bits32);
    State::EarlierChoices earlier(choices.size(), table.getIdFALSE());
    std::vector<std::vector<SymbolicExprId>> hiding(policy == ChoicePolicy::First ? choices.size() : 0);
    const std::vector<ChoiceRun> inOrder =
        policy == ChoicePolicy::First ? joinedInHalves(state.table, holds) : std::vector<ChoiceRun>();
    ChoiceEvaluation evaluation(table, state.decider.options().keywordsInForce, conditions);
    place.conditions = conditions;
    place.evaluation = &evaluation;
    for (std::size_t i = 0; i < choices.size(); ++i) {
        if (i == left)
            continue;
        if (state.setLeft == 0) {
            State::add({.fault = ChoiceFault::Dead, .choice = i},
                       {Answer::Undecided, DecisionBound::Steps, std::nullopt}, report);
            continue;
        }
        ChoiceBoxes::Activity seen;
        if (policy == ChoicePolicy::First)
            seen = state.counted(boxes, boxes.activityOf(i));
        Answer isActive = Answer::Undecided;
        if (seen.answer != Answer::No && state.counted(boxes, boxes.isFaultless(i)))
            isActive = Answer::Yes;
        if (seen.answer == Answer::No) {
            State::placeAfter(place, seen.hiddenBy);
            hiding[i] = place.earlierHold;
        } else if (policy == ChoicePolicy::First && (isActive != Answer::Yes || !state.options.domains.empty())) {
            state.placeAfter(place, i, inOrder, earlier);
            hiding[i] = place.earlierHold;
        }
        if (isActive != Answer::Yes && place.earlierHold.empty() && ordinary.contains(conditions[i]))
            isActive = Answer::Yes;
        if (isActive != Answer::Yes)
            isActive = state.checkOne(i, place, choices[i], boxes, seen, report);
        if (isActive == Answer::No) {
            earlier.isDead[i] = true;
            holds[i] = table.getIdFALSE();
        } else if (policy == ChoicePolicy::First) {
            earlier.anyHolds = state.service.OR(earlier.anyHolds, conditions[i], false).id();
            earlier.isAnyActive = earlier.isAnyActive || isActive == Answer::Yes;
            earlier.living.push_back(i);
            boxes.hide(i);
        }
    }
    std::vector<bool>& isDead = earlier.isDead;
    const std::vector<ChoiceRun> runs = joinedInHalves(state.table, holds);
    auto [gap, isExact] = state.findGap(context, runs, boxes);
    if (defaultChoice)
        state.checkDefault(*defaultChoice, context, runs, gap, report);
    if (policy == ChoicePolicy::Unique) {
        const std::size_t firstOverlap = report.findings.size();
        state.findOverlaps(runs, holds, boxes, report);
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
    state.begin(1);
    report.parentNeverHolds = state.ask(&Decider::canHold, place.context).isNo();
    if (!report.parentNeverHolds) {
        const SymbolicExprId inC = state.toC(condition);
        ChoiceBoxes boxes(state.table, place.context, std::span(&inC, 1), state.options.bits32);
        state.checkOne(0, place, condition, boxes, {}, report);
    }
    return report;
}

} // namespace VT
