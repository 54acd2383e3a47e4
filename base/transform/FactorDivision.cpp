// Pulls divisions outwards: a/b + c/d becomes (a*d + c*b)/(b*d).
//
// Method: one rebuilding pass.  At each sum, difference, remainder, product and quotient the operands, rebuilt already,
// are taken as fractions, and the node becomes one fraction.
// Cost: linear in the distinct nodes; nothing is folded, so a result has at most a few nodes more for each of them.
#include "base/transform/FactorDivision.hpp"

namespace VT {

/// An operand as numerator and divisor; the divisor of anything but a quotient is the invalid identifier and means 1.
struct SymbolicExprFactorDivisionVisitor::Fraction {
    SymbolicExprId numerator;
    SymbolicExprId divisor = invalidId;

    [[nodiscard]] bool isQuotient() const noexcept { return divisor != invalidId; }
};

SymbolicExprFactorDivisionVisitor::Fraction SymbolicExprFactorDivisionVisitor::fraction(SymbolicExprId id) const {
    const SymbolicExpr* const node = table().get(id);
    if (node == nullptr || node->op() != SymbolicOp::Divide)
        return {id};
    const auto& quotient = static_cast<const SymbolicDivideExpr&>(*node);
    const bool isWhole = table().hasOperand(id, quotient.left()) && table().hasOperand(id, quotient.right());
    return isWhole ? Fraction{quotient.left(), quotient.right()} : Fraction{id};
}

SymbolicExprId SymbolicExprFactorDivisionVisitor::product(SymbolicExprId a, SymbolicExprId b) {
    return factory_.make<SymbolicMultiplyExpr>(a, b);
}

/// a times what b is divided by.
SymbolicExprId SymbolicExprFactorDivisionVisitor::product(SymbolicExprId a, const Fraction& b) {
    return b.isQuotient() ? product(a, b.divisor) : a;
}

/// The common divisor of two operands, one of which is a quotient.
SymbolicExprId SymbolicExprFactorDivisionVisitor::divisor(const Fraction& a, const Fraction& b) {
    return a.isQuotient() ? product(a.divisor, b) : b.divisor;
}

/// Replaces the operands on the stack by the quotient that `combination(a, b)` makes of them; rebuilds the node where
/// neither is a quotient, or one is missing.
template <class Node, class Combine>
void SymbolicExprFactorDivisionVisitor::combine(const Node& node, Combine combination) {
    if (lacksOperand(node))
        return SymbolicExprXFormVisitor::visit(node);
    const SymbolicExprId right = pop();
    const SymbolicExprId left = pop();
    const Fraction a = fraction(left);
    const Fraction b = fraction(right);
    if (a.isQuotient() || b.isQuotient()) {
        const Fraction quotient = combination(a, b);
        push(factory_.make<SymbolicDivideExpr>(quotient.numerator, quotient.divisor));
    } else {
        push(left);
        push(right);
        SymbolicExprXFormVisitor::visit(node);
    }
}

template <class Node>
void SymbolicExprFactorDivisionVisitor::overCommonDivisor(const Node& node) {
    combine(node, [this](const Fraction& a, const Fraction& b) {
        const SymbolicExprId left = product(a.numerator, b);
        const SymbolicExprId right = product(b.numerator, a);
        return Fraction{factory_.make<Node>(left, right), divisor(a, b)};
    });
}

void SymbolicExprFactorDivisionVisitor::visit(const SymbolicPlusExpr& node) {
    overCommonDivisor(node);
}

void SymbolicExprFactorDivisionVisitor::visit(const SymbolicMinusExpr& node) {
    overCommonDivisor(node);
}

void SymbolicExprFactorDivisionVisitor::visit(const SymbolicModuloExpr& node) {
    overCommonDivisor(node);
}

void SymbolicExprFactorDivisionVisitor::visit(const SymbolicMultiplyExpr& node) {
    combine(node, [this](const Fraction& a, const Fraction& b) {
        return Fraction{product(a.numerator, b.numerator), divisor(a, b)};
    });
}

void SymbolicExprFactorDivisionVisitor::visit(const SymbolicDivideExpr& node) {
    combine(node, [this](const Fraction& a, const Fraction& b) {
        const SymbolicExprId numerator = product(a.numerator, b);
        return Fraction{numerator, a.isQuotient() ? product(a.divisor, b.numerator) : b.numerator};
    });
}

SymbolicExprId SymbolicExprFactorDivision::factorDivision(SymbolicExprId id) const {
    return SymbolicExprFactorDivisionVisitor(table_).rebuild(table_, id);
}

} // namespace VT
