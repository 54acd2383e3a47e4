// Judges a condition under known facts.
//
// Method: a verdict is a question to the decider: disjoint from the facts, implied by them, or equivalent to a shorter
// condition (ImpliedCondition) under them.  Reasons are minimised as in delta debugging (Zeller, Hildebrandt,
// "Simplifying and isolating failure-inducing input", 2002): runs of facts are dropped, in halves of halves, while the
// rest suffices.
// Cost: at most limits::branchSteps a question; what was judged before is answered from memory.
// Relies on: Decider, whose answers are proven or "undecided".
#include "base/scan/BranchVerdict.hpp"

#include "base/core/Limits.hpp"
#include "base/core/Walk.hpp"
#include "base/decide/shorten/ImpliedCondition.hpp"

#include <boost/container_hash/hash.hpp>

#include <algorithm>
#include <numeric>

namespace VT {

std::size_t BranchJudge::QuestionHash::operator()(const Question& question) const noexcept {
    std::size_t seed = question.condition;
    boost::hash_combine(seed, question.known);
    boost::hash_combine(seed, question.knownToShorten);
    return seed;
}

BranchJudge::BranchJudge(SymbolicExprTable& table)
    : table_(table),
      decider_(table, {.keywordsInForce = false, .steps = limits::branchDecisionSteps}),
      printer_(table, false) {
    table.addBoolSymbols();
}

/// Joins conditions by And; no conditions yield TRUE.
SymbolicExprId BranchJudge::all(std::span<const SymbolicExprId> facts, std::span<const SymbolicExprId> laws,
                                std::span<const SymbolicExprId> further) {
    SymbolicExprId joined = invalidId;
    for (const auto part : {facts, laws, further})
        for (const SymbolicExprId each : part)
            joined = joined == invalidId ? each : SymbolicAndExpr(table_, joined, each).getId(table_);
    charge(facts.size() + laws.size() + further.size());
    return joined == invalidId ? table_.getIdTRUE() : joined;
}

void BranchJudge::charge(std::uint64_t steps) {
    stepsLeft_ -= std::min(stepsLeft_, steps);
}

/// Whether a decision is "yes".  Does not ask once the steps are used up.
template <class Ask>
bool BranchJudge::proven(Ask ask) {
    if (stepsLeft_ == 0) {
        isUndecided_ = true;
        return false;
    }
    const Decision decision = ask();
    charge(decider_.stepsTaken() + 1);
    isUndecided_ = isUndecided_ || decision.isUndecided();
    return decision.isYes();
}

/// Whether a verdict is right under a condition that is known.
bool BranchJudge::holds(BranchVerdict verdict, SymbolicExprId condition, SymbolicExprId known) {
    return proven([&] {
        switch (verdict.kind) {
        case BranchVerdictKind::Dead:
            return decider_.disjoint(known, condition);
        case BranchVerdictKind::AlwaysTrue:
            return decider_.implies(known, condition);
        case BranchVerdictKind::Removable:
            return decider_.equivalentGiven(verdict.shorter, condition, known);
        default:
            return Decision{};
        }
    });
}

BranchVerdict BranchJudge::decide(const Question& question) {
    for (const auto kind : {BranchVerdictKind::Dead, BranchVerdictKind::AlwaysTrue}) {
        const BranchVerdict verdict{kind, invalidId};
        if (holds(verdict, question.condition, question.known))
            return proven([&] { return decider_.canHold(question.known); }) ? verdict : BranchVerdict{};
    }
    const SymbolicExprId shorter = shortened(question.condition, question.knownToShorten);
    return shorter == question.condition ? BranchVerdict{} : BranchVerdict{BranchVerdictKind::Removable, shorter};
}

SymbolicExprId BranchJudge::shortened(SymbolicExprId condition, SymbolicExprId known) {
    const SymbolicOp op = table_.get(condition)->op();
    if (op != SymbolicOp::And && op != SymbolicOp::Or)
        return condition;
    bool isTooHard = false; // its neighbours are as hard
    const auto isEqual = [&](SymbolicExprId candidate) {
        if (isTooHard)
            return false;
        return proven([&] {
            Decision equal = decider_.equivalentGiven(candidate, condition, known);
            isTooHard = equal.bound == DecisionBound::Steps;
            return equal;
        });
    };
    std::uint64_t nodes = 0; // each candidate leaves out one of them
    walkDistinct(
        table_, condition, [&](SymbolicExprId, const SymbolicExpr&) { ++nodes; }, [](SymbolicExprId) {});
    charge(std::min<std::uint64_t>(nodes * nodes, limits::impliedNodes));
    return ImpliedCondition(table_, printer_, known, isEqual).shorten(condition);
}

bool BranchJudge::beginBranch() noexcept {
    fileStepsLeft_ += limits::scanStepsPerBranch;
    const bool hasSteps = fileStepsLeft_ > 0;
    givenUp_ += hasSteps ? 0U : 1U;
    return hasSteps;
}

BranchVerdict BranchJudge::judge(SymbolicExprId condition, const KnownConditions& known) {
    beginQuestion();
    const Question question{condition, all(known.facts, known.includeLaws, known.undefinedLaws),
                            all(known.facts, known.includeLaws, {})};
    auto judged = judged_.find(question);
    if (judged == judged_.end()) {
        const BranchVerdict verdict = decide(question);
        judged = judged_.emplace(question, Judged{verdict, limits::branchSteps - stepsLeft_, isUndecided_}).first;
    }
    // An earlier verdict costs again what it cost then, so that a file's findings do not depend on the files before it.
    const auto& [verdict, steps, isUndecided] = judged->second;
    spend(steps);
    givenUp_ += isUndecided ? 1U : 0U;
    return verdict;
}

void BranchJudge::beginQuestion() {
    stepsLeft_ = limits::branchSteps;
    isUndecided_ = false;
}

void BranchJudge::spend(std::uint64_t steps) {
    fileStepsLeft_ -= static_cast<std::int64_t>(steps);
    steps_ += steps;
}

std::vector<std::size_t> BranchJudge::reasons(SymbolicExprId condition, const BranchVerdict& verdict,
                                              const KnownConditions& known) {
    const bool toShorten = verdict.kind == BranchVerdictKind::Removable;
    beginQuestion();
    const auto suffices = [&](const std::vector<std::size_t>& positions) {
        std::vector<SymbolicExprId> facts(positions.size());
        std::ranges::transform(positions, facts.begin(), [&](std::size_t at) { return known.facts[at]; });
        return holds(
            verdict, condition,
            all(facts, known.includeLaws, toShorten ? std::span<const SymbolicExprId>() : known.undefinedLaws));
    };
    // The last facts that are enough, then without whole runs of them, then without shorter ones.
    std::vector<std::size_t> kept;
    for (std::size_t length = 0; length < known.facts.size() && !suffices(kept); length = length * 2 + 1) {
        kept.resize(std::min(length * 2 + 1, known.facts.size()));
        std::iota(kept.begin(), kept.end(), known.facts.size() - kept.size());
    }
    for (std::size_t length = kept.size(); length > 0; length /= 2) {
        for (std::size_t i = 0; i < kept.size();) {
            std::vector<std::size_t> without(kept.begin(), kept.begin() + static_cast<std::ptrdiff_t>(i));
            const std::size_t rest = std::min(i + length, kept.size());
            without.insert(without.end(), kept.begin() + static_cast<std::ptrdiff_t>(rest), kept.end());
            if (suffices(without))
                kept = std::move(without);
            else
                i = rest;
        }
    }
    spend(limits::branchSteps - stepsLeft_);
    return kept;
}

} // namespace VT
