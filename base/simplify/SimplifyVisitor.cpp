// Rebuilds an expression from its leaves and applies the rules of each node's operator.
//
// Chains of And, Or and sums are rebuilt first and simplified at their topmost node, with all operands at hand.  A
// node in a condition and in a dimension is visited for both, because quotients mean different things there.
// Cost: linear in the distinct nodes, apart from the chains' own bounds.
// Relies on: an explicit stack, so that the depth of an expression does not matter.
#include "base/simplify/SimplifyVisitor.hpp"

#include "base/core/Walk.hpp"
#include "base/simplify/ConditionRoot.hpp"
#include "base/simplify/LogicalChain.hpp"
#include "base/simplify/RuleTables.hpp"

#include <boost/container/small_vector.hpp>

namespace VT {

namespace {

constexpr OperatorSet chainOps{SymbolicOp::And, SymbolicOp::Or};
/// What takes its operands for true or false.
constexpr OperatorSet logicalOps{SymbolicOp::And, SymbolicOp::Or, SymbolicOp::Not};

/// Whether a node and its parent are one chain.
bool continues(SymbolicOp above, SymbolicOp op) {
    return chainOps.contains(op) ? above == op
                                 : sumOps.contains(op) && above != SymbolicOp::None && sumOps.contains(above);
}

} // namespace

/// The rules' view of the visitor.
class SymbolicExprSimplifyVisitor::Rules final : public RuleContext {
public:
    Rules(SymbolicExprSimplifyVisitor& visitor, const SymbolicExprPrinter& printer)
        : RuleContext(visitor.table(), visitor.keywordsOn),
          visitor_(visitor),
          printer_(printer) {}

    bool confirmRewrite(SymbolicExprId expression, SymbolicExprId replacement) override {
        return visitor_.confirmRewrite(expression, replacement);
    }

    [[nodiscard]] std::uint64_t operandLimit() const override { return visitor_.operandLimit; }

    [[nodiscard]] bool inCondition() const override { return visitor_.inCondition_; }

    [[nodiscard]] bool isOutermost() const override { return !visitor_.inTruth_; }

    void giveUp() override { visitor_.gaveUp = true; }

    bool multiplies(std::size_t literals) override {
        if (literals > visitor_.affordable_) {
            visitor_.affordable_ = 0;
            visitor_.gaveUp = true;
            return false;
        }
        visitor_.affordable_ -= literals;
        return true;
    }

    /// By the Quill text.
    [[nodiscard]] bool sortsBefore(SymbolicExprId a, SymbolicExprId b) const override {
        return printer_.compareUsingCache(a, b) < 0;
    }

    void sort(std::span<SymbolicExprId> operands) const override { printer_.sortUsingCache(operands); }

private:
    SymbolicExprSimplifyVisitor& visitor_;
    const SymbolicExprPrinter& printer_;
};

/// The walk of one pass: visits each distinct node once in each of the two contexts, operands first.
class SymbolicExprSimplifyVisitor::Pass {
public:
    explicit Pass(SymbolicExprSimplifyVisitor& visitor) : visitor_(visitor), table_(visitor.table()) {}

    Pass(const Pass&) = delete;
    Pass& operator=(const Pass&) = delete;

    ~Pass() {
        visitor_.inChain_ = false;
        visitor_.inCondition_ = false;
        visitor_.inTruth_ = false;
    }

    /// Leaves the rebuilt expression on the visitor's stack, or anything where the visitor gives up.
    void run(SymbolicExprId root) {
        enter(root, SymbolicOp::None, false);
        while (!frames_.empty() && !visitor_.gaveUp) {
            Frame& top = frames_.back();
            if (top.next == top.count) {
                const Frame done = top;
                frames_.pop_back();
                leave(done);
                continue;
            }
            const SymbolicExprId operand = top.node->getInput(top.next++);
            const SymbolicOp above = top.node->op();
            if (isMissing(top.id, operand))
                visitor_.push(invalidId);
            else
                enter(operand, above, top.inCondition || booleanOps.contains(above));
        }
    }

private:
    struct Frame {
        const SymbolicExpr* node;
        SymbolicExprId id;
        std::size_t next;
        std::size_t count;
        bool inChain;
        bool inCondition;
    };

    struct Result {
        SymbolicExprId id = invalidId;
        bool inChain = false; ///< rebuilt only, on behalf of a chain above
    };

    /// In a table of the library operands lead in no circle; elsewhere a walk does not enter a node that it is inside.
    [[nodiscard]] bool isMissing(SymbolicExprId id, SymbolicExprId operand) const {
        return !table_.hasOperand(id, operand) || (!table_.isPlain() && path_.depthOf(operand) != 0);
    }

    void enter(SymbolicExprId id, SymbolicOp above, bool inCondition) {
        const SymbolicExpr& node = *table_.get(id);
        const bool inChain = continues(above, node.op());
        Result* const known = results_[inCondition ? 1 : 0].find(id);
        if (known == nullptr) {
            frames_.push_back({&node, id, 0, node.getNumInputs(), inChain, inCondition});
            if (!table_.isPlain())
                path_.enter(id);
            return;
        }
        if (known->inChain && !inChain) {
            visitor_.inCondition_ = inCondition;
            visitor_.inTruth_ = logicalOps.contains(above);
            *known = {visitor_.simplifyTopmost(node, known->id), false};
        }
        visitor_.push(known->id);
    }

