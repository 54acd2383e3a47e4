// Sets are asked about by halves.  The diagrams of both halves stay with the decider, so the next larger half costs
// what it adds.  The price is one node interned for each choice and for each half.
#include "base/service/ChoiceSet.hpp"

#include "base/VCService.hpp"
#include "base/core/Table.hpp"
#include "base/decide/Decider.hpp"
#include "base/service/ImpliedCondition.hpp"
#include "base/simplify/Simplify.hpp"
#include "base/transform/QuillConversion.hpp"
#include "base/variants/VariantKeywords.hpp"

#include <algorithm>

namespace VT {

struct ChoiceSetChecker::State {
    State(VCService& theService, const ChoiceSetOptions& theOptions)
        : service(theService),
          table(theService.table()),
          toC(table),
          decider(table, {.keywordsInForce = isVariantKeywordsSimCodegenFeatureOn(), .bits32 = theOptions.bits32}),
          options(theOptions),
          stepsLeft(theOptions.steps) {}

    /// A run of choices whose conditions are joined by Or.
    struct Run {
        std::size_t begin;
        std::size_t end;
        SymbolicExprId holds; ///< where one of them is active
        std::size_t left;     ///< positions of its halves; of a single choice its own
        std::size_t right;

        [[nodiscard]] bool isSingle() const noexcept { return end - begin == 1; }
    };

    Decision ask(Decision (Decider::*question)(SymbolicExprId), SymbolicExprId condition);
    Decision ask(Decision (Decider::*question)(SymbolicExprId, SymbolicExprId), SymbolicExprId a, SymbolicExprId b);
    Decision counted(Decision decision);
    [[nodiscard]] std::size_t operandsOf(SymbolicExprId condition) const;
    void checkOne(std::size_t position, SymbolicExprId parent, SymbolicExprId condition, SymbolicExprId holds,
                  ChoiceSetReport& report);
    SymbolicExprId shorten(SymbolicExprId parent, SymbolicExprId condition);
    std::vector<Run> halve(std::span<const SymbolicExprId> holds);
    void findOverlaps(const std::vector<Run>& runs, std::span<const SymbolicExprId> holds, ChoiceSetReport& report);
    void tellOverlap(std::size_t first, std::size_t second, Decision decision, std::span<const SymbolicExprId> holds,
                     ChoiceSetReport& report);

