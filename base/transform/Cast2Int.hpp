// Real literals become integers.
#pragma once

#include "base/transform/XForm.hpp"

namespace VT {

/// Rebuilds an expression with every real literal replaced by an integer: the nearest one, halves away from zero.
/// Values that do not fit 32 bits, infinities and NaN become -2147483648.
class VTSYM_API SymbolicExprCast2IntVisitor : public SymbolicExprXFormVisitor2 {
public:
    explicit SymbolicExprCast2IntVisitor(SymbolicExprTable& target) : SymbolicExprXFormVisitor2(target) {}

protected:
    using SymbolicExprXFormVisitor2::buildExpr;
    SymbolicExprId buildExpr(OpTag<SymbolicOp::DoubleValue>, double value) override;
};

/// Casts expressions of one table to integers, in that table.
class VTSYM_API SymbolicExprCast2Int {
public:
    /// `table` outlives the cast.
    explicit SymbolicExprCast2Int(SymbolicExprTable& table) : table_(table) {}

    /// The expression with integer literals alone: `N*2.0+0.5` becomes `N*2+1`, and an expression without real literals
    /// stays itself.  An identifier that is not of the table yields the invalid one.  Linear in the number of distinct
    /// nodes.
    [[nodiscard]] SymbolicExprId cast2Int(SymbolicExprId id) const;

private:
    SymbolicExprTable& table_;
};

} // namespace VT
