// Collects the symbols of a condition by kind.
//
// Method: depth first on an explicit stack.  The general walkers follow every operand; here the node decides: a
// member's owner is not entered, and a call's name is reported for each distinct call, before its arguments.
// Cost: linear in the edges.
#include "base/service/VCSymbols.hpp"

#include "base/print/ExpressionPrinter.hpp"

#include <iterator>

namespace VT {

void VCSymbolsOfSymbolicExpr::getSymbols(SymbolicExprId id, std::vector<std::string>& names) {
    std::vector<SymbolicExprId> ids;
    VCSymbolsOfSymbolicExpr::getSymbolIds(id, ids);
    const SymbolicExprPrinter print(table(), true);
    std::vector<std::string> found;
    found.reserve(ids.size());
    for (const SymbolicExprId symbol : ids)
        found.push_back(print(symbol));
    names.insert(names.end(), std::move_iterator(found.begin()), std::move_iterator(found.end()));
}

void VCSymbolsOfSymbolicExpr::getSymbolIds(SymbolicExprId id, std::vector<SymbolicExprId>& ids) {
    // The general walkers follow every operand; here the node decides, and a call's name comes before its arguments.
    std::vector<SymbolicExprId> found;
    std::vector<SymbolicExprId> open{id};
    while (!open.empty()) {
        const SymbolicExprId next = open.back();
        open.pop_back();
        if (!table().has(next) || !enter(next))
            continue;
        const SymbolicExpr& node = *table().get(next);
        std::size_t first = 0; // of the operands to follow
        if (node.op() == SymbolicOp::String) {
            if (wants(VCSymbolType::Identifier))
                found.push_back(next);
        } else if (node.op() == SymbolicOp::MemberValue) {
            const bool unbound = table().isUnsetValue(table().getValueId(next));
            if (wants(unbound ? VCSymbolType::UnboundMember : VCSymbolType::BoundMember))
                found.push_back(next);
            continue;
        } else if (callOps.contains(node.op()) && node.getNumInputs() > 0) {
            first = 1;
            if (wants(VCSymbolType::FunctionName) && table().hasOperand(next, node.getInput(0)))
                found.push_back(node.getInput(0));
        }
        for (std::size_t i = node.getNumInputs(); i > first; --i)
            if (table().hasOperand(next, node.getInput(i - 1)))
                open.push_back(node.getInput(i - 1));
    }
    ids.insert(ids.end(), found.begin(), found.end());
}

} // namespace VT
