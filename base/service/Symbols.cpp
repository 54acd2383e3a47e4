// The symbols of conditions.
#include "base/VCService.hpp"
#include "base/service/ServiceParts.hpp"
#include "base/transform/Replacement.hpp"

namespace VT {

void VCService::getSymbolsFromExpression(const VCSymbolicExprId& condition, std::vector<std::string>& symbols,
                                         const VCSymbolTypes& kinds) const {
    VCSymbolsOfSymbolicExpr(parts_->table, kinds).getSymbols(condition.id(), symbols);
}

void VCService::getSymbolsFromExpression(const VCSymbolicExprId& condition, std::vector<std::string>& symbols,
                                         const VCSymbolType& kind) const {
    getSymbolsFromExpression(condition, symbols, VCSymbolTypes{kind});
}

void VCService::getSymbolsFromExpression(const VCSymbolicExprId& condition, std::vector<VCSymbolicExprId>& symbols,
                                         const VCSymbolTypes& kinds) const {
    std::vector<SymbolicExprId> ids;
    VCSymbolsOfSymbolicExpr(parts_->table, kinds).getSymbolIds(condition.id(), ids);
    symbols.insert(symbols.end(), ids.begin(), ids.end());
}

void VCService::getSymbolsFromExpression(const VCSymbolicExprId& condition, std::vector<VCSymbolicExprId>& symbols,
                                         const VCSymbolType& kind) const {
    getSymbolsFromExpression(condition, symbols, VCSymbolTypes{kind});
}

namespace {

/// Replaces identifiers by what `other(name)` gives for them; the invalid identifier for those that stay.  A name that
/// does not occur is never asked for, so that nothing is interned in vain.
template <class Other>
SymbolicExprId replaceIdentifiers(SymbolicExprTable& table, SymbolicExprId condition, Other other) {
    std::vector<SymbolicExprId> identifiers;
    SymbolsOfSymbolicExpr(table).getSymbolIds(condition, identifiers);
    SymbolicExprReplacements replacements;
    for (const SymbolicExprId symbol : identifiers) {
        const std::string name = static_cast<const SymbolicString*>(table.get(symbol))->getName();
        if (const SymbolicExprId replacement = other(name); replacement != invalidId)
            replacements[symbol] = replacement;
    }
    // A condition that is one symbol is nobody's operand.
    const auto whole = replacements.find(condition);
    return whole != replacements.end() ? whole->second : SymbolicExprReplacement(table, replacements)(condition);
}

} // namespace

VCSymbolicExprId VCService::replaceSymbolsInExpression(const VCSymbolicExprId& condition,
                                                       const std::unordered_map<std::string, std::string>& names) {
    SymbolicExprTable& table = parts_->table;
    return replaceIdentifiers(table, condition.id(), [&](const std::string& name) {
        const auto entry = names.find(name);
        return entry == names.end() ? invalidId : SymbolicString(table, entry->second).getId(table);
    });
}

/// The condition with its parameters replaced; the truth constants have none.
SymbolicExprId VCService::replaceParameters(SymbolicExprId condition, const ParameterReplacements& parameters) {
    SymbolicExprTable& table = parts_->table;
    if (parameters.empty() || condition == table.getIdTRUE() || condition == table.getIdFALSE())
        return condition;
    return replaceIdentifiers(table, condition, [&](const std::string& name) {
        const auto entry = parameters.find(name);
        if (entry == parameters.end())
            return invalidId;
        if (const int* const value = std::get_if<int>(&entry->second))
            return SymbolicIntValue(table, *value).getId(table);
        return SymbolicString(table, std::get<std::string>(entry->second)).getId(table);
    });
}

} // namespace VT
