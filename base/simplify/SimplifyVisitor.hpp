// One pass of the simplifier.
#pragma once

#include "base/core/Limits.hpp"
#include "base/print/ExpressionPrinter.hpp"
#include "base/simplify/Rule.hpp"
#include "base/transform/XForm.hpp"
#include "base/util/IdMap.hpp"

#include <memory>
#include <vector>

namespace VT {

/// Rebuilds an expression bottom-up and applies the simplification rules at each arithmetic node, comparison, Not, And
/// and Or.
///
/// A chain of one operator is simplified at its topmost node, once, so that a long chain does not cost its square. When
/// a chain or a distribution is beyond the operand limit, or the rules have multiplied out more than one call may, the
/// pass gives up; its result is not to be used.
///
/// Below a comparison or a logical operator quotients are those of integers, truncated toward zero; elsewhere they are
/// those of dimensions, which divide exactly.  A pass rebuilds a node that is in both places once for each.  A visit
/// that no pass makes takes its node for a dimension.
///
/// A truth value has the value 0 or 1: where the rules reduce one to an operand with other values, x, every parent but
/// And, Or and Not gets x ~= 0; so does the result of a pass where x has a quotient, which must stay truncated.  No
/// rule looks at an expression in which an operand is missing: it is rebuilt as it is.
class VTSYM_API SymbolicExprSimplifyVisitor : public SymbolicExprXFormVisitor {
public:
    /// `keywordsFlag` is and-ed with the feature flag.  `printer` prints Quill text of the table and outlives the
    /// visitor.
    SymbolicExprSimplifyVisitor(SymbolicExprTable& table, bool keywordsFlag, const SymbolicExprPrinter& printer);
    ~SymbolicExprSimplifyVisitor() override;

#define VTSYM_OPERATOR(Code, Name, Class, ...) void visit(const Class& node) override;
#include "base/core/operators.def"
#undef VTSYM_OPERATOR

    /// Asked before some rules replace `expression` by `replacement`.  The base answers true.
    virtual bool confirmRewrite(SymbolicExprId expression, SymbolicExprId replacement);

    /// One pass over an expression of the visitor's table: its result, or the expression itself where the pass gave up.
    SymbolicExprId pass(SymbolicExprId id);

    [[nodiscard]] bool hasGivenUp() const noexcept {
        return gaveUp;
    }

    void setOperandLimit(std::uint64_t limit) noexcept {
        operandLimit = limit;
    }

    /// Lets further passes multiply out as many literals as one call may.
    void renewBudget() noexcept {
        affordable_ = limits::multipliedLiterals;
    }

    /// Whether a pass has given up since, because it would have multiplied out more.
    [[nodiscard]] bool hasExhaustedBudget() const noexcept {
        return gaveUp && affordable_ == 0;
    }

    /// Whether the result of a pass is proven to have the fewest comparisons of all sums of products; points of a
    /// symbol that are written one by one count as such.  True for what is not a chain of And or Or.
    [[nodiscard]] bool isSmallest(SymbolicExprId result) const;

    /// Receives the rules that fire in further passes; nullptr for none.
    void setListener(RuleListener* listener) noexcept {
        listener_ = listener;
    }

private:
    class Rules;
    class Pass;

    template <class Node>
    void simplifyNode(const Node& node);
    bool takeOperands(const SymbolicExpr& node);
    [[nodiscard]] bool isWhole(SymbolicExprId id) const;
    SymbolicExprId simplifyTopmost(const SymbolicExpr& source, SymbolicExprId rebuilt);
    SymbolicExprId finishRoot(SymbolicExprId source, SymbolicExprId rebuilt);

    std::unique_ptr<Rules> rules_;
    RuleListener* listener_ = nullptr;
    std::uint64_t passes_ = 0;
    std::size_t affordable_ = limits::multipliedLiterals; ///< literals that may still be multiplied out
    bool inChain_ = false;     ///< the node that is visited goes on in its parent, which is simplified for both
    bool inCondition_ = false; ///< the node that is visited is below a comparison or a logical operator
    bool inTruth_ = false;     ///< the node that is visited is an operand of And, Or or Not
    std::vector<SymbolicExprId> operands_;
    IdMap<bool> broken_; ///< rebuilt expressions in which an operand is missing
};

} // namespace VT
