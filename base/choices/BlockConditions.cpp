// Reads and combines the variant conditions of blocks.
//
// Method: memos by block for own and net conditions; net conditions are built from the topmost ancestor that is not
// known down to the block.
// Cost: each condition is read once, each block combined once.
#include "base/choices/BlockConditions.hpp"

#include "base/core/Table.hpp"
#include "base/service/ParameterReplacement.hpp"
#include "base/service/VCService.hpp"
#include "base/variants/VariantKeywords.hpp"

#include <string>
#include <vector>

namespace VT {

bool BlockConditions::isDefault(const VTBlock& block) {
    return VariantKeywords::isDefaultVariantKeyword(std::string(vtsvGetBlockVariantCondition(block).text), true);
}

// NOLINTBEGIN(misc-no-recursion): a default choice asks for the others, and those ask no further
VCSymbolicExprId BlockConditions::own(const VTBlock& block) {
    if (const auto known = own_.find(&block); known != own_.end())
        return known->second;
    const VCSymbolicExprId condition = isDefault(block) ? readDefault(block) : read(block);
    own_.emplace(&block, condition.id());
    return condition;
}

VCSymbolicExprId BlockConditions::read(const VTBlock& block) {
    const VariantCondition condition = vtsvGetBlockVariantCondition(block);
    const std::string text(condition.text);
    if (VariantKeywords::isInheritVariantKeyword(text, true))
        return service_.table().getIdTRUE();
    const SymbolicExprId own = condition.isQuill ? service_.parseQ(text) : service_.parseC(text);
    if (customizer_ == nullptr)
        return own;
    return replaceParameters(service_.table(), own, [&](const std::string& parameter) {
        return customizer_->parameterOfBlock(&block, parameter);
    });
}

VCSymbolicExprId BlockConditions::readDefault(const VTBlock& block) {
    VCSymbolicExprId others = service_.table().getIdFALSE();
    if (const VTBlock* const parent = vtsvGetBlockParent(block)) {
        for (const VTBlock* const choice : vtsvGetBlockChoices(*parent))
            if (!isDefault(*choice))
                others = service_.OR(others, own(*choice), false);
    }
    return service_.NOT(others, false);
}

// NOLINTEND(misc-no-recursion)

VCSymbolicExprId BlockConditions::net(const VTBlock& block) {
    std::vector<const VTBlock*> open; // the innermost first
    VCSymbolicExprId condition = service_.table().getIdTRUE();
    for (const VTBlock* next = &block; next != nullptr; next = vtsvGetBlockParent(*next)) {
        if (const auto known = net_.find(next); known != net_.end()) {
            condition = known->second;
            break;
        }
        open.push_back(next);
    }
    for (; !open.empty(); open.pop_back()) {
        condition = service_.AND(condition, own(*open.back()), false);
        net_.emplace(open.back(), condition.id());
    }
    return condition;
}

VCSymbolicExprId BlockConditions::of(const vtPort& port) {
    const VTBlock* const source = vtsvGetPortSource(port);
    const VCSymbolicExprId from = source != nullptr ? net(*source) : VCSymbolicExprId(service_.table().getIdTRUE());
    const auto destinations = vtsvGetPortDestinations(port);
    if (destinations.empty())
        return from;
    VCSymbolicExprId to = service_.table().getIdFALSE();
    for (const VTBlock* const destination : destinations)
        to = service_.OR(to, net(*destination), false);
    return service_.AND(from, to, false);
}

// The service's operations, each with memos of its own.

VCSymbolicExprId VCService::getQExprNetAAVCEIdx(const VTBlock* block, bool simplify, const VCCustomizer* customizer) {
    return block == nullptr ? VCSymbolicExprId()
                            : combined(BlockConditions(*this, customizer).net(*block).id(), simplify);
}

VCSymbolicExprId VCService::getQExprNetAAVCEIdx(const vtPort* port, bool simplify, const VCCustomizer* customizer) {
    return port == nullptr ? VCSymbolicExprId() : combined(BlockConditions(*this, customizer).of(*port).id(), simplify);
}

std::string VCService::getQExprNetAAVCEString(const VTBlock* block, bool simplify, const VCCustomizer* customizer) {
    return block == nullptr ? std::string()
                            : printQExprWithConversion(getQExprNetAAVCEIdx(block, simplify, customizer));
}

std::string VCService::getQExprNetAAVCEString(const vtPort* port, bool simplify, const VCCustomizer* customizer) {
    return port == nullptr ? std::string() : printQExprWithConversion(getQExprNetAAVCEIdx(port, simplify, customizer));
}

std::string VCService::getCExprNetAAVCEString(const VTBlock* block, bool simplify, const VCCustomizer* customizer) {
    return block == nullptr ? std::string() : printCExpr(getQExprNetAAVCEIdx(block, simplify, customizer));
}

std::string VCService::getCExprNetAAVCEString(const vtPort* port, bool simplify, const VCCustomizer* customizer) {
    return port == nullptr ? std::string() : printCExpr(getQExprNetAAVCEIdx(port, simplify, customizer));
}

} // namespace VT
