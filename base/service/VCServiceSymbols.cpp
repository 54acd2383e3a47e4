// The symbols of conditions, and their replacement by name.
//
// Thin wrappers over VCSymbols and ParameterReplacement; linear in the distinct nodes.
#include "base/service/ParameterReplacement.hpp"
#include "base/service/ServiceParts.hpp"
#include "base/service/VCService.hpp"

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
    return replaceIdentifiers(table, condition.id(), [&](const std::string& name) {
        const auto entry = names.find(name);
        return entry == names.end() ? invalidId : SymbolicString(table, entry->second).getId(table);
    });
}

} // namespace VT
