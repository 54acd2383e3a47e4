// Simplifies conditions: cache, then the customizer's rewrite, then the simplifier.
//
// The caches keep identifiers by condition and by text, one pair for each language, and texts by text.  A hit is O(1).
#include "base/core/Check.hpp"
#include "base/service/ServiceParts.hpp"
#include "base/service/VCService.hpp"
#include "base/simplify/SimplifyVisitorBlockVariants.hpp"
#include "base/variants/VariantKeywords.hpp"

#include <algorithm>
#include <vector>

namespace VT {

bool ServiceParts::mayHaveChanged(SymbolicExprId condition) const {
    std::vector<SymbolicExprId> symbols;
    VCSymbolsOfSymbolicExpr(table, VCSymbolTypes{VCSymbolType::Identifier, VCSymbolType::BoundMember})
        .getSymbolIds(condition, symbols);
    return customized || std::ranges::any_of(symbols, [&](SymbolicExprId id) {
               const SymbolicExpr& symbol = *table.get(id);
               return symbol.op() != SymbolicOp::String ||
                      VariantKeywords::isVariantKeyword(static_cast<const SymbolicString&>(symbol).getName(), false);
           });
}

VCSymbolicExprId VCService::simplify(const VCSymbolicExprId& condition, bool isQuill) {
    if (!has(condition))
        return invalidId;
    auto& cache = ServiceParts::of(parts_->simplified, isQuill);
    if (const auto known = parts_->caching ? cache.find(condition.id()) : nullptr) {
        VTSYM_CHECK_SAMPLED(parts_->mayHaveChanged(condition.id()) || *known == simplifyNow(condition.id(), isQuill));
        return *known;
    }
    SymbolicExprId result = invalidId;
    if (const SymbolicExprId other = rewritten(condition.id()); other != condition.id())
        result = simplifyNow(other, isQuill);
    // A rewrite is a way to decide a condition; one that it leaves open keeps its own symbols.
    if (result != parts_->table.getIdTRUE() && result != parts_->table.getIdFALSE())
        result = simplifyNow(condition.id(), isQuill);
    if (parts_->caching)
        cache.insert(condition.id(), result);
    return result;
}

/// Returns the customizer's rewrite of a condition; the condition itself without a customizer, and for constants.
SymbolicExprId VCService::rewritten(SymbolicExprId condition) {
    const SymbolicExprTable& table = parts_->table;
    const bool constant = condition == table.getIdTRUE() || condition == table.getIdFALSE();
    if (parts_->customizer == nullptr || constant)
        return condition;
    const SymbolicExprId other = parts_->customizer->rewrite(condition, parts_->table);
    return table.has(other) ? other : condition;
}

SymbolicExprId VCService::simplifyNow(SymbolicExprId condition, bool isQuill) {
    VCCustomizer* const customizer = parts_->customizer.get();
    // Asking without a customizer, the visitor would decide self-comparisons the wrong way round.
    const bool ask = isQuill && customizer != nullptr;
    const SymbolicExprSimplify& simplifier = parts_->simplifier;
    SymbolicExprSimplifyVisitorBlockVariants visitor(parts_->table, parts_->keywordFlag, simplifier.printer(), ask,
                                                     customizer);
    std::uint64_t passes = 0;
    return simplifier.simplify(condition, passes, visitor);
}

/// Whether a text is read and simplified to what was kept.
bool VCService::isAsSimplifiedAnew(const std::string& text, bool isQuill, SymbolicExprId kept) {
    const SymbolicExprId condition = parse(text, isQuill);
    return parts_->mayHaveChanged(condition) || simplifyNow(condition, isQuill) == kept;
}

VCSymbolicExprId VCService::simplifyFrom(const std::string& text, bool isQuill) {
    auto& cache = ServiceParts::of(parts_->simplifiedFromText, isQuill);
    if (const auto known = parts_->caching ? cache.find(text) : nullptr) {
        VTSYM_CHECK_SAMPLED(isAsSimplifiedAnew(text, isQuill, *known));
        return *known;
    }
    const SymbolicExprId result = simplify(parse(text, isQuill), isQuill).id();
    if (parts_->caching)
        cache.insert(text, result);
    return result;
}

/// Simplifies a text and prints the result in the same or the other language.
std::string VCService::simplifiedText(const std::string& text, bool wasQuill, bool quill) {
    if (text.empty())
        return {};
    auto& cache = ServiceParts::of(ServiceParts::of(parts_->simplifiedTexts, wasQuill), quill);
    if (const std::string* const known = parts_->caching ? cache.find(text) : nullptr) {
        VTSYM_CHECK_SAMPLED(*known == printSimplified(text, wasQuill, quill));
        return *known;
    }
    std::string result = printSimplified(text, wasQuill, quill);
    if (parts_->caching)
        cache.insert(text, result);
    return result;
}

std::string VCService::printSimplified(const std::string& text, bool wasQuill, bool quill) {
    const VCSymbolicExprId result = simplifyFrom(text, wasQuill);
    return quill && !wasQuill ? printQExprWithConversion(result) : quill ? printQExpr(result) : printCExpr(result);
}

VCSymbolicExprId VCService::simplifyFromCCondition(const std::string& text) {
    return simplifyFrom(text, false);
}

VCSymbolicExprId VCService::simplifyFromQCondition(const std::string& text) {
    return simplifyFrom(text, true);
}

} // namespace VT
