// Combines and compares conditions, and records aliases of parameters.  A combination interns one node at most; its
// simplification costs what simplify() costs.
#include "base/service/AliasText.hpp"
#include "base/service/ParameterReplacement.hpp"
#include "base/service/ServiceParts.hpp"
#include "base/service/VCService.hpp"

namespace VT {

bool VCSymbolicExprId::operator==(const VCSymbolicExprId& other) const {
    return VCService::getInstance().isEqual(id_, other.id_);
}

VCSymbolicExprId VCService::AND(const VCSymbolicExprId& a, const VCSymbolicExprId& b, bool simplify) {
    if (!has(a) || !has(b))
        return invalidId;
    SymbolicExprTable& table = parts_->table;
    if (a == table.getIdFALSE() || b == table.getIdFALSE())
        return table.getIdFALSE();
    if (a == table.getIdTRUE())
        return combined(b.id(), simplify);
    if (b == table.getIdTRUE())
        return combined(a.id(), simplify);
    return combined(SymbolicAndExpr(table, a.id(), b.id()).getId(table), simplify);
}

VCSymbolicExprId VCService::OR(const VCSymbolicExprId& a, const VCSymbolicExprId& b, bool simplify) {
    if (!has(a) || !has(b))
        return invalidId;
    SymbolicExprTable& table = parts_->table;
    if (a == table.getIdTRUE() || b == table.getIdTRUE())
        return table.getIdTRUE();
    if (a == table.getIdFALSE())
        return combined(b.id(), simplify);
    if (b == table.getIdFALSE())
        return combined(a.id(), simplify);
    return combined(SymbolicOrExpr(table, a.id(), b.id()).getId(table), simplify);
}

VCSymbolicExprId VCService::NOT(const VCSymbolicExprId& a, bool simplify) {
    if (!has(a))
        return invalidId;
    SymbolicExprTable& table = parts_->table;
    if (a == table.getIdTRUE())
        return table.getIdFALSE();
    if (a == table.getIdFALSE())
        return table.getIdTRUE();
    return combined(SymbolicNotExpr(table, a.id()).getId(table), simplify);
}

VCSymbolicExprId VCService::combined(SymbolicExprId condition, bool simplify) {
    return simplify ? this->simplify(condition, true) : VCSymbolicExprId(condition);
}

bool VCService::has(const VCSymbolicExprId& condition) const noexcept {
    return parts_->table.has(condition.id());
}

bool VCService::getBoolean(SymbolicExprId condition) const {
    return condition == parts_->table.getIdTRUE();
}

bool VCService::isEqual(const SymbolicExprId& a, const SymbolicExprId& b) {
    if (a == b)
        return true;
    if (parts_->customizer == nullptr || !has(a) || !has(b))
        return false;
    const ParameterReplacements parameters = parts_->customizer->parameterReplacements();
    const auto replaced = [&](SymbolicExprId condition) {
        return replaceParameters(parts_->table, condition, [&](const std::string& name) {
            const auto entry = parameters.find(name);
            return entry == parameters.end() ? std::nullopt : std::optional(entry->second);
        });
    };
    const SymbolicExprId simplifiedA = simplify(replaced(a), true).id();
    return simplifiedA == simplify(replaced(b), true).id();
}

std::string VCService::getParameterAlias(const std::string& parameter) const {
    const auto entry = parts_->parameterAliases.find(parameter);
    return entry == parts_->parameterAliases.end() ? std::string() : entry->second;
}

void VCService::addParameterAlias(const std::string& parameter, const std::string& alias) {
    parts_->parameterAliases.emplace(parameter, aliasText(alias));
}

void VCService::addParameterAlias(const VTBlock* block, SymbolicExprId condition, const VCCustomizer* customizer) {
    if (customizer == nullptr)
        return;
    std::vector<std::pair<std::string, std::string>> aliases;
    for (std::string& parameter : parametersOf(parts_->table, condition)) {
        if (const auto replacement = customizer->parameterOfBlock(block, parameter)) {
            const int* const value = std::get_if<int>(&*replacement);
            std::string text = value != nullptr ? std::to_string(*value) : std::get<std::string>(*replacement);
            aliases.emplace_back(std::move(parameter), aliasText(std::move(text)));
        }
    }
    auto& known = parts_->parameterAliases;
    std::vector<std::string> added;
    added.reserve(aliases.size());
    try {
        for (const auto& [parameter, alias] : aliases)
            if (std::string name = parameter; known.emplace(parameter, alias).second)
                added.push_back(std::move(name));
    } catch (...) {
        for (const std::string& parameter : added)
            known.erase(parameter);
        throw;
    }
}

SymbolicExprTable& VCService::table() noexcept {
    return parts_->table;
}

SymbolicExprSimplify& VCService::simplifier() noexcept {
    return parts_->simplifier;
}

SymbolRegistry& VCService::symbolRegistry() noexcept {
    return parts_->registry;
}

bool VCService::areVariantKeywordsInForce() const {
    return parts_->keywordsInForce();
}

} // namespace VT
