// Decisions about conditions given as texts.
//
// Texts are read in order, so of several bad ones the first is reported.  Costs parsing and the decision.
#include "base/service/ServiceParts.hpp"
#include "base/service/VCService.hpp"

namespace VT {

#define VTSYM_DECISION_OF_TEXTS(operation)                                                                             \
    Decision VCService::operation##FromCConditions(const std::string& a, const std::string& b) {                       \
        const SymbolicExprId first = parse(a, false);                                                                  \
        return operation(first, parse(b, false));                                                                      \
    }                                                                                                                  \
    Decision VCService::operation##FromQConditions(const std::string& a, const std::string& b) {                       \
        const SymbolicExprId first = parse(a, true);                                                                   \
        return operation(first, parse(b, true));                                                                       \
    }

VTSYM_DECISION_OF_TEXTS(implies)
VTSYM_DECISION_OF_TEXTS(isEquivalent)
VTSYM_DECISION_OF_TEXTS(isDisjoint)
VTSYM_DECISION_OF_TEXTS(contains)
VTSYM_DECISION_OF_TEXTS(isTighterThan)

#undef VTSYM_DECISION_OF_TEXTS

std::vector<VCSymbolicExprId> VCService::parseAll(const std::vector<std::string>& texts, bool isQuill) {
    std::vector<VCSymbolicExprId> conditions;
    conditions.reserve(texts.size());
    for (const std::string& text : texts)
        conditions.emplace_back(parse(text, isQuill));
    return conditions;
}

SetDecision VCService::coversFromCConditions(const std::vector<std::string>& conditions) {
    return covers(parseAll(conditions, false));
}

SetDecision VCService::coversFromQConditions(const std::vector<std::string>& conditions) {
    return covers(parseAll(conditions, true));
}

std::string VCService::getImpliedCExprFromCConditions(const std::string& condition, const std::string& known) {
    const SymbolicExprId given = parse(condition, false);
    return printCExpr(getImpliedCondition(given, parse(known, false)));
}

std::string VCService::getImpliedQExprFromQConditions(const std::string& condition, const std::string& known) {
    const SymbolicExprId given = parse(condition, true);
    return printQExpr(getImpliedCondition(given, parse(known, true), true));
}

std::string VCService::shortestCExprFromCCondition(const std::string& text) {
    return printCExpr(shortestCondition(parse(text, false), false));
}

std::string VCService::shortestQExprFromCCondition(const std::string& text) {
    return printQExpr(shortestCondition(parts_->toQuill(parse(text, false)), true));
}

std::string VCService::shortestCExprFromQCondition(const std::string& text) {
    return printCExpr(shortestCondition(parse(text, true), false));
}

std::string VCService::shortestQExprFromQCondition(const std::string& text) {
    return printQExpr(shortestCondition(parse(text, true), true));
}

std::vector<std::string> VCService::computeUniqueAndOperandsFromCCondition(const std::string& condition) {
    return operandTexts(condition, true, false);
}

std::vector<std::string> VCService::computeUniqueAndOperandsFromQCondition(const std::string& condition) {
    return operandTexts(condition, true, true);
}

std::vector<std::string> VCService::computeUniqueOrOperandsFromCCondition(const std::string& condition) {
    return operandTexts(condition, false, false);
}

std::vector<std::string> VCService::computeUniqueOrOperandsFromQCondition(const std::string& condition) {
    return operandTexts(condition, false, true);
}

std::vector<std::string> VCService::operandTexts(const std::string& condition, bool ofAnd, bool isQuill) {
    std::vector<std::string> texts;
    for (const VCSymbolicExprId& operand : uniqueOperands(parse(condition, isQuill), ofAnd))
        texts.push_back(isQuill ? printQExpr(operand) : printCExpr(operand));
    return texts;
}

} // namespace VT
