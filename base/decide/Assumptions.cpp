// Finds the assumptions that have to do with a question.
//
// Method: each operand of an assumed And is kept with its names; a search through shared names collects those that a
// question reaches.
// Cost: linear in the nodes of the question and in the operands found.
#include "base/decide/Assumptions.hpp"

#include "base/core/Chains.hpp"
#include "base/core/Make.hpp"
#include "base/core/Nodes.hpp"
#include "base/transform/QuillConversion.hpp"
#include "base/transform/Symbols.hpp"
#include "base/util/IdMap.hpp"
#include "base/variants/VariantKeywords.hpp"

#include <algorithm>

namespace VT {

/// The names in conditions, each once.  All variant keywords are the first one met, and truth constants are left out.
std::vector<SymbolicExprId> Assumptions::namesOf(std::span<const SymbolicExprId> conditions) const {
    std::vector<SymbolicExprId> names;
    SymbolsOfSymbolicExpr symbols(table_);
    for (const SymbolicExprId condition : conditions)
        symbols.getSymbolIds(condition, names);
    std::erase_if(names, [&](SymbolicExprId id) { return id == table_.getIdTRUE() || id == table_.getIdFALSE(); });
    for (SymbolicExprId& name : names)
        if (VariantKeywords::isVariantKeyword(static_cast<const SymbolicString*>(table_.get(name))->getName(), false))
            name = SymbolicString(table_, VariantKeywords::getSimVariantKeyword()).getId(table_);
    std::ranges::sort(names);
    names.erase(std::unique(names.begin(), names.end()), names.end());
    return names;
}

bool Assumptions::add(SymbolicExprId condition) {
    if (!table_.has(condition))
        return false;
    std::vector<SymbolicExprId> operands;
    const bool complete = walkDistinctChain(
        table_, SymbolicExprQ2C(table_)(condition), anyNumber, LinksOf(SymbolicOp::And),
        [&](SymbolicExprId id, const SymbolicExpr* node) {
            operands.push_back(id);
            return node != nullptr;
        },
        [](SymbolicExprId) {});
    if (!complete)
        return false;
    for (const SymbolicExprId operand : operands) {
        if (operand == table_.getIdTRUE())
            continue;
        std::vector<SymbolicExprId> names = namesOf(std::span(&operand, 1));
        const std::vector<std::size_t>& alike = names.empty() ? constants_ : uses_[names.front()];
        if (std::ranges::any_of(alike, [&](std::size_t other) { return operands_[other] == operand; }))
            continue;
        if (names.empty())
            constants_.push_back(operands_.size());
        for (const SymbolicExprId name : names)
            uses_[name].push_back(operands_.size());
        operands_.push_back(operand);
        names_.push_back(std::move(names));
    }
    return true;
}

void Assumptions::clear() {
    operands_.clear();
    names_.clear();
    constants_.clear();
    uses_.clear();
}

void Assumptions::shrink(std::size_t operands) {
    for (; operands_.size() > operands; operands_.pop_back(), names_.pop_back()) {
        if (names_.back().empty())
            constants_.pop_back();
        for (const SymbolicExprId name : names_.back())
            uses_[name].pop_back();
    }
}

std::vector<SymbolicExprId> Assumptions::relevantTo(std::span<const SymbolicExprId> conditions) const {
    if (operands_.empty())
        return {};
    std::vector<std::size_t> found = constants_;
    IdMap<bool> isFound;
    std::vector<SymbolicExprId> open = namesOf(conditions);
    IdMap<bool> reached;
    while (!open.empty()) {
        const SymbolicExprId name = open.back();
        open.pop_back();
        if (reached.find(name) != nullptr)
            continue;
        reached.insert(name, true);
        const auto uses = uses_.find(name);
        if (uses == uses_.end())
            continue;
        for (const std::size_t operand : uses->second) {
            if (isFound.find(operand) != nullptr)
                continue;
            isFound.insert(operand, true);
            found.push_back(operand);
            open.insert(open.end(), names_[operand].begin(), names_[operand].end());
        }
    }
    std::ranges::sort(found);
    std::vector<SymbolicExprId> relevant;
    relevant.reserve(found.size());
    for (const std::size_t operand : found)
        relevant.push_back(operands_[operand]);
    return relevant;
}

SymbolicExprId Assumptions::knownOf(std::span<const SymbolicExprId> conditions) const {
    const std::vector<SymbolicExprId> relevant = relevantTo(conditions);
    return relevant.empty() ? table_.getIdTRUE() : makeChain(table_, SymbolicOp::And, relevant);
}

} // namespace VT
