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

/// The conjunction; TRUE of nothing.
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

/// Whether a decision is yes; it is not asked once the steps are used up.
template <class Ask>
bool BranchJudge::proven(Ask ask) {
    if (stepsLeft_ == 0) {
        gaveUp_ = true;
        return false;
    }
    const Decision decision = ask();
    charge(decider_.stepsTaken() + 1);
    gaveUp_ = gaveUp_ || decision.isUndecided();
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
    bool gaveUp = false; // the neighbours of what is too hard are as hard
    const auto isEqual = [&](SymbolicExprId candidate) {
        if (gaveUp)
            return false;
        return proven([&] {
            Decision equal = decider_.equivalentGiven(candidate, condition, known);
            gaveUp = equal.bound == DecisionBound::Steps;
            return equal;
        });
    };
    std::uint64_t nodes = 0; // what is tried is made of them, at most each time with one of them left out
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
    const Question question{condition, all(known.facts, known.laws, known.deathLaws), all(known.facts, known.laws, {})};
    auto judged = judged_.find(question);
    if (judged == judged_.end()) {
        const BranchVerdict verdict = decide(question);
        judged = judged_.emplace(question, Judged{verdict, limits::branchSteps - stepsLeft_, gaveUp_}).first;
    }
    // What was judged before costs what it cost then, so that a file's findings do not depend on those before it.
    const auto& [verdict, steps, gaveUp] = judged->second;
    spend(steps);
    givenUp_ += gaveUp ? 1U : 0U;
    return verdict;
}

void BranchJudge::beginQuestion() {
    stepsLeft_ = limits::branchSteps;
    gaveUp_ = false;
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
        return holds(verdict, condition,
                     all(facts, known.laws, toShorten ? std::span<const SymbolicExprId>() : known.deathLaws));
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
