// Finds choices whose conditions together are one product.
//
// Method: an And is taken apart into what it says of each group of names.  Choices that agree in all groups but one are
// found by hashing the others; those that are neighbours by range are joined one after the other while the shortest
// form of the group stays a product.  A == 1 && B > 2 and A == 1 && B <= 2 become A == 1.
// Cost: one entry for each group of each choice, and at most limits::choiceMerges shortest forms.
#include "base/choices/ChoiceMerges.hpp"

#include "base/choices/ChoiceRanges.hpp"
#include "base/core/Chains.hpp"
#include "base/core/Limits.hpp"
#include "base/core/Make.hpp"
#include "base/transform/Symbols.hpp"

#include <algorithm>
#include <map>

namespace VT {

/// The groups of an And in the order of their names; none for a condition that is no And of a few operands.
std::vector<ChoiceMerges::Group> ChoiceMerges::groupsOf(SymbolicExprId condition) const {
    std::vector<Group> groups;
    std::vector<std::vector<SymbolicExprId>> operands;
    const SymbolicExprSymbols symbols(table_);
    const bool complete = walkChain(table_, condition, limits::choiceOperands, LinksOf(SymbolicOp::And),
                                    [&](SymbolicExprId id, const SymbolicExpr* node) {
                                        if (node == nullptr)
                                            return false;
                                        std::vector<SymbolicExprId> names;
                                        symbols(id, names);
                                        std::ranges::sort(names);
                                        const auto at = std::ranges::find(groups, names, &Group::names);
                                        const auto position = static_cast<std::size_t>(at - groups.begin());
                                        if (at == groups.end()) {
                                            groups.push_back({std::move(names), invalidId});
                                            operands.emplace_back();
                                        }
                                        operands[position].push_back(id);
                                        return true;
                                    });
    if (!complete)
        return {};
    for (std::size_t i = 0; i < groups.size(); ++i) {
        std::ranges::sort(operands[i]);
        groups[i].says = makeChain(table_, SymbolicOp::And, operands[i]);
    }
    std::ranges::sort(groups, {}, &Group::names);
    return groups;
}

/// The shortest form of a condition where that is a product; the invalid identifier elsewhere.
SymbolicExprId ChoiceMerges::asProduct(SymbolicExprId condition) {
    if (triesLeft_ == 0)
        return invalidId;
    --triesLeft_;
    const SymbolicExprId merged = shorten_(condition);
    bool isProduct = merged != table_.getIdFALSE();
    walkChain(table_, merged, limits::choiceOperands, LinksOf(SymbolicOp::And),
              [&](SymbolicExprId, const SymbolicExpr* node) {
                  isProduct = isProduct && node != nullptr && node->op() != SymbolicOp::Or;
                  return isProduct;
              });
    return isProduct ? merged : invalidId;
}

std::vector<ChoiceMerge> ChoiceMerges::find(std::span<const SymbolicExprId> choices, bool inOrder) {
    triesLeft_ = limits::choiceMerges;
    std::vector<std::vector<Group>> groups;
    groups.reserve(choices.size());
    // By the group that is left out and all that the others say: choices that agree but for that group.
    std::map<std::vector<SymbolicExprId>, std::vector<std::size_t>> alike;
    for (std::size_t i = 0; i < choices.size(); ++i) {
        groups.push_back(groupsOf(choices[i]));
        for (const Group& without : groups[i]) {
            std::vector<SymbolicExprId> key = without.names;
            key.push_back(invalidId);
            for (const Group& each : groups[i])
                if (&each != &without)
                    key.push_back(each.says);
            alike[std::move(key)].push_back(i);
        }
    }
    std::vector<ChoiceMerge> merges;
    std::vector<bool> isMerged(choices.size(), false);
    std::vector<const decltype(alike)::value_type*> order;
    for (const auto& entry : alike)
        if (entry.second.size() > 1)
            order.push_back(&entry);
    std::ranges::stable_sort(order, [](const auto* a, const auto* b) {
        return a->second.size() != b->second.size() ? a->second.size() > b->second.size() : a->second < b->second;
    });
    for (const auto* const entry : order) {
        const auto& [key, members] = *entry;
        const std::vector<SymbolicExprId> names(key.begin(), std::ranges::find(key, invalidId));
        const auto says = [&](std::size_t choice) {
            return std::ranges::find(groups[choice], names, &Group::names)->says;
        };
        std::vector<std::size_t> sorted = members;
        if (!inOrder) {
            std::vector<NameRanges> ranges;
            for (const std::size_t choice : members)
                ranges.push_back(rangesOf(table_, says(choice)));
            const std::vector<std::size_t> byRange = sortedByRange(ranges);
            std::ranges::transform(byRange, sorted.begin(), [&all = members](std::size_t at) { return all[at]; });
        }
        std::erase_if(sorted, [&](std::size_t choice) { return isMerged[choice]; });
        for (std::size_t i = 0; i < sorted.size();) {
            // A union may become a product again with the next choice.
            const std::size_t first = i;
            ChoiceMerge merge{{sorted[i]}, says(sorted[i])};
            SymbolicExprId either = merge.merged;
            std::size_t last = i;
            while (++i < sorted.size() && i - last <= limits::mergeAhead &&
                   (!inOrder || sorted[i] == sorted[i - 1] + 1)) {
                either = makeBinary(table_, SymbolicOp::Or, either, says(sorted[i]));
                if (const SymbolicExprId product = asProduct(either); product != invalidId) {
                    merge.merged = either = product;
                    last = i;
                }
            }
            i = last + 1;
            merge.choices.assign(sorted.begin() + static_cast<std::ptrdiff_t>(first),
                                 sorted.begin() + static_cast<std::ptrdiff_t>(i));
            if (merge.choices.size() < 2)
                continue;
            std::vector<SymbolicExprId> operands;
            for (const Group& each : groups[merge.choices.front()]) {
                const SymbolicExprId part = each.names == names ? merge.merged : each.says;
                if (part != table_.getIdTRUE())
                    operands.push_back(part);
            }
            merge.merged = operands.empty() ? table_.getIdTRUE() : makeChain(table_, SymbolicOp::And, operands);
            std::ranges::sort(merge.choices);
            for (const std::size_t choice : merge.choices)
                isMerged[choice] = true;
            merges.push_back(std::move(merge));
        }
    }
    std::ranges::sort(merges, {}, &ChoiceMerge::choices);
    return merges;
}

} // namespace VT
