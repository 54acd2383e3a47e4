// Judges a condition under known facts.
//
// Method: a comparison of one symbol under comparisons of it is judged by sets of values, see KnownValues.  Any other
// verdict is a question to the decider: disjoint from the facts, implied by them, or equivalent to a shorter
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
      printer_(table, false),
      values_(table) {
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

/// What a fact says about a condition that it is the same as, or the opposite of.
BranchVerdictKind BranchJudge::statedBy(std::span<const SymbolicExprId> facts, SymbolicExprId condition) {
    const auto negates = [&](SymbolicExprId negation, SymbolicExprId of) {
        const SymbolicExpr* node = table_.get(negation);
        return node->op() == SymbolicOp::Not && node->getInput(0) == of;
    };
    charge(facts.size());
    for (const SymbolicExprId fact : facts) {
        if (fact == condition)
            return BranchVerdictKind::AlwaysTrue;
        if (negates(fact, condition) || negates(condition, fact))
            return BranchVerdictKind::Dead;
    }
    return BranchVerdictKind::None;
}

BranchVerdict BranchJudge::decide(const Question& question, std::span<const SymbolicExprId> facts) {
    const BranchVerdictKind stated = statedBy(facts, question.condition);
    for (const auto kind : {BranchVerdictKind::Dead, BranchVerdictKind::AlwaysTrue}) {
        const BranchVerdict verdict{kind, invalidId};
        if (stated == BranchVerdictKind::None ? holds(verdict, question.condition, question.known) : stated == kind)
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

/// Judges a comparison of one symbol under comparisons of it, without the decider.  Costs the same whatever was asked
/// before.
std::optional<BranchVerdict> BranchJudge::judgeByValues(SymbolicExprId condition, const KnownConditions& known) {
    if (!known.includeLaws.empty() || !known.undefinedLaws.empty())
        return std::nullopt;
    const std::optional<ValueVerdict> values = values_.judge(condition, known.facts);
    if (!values)
        return std::nullopt;
    spend(known.facts.size() + 1);
    return BranchVerdict{*values == ValueVerdict::Never    ? BranchVerdictKind::Dead
                         : *values == ValueVerdict::Always ? BranchVerdictKind::AlwaysTrue
                                                           : BranchVerdictKind::None,
                         invalidId};
}

BranchVerdict BranchJudge::judge(SymbolicExprId condition, const KnownConditions& known) {
    beginQuestion();
    if (const std::optional<BranchVerdict> verdict = judgeByValues(condition, known))
        return *verdict;
    const Question question{condition, all(known.facts, known.includeLaws, known.undefinedLaws),
                            all(known.facts, known.includeLaws, {})};
    auto judged = judged_.find(question);
    if (judged == judged_.end()) {
        const BranchVerdict verdict = decide(question, known.facts);
        judged = judged_.emplace(question, Judged{verdict, limits::branchSteps - stepsLeft_, isUndecided_}).first;
    }
    // An earlier verdict costs again what it cost then, so that a file's findings do not depend on the files before it.
    const auto& [verdict, steps, isUndecided] = judged->second;
    spend(steps);
    givenUp_ += isUndecided ? 1U : 0U;
    return verdict;
}

Witness BranchJudge::witness(SymbolicExprId condition, const KnownConditions& known) {
    beginQuestion();
    const SymbolicExprId all = this->all(known.facts, known.includeLaws, known.undefinedLaws);
    const Decision decision = decider_.canHold(SymbolicAndExpr(table_, condition, all).getId(table_));
    charge(decider_.stepsTaken() + 1);
    spend(limits::branchSteps - stepsLeft_);
    return decision.witness.value_or(Witness());
}

void BranchJudge::beginQuestion() {
    stepsLeft_ = limits::branchSteps;
    isUndecided_ = false;
}

void BranchJudge::spend(std::uint64_t steps) {
    fileStepsLeft_ -= static_cast<std::int64_t>(steps);
    steps_ += steps;
}

MinimalSubset BranchJudge::reasons(SymbolicExprId condition, const BranchVerdict& verdict,
                                   const KnownConditions& known) {
    const bool toShorten = verdict.kind == BranchVerdictKind::Removable;
    beginQuestion();
    const auto suffices = [&](std::span<const std::size_t> positions) {
        std::vector<SymbolicExprId> facts(positions.size());
        std::ranges::transform(positions, facts.begin(), [&](std::size_t at) { return known.facts[at]; });
        isUndecided_ = false;
        const bool isEnough =
            holds(verdict, condition,
                  all(facts, known.includeLaws, toShorten ? std::span<const SymbolicExprId>() : known.undefinedLaws));
        return isEnough ? Answer::Yes : isUndecided_ ? Answer::Undecided : Answer::No;
    };
    MinimalSubset kept = minimalSubset(known.facts.size(), suffices);
    spend(limits::branchSteps - stepsLeft_);
    return kept;
}

} // namespace VT
