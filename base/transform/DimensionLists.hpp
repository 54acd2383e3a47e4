// Matrices with one row become lists of dimensions.
#pragma once

#include "base/transform/XForm.hpp"

namespace VT {

/// Rebuilds an expression so that every matrix with one row, which is how Quill writes a list (`[1 2]*3`), becomes a
/// list of dimensions, which has a value.  Matrices with more rows stay.
class VTSYM_API SymbolicExprDimensionListsVisitor : public SymbolicExprXFormVisitor {
public:
    explicit SymbolicExprDimensionListsVisitor(SymbolicExprTable& target) : SymbolicExprXFormVisitor(target) {}

    using SymbolicExprXFormVisitor::visit;
    void visit(const SymbolicMatrixExpr& node) override;
};

/// Converts expressions of one table, in that table.
class VTSYM_API SymbolicExprDimensionLists {
public:
    /// `table` outlives the driver.
    explicit SymbolicExprDimensionLists(SymbolicExprTable& table) : table_(table) {}

    /// The expression with lists; itself where it has no matrix with one row.  An identifier that is not of the table
    /// yields the invalid one.  Linear in the number of distinct nodes and their operands.
    [[nodiscard]] SymbolicExprId operator()(SymbolicExprId id) const;

private:
    SymbolicExprTable& table_;
};

} // namespace VT
