// Asks the questions about choices and turns the answers into findings.
//
// Method: overlaps are looked for by halves: where no choice of one half overlaps one of the other, one decision
// settles all pairs; otherwise the larger half is split.  The diagrams of both halves stay with the decider, so the
// next larger half costs what it adds. Relies on: Decider for every answer, ChoiceRanges to skip decisions.
#include "base/choices/ChoiceSetState.hpp"

#include "base/core/Chains.hpp"
#include "base/core/Make.hpp"
#include "base/decide/reasons/MinimalSubset.hpp"
#include "base/decide/reasons/ReasonSearch.hpp"
#include "base/decide/shorten/ConditionProofs.hpp"
#include "base/decide/shorten/ImpliedCondition.hpp"
#include "base/decide/shorten/ShortestForm.hpp"
#include "base/simplify/Simplify.hpp"

#include <algorithm>
#include <limits>

namespace VT {

namespace {

const Decision no{Answer::No, DecisionBound::None, std::nullopt}; ///< without a witness

} // namespace

ChoiceSetChecker::State::State(VCService& theService, const ChoiceSetOptions& theOptions)
    : service(theService),
      table(theService.table()),
      toC(table),
      decider(table, {.keywordsInForce = theService.areVariantKeywordsInForce(), .bits32 = theOptions.bits32}),
      bounds(table),
      options(theOptions),
      stepsLeft(theOptions.steps) {
    for (const SymbolDomain& domain : options.domains)
        bounds.add(conditionOf(table, domain));
    for (const VCSymbolicExprId& assumption : service.assumptions()) {
        bounds.add(assumption.id());
        assumed.push_back(assumption.id());
    }
}

/// Begins a set with so many choices.
void ChoiceSetChecker::State::begin(std::size_t choices) {
    questionSteps = limits::decisionSteps;
    setLeft = limits::setSteps + choices * limits::setStepsPerChoice;
}

void ChoiceSetChecker::State::take(std::uint64_t steps) {
    stepsLeft -= std::min(stepsLeft, steps);
    setLeft -= std::min(setLeft, steps);
}

/// What one question of a set may take.
std::uint64_t ChoiceSetChecker::State::share() const {
    return std::min(stepsLeft, std::max(limits::leastSetSteps, setLeft / 8));
}

Decision ChoiceSetChecker::State::counted(Decision decision) {
    take(decider.stepsTaken() + 1);
    if (decision.bound == DecisionBound::Steps)
        questionSteps = std::max(questionSteps / 4, limits::furtherSteps);
    return decision;
}

Decision ChoiceSetChecker::State::ask(Decision (Decider::*question)(SymbolicExprId), SymbolicExprId condition) {
    if (stepsLeft == 0 || setLeft == 0)
        return {Answer::Undecided, DecisionBound::Steps, std::nullopt};
    decider.limitSteps(std::min(questionSteps, share()));
    return counted((decider.*question)(condition));
}

Decision ChoiceSetChecker::State::ask(Decision (Decider::*question)(SymbolicExprId, SymbolicExprId), SymbolicExprId a,
                                      SymbolicExprId b) {
    if (stepsLeft == 0 || setLeft == 0)
        return {Answer::Undecided, DecisionBound::Steps, std::nullopt};
    decider.limitSteps(std::min(questionSteps, share()));
    return counted((decider.*question)(a, b));
}

/// Operands that && || ! leave, counted up to one beyond the bound.
std::size_t ChoiceSetChecker::State::operandsOf(SymbolicExprId condition) const {
    static constexpr OperatorSet logicalOps{SymbolicOp::And, SymbolicOp::Or, SymbolicOp::Not};
    std::size_t count = 0;
    const bool complete = walkChain(table, condition, limits::choiceOperands, LinksOf(logicalOps),
                                    [&](SymbolicExprId, const SymbolicExpr*) {
                                        ++count;
                                        return true;
                                    });
    return complete ? count : limits::choiceOperands + 1;
}

SymbolicExprId ChoiceSetChecker::State::both(SymbolicExprId a, SymbolicExprId b) {
    return service.AND(a, b, false).id();
}

/// Where choices with these conditions are asked about.
ChoiceSetChecker::State::Place ChoiceSetChecker::State::placeIn(SymbolicExprId parent,
                                                                std::span<const SymbolicExprId> conditions) {
    std::vector<SymbolicExprId> all(conditions.begin(), conditions.end());
    all.push_back(parent);
    Place place{.context = both(bounds.knownOf(all), toC(parent)), .premises = bounds.relevantTo(all)};
    place.premises.push_back(parent);
    return place;
}

/// Adds the choices that come before one and may hide it.
void ChoiceSetChecker::State::placeAfter(Place& place, std::size_t position, const std::vector<ChoiceRun>& runs,
                                         const EarlierChoices& earlier) {
    const auto ranges = rangesOf(table, both(place.context, place.conditions[position]));
    const auto near = choicesNear(runs, ranges, limits::hidingChoices,
                                  [&](std::size_t choice) { return choice < position && !earlier.isDead[choice]; });
    place.isHidden = earlier.isAnyActive;
    place.earlier.clear();
    place.earlierHold.clear();
    if (!near) {
        place.earlierHold.assign(1, earlier.anyHolds);
        place.living = earlier.living;
        return;
    }
    place.earlier = *near;
    place.living = *near;
    for (const std::size_t choice : *near)
        place.earlierHold.push_back(place.conditions[choice]);
}

/// Adds the choices that are known to hide one.
void ChoiceSetChecker::State::placeAfter(Place& place, const std::vector<std::size_t>& hiding) {
    place.earlier = hiding;
    place.living = hiding;
    place.earlierHold.clear();
    for (const std::size_t choice : hiding)
        place.earlierHold.push_back(place.conditions[choice]);
}

/// The condition without operands that its context makes redundant; itself where there are none.
/// What `isEqual` leaves undecided of a candidate is proven.
SymbolicExprId ChoiceSetChecker::State::shorten(SymbolicExprId context, SymbolicExprId condition,
                                                const std::function<Answer(SymbolicExprId)>& isEqual) {
    const std::size_t operands = operandsOf(condition);
    if (operands < 2 || operands > limits::choiceOperands)
        return condition;
    // Literals are taken from a context that is not large.
    const SymbolicExprId literals = operandsOf(context) > limits::choiceOperands ? table.getIdTRUE() : context;
    ConditionProofs proofs(decider, toC, condition, context, true, std::min(share(), limits::shortenSteps));
    const auto isProven = [&](SymbolicExprId candidate) {
        const Answer seen = isEqual ? isEqual(candidate) : Answer::Undecided;
        return seen == Answer::Undecided ? proofs.isEqual(candidate) : seen == Answer::Yes;
    };
    const SymbolicExprId shorter =
        ImpliedCondition(table, service.simplifier().printer(), literals, isProven).shorten(condition);
    take(proofs.stepsTaken());
    return operandsOf(shorter) < operands ? shorter : condition;
}

/// The reasons that a search finds, where they are asked for.
template <class Search>
Reasons ChoiceSetChecker::State::reasonsBy(Search search) {
    if (!options.reasons || stepsLeft == 0)
        return {};
    ReasonSearch reasons(table, decider, std::min(stepsLeft, limits::reasonSteps));
    Reasons found = search(reasons);
    stepsLeft -= std::min(stepsLeft, reasons.stepsTaken());
    return found;
}

void ChoiceSetChecker::State::add(ChoiceFinding finding, Decision decision, ChoiceSetReport& report) {
    finding.witness = std::move(decision.witness).value_or(Witness{});
    finding.bound = decision.bound;
    (decision.isUndecided() ? report.undecided : report.findings).push_back(std::move(finding));
}

/// The default choice is active in the gap of the others.
void ChoiceSetChecker::State::checkDefault(std::size_t position, SymbolicExprId context,
                                           const std::vector<ChoiceRun>& runs, const Decision& gap,
                                           ChoiceSetReport& report) {
    if (!gap.isYes()) {
        add({.fault = ChoiceFault::Dead, .choice = position}, gap, report);
        return;
    }
    const auto isUnknown = [](const ChoiceFinding& finding) { return finding.fault == ChoiceFault::Dead; };
    if (runs.back().count > static_cast<std::size_t>(std::ranges::count_if(report.undecided, isUnknown)))
        return; // another choice can be active
    Decision others = ask(&Decider::overlaps, context, runs.back().holds);
    if (others.isYes())
        return;
    if (others.isNo())
        others.witness = gap.witness;
    add({.fault = ChoiceFault::AlwaysActive, .choice = position}, std::move(others), report);
}

OrdinaryChoices ChoiceSetChecker::State::ordinaryIn(SymbolicExprId context) {
    return {table, context, [this](SymbolicExprId known, SymbolicExprId condition) {
                return ask(&Decider::overlaps, known, condition).isYes() &&
                       ask(&Decider::implies, known, condition).isNo() && shorten(known, condition) == condition;
            }};
}

/// Why a choice is dead: choices that hide it, or operands that contradict each other.
void ChoiceSetChecker::State::findHiding(ChoiceFinding& finding, const Place& place, SymbolicExprId condition,
                                         SymbolicExprId holds, ChoiceBoxes& boxes) {
    std::vector<SymbolicExprId> premises = place.premises;
    premises.push_back(condition);
    if (place.earlierHold.empty() || (!place.isDeadByEarlier && isDeadAlone(finding.choice, holds, boxes))) {
        finding.reasons = reasonsBy([&](ReasonSearch& search) { return search.whyNever(premises); });
        return;
    }
    finding.isHidden = true;
    std::vector<SymbolicExprId> some;
    std::vector<std::size_t> earlier;
    const auto subset = minimalSubset(place.earlierHold.size(), [&](std::span<const std::size_t> positions) {
        earlier.clear();
        for (const std::size_t at : positions)
            if (!place.earlier.empty())
                earlier.push_back(place.earlier[at]);
        const Answer shows =
            counted(boxes, earlier.size() == positions.size() ? boxes.isActiveWithout(finding.choice, earlier)
                                                              : Answer::Undecided);
        if (shows != Answer::Undecided)
            return shows == Answer::No ? Answer::Yes : Answer::No;
        some.clear();
        for (const std::size_t at : positions)
            some.push_back(place.earlierHold[at]);
        return some.empty() ? Answer::No : ask(&Decider::implies, holds, makeChain(table, SymbolicOp::Or, some)).answer;
    });
    some.clear();
    for (const std::size_t at : subset.positions) {
        if (!place.earlier.empty())
            finding.hiddenBy.push_back(place.earlier[at]);
        some.push_back(place.earlierHold[at]);
    }
    const SymbolicExprId hiding = makeChain(table, SymbolicOp::Or, some);
    finding.reasons = reasonsBy([&](ReasonSearch& search) { return search.whyImplied(premises, hiding); });
}

/// Whether a choice is never active, even where those before it do not count.
bool ChoiceSetChecker::State::isDeadAlone(std::size_t position, SymbolicExprId holds, ChoiceBoxes& boxes) {
    const Answer seen = counted(boxes, boxes.isActiveWithout(position, {}));
    return seen == Answer::No || (seen == Answer::Undecided && ask(&Decider::canHold, holds).isNo());
}

/// Whether a choice is active where those before it do not count.  Where it is not, the place is left with those that
/// hide it.
Decision ChoiceSetChecker::State::findActive(Place& place, SymbolicExprId holds, SymbolicExprId left) {
    if (place.earlierHold.empty())
        return ask(&Decider::canHold, holds);
    std::vector<std::size_t> hiding;
    Decision active = findBeyond(place, holds, hiding);
    if (active.isNo()) {
        std::ranges::sort(hiding);
        placeAfter(place, hiding);
        place.isDeadByEarlier = !hiding.empty();
    }
    return active.bound != DecisionBound::Terms ? active : ask(&Decider::canHold, both(holds, left));
}

/// Whether a condition holds where no earlier choice does.  These become part of the question when values that were
/// found turn out to be theirs: most never do.  `hiding` has those from which to start, and then all that did.
/// Undecided with the bound of terms where they cannot be evaluated.
Decision ChoiceSetChecker::State::findBeyond(const Place& place, SymbolicExprId holds,
                                             std::vector<std::size_t>& hiding) {
    const auto leaveOut = [&](std::size_t choice) {
        holds = both(holds, makeUnary(table, SymbolicOp::Not, place.conditions[choice]));
    };
    std::ranges::for_each(hiding, leaveOut);
    while (hiding.size() < limits::hidingChoices) {
        Decision found = ask(&Decider::canHold, holds);
        if (!found.isYes())
            return found;
        if (!found.witness)
            return {Answer::Undecided, DecisionBound::Terms, std::nullopt};
        const ChoiceEvaluation::Hit hit = place.evaluation->anyOf(place.living, *found.witness);
        take(hit.steps);
        if (hit.answer == Answer::No)
            return found;
        if (hit.answer == Answer::Undecided)
            return {Answer::Undecided, DecisionBound::Terms, std::nullopt};
        hiding.push_back(hit.choice);
        leaveOut(hit.choice);
    }
    return {Answer::Undecided, DecisionBound::Steps, std::nullopt};
}

/// A condition holds at a point, if evaluation or a decision about the names that boxes know nothing of confirms it.
Decision ChoiceSetChecker::State::heldAt(const BoxPoint& point, SymbolicExprId condition, const ChoiceBoxes& boxes) {
    std::vector<SymbolicExprId> names;
    const SymbolicExprSymbols symbols(table);
    symbols(condition, names);
    Witness witness = boxes.valuesAt(point);
    std::erase_if(witness, [&](const UnknownValue& each) {
        return each.value == 0 && std::ranges::find(names, each.unknown) == names.end();
    });
    if (boxes.hasOtherNames()) {
        for (const auto& [name, value] : witness) {
            if (!fitsInt(value))
                return {};
            condition = both(condition, compareWith(table, SymbolicOp::Equal, name, static_cast<int>(value)));
        }
        return ask(&Decider::canHold, condition);
    }
    if (!decider.holds(condition, witness).value_or(false))
        return {};
    std::ranges::sort(witness, {}, [&](const UnknownValue& each) { return decider.nameOf(each.unknown); });
    return {Answer::Yes, DecisionBound::None, std::move(witness)};
}

/// Checks a choice by itself; whether it can be active.
Answer ChoiceSetChecker::State::checkOne(std::size_t position, Place place, SymbolicExprId condition,
                                         ChoiceBoxes& boxes, const ChoiceBoxes::Activity& seen,
                                         ChoiceSetReport& report) {
    const SymbolicExprId holds = both(place.context, toC(condition));
    const SymbolicExprId left =
        place.earlierHold.empty()
            ? table.getIdTRUE()
            : makeUnary(table, SymbolicOp::Not, makeChain(table, SymbolicOp::Or, place.earlierHold));
    Decision active = seen.answer == Answer::No    ? no
                      : seen.answer == Answer::Yes ? heldAt(seen.point, holds, boxes)
                                                   : Decision();
    // What boxes cannot tell from many earlier choices takes a decision even more steps.
    if (active.isUndecided() && place.isCrowded() && boxes.isHidingKnownOf(position))
        active.bound = DecisionBound::Steps;
    else if (active.isUndecided())
        active = findActive(place, holds, left);
    if (!active.isYes()) {
        const Answer answer = active.answer;
        ChoiceFinding finding{.fault = ChoiceFault::Dead, .choice = position};
        if (active.isNo())
            findHiding(finding, place, condition, holds, boxes);
        add(std::move(finding), std::move(active), report);
        return answer;
    }
    // An earlier choice that is active somewhere hides it there.
    Decision always = place.isHidden ? no : ask(&Decider::implies, place.context, both(toC(condition), left));
    if (!always.isNo()) {
        always.witness = std::move(active.witness);
        ChoiceFinding finding{.fault = ChoiceFault::AlwaysActive, .choice = position};
        finding.reasons = reasonsBy([&](ReasonSearch& search) { return search.whyImplied(place.premises, condition); });
        add(std::move(finding), std::move(always), report);
        return Answer::Yes;
    }
    // Many earlier choices are left out, as their proofs would take more than the finding is worth.
    const bool isAlone = place.isCrowded() || (seen.answer != Answer::Yes && place.evaluation != nullptr &&
                                               operandsOf(left) > limits::choiceOperands);
    const SymbolicExprId around = isAlone ? place.context : both(place.context, left);
    const auto isEqual = [&](SymbolicExprId candidate) {
        if (seen.answer == Answer::Yes)
            return counted(boxes, boxes.isEqual(position, toC(candidate)));
        if (!isAlone || place.isCrowded())
            return Answer::Undecided;
        std::vector<std::size_t> hiding;
        const SymbolicExprId inC = toC(candidate);
        for (const auto& [holdsThere, failsThere] : {std::pair(inC, toC(condition)), std::pair(toC(condition), inC)}) {
            const SymbolicExprId differs =
                both(place.context, both(holdsThere, makeUnary(table, SymbolicOp::Not, failsThere)));
            const Decision found = findBeyond(place, differs, hiding);
            if (!found.isNo())
                return found.isYes() ? Answer::No : Answer::Undecided;
        }
        return Answer::Yes;
    };
    if (const SymbolicExprId shorter = shorten(around, condition, isEqual); shorter != condition) {
        ChoiceFinding finding{.fault = ChoiceFault::Redundant, .choice = position, .proposed = shorter};
        finding.reasons = reasonsBy([&](ReasonSearch& search) {
            std::vector<SymbolicExprId> premises = place.premises;
            for (const SymbolicExprId earlier : place.earlierHold)
                premises.push_back(makeUnary(table, SymbolicOp::Not, earlier));
            return search.whyEqual(premises, condition, shorter);
        });
        add(std::move(finding), std::move(active), report);
    }
    return Answer::Yes;
}

void ChoiceSetChecker::State::reportOverlap(std::size_t first, std::size_t second, Decision decision,
                                            std::span<const SymbolicExprId> holds, ChoiceSetReport& report) {
    ChoiceFinding finding{
        .fault = ChoiceFault::Overlap, .choice = std::min(first, second), .other = std::max(first, second)};
    if (decision.isUndecided()) {
        add(std::move(finding), std::move(decision), report);
        return;
    }
    finding.witness = std::move(decision.witness).value_or(Witness{});
    finding.firstCovered = ask(&Decider::implies, holds[finding.choice], holds[finding.other]).isYes();
    finding.secondCovered = ask(&Decider::implies, holds[finding.other], holds[finding.choice]).isYes();
    report.findings.push_back(std::move(finding));
}

/// Whether some choice of a run overlaps one of another.  Undecided where that is cheaper to see from their halves.
Decision ChoiceSetChecker::State::overlapOf(const ChoiceRun& a, const ChoiceRun& b, ChoiceBoxes& boxes) {
    if (a.isSingle() && b.isSingle()) {
        if (counted(boxes, boxes.overlap(a.left, b.left)) == Answer::No)
            return no;
        return ask(&Decider::overlaps, a.holds, b.holds);
    }
    if (setLeft == 0)
        return {Answer::Undecided, DecisionBound::Steps, std::nullopt};
    const std::size_t count = a.count + b.count;
    if (boxes.areKnown() && count <= limits::overlapRun)
        return {};
    decider.limitSteps(std::min(share(), boxes.areKnown() ? count * limits::overlapSteps : questionSteps));
    Decision decision = decider.overlaps(a.holds, b.holds);
    take(decider.stepsTaken() + 1);
    return decision;
}

void ChoiceSetChecker::State::findOverlaps(const std::vector<ChoiceRun>& runs, std::span<const SymbolicExprId> holds,
                                           ChoiceBoxes& boxes, ChoiceSetReport& report) {
    std::size_t reported = 0;
    std::optional<std::uint64_t> kept; // steps that counting further overlaps leaves
    std::vector<std::pair<std::size_t, std::size_t>> open;
    // Small runs come first, so that larger ones are decided from theirs.
    for (const ChoiceRun& run : runs) {
        if (run.isSingle())
            continue;
        for (open.emplace_back(run.left, run.right); !open.empty();) {
            const auto [a, b] = open.back();
            open.pop_back();
            if (areApart(runs[a].ranges, runs[b].ranges))
                continue;
            const bool isPair = runs[a].isSingle() && runs[b].isSingle();
            const bool isCounting = reported == options.overlaps;
            // Of a pair that is only counted boxes say enough.
            const bool isSeen =
                isCounting && isPair && counted(boxes, boxes.overlap(runs[a].left, runs[b].left)) == Answer::Yes;
            Decision both =
                isSeen ? Decision{Answer::Yes, DecisionBound::None, std::nullopt} : overlapOf(runs[a], runs[b], boxes);
            if (both.isNo())
                continue;
            if (isCounting && !kept)
                kept = setLeft - std::min(setLeft, share());
            const bool isCut = stepsLeft == 0 || setLeft <= kept.value_or(0);
            if (isCut || (isCounting && isPair)) {
                report.allOverlaps = false;
                report.furtherOverlaps += isPair && both.isYes() ? 1U : 0U;
                report.allCounted = report.allCounted && !isCut && both.isYes();
                if (isCut)
                    return;
                continue;
            }
            if (isPair) {
                reportOverlap(runs[a].left, runs[b].left, std::move(both), holds, report);
                ++reported;
                continue;
            }
            const bool splitsFirst = runs[a].count >= runs[b].count;
            const ChoiceRun& split = runs[splitsFirst ? a : b];
            for (const std::size_t half : {split.right, split.left})
                open.emplace_back(splitsFirst ? half : a, splitsFirst ? b : half);
        }
    }
}

/// Whether the parent can be active where no choice is.  The price of an exact answer grows with the names in the
/// conditions; when it is too high, values beyond all ranges may still show that there is a gap.
ChoiceSetChecker::State::Gap ChoiceSetChecker::State::findGap(SymbolicExprId context,
                                                              const std::vector<ChoiceRun>& runs, ChoiceBoxes& boxes) {
    const ChoiceRun& all = runs.back();
    std::vector<std::size_t> choices;
    for (const ChoiceRun& run : runs)
        if (run.count == 1)
            choices.push_back(run.left);
    const BoxGap seen = counted(boxes, boxes.gapOf(choices));
    if (seen.answer == Answer::No)
        return {no, true};
    const auto gapSeen = [&] { return seen.answer == Answer::Yes ? heldAt(seen.point, context, boxes) : Decision(); };
    // Of many choices no decision is needed, as no condition is looked for that closes the gap.
    if (choices.size() > limits::shortenComparisons)
        if (Decision gap = gapSeen(); gap.isYes())
            return {std::move(gap), true};
    Decision gap = ask(&Decider::implies, context, all.holds).opposite();
    if (!gap.isUndecided())
        return {std::move(gap), true};
    if (Decision found = gapSeen(); found.isYes())
        return {std::move(found), false};
    for (const NameRange& range : all.ranges) {
        for (const bool isAbove : {true, false}) {
            const std::int64_t bound = isAbove ? range.high : range.low;
            if (bound <= std::numeric_limits<int>::min() || bound >= std::numeric_limits<int>::max())
                continue;
            const SymbolicIntValue literal(table, static_cast<int>(bound) + (isAbove ? 1 : -1));
            const SymbolicEqualExpr beyond(table, range.name, literal.getId(table));
            Decision active = ask(&Decider::overlaps, context, beyond.getId(table));
            if (active.isYes())
                return {std::move(active), false};
        }
    }
    return {std::move(gap), false};
}

} // namespace VT
