// Explains answers: the operands of conditions and the assumptions that force them.
//
// Relies on: ReasonSearch, which prefers premises that come late, so that assumptions come first.
#include "base/decide/reasons/ReasonSearch.hpp"
#include "base/service/ServiceParts.hpp"
#include "base/service/VCService.hpp"

namespace VT {

/// The assumptions that have to do with conditions, and then these.
std::vector<SymbolicExprId> VCService::withAssumptions(const std::vector<VCSymbolicExprId>& conditions) {
    std::vector<SymbolicExprId> ids;
    ids.reserve(conditions.size());
    for (const VCSymbolicExprId& condition : conditions)
        ids.push_back(condition.id());
    std::vector<SymbolicExprId> premises = parts_->assumptions.relevantTo(ids);
    premises.insert(premises.end(), ids.begin(), ids.end());
    return premises;
}

Reasons VCService::explainImplies(const VCSymbolicExprId& a, const VCSymbolicExprId& b) {
    if (!has(a) || !has(b))
        return {};
    std::vector<SymbolicExprId> premises = withAssumptions({a, b});
    premises.pop_back(); // the conclusion
    return ReasonSearch(parts_->table, parts_->decider()).whyImplied(premises, b.id());
}

EquivalenceReasons VCService::explainEquivalent(const VCSymbolicExprId& a, const VCSymbolicExprId& b) {
    return {explainImplies(a, b), explainImplies(b, a)};
}

Reasons VCService::explainDisjoint(const std::vector<VCSymbolicExprId>& conditions) {
    for (const VCSymbolicExprId& condition : conditions)
        if (!has(condition))
            return {};
    return ReasonSearch(parts_->table, parts_->decider()).whyNever(withAssumptions(conditions));
}

ShorteningReasons VCService::explainImpliedCondition(const VCSymbolicExprId& condition, const VCSymbolicExprId& implied,
                                                     const VCSymbolicExprId& known) {
    if (!has(condition) || !has(implied) || !has(known))
        return {};
    std::vector<SymbolicExprId> premises = withAssumptions({condition, known});
    premises.erase(premises.end() - 2); // the condition itself
    return ReasonSearch(parts_->table, parts_->decider()).whyShorter(premises, condition.id(), implied.id());
}

// The same about texts.

std::optional<std::vector<std::string>> VCService::printReasons(const Reasons& reasons, bool isQuill) {
    if (!reasons.isProven)
        return std::nullopt;
    std::vector<std::string> texts;
    for (const SymbolicExprId operand : reasons.operands)
        texts.push_back(isQuill ? printQExprWithConversion(operand) : printCExpr(operand));
    return texts;
}

std::optional<std::vector<std::string>> VCService::explainImpliesFromCConditions(const std::string& a,
                                                                                 const std::string& b) {
    const SymbolicExprId first = parse(a, false);
    return printReasons(explainImplies(first, parse(b, false)), false);
}

std::optional<std::vector<std::string>> VCService::explainImpliesFromQConditions(const std::string& a,
                                                                                 const std::string& b) {
    const SymbolicExprId first = parse(a, true);
    return printReasons(explainImplies(first, parse(b, true)), true);
}

std::optional<std::pair<std::vector<std::string>, std::vector<std::string>>>
VCService::printReasons(const EquivalenceReasons& reasons, bool isQuill) {
    auto first = printReasons(reasons.secondFromFirst, isQuill);
    auto second = printReasons(reasons.firstFromSecond, isQuill);
    if (!first || !second)
        return std::nullopt;
    return std::pair(*std::move(first), *std::move(second));
}

std::optional<std::pair<std::vector<std::string>, std::vector<std::string>>>
VCService::explainEquivalentFromCConditions(const std::string& a, const std::string& b) {
    const SymbolicExprId first = parse(a, false);
    return printReasons(explainEquivalent(first, parse(b, false)), false);
}

std::optional<std::pair<std::vector<std::string>, std::vector<std::string>>>
VCService::explainEquivalentFromQConditions(const std::string& a, const std::string& b) {
    const SymbolicExprId first = parse(a, true);
    return printReasons(explainEquivalent(first, parse(b, true)), true);
}

std::optional<std::vector<std::string>>
VCService::explainDisjointFromCConditions(const std::vector<std::string>& conditions) {
    return printReasons(explainDisjoint(parseAll(conditions, false)), false);
}

std::optional<std::vector<std::string>>
VCService::explainDisjointFromQConditions(const std::vector<std::string>& conditions) {
    return printReasons(explainDisjoint(parseAll(conditions, true)), true);
}

bool VCService::assumeFromCCondition(const std::string& condition) {
    return assume(parse(condition, false));
}

bool VCService::assumeFromQCondition(const std::string& condition) {
    return assume(parse(condition, true));
}

} // namespace VT
