// Reads conditions from text, prints them, and converts between the languages.
//
// The constants have texts of their own, which no parser or printer sees: TRUE is the empty text.
#include "base/service/ServiceParts.hpp"
#include "base/service/TruthTexts.hpp"
#include "base/service/VCService.hpp"

namespace VT {

std::optional<SymbolicExprId> truthOfText(const SymbolicExprTable& table, std::string_view text) {
    if (text.empty() || text == "true")
        return table.getIdTRUE();
    if (text == "false")
        return table.getIdFALSE();
    return std::nullopt;
}

SymbolicExprId VCService::parse(const std::string& text, bool isQuill) {
    if (const auto truth = truthOfText(parts_->table, text))
        return *truth;
    return isQuill ? parts_->quillParser(text) : parts_->cParser(text);
}

SymbolicExprId VCService::parseC(const std::string& text) {
    return parse(text, false);
}

SymbolicExprId VCService::parseQ(const std::string& text) {
    return parse(text, true);
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

/// Prints a condition that was read in one language in the same or the other one.  Where the languages differ, the
/// condition is converted to the shape of the one it is printed in.
std::string VCService::printIn(bool quill, SymbolicExprId condition, bool wasQuill) {
    if (quill)
        return wasQuill ? printQExpr(condition) : printQExprWithConversion(condition);
    return wasQuill ? printCExpr(condition) : printCExprNoConversion(condition);
}

std::string VCService::convertExprBetweenQandC(const std::string& text, bool inputIsQuill, bool outputIsQuill) {
    const SymbolicExprId condition = parse(text, inputIsQuill);
    return outputIsQuill ? printIn(true, condition, inputIsQuill) : printCExpr(condition);
}

std::string VCService::simplifyCExprFromCCondition(const std::string& text) {
    return simplifiedText(text, false, false);
}

std::string VCService::simplifyQExprFromCCondition(const std::string& text) {
    return simplifiedText(text, false, true);
}

std::string VCService::simplifyCExprFromQCondition(const std::string& text) {
    return simplifiedText(text, true, false);
}

std::string VCService::simplifyQExprFromQCondition(const std::string& text) {
    return simplifiedText(text, true, true);
}

std::string VCService::simplifyExpressionWithoutEvalChecks(const std::string& text, bool inputIsQuill,
                                                           bool outputIsQuill) {
    std::uint64_t passes = 0;
    const SymbolicExprId condition = parts_->simplifier.simplify(parse(text, inputIsQuill), passes);
    return printIn(outputIsQuill, condition, inputIsQuill);
}

} // namespace VT
