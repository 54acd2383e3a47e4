// Collects the symbols that an expression mentions: one walk over the distinct nodes, with the nodes that were visited
// kept from call to call.  Linear in the edges.
#include "base/transform/Symbols.hpp"

#include "base/core/Walk.hpp"

#include <iterator>

namespace VT {

SymbolsOfSymbolicExpr::~SymbolsOfSymbolicExpr() = default;

bool SymbolsOfSymbolicExpr::enter(SymbolicExprId id) {
    if (visited_.find(id) != nullptr)
        return false;
    visited_.insert(id, true);
    return true;
}

void SymbolsOfSymbolicExpr::getSymbols(SymbolicExprId id, std::vector<std::string>& names) {
    std::vector<SymbolicExprId> ids;
    SymbolsOfSymbolicExpr::getSymbolIds(id, ids);
    std::vector<std::string> found;
    found.reserve(ids.size());
    for (const SymbolicExprId symbol : ids)
        found.push_back(static_cast<const SymbolicString&>(*table_.get(symbol)).getName());
    names.insert(names.end(), std::move_iterator(found.begin()), std::move_iterator(found.end()));
}

void SymbolsOfSymbolicExpr::getSymbolIds(SymbolicExprId id, std::vector<SymbolicExprId>& ids) {
    std::vector<SymbolicExprId> found;
    std::vector<WalkFrame> stack;
    walkUnknown(
        table_, id, stack, [&](SymbolicExprId met, const SymbolicExpr*) { return !enter(met); },
        [&](SymbolicExprId visited, const SymbolicExpr& node, const SymbolicExpr*) {
            if (node.op() == SymbolicOp::String)
                found.push_back(visited);
        },
        [](SymbolicExprId, const SymbolicExpr*) {});
    ids.insert(ids.end(), found.begin(), found.end());
}

SymbolicExprSymbols::~SymbolicExprSymbols() = default;

void SymbolicExprSymbols::operator()(SymbolicExprId id, std::vector<std::string>& names) const {
    SymbolsOfSymbolicExpr(table_).getSymbols(id, names);
}

void SymbolicExprSymbols::operator()(SymbolicExprId id, std::vector<SymbolicExprId>& ids) const {
    SymbolsOfSymbolicExpr(table_).getSymbolIds(id, ids);
}

} // namespace VT
