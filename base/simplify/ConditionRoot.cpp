// Looks for quotients with a walk that stops at truth values; no recursion.
#include "base/simplify/ConditionRoot.hpp"

#include "base/core/Nodes.hpp"
#include "base/util/IdMap.hpp"

#include <vector>

namespace VT {

bool hasQuotientOfItsOwn(const SymbolicExprTable& table, SymbolicExprId root) {
    std::vector<SymbolicExprId> pending{root};
    IdMap<bool> seen;
    while (!pending.empty()) {
        const SymbolicExprId id = pending.back();
        pending.pop_back();
        const SymbolicExpr* const node = table.get(id);
        if (node == nullptr || seen.find(id) != nullptr || booleanOps.contains(node->op()))
            continue;
        if (node->op() == SymbolicOp::Divide)
            return true;
        seen.insert(id, true);
        for (std::size_t i = 0; i < node->getNumInputs(); ++i)
            pending.push_back(node->getInput(i));
    }
    return false;
}

SymbolicExprId asConditionOfItsOwn(SymbolicExprTable& table, SymbolicExprId reduced) {
    if (!hasQuotientOfItsOwn(table, reduced))
        return reduced;
    return SymbolicNotEqualExpr(table, reduced, SymbolicIntValue(table, 0)).getId(table);
}

} // namespace VT
