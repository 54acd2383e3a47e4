// Matrices with one row become lists of dimensions, which have a value.  Linear in the distinct nodes and their
// operands.
#include "base/transform/DimensionLists.hpp"

namespace VT {

namespace {

/// Returns the only row of a matrix; nullptr for other nodes and matrices.
const SymbolicExpr* onlyRow(const SymbolicExprTable& table, SymbolicExprId id) {
    const SymbolicExpr* const matrix = table.get(id);
    if (matrix == nullptr || matrix->op() != SymbolicOp::Matrix || matrix->getNumInputs() != 1)
        return nullptr;
    const SymbolicExpr* const row = table.get(matrix->getInput(0));
    return row != nullptr && row->op() == SymbolicOp::Row ? row : nullptr;
}

} // namespace

void SymbolicExprDimensionListsVisitor::visit(const SymbolicMatrixExpr& node) {
    SymbolicExprXFormVisitor::visit(node);
    const SymbolicExpr* const row = onlyRow(table(), top());
    if (row == nullptr)
        return;
    std::vector<SymbolicExprId> elements;
    for (std::size_t i = 0; i < row->getNumInputs(); ++i)
        elements.push_back(row->getInput(i));
    pop();
    push(factory_.make<SymbolicNDExpr>(elements));
}

SymbolicExprId SymbolicExprDimensionLists::operator()(SymbolicExprId id) const {
    return SymbolicExprDimensionListsVisitor(table_).rebuild(table_, id);
}

} // namespace VT
