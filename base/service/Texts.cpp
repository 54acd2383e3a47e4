// Conditions from text and to text.
#include "base/VCService.hpp"
#include "base/service/ServiceParts.hpp"
#include "base/service/TruthTexts.hpp"

#include <stdexcept>

namespace VT {

std::optional<SymbolicExprId> truthOfText(const SymbolicExprTable& table, std::string_view text) {
    if (text.empty() || text == "true")
        return table.getIdTRUE();
    if (text == "false")
        return table.getIdFALSE();
    return std::nullopt;
}

namespace {

void requireC(bool inputIsQuill) {
    if (inputIsQuill)
        throw std::invalid_argument("Quill text is not read: give the condition as C text");
}

} // namespace

SymbolicExprId VCService::parseC(const std::string& text) {
    const auto truth = truthOfText(parts_->table, text);
    return truth ? *truth : parts_->cParser(text);
}

bool VCService::isTRUEOrFALSEString(const std::string& text) {
    return text == "true" || text == "false";
}

std::string VCService::printQExpr(const VCSymbolicExprId& condition) {
    return getBoolean(condition.id()) ? std::string() : parts_->quillPrinter(condition.id());
}

std::string VCService::printQExprWithConversion(const VCSymbolicExprId& condition) {
    return printQExpr(parts_->toQuill(condition.id()));
}

std::string VCService::printCExprNoConversion(const VCSymbolicExprId& condition) {
    return getBoolean(condition.id()) ? std::string() : parts_->cPrinter(condition.id());
}

std::string VCService::printCExpr(const VCSymbolicExprId& condition) {
    return printCExprNoConversion(parts_->toC(condition.id()));
}

std::string VCService::convertExprBetweenQandC(const std::string& text, bool inputIsQuill, bool outputIsQuill) {
    requireC(inputIsQuill);
    const SymbolicExprId condition = parseC(text);
    return outputIsQuill ? printQExprWithConversion(condition) : printCExpr(condition);
}

std::string VCService::simplifyCExprFromCCondition(const std::string& text) {
    return text.empty() ? std::string() : printCExpr(simplifyFromCCondition(text));
}

std::string VCService::simplifyQExprFromCCondition(const std::string& text) {
    return text.empty() ? std::string() : printQExprWithConversion(simplifyFromCCondition(text));
}

std::string VCService::simplifyExpressionWithoutEvalChecks(const std::string& text, bool inputIsQuill,
                                                           bool outputIsQuill) {
    requireC(inputIsQuill);
    std::uint64_t passes = 0;
    const SymbolicExprId condition = parts_->simplifier.simplify(parseC(text), passes);
    return outputIsQuill ? printQExprWithConversion(condition) : printCExprNoConversion(condition);
}

} // namespace VT
