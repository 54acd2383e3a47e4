// Finds the operands of premises that force a conclusion, and those that a shorter form lost.
//
// Method: the premises' And operands are a list from which minimalSubset() picks; each of its questions is one decision
// about the And of some of them.  For a shorter form, the operands of the longer one that it does not contain are taken
// away one by one, outer ones first, each with a proof; the same search finds the known facts that the proof needs.
// Cost: at most the steps of the search; each node interned on the way counts as limits::reasonNodeSteps.
// Relies on: Decider for every answer.
#include "base/decide/reasons/ReasonSearch.hpp"

#include "base/core/Chains.hpp"
#include "base/core/Make.hpp"
#include "base/decide/reasons/MinimalSubset.hpp"
#include "base/decide/shorten/ChainTree.hpp"
#include "base/transform/QuillConversion.hpp"
#include "base/util/IdMap.hpp"

#include <algorithm>

namespace VT {

ReasonSearch::ReasonSearch(SymbolicExprTable& table, Decider& decider, std::uint64_t steps)
    : table_(table),
      decider_(decider),
      steps_(steps),
      left_(steps) {}

SymbolicExprId ReasonSearch::converted(SymbolicExprId condition) {
    return SymbolicExprQ2C(table_)(condition);
}

/// The operands of all premises, each once; nothing where one is missing.
std::optional<std::vector<SymbolicExprId>> ReasonSearch::operandsOf(std::span<const SymbolicExprId> premises) {
    std::vector<SymbolicExprId> operands;
    IdMap<bool> seen;
    const auto add = [&](SymbolicExprId id) {
        if (seen.find(id) == nullptr && id != table_.getIdTRUE())
            operands.push_back(id);
        seen.insert(id, true);
    };
    for (const SymbolicExprId premise : premises) {
        std::vector<SymbolicExprId> ofPremise;
        bool isMissing = false;
        const bool complete = walkDistinctChain(
            table_, premise, limits::reasonOperands, LinksOf(SymbolicOp::And),
            [&](SymbolicExprId id, const SymbolicExpr* node) {
                ofPremise.push_back(id);
                isMissing = isMissing || node == nullptr;
                return !isMissing;
            },
            [](SymbolicExprId) {});
        if (isMissing)
            return std::nullopt;
        if (complete)
            std::ranges::for_each(ofPremise, add);
        else
            add(premise);
    }
    return operands;
}

Answer ReasonSearch::ask(const Question& question, std::span<const SymbolicExprId> operands) {
    const auto charge = [&](std::uint64_t steps) { left_ -= std::min(left_, steps); };
    charge(operands.size() * limits::reasonNodeSteps);
    if (left_ == 0)
        return Answer::Undecided;
    const SymbolicExprId known = operands.empty() ? table_.getIdTRUE() : makeChain(table_, SymbolicOp::And, operands);
    const std::uint64_t most = decider_.options().steps;
    decider_.limitSteps(std::min(left_, most));
    const std::size_t further = decider_.limitSolver(solverQuestions_);
    const Decision decision = question(known);
    solverQuestions_ = decider_.limitSolver(further);
    decider_.limitSteps(most);
    charge(decider_.stepsTaken() + 1);
    return decision.answer;
}

Reasons ReasonSearch::find(std::span<const SymbolicExprId> premises, const Question& question) {
    const auto operands = operandsOf(premises);
    if (!operands)
        return {};
    std::vector<SymbolicExprId> asked(operands->size());
    std::ranges::transform(*operands, asked.begin(), [&](SymbolicExprId id) { return converted(id); });
    if (ask(question, asked) != Answer::Yes)
        return {};
    std::vector<SymbolicExprId> some;
    const MinimalSubset subset = minimalSubset(asked.size(), [&](std::span<const std::size_t> positions) {
        some.clear();
        for (const std::size_t position : positions)
            some.push_back(asked[position]);
        return ask(question, some);
    });
    Reasons reasons{.isProven = true, .isMinimal = subset.isMinimal};
    for (const std::size_t position : subset.positions)
        reasons.operands.push_back((*operands)[position]);
    return reasons;
}

Reasons ReasonSearch::whyImplied(std::span<const SymbolicExprId> premises, SymbolicExprId conclusion) {
    if (!table_.has(conclusion))
        return {};
    const SymbolicExprId asked = converted(conclusion);
    return find(premises, [&](SymbolicExprId known) { return decider_.implies(known, asked); });
}

Reasons ReasonSearch::whyNever(std::span<const SymbolicExprId> premises) {
    return find(premises, [&](SymbolicExprId known) { return decider_.canHold(known).opposite(); });
}

Reasons ReasonSearch::whyEqual(std::span<const SymbolicExprId> premises, SymbolicExprId a, SymbolicExprId b) {
    if (!table_.has(a) || !table_.has(b))
        return {};
    const SymbolicExprId first = converted(a);
    const SymbolicExprId second = converted(b);
    return find(premises, [&](SymbolicExprId known) { return decider_.equivalentGiven(first, second, known); });
}

ShorteningReasons ReasonSearch::whyShorter(std::span<const SymbolicExprId> premises, SymbolicExprId condition,
                                           SymbolicExprId shorter) {
    if (!table_.has(condition) || !table_.has(shorter))
        return {};
    ShorteningReasons result{.because = whyEqual(premises, condition, shorter)};
    ChainTree longer(table_);
    ChainTree kept(table_);
    if (!result.because.isProven || !longer.split(condition) || !kept.split(shorter))
        return result;
    IdMap<bool> isKept;
    for (const ChainTree::Item& item : kept.items())
        isKept.insert(converted(item.id), true);
    std::vector<SymbolicExprId> built;
    SymbolicExprId current = condition;
    std::vector<ChainTree::Item>& items = longer.items();
    const auto isGone = [&](const ChainTree::Item& item) {
        for (std::size_t at = item.parent; at != 0; at = items[at].parent)
            if (items[at].removed)
                return true;
        return false;
    };
    for (std::size_t i = 1; i < items.size() && left_ > 0; ++i) {
        ChainTree::Item& item = items[i];
        if (isKept.find(converted(item.id)) != nullptr || longer.operandsLeft(items[item.parent]) < 2 || isGone(item))
            continue;
        left_ -= std::min<std::uint64_t>(left_, items.size() * limits::reasonNodeSteps);
        std::size_t nodes = items.size();
        item.removed = true;
        const SymbolicExprId without = longer.build(built, nodes);
        Reasons because = whyEqual(premises, current, without);
        item.removed = because.isProven;
        if (!because.isProven)
            continue;
        current = without;
        result.lost.push_back({item.id, std::move(because)});
    }
    return result;
}

} // namespace VT
