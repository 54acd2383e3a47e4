// Checks choice sets against exact decisions.
//
// Method: the choices, sorted by their ranges, are joined in halves of halves.  Where no choice of one half overlaps
// one of the other, one decision settles all pairs; otherwise the larger half is split.  The diagrams of both halves
// stay with the decider, so the next larger half costs only the difference.
// Cost: one node interned for each choice and each half; some n log n steps without overlaps, and a few decisions more
// for each level and each overlap.  limits::choiceSteps bounds all sets together.
// Relies on: Decider for proofs, ChoiceRanges to skip decisions.
#include "base/choices/ChoiceSetChecker.hpp"

#include "base/choices/ChoiceRanges.hpp"
#include "base/core/Chains.hpp"
#include "base/core/Table.hpp"
#include "base/decide/Decider.hpp"
#include "base/decide/shorten/ConditionProofs.hpp"
#include "base/decide/shorten/ImpliedCondition.hpp"
#include "base/service/VCService.hpp"
#include "base/simplify/Simplify.hpp"
#include "base/transform/QuillConversion.hpp"

#include <algorithm>
#include <limits>

namespace VT {

struct ChoiceSetChecker::State {
    State(VCService& theService, const ChoiceSetOptions& theOptions)
        : service(theService),
          table(theService.table()),
          toC(table),
          decider(table, {.keywordsInForce = theService.areVariantKeywordsInForce(), .bits32 = theOptions.bits32}),
          options(theOptions),
          stepsLeft(theOptions.steps) {}

    /// A run of choices whose conditions are joined by Or.
    struct Run {
        SymbolicExprId holds; ///< where one of them is active
        NameRanges ranges;    ///< of names there
        std::size_t count;
        std::size_t left; ///< positions of its halves in the runs; of a single choice its own among the choices
        std::size_t right;

        [[nodiscard]] bool isSingle() const noexcept { return count < 2; }
    };

    Decision ask(Decision (Decider::*question)(SymbolicExprId), SymbolicExprId condition);
    Decision ask(Decision (Decider::*question)(SymbolicExprId, SymbolicExprId), SymbolicExprId a, SymbolicExprId b);
    Decision counted(Decision decision);
    [[nodiscard]] std::size_t operandsOf(SymbolicExprId condition) const;
    static void add(ChoiceFinding finding, Decision decision, ChoiceSetReport& report);
    void checkDefault(std::size_t position, SymbolicExprId parent, const std::vector<Run>& runs, const Decision& gap,
                      ChoiceSetReport& report);
    Decision findGap(SymbolicExprId parent, const std::vector<Run>& runs);
    bool checkOne(std::size_t position, SymbolicExprId parent, SymbolicExprId condition, SymbolicExprId holds,
                  ChoiceSetReport& report);
    SymbolicExprId shorten(SymbolicExprId parent, SymbolicExprId condition);
    std::vector<Run> halve(std::span<const SymbolicExprId> holds);
    void findOverlaps(const std::vector<Run>& runs, std::span<const SymbolicExprId> holds, ChoiceSetReport& report);
    void reportOverlap(std::size_t first, std::size_t second, Decision decision, std::span<const SymbolicExprId> holds,
                       ChoiceSetReport& report);

