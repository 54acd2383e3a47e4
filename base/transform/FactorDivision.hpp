// Pulls divisions outwards.
#pragma once

#include "base/transform/XForm.hpp"

namespace VT {

/// Rebuilds an expression so that a sum, difference, remainder, product or quotient of quotients becomes one quotient:
/// N/2 + M/3 becomes (N*3 + M*2)/(2*3).  Nothing is folded or cancelled, and no divisor is checked.
/// Element-wise and left division are not quotients, nor is a division that lacks an operand.
///
/// The result has the value of the original where quotients are exact, as those of dimensions are; under the truncating
/// division of integers it may differ.
class VTSYM_API SymbolicExprFactorDivisionVisitor : public SymbolicExprXFormVisitor {
public:
    /// A visitor that builds in `target`.
    explicit SymbolicExprFactorDivisionVisitor(SymbolicExprTable& target) : SymbolicExprXFormVisitor(target) {}

    using SymbolicExprXFormVisitor::visit;
    void visit(const SymbolicPlusExpr& node) override;
    void visit(const SymbolicMinusExpr& node) override;
    void visit(const SymbolicMultiplyExpr& node) override;
    void visit(const SymbolicDivideExpr& node) override;
    void visit(const SymbolicModuloExpr& node) override;

private:
    struct Fraction;

    [[nodiscard]] Fraction fraction(SymbolicExprId id) const;
    template <class Node>
    void overCommonDivisor(const Node& node);
    template <class Node, class Combine>
    void combine(const Node& node, Combine combination);
    SymbolicExprId product(SymbolicExprId a, SymbolicExprId b);
    SymbolicExprId product(SymbolicExprId a, const Fraction& b);
    SymbolicExprId divisor(const Fraction& a, const Fraction& b);
};

/// Pulls divisions outwards in expressions of one table, in that table.
class VTSYM_API SymbolicExprFactorDivision {
public:
    explicit SymbolicExprFactorDivision(SymbolicExprTable& table) : table_(table) {}

    /// The expression with its divisions pulled outwards, in one pass that is not repeated: the expression itself where
    /// it has none.  An identifier that is not of the table yields the invalid one.  Linear in the number of distinct
    /// nodes.
    [[nodiscard]] SymbolicExprId factorDivision(SymbolicExprId id) const;

private:
    SymbolicExprTable& table_;
};

} // namespace VT
