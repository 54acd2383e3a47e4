// Decisions about pairs and sets of conditions.
//
// Method: every question about a pair is one of three (PairQuestion) or its opposite, which share a cache.  There is
// one decider for each mode (keywords in force, 32-bit unknowns), made when it is first needed.
// Cost: at most limits::decisionSteps a question; a kept decision is O(1).
#include "base/core/Check.hpp"
#include "base/core/Make.hpp"
#include "base/decide/external/SolverPlugin.hpp"
#include "base/service/ServiceParts.hpp"
#include "base/service/VCService.hpp"
#include "base/variants/VariantKeywords.hpp"

#include <algorithm>

namespace VT {

namespace {

Decision noCondition() {
    return {Answer::Undecided, DecisionBound::NoCondition, std::nullopt};
}

/// Asks a question about a set.  Calls that Quill writes for operators are decided as operators.
SetDecision askAbout(ServiceParts& parts, SetDecision (Decider::*question)(std::span<const SymbolicExprId>),
                     const std::vector<VCSymbolicExprId>& conditions) {
    std::vector<SymbolicExprId> converted;
    converted.reserve(conditions.size() + 1);
    for (const VCSymbolicExprId& condition : conditions) {
        if (!parts.table.has(condition.id()))
            return {noCondition(), std::nullopt};
        converted.push_back(parts.toC(condition.id()));
    }
    const SymbolicExprId known = parts.assumptions.knownOf(converted);
    if (known != parts.table.getIdTRUE() && question == &Decider::covers)
        converted.push_back(makeUnary(parts.table, SymbolicOp::Not, known));
    else if (known != parts.table.getIdTRUE())
        for (SymbolicExprId& condition : converted)
            condition = makeBinary(parts.table, SymbolicOp::And, known, condition);
    return (parts.decider().*question)(converted);
}

/// Decides a pair anew.  Operators that Quill writes as calls are decided as operators.
Decision decide(ServiceParts& parts, Decider& decider, const DecisionCache::Key& key, std::uint64_t steps) {
    const bool isAnythingKnown = key.known != parts.table.getIdTRUE();
    const SymbolicExprId second = parts.toC(key.b);
    const SymbolicExprId given = parts.toC(key.a);
    const SymbolicExprId first = isAnythingKnown && key.question != PairQuestion::Differ
                                     ? makeBinary(parts.table, SymbolicOp::And, key.known, given)
                                     : given;
    decider.limitSteps(steps);
    Decision decision = key.question == PairQuestion::Both         ? decider.overlaps(first, second)
                        : key.question == PairQuestion::FirstAlone ? decider.implies(first, second).opposite()
                        : isAnythingKnown ? decider.equivalentGiven(first, second, key.known).opposite()
                                          : decider.equivalent(first, second).opposite();
    decider.limitSteps(limits::decisionSteps);
    return decision;
}

/// Whether a decider that has read nothing comes to the decision that was kept.
[[maybe_unused]] bool isAsDecidedAnew(ServiceParts& parts, const DecisionCache::Key& key, const Decision& kept) {
    if (parts.mayHaveChanged(key.a) || parts.mayHaveChanged(key.b))
        return true;
    Decider fresh(parts.table, parts.decider().options());
    const Decision decision = decide(parts, fresh, key, limits::decisionSteps);
    return kept.answer == decision.answer && kept.witness == decision.witness;
}

} // namespace

bool ServiceParts::keywordsInForce() const {
    return keywordFlag && isVariantKeywordsSimCodegenFeatureOn();
}

unsigned ServiceParts::decisionMode() const {
    return (keywordsInForce() ? 1U : 0U) + (bits32 ? 2U : 0U) + (asksSolver ? 4U : 0U);
}

Decider& ServiceParts::decider() {
    std::unique_ptr<Decider>& decider = deciders.at(decisionMode());
    if (decider == nullptr) {
        decider = std::make_unique<Decider>(
            table, DecisionOptions{.keywordsInForce = keywordsInForce(),
                                   .bits32 = bits32,
                                   .solver = asksSolver ? &SolverPlugin::installed() : nullptr});
    }
    decider->share(budget);
    return *decider;
}

/// Decides a pair, from the cache where possible.
Decision VCService::ask(PairQuestion question, const VCSymbolicExprId& a, const VCSymbolicExprId& b,
                        std::uint64_t steps) {
    if (!has(a) || !has(b))
        return noCondition();
    const bool ordered = question == PairQuestion::FirstAlone;
    const SymbolicExprId pair[] = {ordered ? a.id() : std::min(a.id(), b.id()),
                                   ordered ? b.id() : std::max(a.id(), b.id())};
    const DecisionCache::Key key{pair[0], pair[1], parts_->assumptions.knownOf(pair), question, parts_->decisionMode()};
    if (const Decision* before = parts_->caching ? parts_->decisions.find(key) : nullptr) {
        VTSYM_CHECK_SAMPLED(isAsDecidedAnew(*parts_, key, *before));
        return *before;
    }
    const std::uint64_t allowed = parts_->budget != nullptr ? std::min(steps, parts_->budget->left()) : steps;
    Decision decision = decide(*parts_, parts_->decider(), key, steps);
    // What stays undecided with fewer steps may be decided with all.
    if (parts_->caching && (allowed == limits::decisionSteps || !decision.isUndecided()))
        parts_->decisions.insert(key, decision);
    return decision;
}

void VCService::setDecisions32Bit(bool are32Bit) {
    parts_->bits32 = are32Bit;
}

void VCService::setSolver(bool isAsked) {
    parts_->asksSolver = isAsked;
}

void VCService::shareBudget(Budget* budget) {
    parts_->budget = budget;
}

bool VCService::assume(const VCSymbolicExprId& condition) {
    return has(condition) && parts_->assumptions.add(condition.id());
}

std::vector<VCSymbolicExprId> VCService::assumptions() const {
    const std::vector<SymbolicExprId>& all = parts_->assumptions.all();
    return {all.begin(), all.end()};
}

void VCService::clearAssumptions() {
    parts_->assumptions.clear();
}

Decision VCService::canHold(const VCSymbolicExprId& condition) {
    return ask(PairQuestion::Both, condition, condition);
}

Decision VCService::mustHold(const VCSymbolicExprId& condition) {
    return implies(parts_->table.getIdTRUE(), condition);
}

Decision VCService::implies(const VCSymbolicExprId& a, const VCSymbolicExprId& b) {
    return ask(PairQuestion::FirstAlone, a, b).opposite();
}

Decision VCService::isEquivalent(const VCSymbolicExprId& a, const VCSymbolicExprId& b) {
    return ask(PairQuestion::Differ, a, b).opposite();
}

Decision VCService::isDisjoint(const VCSymbolicExprId& a, const VCSymbolicExprId& b) {
    return ask(PairQuestion::Both, a, b).opposite();
}

Decision VCService::contains(const VCSymbolicExprId& outer, const VCSymbolicExprId& inner) {
    return implies(inner, outer);
}

Decision VCService::isTighterThan(const VCSymbolicExprId& a, const VCSymbolicExprId& b) {
    Decision aImpliesB = implies(a, b);
    if (aImpliesB.isNo())
        return aImpliesB;
    Decision onlyB = ask(PairQuestion::FirstAlone, b, a);
    return aImpliesB.isUndecided() && !onlyB.isNo() ? aImpliesB : onlyB;
}

Relation VCService::compare(const VCSymbolicExprId& a, const VCSymbolicExprId& b) {
    std::uint64_t steps = limits::decisionSteps;
    const auto next = [&](PairQuestion question, const VCSymbolicExprId& x, const VCSymbolicExprId& y) {
        Decision decision = ask(question, x, y, steps);
        if (decision.bound == DecisionBound::Steps)
            steps = limits::furtherSteps;
        return decision;
    };
    Decision onlyA = next(PairQuestion::FirstAlone, a, b);
    Decision onlyB = next(PairQuestion::FirstAlone, b, a);
    return Relation::of(std::move(onlyA), std::move(onlyB), next(PairQuestion::Both, a, b));
}

SetDecision VCService::covers(const std::vector<VCSymbolicExprId>& conditions) {
    return askAbout(*parts_, &Decider::covers, conditions);
}

SetDecision VCService::isDisjoint(const std::vector<VCSymbolicExprId>& conditions) {
    return askAbout(*parts_, &Decider::disjoint, conditions);
}

// Sums of products.

std::vector<VCSymbolicExprId> VCService::uniqueOperands(const VCSymbolicExprId& condition, bool ofAnd) {
    if (!has(condition))
        return {};
    const SymbolicExprTable& table = parts_->table;
    const SymbolicExprId simple = simplify(condition, true).id();
    if (simple == (ofAnd ? table.getIdTRUE() : table.getIdFALSE()))
        return {};
    boost::container::flat_set<SymbolicExprId> operands;
    if (ofAnd)
        parts_->simplifier.computeUniqueAndOperandsId(*table.get(simple), operands);
    else
        parts_->simplifier.computeUniqueOrOperandsId(*table.get(simple), operands);
    std::vector<SymbolicExprId> sorted(operands.begin(), operands.end());
    std::ranges::sort(
        sorted, [&](SymbolicExprId a, SymbolicExprId b) { return parts_->quillPrinter.compareUsingCache(a, b) < 0; });
    return {sorted.begin(), sorted.end()};
}

std::vector<VCSymbolicExprId> VCService::computeUniqueAndOperandsId(const VCSymbolicExprId& condition) {
    return uniqueOperands(condition, true);
}

std::vector<VCSymbolicExprId> VCService::computeUniqueOrOperandsId(const VCSymbolicExprId& condition) {
    return uniqueOperands(condition, false);
}

std::string VCService::printWitness(const Witness& witness) {
    std::string text;
    for (const UnknownValue& each : witness)
        text += (text.empty() ? "" : ", ") + parts_->cPrinter(each.unknown) + "=" + std::to_string(each.value);
    return text;
}

} // namespace VT
