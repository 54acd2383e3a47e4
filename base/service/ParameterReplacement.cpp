// Replaces parameters of conditions: collects the identifiers, asks what replaces each, and rebuilds the condition
// once.  Linear in the distinct nodes.
#include "base/service/ParameterReplacement.hpp"

#include "base/service/VCSymbols.hpp"
#include "base/transform/Replacement.hpp"
#include "base/variants/VariantKeywords.hpp"

namespace VT {

namespace {

bool isParameter(const std::string& name) {
    return name != "true" && name != "false" && !VariantKeywords::isVariantKeyword(name, false);
}

SymbolicExprId idOf(SymbolicExprTable& table, const ParameterReplacement& replacement) {
    if (const int* const value = std::get_if<int>(&replacement))
        return SymbolicIntValue(table, *value).getId(table);
    return SymbolicString(table, std::get<std::string>(replacement)).getId(table);
}

} // namespace

SymbolicExprId replaceIdentifiers(SymbolicExprTable& table, SymbolicExprId condition,
                                  const std::function<SymbolicExprId(const std::string& name)>& other) {
    std::vector<SymbolicExprId> identifiers;
    SymbolsOfSymbolicExpr(table).getSymbolIds(condition, identifiers);
    SymbolicExprReplacements replacements;
    for (const SymbolicExprId symbol : identifiers) {
        const std::string name = static_cast<const SymbolicString*>(table.get(symbol))->getName();
        if (const SymbolicExprId replacement = other(name); replacement != invalidId)
            replacements[symbol] = replacement;
    }
    // A condition that is one symbol is not an operand.
    const auto whole = replacements.find(condition);
    return whole != replacements.end() ? whole->second : SymbolicExprReplacement(table, replacements)(condition);
}

SymbolicExprId replaceParameters(SymbolicExprTable& table, SymbolicExprId condition, const ParameterChoice& choose) {
    return replaceIdentifiers(table, condition, [&](const std::string& name) {
        const auto replacement = isParameter(name) ? choose(name) : std::nullopt;
        return replacement ? idOf(table, *replacement) : invalidId;
    });
}

std::vector<std::string> parametersOf(const SymbolicExprTable& table, SymbolicExprId condition) {
    std::vector<SymbolicExprId> identifiers;
    VCSymbolsOfSymbolicExpr(table, VCSymbolTypes{VCSymbolType::Identifier}).getSymbolIds(condition, identifiers);
    std::vector<std::string> parameters;
    for (const SymbolicExprId symbol : identifiers)
        if (std::string name = static_cast<const SymbolicString*>(table.get(symbol))->getName(); isParameter(name))
            parameters.push_back(std::move(name));
    return parameters;
}

} // namespace VT
