// Recognises choices without faults of their own by their operands.
//
// Method: where the operands of a choice and of its context fall into parts about one name each, the choice holds
// somewhere if each part does, and an operand is needed if the context's part about its name does not imply it.
// Cost: linear in the operands, and a few decisions for each different part.
#include "base/choices/OrdinaryChoices.hpp"

#include "base/core/Chains.hpp"
#include "base/core/Limits.hpp"
#include "base/core/Make.hpp"
#include "base/core/Nodes.hpp"
#include "base/core/Walk.hpp"
#include "base/transform/Symbols.hpp"
#include "base/variants/VariantKeywords.hpp"

#include <algorithm>

namespace VT {

OrdinaryChoices::OrdinaryChoices(SymbolicExprTable& table, SymbolicExprId context, Judge judge)
    : table_(table),
      judge_(std::move(judge)) {
    const SymbolicExprSymbols symbols(table);
    isUsable_ = walkDistinctChain(
        table, context, limits::reasonOperands, LinksOf(SymbolicOp::And),
        [&](SymbolicExprId id, const SymbolicExpr* node) {
            if (node == nullptr)
                return false;
            std::vector<SymbolicExprId> names;
            symbols(id, names);
            for (const SymbolicExprId name : names) {
                const SymbolicExprId* const before = contexts_.find(name);
                const bool isAlone = names.size() == 1 && (before == nullptr || *before != invalidId);
                const SymbolicExprId known =
                    before == nullptr || !isAlone ? id : makeBinary(table_, SymbolicOp::And, *before, id);
                contexts_.insert(name, isAlone ? known : invalidId);
            }
            return true;
        },
        [](SymbolicExprId) {});
}

/// The only name in an operand that is made of comparisons with integers; the invalid identifier elsewhere.
SymbolicExprId OrdinaryChoices::nameIn(SymbolicExprId operand) {
    static constexpr OperatorSet plainOps =
        comparisonOps | OperatorSet{SymbolicOp::And, SymbolicOp::Or, SymbolicOp::Not, SymbolicOp::IntValue};
    if (const SymbolicExprId* const before = names_.find(operand))
        return *before;
    SymbolicExprId name = invalidId;
    bool isPlain = true;
    walkDistinct(
        table_, operand,
        [&](SymbolicExprId id, const SymbolicExpr& node) {
            if (node.op() != SymbolicOp::String) {
                isPlain = isPlain && plainOps.contains(node.op());
                return;
            }
            const std::string& text = static_cast<const SymbolicString&>(node).getName();
            isPlain = isPlain && name == invalidId && id != table_.getIdTRUE() && id != table_.getIdFALSE() &&
                      !VariantKeywords::isVariantKeyword(text, false);
            name = id;
        },
        [&](SymbolicExprId id) { isPlain = isPlain && id != invalidId; });
    return names_.insert(operand, isPlain ? name : invalidId);
}

bool OrdinaryChoices::contains(SymbolicExprId condition) {
    struct Part {
        SymbolicExprId name;
        SymbolicExprId says;
    };

    std::vector<Part> parts;
    const bool isPlain = isUsable_ && walkChain(table_, condition, limits::choiceOperands, LinksOf(SymbolicOp::And),
                                                [&](SymbolicExprId id, const SymbolicExpr* node) {
                                                    const SymbolicExprId name =
                                                        node == nullptr ? invalidId : nameIn(id);
                                                    const auto at = std::ranges::find(parts, name, &Part::name);
                                                    if (at == parts.end())
                                                        parts.push_back({name, id});
                                                    else
                                                        at->says = makeBinary(table_, SymbolicOp::And, at->says, id);
                                                    return name != invalidId;
                                                });
    return isPlain && std::ranges::all_of(parts, [&](const Part& part) {
               if (const bool* const before = isOrdinary_.find(part.says))
                   return *before;
               const SymbolicExprId* const known = contexts_.find(part.name);
               const SymbolicExprId context = known == nullptr ? table_.getIdTRUE() : *known;
               return isOrdinary_.insert(part.says, context != invalidId && judge_(context, part.says));
           });
}

} // namespace VT