    VCService& service;
    SymbolicExprTable& table;
    SymbolicExprQ2C toC;
    Decider decider;
    ChoiceSetOptions options;
    std::uint64_t stepsLeft;
    std::uint64_t questionSteps = limits::decisionSteps; ///< a quarter after each question of a set that gives up
};

ChoiceSetChecker::ChoiceSetChecker(VCService& service, const ChoiceSetOptions& options)
    : state_(std::make_unique<State>(service, options)) {}

ChoiceSetChecker::ChoiceSetChecker(ChoiceSetChecker&&) noexcept = default;
ChoiceSetChecker& ChoiceSetChecker::operator=(ChoiceSetChecker&&) noexcept = default;
ChoiceSetChecker::~ChoiceSetChecker() = default;

bool ChoiceSetChecker::stepsUsedUp() const noexcept {
    return state_->stepsLeft == 0;
}

Decision ChoiceSetChecker::State::counted(Decision decision) {
    stepsLeft -= std::min(stepsLeft, decider.stepsTaken() + 1);
    if (decision.bound == DecisionBound::Steps)
        questionSteps = std::max(questionSteps / 4, limits::furtherSteps);
    return decision;
}

Decision ChoiceSetChecker::State::ask(Decision (Decider::*question)(SymbolicExprId), SymbolicExprId condition) {
    if (stepsLeft == 0)
        return {Answer::Undecided, DecisionBound::Steps, std::nullopt};
    decider.limitSteps(questionSteps);
    return counted((decider.*question)(condition));
}

Decision ChoiceSetChecker::State::ask(Decision (Decider::*question)(SymbolicExprId, SymbolicExprId), SymbolicExprId a,
                                      SymbolicExprId b) {
    if (stepsLeft == 0)
        return {Answer::Undecided, DecisionBound::Steps, std::nullopt};
    decider.limitSteps(questionSteps);
    return counted((decider.*question)(a, b));
}

Decision ChoiceSetChecker::canHold(SymbolicExprId condition) {
    return state_->ask(&Decider::canHold, state_->toC(condition));
}

/// Counts the operands below && || !, up to one beyond the bound.
std::size_t ChoiceSetChecker::State::operandsOf(SymbolicExprId condition) const {
    static constexpr OperatorSet logicalOps{SymbolicOp::And, SymbolicOp::Or, SymbolicOp::Not};
    std::size_t count = 0;
    const bool complete = walkChain(
        table, condition, limits::choiceOperands,
        [](SymbolicExprId, const SymbolicExpr& node) { return logicalOps.contains(node.op()); },
        [&](SymbolicExprId, const SymbolicExpr*) {
            ++count;
            return true;
        });
    return complete ? count : limits::choiceOperands + 1;
}

/// Drops operands that the parent's condition makes redundant; returns the condition itself without such.
SymbolicExprId ChoiceSetChecker::State::shorten(SymbolicExprId parent, SymbolicExprId condition) {
    const std::size_t operands = operandsOf(condition);
    if (operands < 2 || operands > limits::choiceOperands)
        return condition;
    // Literals are taken from a context that is not large.
    const SymbolicExprId literals = operandsOf(parent) > limits::choiceOperands ? table.getIdTRUE() : parent;
    ConditionProofs proofs(decider, toC, condition, parent, true, std::min(stepsLeft, limits::shortenSteps));
    const auto isEqual = [&](SymbolicExprId candidate) { return proofs.isEqual(candidate); };
    const SymbolicExprId shorter =
        ImpliedCondition(table, service.simplifier().printer(), literals, isEqual).shorten(condition);
    stepsLeft -= std::min(stepsLeft, proofs.stepsTaken());
    return operandsOf(shorter) < operands ? shorter : condition;
}

void ChoiceSetChecker::State::add(ChoiceFinding finding, Decision decision, ChoiceSetReport& report) {
    finding.witness = std::move(decision.witness).value_or(Witness{});
    finding.bound = decision.bound;
    (decision.isUndecided() ? report.undecided : report.findings).push_back(std::move(finding));
}

/// The default choice is active in the gap of the others.
void ChoiceSetChecker::State::checkDefault(std::size_t position, SymbolicExprId parent, const std::vector<Run>& runs,
                                           const Decision& gap, ChoiceSetReport& report) {
    if (!gap.isYes()) {
        add({.fault = ChoiceFault::Dead, .choice = position}, gap, report);
        return;
    }
    const auto isUnknown = [](const ChoiceFinding& finding) { return finding.fault == ChoiceFault::Dead; };
    if (runs.back().count > static_cast<std::size_t>(std::ranges::count_if(report.undecided, isUnknown)))
        return; // another choice can be active
    Decision others = ask(&Decider::overlaps, parent, runs.back().holds);
    if (others.isYes())
        return;
    if (others.isNo())
        others.witness = gap.witness;
    add({.fault = ChoiceFault::AlwaysActive, .choice = position}, std::move(others), report);
}

/// Checks a choice by itself; false where it is dead.  `holds` is where both the parent and the condition hold.
bool ChoiceSetChecker::State::checkOne(std::size_t position, SymbolicExprId parent, SymbolicExprId condition,
                                       SymbolicExprId holds, ChoiceSetReport& report) {
    Decision active = ask(&Decider::canHold, holds);
    if (!active.isYes()) {
        const bool isDead = active.isNo();
        add({.fault = ChoiceFault::Dead, .choice = position}, std::move(active), report);
        return !isDead;
    }
    Decision always = ask(&Decider::implies, toC(parent), toC(condition));
    if (!always.isNo()) {
        always.witness = std::move(active.witness);
        add({.fault = ChoiceFault::AlwaysActive, .choice = position}, std::move(always), report);
        return true;
    }
    if (const SymbolicExprId shorter = shorten(parent, condition); shorter != condition) {
        add({.fault = ChoiceFault::Redundant, .choice = position, .proposed = shorter}, std::move(active), report);
    }
    return true;
}

/// The choices, neighbours by their ranges, in halves of halves; the last run is all of them.
std::vector<ChoiceSetChecker::State::Run> ChoiceSetChecker::State::halve(std::span<const SymbolicExprId> holds) {
    std::vector<NameRanges> ranges;
    ranges.reserve(holds.size());
    for (const SymbolicExprId each : holds)
        ranges.push_back(rangesOf(table, each));
    std::vector<Run> runs;
    std::vector<std::size_t> level;
    for (const std::size_t position : sortedByRange(ranges)) {
        if (holds[position] == table.getIdFALSE())
            continue;
        level.push_back(runs.size());
        runs.push_back({holds[position], std::move(ranges[position]), 1, position, position});
    }
    if (runs.empty())
        runs.push_back({table.getIdFALSE(), {}, 0, 0, 0});
    while (level.size() > 1) {
        std::size_t next = 0;
        for (std::size_t i = 0; i < level.size(); i += 2) {
            std::size_t run = level[i];
            if (i + 1 < level.size()) {
                const std::size_t right = level[i + 1];
                const SymbolicExprId either = SymbolicOrExpr(table, runs[run].holds, runs[right].holds).getId(table);
                runs.push_back({either, joined(runs[run].ranges, runs[right].ranges),
                                runs[run].count + runs[right].count, run, right});
                run = runs.size() - 1;
            }
            level[next++] = run;
        }
        level.resize(next);
    }
    return runs;
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

void ChoiceSetChecker::State::findOverlaps(const std::vector<Run>& runs, std::span<const SymbolicExprId> holds,
                                           ChoiceSetReport& report) {
    std::size_t reported = 0;
    std::vector<std::pair<std::size_t, std::size_t>> open;
    // Small runs come first, so that larger ones are decided from theirs.
    for (const Run& run : runs) {
        if (run.isSingle())
            continue;
        for (open.emplace_back(run.left, run.right); !open.empty();) {
            const auto [a, b] = open.back();
            open.pop_back();
            if (areApart(runs[a].ranges, runs[b].ranges))
                continue;
            Decision both = ask(&Decider::overlaps, runs[a].holds, runs[b].holds);
            if (both.isNo())
                continue;
            if (reported == options.overlaps || stepsLeft == 0) {
                report.allOverlaps = false;
                return;
            }
            if (runs[a].isSingle() && runs[b].isSingle()) {
                reportOverlap(runs[a].left, runs[b].left, std::move(both), holds, report);
                ++reported;
                continue;
            }
            const bool splitsFirst = runs[a].count >= runs[b].count;
            const Run& split = runs[splitsFirst ? a : b];
            for (const std::size_t half : {split.right, split.left})
                open.emplace_back(splitsFirst ? half : a, splitsFirst ? b : half);
        }
    }
}

/// Decides whether the parent can be active and no choice.  The cost of an exact answer grows with the names in the
/// conditions; when it is too high, values beyond all ranges may still prove a gap.
Decision ChoiceSetChecker::State::findGap(SymbolicExprId parent, const std::vector<Run>& runs) {
    const Run& all = runs.back();
    Decision gap = ask(&Decider::implies, parent, all.holds).opposite();
    if (!gap.isUndecided())
        return gap;
    for (const NameRange& range : all.ranges) {
        for (const bool isAbove : {true, false}) {
            const std::int64_t bound = isAbove ? range.high : range.low;
            if (bound <= std::numeric_limits<int>::min() || bound >= std::numeric_limits<int>::max())
                continue;
            const SymbolicIntValue literal(table, static_cast<int>(bound) + (isAbove ? 1 : -1));
            const SymbolicEqualExpr beyond(table, range.name, literal.getId(table));
            Decision active = ask(&Decider::overlaps, parent, beyond.getId(table));
            if (active.isYes())
                return active;
        }
    }
    return gap;
}

ChoiceSetReport ChoiceSetChecker::check(SymbolicExprId parent, std::span<const SymbolicExprId> choices,
                                        std::optional<std::size_t> defaultChoice) {
    ChoiceSetReport report;
    State& state = *state_;
    const SymbolicExprTable& table = state.table;
    if (!table.has(parent) || !std::ranges::all_of(choices, [&](SymbolicExprId id) { return table.has(id); })) {
        State::add({.fault = ChoiceFault::Missing}, {Answer::Undecided, DecisionBound::NoCondition, std::nullopt},
                   report);
        return report;
    }
    const SymbolicExprId context = state.toC(parent);
    state.questionSteps = limits::decisionSteps;
    report.parentNeverHolds = state.ask(&Decider::canHold, context).isNo();
    if (report.parentNeverHolds || choices.empty())
        return report;
    std::vector<SymbolicExprId> holds(choices.size(), table.getIdFALSE()); // which overlaps nothing
    for (std::size_t i = 0; i < choices.size(); ++i) {
        if (i == defaultChoice)
            continue;
        holds[i] = state.service.AND(context, state.toC(choices[i]), false).id();
        if (!state.checkOne(i, parent, choices[i], holds[i], report))
            holds[i] = table.getIdFALSE();
    }
    const std::vector<State::Run> runs = state.halve(holds);
    Decision gap = state.findGap(context, runs);
    if (defaultChoice)
        state.checkDefault(*defaultChoice, context, runs, gap, report);
    const std::size_t firstOverlap = report.findings.size();
    state.findOverlaps(runs, holds, report);
    std::sort(report.findings.begin() + static_cast<std::ptrdiff_t>(firstOverlap), report.findings.end(),
              [](const ChoiceFinding& a, const ChoiceFinding& b) {
                  return std::pair(a.choice, a.other) < std::pair(b.choice, b.other);
              });
    if (!defaultChoice && !gap.isNo())
        State::add({.fault = ChoiceFault::Missing}, std::move(gap), report);
    return report;
}

ChoiceSetReport ChoiceSetChecker::checkCondition(SymbolicExprId parent, SymbolicExprId condition) {
    ChoiceSetReport report;
    State& state = *state_;
    if (!state.table.has(parent) || !state.table.has(condition)) {
        State::add({.fault = ChoiceFault::Dead}, {Answer::Undecided, DecisionBound::NoCondition, std::nullopt}, report);
        return report;
    }
    const SymbolicExprId context = state.toC(parent);
    state.questionSteps = limits::decisionSteps;
    report.parentNeverHolds = state.ask(&Decider::canHold, context).isNo();
    if (!report.parentNeverHolds)
        state.checkOne(0, parent, condition, state.service.AND(context, state.toC(condition), false).id(), report);
    return report;
}

} // namespace VT
