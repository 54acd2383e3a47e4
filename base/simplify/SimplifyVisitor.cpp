#include "base/simplify/SimplifyVisitor.hpp"

#include "base/core/Walk.hpp"
#include "base/simplify/LogicalChain.hpp"
#include "base/simplify/RuleTables.hpp"

namespace VT {

namespace {

/// Whether a node and its parent are one chain.
bool continues(const SymbolicExpr* parent, SymbolicOp op) {
    if (parent == nullptr)
        return false;
    const SymbolicOp above = parent->op();
    if (op == SymbolicOp::And || op == SymbolicOp::Or)
        return above == op;
    return sumOps.contains(op) && sumOps.contains(above);
}

} // namespace

/// The rules' view of the visitor.
class SymbolicExprSimplifyVisitor::Rules final : public RuleContext {
public:
    Rules(SymbolicExprSimplifyVisitor& visitor, const SymbolicExprPrinter& printer)
        : RuleContext(visitor.table(), printer, visitor.keywordsOn),
          visitor_(visitor) {}

    bool confirmRewrite(SymbolicExprId expression, SymbolicExprId replacement) override {
        return visitor_.confirmRewrite(expression, replacement);
    }

    [[nodiscard]] std::uint64_t operandLimit() const override { return visitor_.operandLimit; }

    void giveUp() override { visitor_.gaveUp = true; }

private:
    SymbolicExprSimplifyVisitor& visitor_;
};

SymbolicExprSimplifyVisitor::SymbolicExprSimplifyVisitor(SymbolicExprTable& table, bool keywordsFlag,
                                                         const SymbolicExprPrinter& printer)
    : SymbolicExprXFormVisitor(table) {
    keywordsOn = keywordsOn && keywordsFlag;
    if (table.getIdTRUE() == invalidId)
        table.addBoolSymbols();
    rules_ = std::make_unique<Rules>(*this, printer);
}

SymbolicExprSimplifyVisitor::~SymbolicExprSimplifyVisitor() = default;

bool SymbolicExprSimplifyVisitor::confirmRewrite(SymbolicExprId, SymbolicExprId) {
    return true;
}

SymbolicExprId SymbolicExprSimplifyVisitor::pass(SymbolicExprId id) {
    if (!table().has(id))
        return invalidId;

    struct Result {
        SymbolicExprId id = invalidId;
        bool inChain = false; ///< rebuilt only, on behalf of a chain above
    };

    IdMap<Result> results;
    const std::size_t before = depth();
    rules_->listen(listener_, ++passes_);
    try {
        walkDistinctWithParents(
            table(), id,
            [&](SymbolicExprId visited, const SymbolicExpr& node, const SymbolicExpr* parent) {
                inChain_ = continues(parent, node.op());
                visitAs(visited, node);
                results.insert(visited, {top(), inChain_});
                inChain_ = false;
            },
            [&](SymbolicExprId known, const SymbolicExpr* parent) {
                Result* result = results.find(known);
                if (result != nullptr && result->inChain && !continues(parent, table().get(known)->op())) {
                    const SymbolicOp op = rules_->op(result->id);
                    if (op == SymbolicOp::And || op == SymbolicOp::Or)
                        result->id = simplifyChain(*rules_, result->id);
                    else if (sumOps.contains(op))
                        result->id = simplifySum(*rules_, result->id);
                    result->inChain = false;
                }
                push(result != nullptr ? result->id : invalidId);
            });
    } catch (...) {
        inChain_ = false;
        unwind(before);
        throw;
    }
    return gaveUp ? (pop(), id) : pop();
}

template <class Node>
void SymbolicExprSimplifyVisitor::visitSum(const Node& node) {
    SymbolicExprXFormVisitor::visit(node);
    if (!gaveUp)
        push(inChain_ ? foldSum(*rules_, pop()) : simplifySum(*rules_, pop()));
}

template <class Node>
void SymbolicExprSimplifyVisitor::visitComparison(const Node& node) {
    if (gaveUp)
        return SymbolicExprXFormVisitor::visit(node);
    const SymbolicExprId b = pop();
    const SymbolicExprId a = pop();
    push(simplifyComparison(*rules_, node.op(), a, b));
}

template <class Node>
void SymbolicExprSimplifyVisitor::visitChain(const Node& node) {
    SymbolicExprXFormVisitor::visit(node);
    if (!inChain_ && !gaveUp)
        push(simplifyChain(*rules_, pop()));
}

void SymbolicExprSimplifyVisitor::visit(const SymbolicPlusExpr& node) {
    visitSum(node);
}

void SymbolicExprSimplifyVisitor::visit(const SymbolicMinusExpr& node) {
    visitSum(node);
}

void SymbolicExprSimplifyVisitor::visit(const SymbolicUnaryMinusExpr& node) {
    visitSum(node);
}

void SymbolicExprSimplifyVisitor::visit(const SymbolicEqualExpr& node) {
    visitComparison(node);
}

void SymbolicExprSimplifyVisitor::visit(const SymbolicNotEqualExpr& node) {
    visitComparison(node);
}

void SymbolicExprSimplifyVisitor::visit(const SymbolicLessThanExpr& node) {
    visitComparison(node);
}

void SymbolicExprSimplifyVisitor::visit(const SymbolicLessThanEqualExpr& node) {
    visitComparison(node);
}

void SymbolicExprSimplifyVisitor::visit(const SymbolicGreaterThanExpr& node) {
    visitComparison(node);
}

void SymbolicExprSimplifyVisitor::visit(const SymbolicGreaterThanEqualExpr& node) {
    visitComparison(node);
}

void SymbolicExprSimplifyVisitor::visit(const SymbolicAndExpr& node) {
    visitChain(node);
}

void SymbolicExprSimplifyVisitor::visit(const SymbolicOrExpr& node) {
    visitChain(node);
}

void SymbolicExprSimplifyVisitor::visit(const SymbolicMultiplyExpr& node) {
    if (gaveUp)
        return SymbolicExprXFormVisitor::visit(node);
    const SymbolicExprId b = pop();
    const SymbolicExprId a = pop();
    push(simplifyMultiply(*rules_, a, b));
}

void SymbolicExprSimplifyVisitor::visit(const SymbolicDivideExpr& node) {
    if (gaveUp)
        return SymbolicExprXFormVisitor::visit(node);
    const SymbolicExprId b = pop();
    const SymbolicExprId a = pop();
    push(simplifyDivide(*rules_, a, b));
}

void SymbolicExprSimplifyVisitor::visit(const SymbolicNotExpr& node) {
    if (gaveUp)
        return SymbolicExprXFormVisitor::visit(node);
    push(simplifyNot(*rules_, pop()));
}

} // namespace VT