    VCService& service;
    SymbolicExprTable& table;
    SymbolicExprQ2C toC;
    Decider decider;
    ChoiceSetOptions options;
    std::uint64_t stepsLeft;
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
    return decision;
}

Decision ChoiceSetChecker::State::ask(Decision (Decider::*question)(SymbolicExprId), SymbolicExprId condition) {
    if (stepsLeft == 0)
        return {Answer::Undecided, DecisionBound::Steps, std::nullopt};
    return counted((decider.*question)(condition));
}

Decision ChoiceSetChecker::State::ask(Decision (Decider::*question)(SymbolicExprId, SymbolicExprId), SymbolicExprId a,
                                      SymbolicExprId b) {
    if (stepsLeft == 0)
        return {Answer::Undecided, DecisionBound::Steps, std::nullopt};
    return counted((decider.*question)(a, b));
}

Decision ChoiceSetChecker::canHold(SymbolicExprId condition) {
    return state_->ask(&Decider::canHold, state_->toC(condition));
}

/// Operands that && || ! leave, counted up to one beyond the bound.
std::size_t ChoiceSetChecker::State::operandsOf(SymbolicExprId condition) const {
    std::size_t count = 0;
    std::vector<SymbolicExprId> open{condition};
    while (!open.empty() && count + open.size() <= limits::choiceOperands) {
        const SymbolicExpr& node = *table.get(open.back());
        open.pop_back();
        const bool isChain = node.op() == SymbolicOp::And || node.op() == SymbolicOp::Or;
        if (isChain || node.op() == SymbolicOp::Not)
            open.push_back(node.getInput(0));
        if (isChain)
            open.push_back(node.getInput(1));
        if (!isChain && node.op() != SymbolicOp::Not)
            ++count;
    }
    return count + open.size();
}

/// The condition without operands that its parent's makes redundant; itself where there are none.
SymbolicExprId ChoiceSetChecker::State::shorten(SymbolicExprId parent, SymbolicExprId condition) {
    const std::size_t operands = operandsOf(condition);
    if (operands < 2 || operands > limits::choiceOperands)
        return condition;
    const SymbolicExprId given = toC(condition);
    const SymbolicExprId context = toC(parent);
    const auto isEqual = [&](SymbolicExprId candidate) {
        return stepsLeft != 0 && counted(decider.equivalentGiven(toC(candidate), given, context)).isYes();
    };
    const SymbolicExprId shorter =
        ImpliedCondition(table, service.simplifier().printer(), parent, isEqual).shorten(condition);
    return operandsOf(shorter) < operands ? shorter : condition;
}

/// `holds` is where both the parent and the condition hold.
void ChoiceSetChecker::State::checkOne(std::size_t position, SymbolicExprId parent, SymbolicExprId condition,
                                       SymbolicExprId holds, ChoiceSetReport& report) {
    const auto add = [&](ChoiceFault fault, Decision decision) {
        auto& list = decision.isUndecided() ? report.undecided : report.findings;
        list.push_back({.fault = fault,
                        .choice = position,
                        .witness = std::move(decision.witness).value_or(Witness{}),
                        .bound = decision.bound});
    };
    Decision active = ask(&Decider::canHold, holds);
    if (!active.isYes()) {
        add(ChoiceFault::Dead, std::move(active));
        return;
    }
    Decision always = ask(&Decider::implies, toC(parent), toC(condition));
    if (!always.isNo()) {
        always.witness = std::move(active.witness);
        add(ChoiceFault::AlwaysActive, std::move(always));
        return;
    }
    if (const SymbolicExprId shorter = shorten(parent, condition); shorter != condition) {
        add(ChoiceFault::Redundant, std::move(active));
        report.findings.back().proposed = shorter;
    }
}

/// The choices in halves of halves; the last run is all of them.
std::vector<ChoiceSetChecker::State::Run> ChoiceSetChecker::State::halve(std::span<const SymbolicExprId> holds) {
    std::vector<Run> runs;
    std::vector<std::size_t> level;
    for (std::size_t i = 0; i < holds.size(); ++i) {
        runs.push_back({i, i + 1, holds[i], i, i});
        level.push_back(i);
    }
    while (level.size() > 1) {
        std::size_t next = 0;
        for (std::size_t i = 0; i < level.size(); i += 2) {
            std::size_t run = level[i];
            if (i + 1 < level.size()) {
                const std::size_t right = level[i + 1];
                const SymbolicExprId either = SymbolicOrExpr(table, runs[run].holds, runs[right].holds).getId(table);
                runs.push_back({runs[run].begin, runs[right].end, either, run, right});
                run = runs.size() - 1;
            }
            level[next++] = run;
        }
        level.resize(next);
    }
    return runs;
}

void ChoiceSetChecker::State::tellOverlap(std::size_t first, std::size_t second, Decision decision,
                                          std::span<const SymbolicExprId> holds, ChoiceSetReport& report) {
    ChoiceFinding finding{.fault = ChoiceFault::Overlap,
                          .choice = std::min(first, second),
                          .other = std::max(first, second),
                          .witness = std::move(decision.witness).value_or(Witness{}),
                          .bound = decision.bound};
    if (decision.isUndecided()) {
        report.undecided.push_back(std::move(finding));
        return;
    }
    finding.firstCovered = ask(&Decider::implies, holds[finding.choice], holds[finding.other]).isYes();
    finding.secondCovered = ask(&Decider::implies, holds[finding.other], holds[finding.choice]).isYes();
    report.findings.push_back(std::move(finding));
}

void ChoiceSetChecker::State::findOverlaps(const std::vector<Run>& runs, std::span<const SymbolicExprId> holds,
                                           ChoiceSetReport& report) {
    std::size_t told = 0;
    std::vector<std::pair<std::size_t, std::size_t>> open;
    // Small runs come first, so that larger ones are decided from theirs.
    for (const Run& run : runs) {
        if (run.isSingle())
            continue;
        for (open.emplace_back(run.left, run.right); !open.empty();) {
            const auto [a, b] = open.back();
            open.pop_back();
            Decision both = ask(&Decider::overlaps, runs[a].holds, runs[b].holds);
            if (both.isNo())
                continue;
            if (told == options.overlaps || stepsLeft == 0) {
                report.allOverlaps = false;
                return;
            }
            if (runs[a].isSingle() && runs[b].isSingle()) {
                tellOverlap(runs[a].begin, runs[b].begin, std::move(both), holds, report);
                ++told;
                continue;
            }
            const bool splitsFirst = runs[a].end - runs[a].begin >= runs[b].end - runs[b].begin;
            const Run& split = runs[splitsFirst ? a : b];
            for (const std::size_t half : {split.right, split.left})
                open.emplace_back(splitsFirst ? half : a, splitsFirst ? b : half);
        }
    }
}

ChoiceSetReport ChoiceSetChecker::check(SymbolicExprId parent, std::span<const SymbolicExprId> choices) {
    ChoiceSetReport report;
    State& state = *state_;
    const SymbolicExprId context = state.toC(parent);
    report.parentNeverHolds = state.ask(&Decider::canHold, context).isNo();
    if (report.parentNeverHolds || choices.empty())
        return report;
    std::vector<SymbolicExprId> holds;
    holds.reserve(choices.size());
    for (std::size_t i = 0; i < choices.size(); ++i) {
        holds.push_back(state.service.AND(context, state.toC(choices[i]), false).id());
        state.checkOne(i, parent, choices[i], holds[i], report);
    }
    const std::vector<State::Run> runs = state.halve(holds);
    const std::size_t firstOverlap = report.findings.size();
    state.findOverlaps(runs, holds, report);
    std::sort(report.findings.begin() + static_cast<std::ptrdiff_t>(firstOverlap), report.findings.end(),
              [](const ChoiceFinding& a, const ChoiceFinding& b) {
                  return std::pair(a.choice, a.other) < std::pair(b.choice, b.other);
              });
    Decision covered = state.ask(&Decider::implies, context, runs.back().holds);
    if (!covered.isYes()) {
        auto& list = covered.isNo() ? report.findings : report.undecided;
        list.push_back({.fault = ChoiceFault::Missing,
                        .witness = std::move(covered.witness).value_or(Witness{}),
                        .bound = covered.bound});
    }
    return report;
}

ChoiceSetReport ChoiceSetChecker::checkCondition(SymbolicExprId parent, SymbolicExprId condition) {
    ChoiceSetReport report;
    State& state = *state_;
    const SymbolicExprId context = state.toC(parent);
    report.parentNeverHolds = state.ask(&Decider::canHold, context).isNo();
    if (!report.parentNeverHolds)
        state.checkOne(0, parent, condition, state.service.AND(context, state.toC(condition), false).id(), report);
    return report;
}

} // namespace VT