    void leave(const Frame& done) {
        if (!table_.isPlain())
            path_.leave(done.id);
        visitor_.inChain_ = done.inChain;
        visitor_.inCondition_ = done.inCondition;
        visitor_.inTruth_ = !frames_.empty() && logicalOps.contains(frames_.back().node->op());
        visitor_.visitAs(done.id, *done.node);
        results_[done.inCondition ? 1 : 0].insert(done.id, {visitor_.top(), done.inChain});
    }

    SymbolicExprSimplifyVisitor& visitor_;
    const SymbolicExprTable& table_;
    boost::container::small_vector<Frame, 16> frames_;
    WalkPath path_{table_};    ///< kept for hosts' tables only
    IdMap<Result> results_[2]; ///< of dimensions, of conditions
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
    const std::size_t before = depth();
    rules_->listen(listener_, ++passes_);
    try {
        Pass(*this).run(id);
    } catch (...) {
        unwind(before);
        throw;
    }
    const SymbolicExprId result = gaveUp ? id : finishRoot(id, pop());
    unwind(before);
    return result;
}

bool SymbolicExprSimplifyVisitor::isSmallest(SymbolicExprId result) const {
    return table().has(result) && (!chainOps.contains(rules_->op(result)) || rules_->isSmallest(result));
}

/// The result of a pass.  A condition that was reduced to a value is a dimension on its own; where that has a quotient,
/// which would be exact then, it stays a condition.
SymbolicExprId SymbolicExprSimplifyVisitor::finishRoot(SymbolicExprId source, SymbolicExprId rebuilt) {
    if (!isWhole(rebuilt) || !rules_->isBoolean(source) || rules_->isBoolean(rebuilt))
        return rebuilt;
    return hasQuotientOfItsOwn(table(), rebuilt) ? truthAsNumber(*rules_, source, rebuilt) : rebuilt;
}

bool SymbolicExprSimplifyVisitor::isWhole(SymbolicExprId id) const {
    return table().has(id) && (broken_.size() == 0 || broken_.find(id) == nullptr);
}

/// Gives truth values among the operands on the stack their value where the node counts with it.  False where one of
/// the operands is missing or an operand below is.
bool SymbolicExprSimplifyVisitor::takeOperands(const SymbolicExpr& node) {
    operands_.resize(node.getNumInputs());
    bool whole = true;
    for (std::size_t i = operands_.size(); i-- > 0;) {
        operands_[i] = pop();
        whole = isWhole(operands_[i]) && whole;
    }
    const bool counts = !logicalOps.contains(node.op());
    for (std::size_t i = 0; i < operands_.size(); ++i)
        push(counts && isWhole(operands_[i]) ? truthAsNumber(*rules_, node.getInput(i), operands_[i]) : operands_[i]);
    return whole;
}

/// The chain whose topmost node is `source`, from its rebuilt nodes.
SymbolicExprId SymbolicExprSimplifyVisitor::simplifyTopmost(const SymbolicExpr& source, SymbolicExprId rebuilt) {
    if (!isWhole(rebuilt))
        return rebuilt;
    const SymbolicOp op = rules_->op(rebuilt);
    if (!chainOps.contains(source.op()))
        return sumOps.contains(op) ? simplifySum(*rules_, rebuilt) : rebuilt;
    if (op != source.op())
        return rebuilt;
    if (chainIsWithin(table(), source, operandLimit))
        return simplifyChain(*rules_, rebuilt);
    gaveUp = true;
    return rebuilt;
}

template <class Node>
void SymbolicExprSimplifyVisitor::simplifyNode(const Node& node) {
    constexpr SymbolicOp op = Node::code;
    if (!takeOperands(node)) {
        SymbolicExprXFormVisitor::visit(node);
        if (top() != invalidId)
            broken_.insert(top(), true);
        return;
    }
    if (gaveUp)
        return SymbolicExprXFormVisitor::visit(node);
    if constexpr (chainOps.contains(op) || sumOps.contains(op)) {
        SymbolicExprXFormVisitor::visit(node);
        if (!inChain_)
            push(simplifyTopmost(node, pop()));
        else if constexpr (sumOps.contains(op))
            push(applyRules(*rules_, pop()));
    } else if constexpr (op == SymbolicOp::Not) {
        push(simplifyNot(*rules_, pop()));
    } else if constexpr (comparisonOps.contains(op) || op == SymbolicOp::Multiply || op == SymbolicOp::Divide) {
        const SymbolicExprId b = pop();
        const SymbolicExprId a = pop();
        push(op == SymbolicOp::Multiply ? simplifyMultiply(*rules_, a, b)
             : op == SymbolicOp::Divide ? simplifyDivide(*rules_, a, b)
                                        : simplifyComparison(*rules_, op, a, b));
    } else {
        SymbolicExprXFormVisitor::visit(node);
        push(applyRules(*rules_, pop()));
    }
}

#define VTSYM_OPERATOR(Code, Name, Class, ...)                                                                         \
    void SymbolicExprSimplifyVisitor::visit(const Class& node) {                                                       \
        simplifyNode(node);                                                                                            \
    }
#include "base/core/operators.def"
#undef VTSYM_OPERATOR

} // namespace VT
