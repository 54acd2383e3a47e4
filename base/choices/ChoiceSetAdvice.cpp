// What a set of choices can do about its faults: a further choice, choices to remove or to merge, and how much each
// choice covers.
//
// Cost: one search for a shortest form; limits::removalCases; limits::choiceMerges shortest forms of two choices; and
// limits::countedAssignments evaluations for names that depend on each other, for each choice.
#include "base/choices/ChoiceSetState.hpp"
#include "base/core/Make.hpp"
#include "base/decide/shorten/ConditionProofs.hpp"
#include "base/decide/shorten/ShortestForm.hpp"
#include "base/simplify/Simplify.hpp"

#include <algorithm>

namespace VT {

/// The shortest form found of a condition where its context holds.
SymbolicExprId ChoiceSetChecker::State::shortestGiven(SymbolicExprId context, SymbolicExprId condition) {
    ConditionProofs proofs(decider, toC, condition, context, true, std::min(stepsLeft, limits::shortenSteps));
    ShortestForm search(table, service.simplifier().printer(), service.areVariantKeywordsInForce(), proofs);
    const SymbolicExprId shortest = search.find(condition, context, [condition] { return condition; });
    stepsLeft -= std::min(stepsLeft, proofs.stepsTaken());
    return shortest;
}

/// The condition of a further choice that closes the gap; the invalid identifier where it is long.
SymbolicExprId ChoiceSetChecker::State::missingChoice(SymbolicExprId context, std::span<const SymbolicExprId> choices,
                                                      std::optional<std::size_t> left) {
    std::vector<SymbolicExprId> others;
    for (std::size_t i = 0; i < choices.size(); ++i)
        if (i != left)
            others.push_back(choices[i]);
    if (others.empty() || others.size() > limits::shortenComparisons || stepsLeft == 0)
        return others.empty() ? table.getIdTRUE() : invalidId;
    const SymbolicExprId none = makeUnary(table, SymbolicOp::Not, makeChain(table, SymbolicOp::Or, others));
    const SymbolicExprId missing = shortestGiven(context, none);
    return operandsOf(missing) <= limits::choiceOperands ? missing : invalidId;
}

/// The smallest set of choices without which none overlap.
void ChoiceSetChecker::State::findRemoval(ChoiceSetReport& report) {
    std::vector<std::pair<std::size_t, std::size_t>> pairs;
    for (const ChoiceFinding& finding : report.findings)
        if (finding.fault == ChoiceFault::Overlap)
            pairs.emplace_back(finding.choice, finding.other);
    report.removal = smallestRemoval(pairs);
    const auto isOverlap = [](const ChoiceFinding& finding) { return finding.fault == ChoiceFault::Overlap; };
    if (!report.allOverlaps || std::ranges::any_of(report.undecided, isOverlap))
        report.removal.isSmallest = false;
}

void ChoiceSetChecker::State::findMerges(const Place& place, std::span<const SymbolicExprId> choices,
                                         const std::vector<bool>& isDead, bool inOrder, ChoiceSetReport& report) {
    if (!options.merges)
        return;
    std::vector<SymbolicExprId> living(choices.begin(), choices.end());
    for (std::size_t i = 0; i < living.size(); ++i)
        if (isDead[i])
            living[i] = invalidId;
    const SymbolicExprId context =
        operandsOf(place.context) > limits::choiceOperands ? table.getIdTRUE() : place.context;
    ChoiceMerges merges(table, [&](SymbolicExprId condition) { return shortestGiven(context, condition); });
    report.merges = merges.find(living, inOrder);
}

void ChoiceSetChecker::State::countAssignments(SymbolicExprId parent, std::span<const SymbolicExprId> choices,
                                               std::optional<std::size_t> defaultChoice,
                                               std::span<const std::vector<SymbolicExprId>> hiding,
                                               ChoiceSetReport& report) {
    if (options.domains.empty())
        return;
    AssignmentCounter counter(table, decider, options.domains);
    const std::size_t left = defaultChoice.value_or(choices.size()); // no condition of its own
    std::vector<SymbolicExprId> all;
    for (std::size_t i = 0; i < choices.size(); ++i)
        if (i != left)
            all.push_back(toC(choices[i]));
    const std::vector<SymbolicExprId> others = all;
    const SymbolicExprId context =
        assumed.empty() ? toC(parent) : both(makeChain(table, SymbolicOp::And, assumed), toC(parent));
    all.push_back(context);
    const std::vector<SymbolicExprId> names = counter.namesOf(all);
    report.parentAssignments = counter.count(std::span(&context, 1), names);
    for (std::size_t i = 0; i < choices.size(); ++i) {
        const bool isDefault = i == left;
        std::vector<SymbolicExprId> counted{context};
        if (!isDefault)
            counted.push_back(toC(choices[i]));
        const auto hides = isDefault        ? std::span(others)
                           : hiding.empty() ? std::span<const SymbolicExprId>()
                                            : hiding[i];
        for (const SymbolicExprId each : hides)
            counted.push_back(makeUnary(table, SymbolicOp::Not, each));
        report.assignments.push_back(counter.count(counted, names));
    }
}

} // namespace VT
