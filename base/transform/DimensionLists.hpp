// Lists of dimensions in the place of matrices with one row.
#pragma once

#include "base/transform/XForm.hpp"

namespace VT {

/// Rebuilds an expression with a list of dimensions, which has a value, in the place of every matrix with one row,
/// which is how Quill's text writes one: `[1 2]*3`.  Matrices with more rows stay.
class VTSYM_API SymbolicExprDimensionListsVisitor : public SymbolicExprXFormVisitor {
public:
    explicit SymbolicExprDimensionListsVisitor(SymbolicExprTable& target) : SymbolicExprXFormVisitor(target) {}

    using SymbolicExprXFormVisitor::visit;
    void visit(const SymbolicMatrixExpr& node) override;
};

/// Does so for expressions of one table, in that table.
class VTSYM_API SymbolicExprDimensionLists {
public:
    /// `table` outlives the driver.
    explicit SymbolicExprDimensionLists(SymbolicExprTable& table) : table_(table) {}

    /// The expression with lists; itself where it has no matrix with one row.  An identifier that is not of the table
    /// gives the invalid one.  Linear in the number of distinct nodes and their operands.
    [[nodiscard]] SymbolicExprId operator()(SymbolicExprId id) const;

private:
    SymbolicExprTable& table_;
};

} // namespace VT
