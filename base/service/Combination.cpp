// Conditions put together, compared and asked.
#include "base/VCService.hpp"
#include "base/service/AliasText.hpp"
#include "base/service/ServiceParts.hpp"

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
    const SymbolicExprId simplifiedA = simplify(replaceParameters(a, parameters), true).id();
    return simplifiedA == simplify(replaceParameters(b, parameters), true).id();
}

std::string VCService::getParameterAlias(const std::string& parameter) const {
    const auto entry = parts_->parameterAliases.find(parameter);
    return entry == parts_->parameterAliases.end() ? std::string() : entry->second;
}

void VCService::addParameterAlias(const std::string& parameter, const std::string& alias) {
    parts_->parameterAliases.emplace(parameter, aliasText(alias));
}

SymbolicExprTable& VCService::table() noexcept {
    return parts_->table;
}

SymbolicExprSimplify& VCService::simplifier() noexcept {
    return parts_->simplifier;
}

} // namespace VT
