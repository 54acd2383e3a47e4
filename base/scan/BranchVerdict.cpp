#include "base/scan/BranchVerdict.hpp"

#include "base/service/ImpliedCondition.hpp"

#include <boost/container_hash/hash.hpp>

#include <algorithm>
#include <numeric>

namespace VT {

namespace {

/// Steps of one decision; a file has many, and real ones take tens.
constexpr std::uint64_t decisionSteps = std::uint64_t{1} << 16U;

} // namespace

std::size_t BranchJudge::QuestionHash::operator()(const Question& question) const noexcept {
    std::size_t seed = question.condition;
    boost::hash_combine(seed, question.known);
    boost::hash_combine(seed, question.knownToShorten);
    return seed;
}

BranchJudge::BranchJudge(SymbolicExprTable& table)
    : table_(table),
      decider_(table, {.keywordsInForce = false, .steps = decisionSteps}),
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
    return joined == invalidId ? table_.getIdTRUE() : joined;
}

bool BranchJudge::proven(const Decision& decision) {
    undecided_ += decision.isUndecided() ? 1U : 0U;
    return decision.isYes();
}

/// Whether a verdict is right under a condition that is known.
bool BranchJudge::holds(BranchVerdict verdict, SymbolicExprId condition, SymbolicExprId known) {
    switch (verdict.kind) {
    case BranchVerdictKind::Dead:
        return proven(decider_.disjoint(known, condition));
    case BranchVerdictKind::AlwaysTrue:
        return proven(decider_.implies(known, condition));
    case BranchVerdictKind::Removable:
        return proven(decider_.equivalentGiven(verdict.shorter, condition, known));
    default:
        return false;
    }
}

BranchVerdict BranchJudge::decide(const Question& question) {
    for (const auto kind : {BranchVerdictKind::Dead, BranchVerdictKind::AlwaysTrue}) {
        const BranchVerdict verdict{kind, invalidId};
        if (holds(verdict, question.condition, question.known))
            return proven(decider_.canHold(question.known)) ? verdict : BranchVerdict{};
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
        const Decision equal = decider_.equivalentGiven(candidate, condition, known);
        gaveUp = equal.bound == DecisionBound::Steps;
        return proven(equal);
    };
    return ImpliedCondition(table_, printer_, known, isEqual).shorten(condition);
}

BranchVerdict BranchJudge::judge(SymbolicExprId condition, const KnownConditions& known) {
    const Question question{condition, all(known.facts, known.laws, known.deathLaws), all(known.facts, known.laws, {})};
    const auto judged = verdicts_.find(question);
    if (judged != verdicts_.end())
        return judged->second;
    return verdicts_.emplace(question, decide(question)).first->second;
}

std::vector<std::size_t> BranchJudge::reasons(SymbolicExprId condition, const BranchVerdict& verdict,
                                              const KnownConditions& known) {
    const bool toShorten = verdict.kind == BranchVerdictKind::Removable;
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
    return kept;
}

} // namespace VT
