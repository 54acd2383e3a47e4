// One pass of the simplifier.
#pragma once

#include "base/print/ExpressionPrinter.hpp"
#include "base/simplify/Rule.hpp"
#include "base/transform/XForm.hpp"

#include <memory>

namespace VT {

/// Rebuilds an expression bottom-up and applies the simplification rules at each arithmetic node, comparison, Not, And
/// and Or.
///
/// A chain of one operator is simplified at its topmost node, once, so that a long chain does not cost its square. When
/// a chain or a distribution is beyond the operand limit, gaveUp is set; the result of that pass is not to be used.
class VTSYM_API SymbolicExprSimplifyVisitor : public SymbolicExprXFormVisitor {
public:
    /// `keywordsFlag` is and-ed with the feature flag.  `printer` prints Quill text of the table and outlives the
    /// visitor.
    SymbolicExprSimplifyVisitor(SymbolicExprTable& table, bool keywordsFlag, const SymbolicExprPrinter& printer);
    ~SymbolicExprSimplifyVisitor() override;

    using SymbolicExprXFormVisitor::visit;
    void visit(const SymbolicPlusExpr& node) override;
    void visit(const SymbolicMinusExpr& node) override;
    void visit(const SymbolicUnaryMinusExpr& node) override;
    void visit(const SymbolicMultiplyExpr& node) override;
    void visit(const SymbolicDivideExpr& node) override;
    void visit(const SymbolicEqualExpr& node) override;
    void visit(const SymbolicNotEqualExpr& node) override;
    void visit(const SymbolicLessThanExpr& node) override;
    void visit(const SymbolicLessThanEqualExpr& node) override;
    void visit(const SymbolicGreaterThanExpr& node) override;
    void visit(const SymbolicGreaterThanEqualExpr& node) override;
    void visit(const SymbolicAndExpr& node) override;
    void visit(const SymbolicOrExpr& node) override;
    void visit(const SymbolicNotExpr& node) override;

    /// Asked before some rules put `replacement` in the place of `expression`.  The base answers true.
    virtual bool confirmRewrite(SymbolicExprId expression, SymbolicExprId replacement);

    /// One pass over an expression of the visitor's table: its result, or the expression itself where the pass gave up.
    SymbolicExprId pass(SymbolicExprId id);

    [[nodiscard]] bool hasGivenUp() const noexcept { return gaveUp; }

    void setOperandLimit(std::uint64_t limit) noexcept { operandLimit = limit; }

    /// Receives the rules that fire in further passes; nullptr for none.
    void setListener(RuleListener* listener) noexcept { listener_ = listener; }

private:
    class Rules;

    template <class Node>
    void visitSum(const Node& node);
    template <class Node>
    void visitComparison(const Node& node);
    template <class Node>
    void visitChain(const Node& node);

    std::unique_ptr<Rules> rules_;
    RuleListener* listener_ = nullptr;
    std::uint64_t passes_ = 0;
    bool inChain_ = false; ///< the node that is visited goes on in its parent, which is simplified for both
};

} // namespace VT
