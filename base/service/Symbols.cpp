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

VCSymbolicExprId VCService::replaceSymbolsInExpression(const VCSymbolicExprId& condition,
                                                       const std::unordered_map<std::string, std::string>& names) {
    SymbolicExprTable& table = parts_->table;
    SymbolicExprReplacements replacements;
    // A name that does not occur is not interned.
    std::vector<SymbolicExprId> identifiers;
    SymbolsOfSymbolicExpr(table).getSymbolIds(condition.id(), identifiers);
    for (const SymbolicExprId symbol : identifiers) {
        const auto other = names.find(static_cast<const SymbolicString*>(table.get(symbol))->getName());
        if (other != names.end())
            replacements[symbol] = SymbolicString(table, other->second).getId(table);
    }
    // A condition that is one symbol is nobody's operand.
    const auto whole = replacements.find(condition.id());
    return whole != replacements.end() ? whole->second : SymbolicExprReplacement(table, replacements)(condition.id());
}

} // namespace VT
