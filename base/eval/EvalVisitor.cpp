#include "base/eval/EvalVisitor.hpp"

#include "base/core/Limits.hpp"
#include "base/eval/EvalReports.hpp"
#include "base/eval/Evaluation.hpp"

#include <algorithm>
#include <stdexcept>

namespace VT {

using detail::Evaluation;

namespace {

/// Marks a node whose value is being evaluated.
const SymbolicValue::Elements open;

} // namespace

SymbolicValue SymbolicExprEvalImpl::evaluate(SymbolicExprId id) {
    evaluateToStack(id);
    return get();
}

SymbolicValue SymbolicExprEvalImpl::get() {
    if (stack_.empty())
        detail::throwMissingNode(table_, invalidId, nullptr);
    const Entry& entry = values_[stack_.back()];
    stack_.pop_back();
    if (entry.elements == nullptr)
        return visibleScalar(entry.scalar);
    Elements elements(*entry.elements);
    std::ranges::transform(elements, elements.begin(), visibleScalar);
    return elements;
}

/// Leaves the value of an expression on the stack.
void SymbolicExprEvalImpl::evaluateToStack(SymbolicExprId id) {
    const std::size_t depth = stack_.size();
    const std::size_t bottom = frames_.size();
    try {
        enter(id, nullptr);
        while (frames_.size() > bottom) {
            Frame& top = frames_.back();
            if (top.next == top.count) {
                leave();
                continue;
            }
            const std::size_t at = top.next++;
            const bool listed = top.rule == ScalarRuleIndex::None && !top.isSymbol;
            enter(listed ? top.node->getInput(at) : at == 0 ? top.first : top.second, &top);
        }
    } catch (...) {
        stack_.resize(depth);
        frames_.resize(bottom);
        known_.clear(); // some symbols are open
        throw;
    }
}

/// Puts the value of an expression on the stack, or its node on the frames.
void SymbolicExprEvalImpl::enter(SymbolicExprId id, const Frame* parent) {
    // A value may be any node; an operand may not.
    const bool isOperand = parent != nullptr && !parent->isSymbol;
    const SymbolicExpr* const found = table_.get(id);
    if (found == nullptr || (isOperand && !table_.hasOperand(parent->id, id)))
        detail::throwMissingNode(table_, id, parent != nullptr ? parent->node : nullptr);
    const SymbolicExpr& node = *found;
    const SymbolicOp op = node.op();
    const Evaluation way = detail::evaluationOf(op);
    if (way == Evaluation::Literal) {
        push(detail::literalValue(node, op));
        return;
    }
    if (const std::size_t* const known = known_.find(id); known != nullptr) {
        if (values_[*known].elements == &open) {
            if (isOperand && way == Evaluation::Operands)
                detail::throwMissingNode(table_, id, parent->node);
            detail::throwCyclicValue(table_, node);
        }
        stack_.push_back(*known);
        return;
    }
    if (way == Evaluation::None)
        detail::throwNotEvaluable(table_, node);
    if (way == Evaluation::Operands) {
        if (!table_.isPlain()) // in which operands lead in no circle
            markOpen(id);
        enterOperands(id, node, op);
    } else
        enterSymbol(id, node, way == Evaluation::Member);
}

/// Marks a node as one whose value needs what is evaluated until it is left.
void SymbolicExprEvalImpl::markOpen(SymbolicExprId id) {
    known_.insert(id, values_.size());
    values_.push_back({SymbolicScalar(), &open});
}

void SymbolicExprEvalImpl::enterOperands(SymbolicExprId id, const SymbolicExpr& node, SymbolicOp op) {
    const ScalarRuleIndex rule = scalarRuleIndex(op);
    if (rule == ScalarRuleIndex::None) {
        frames_.push_back({&node, id, invalidId, invalidId, 0, node.getNumInputs(), rule, false});
    } else if (scalarRules[static_cast<std::size_t>(rule)].operands == 1) {
        const auto& unary = static_cast<const SymbolicUnaryExpr&>(node);
        frames_.push_back({&node, id, unary.operand(), invalidId, 0, 1, rule, false});
    } else {
        const auto& binary = static_cast<const SymbolicBinaryExpr&>(node);
        frames_.push_back({&node, id, binary.left(), binary.right(), 0, 2, rule, false});
    }
}

void SymbolicExprEvalImpl::enterSymbol(SymbolicExprId id, const SymbolicExpr& node, bool isMember) {
    if (const auto truth = isMember ? std::nullopt : detail::truthConstant(node); truth) {
        push(*truth);
        return;
    }
    const SymbolicExprId value = table_.getValueId(id);
    if (!table_.has(value)) {
        if (isMember)
            detail::throwNotEvaluable(table_, node);
        detail::throwUnboundSymbol(table_, node);
    }
    if (const SymbolicExpr& bound = *table_.get(value); detail::evaluationOf(bound.op()) == Evaluation::Literal) {
        push(detail::literalValue(bound, bound.op()));
        known_.insert(id, stack_.back());
        return;
    }
    markOpen(id);
    frames_.push_back({&node, id, value, invalidId, 0, 1, ScalarRuleIndex::None, true});
}

/// Makes the value of the topmost frame's node from those of its operands, and remembers it.
void SymbolicExprEvalImpl::leave() {
    const Frame& done = frames_.back();
    if (done.isSymbol) {
        known_.insert(done.id, stack_.back());
    } else {
        if (done.rule != ScalarRuleIndex::None)
            combine(*done.node, done.rule);
        else
            pushList(*done.node);
        known_.insert(done.id, stack_.back());
    }
    frames_.pop_back();
}

void SymbolicExprEvalImpl::on(const SymbolicString& node) {
    pushSymbol(node);
}

void SymbolicExprEvalImpl::on(const SymbolicIntValue& node) {
    push(SymbolicScalar(node.getValue()));
}

void SymbolicExprEvalImpl::on(const SymbolicDoubleValue& node) {
    push(SymbolicScalar(node.getValue()));
}

void SymbolicExprEvalImpl::on(const SymbolicMemberValue& node) {
    if (!stack_.empty()) // the owner's value, where the walk went there
        stack_.pop_back();
    pushSymbol(node);
}

/// The value of a symbol in a walk that does not follow bindings.
void SymbolicExprEvalImpl::pushSymbol(const SymbolicExpr& node) {
    const SymbolicExprId id = node.getId(table_);
    if (!table_.has(id))
        detail::throwUnboundSymbol(table_, node);
    evaluateToStack(id);
}

void SymbolicExprEvalImpl::on(const Symbolic2DExpr& node) {
    pushList(node);
}

void SymbolicExprEvalImpl::on(const Symbolic3DExpr& node) {
    pushList(node);
}

void SymbolicExprEvalImpl::on(const SymbolicNDExpr& node) {
    pushList(node);
}

void SymbolicExprEvalImpl::pushList(const SymbolicExpr& node) {
    Elements elements(node.getNumInputs());
    for (std::size_t i = elements.size(); i-- > 0;) {
        const Entry& entry = values_[take(node)];
        if (entry.elements != nullptr)
            detail::throwNotEvaluable(table_, node);
        elements[i] = entry.scalar;
    }
    push(std::move(elements));
}

void SymbolicExprEvalImpl::on(const SymbolicUnaryExpr& node) {
    pushOperator(node);
}

void SymbolicExprEvalImpl::on(const SymbolicBinaryExpr& node) {
    pushOperator(node);
}

void SymbolicExprEvalImpl::pushOperator(const SymbolicExpr& node) {
    const ScalarRuleIndex rule = scalarRuleIndex(node.op());
    if (rule == ScalarRuleIndex::None)
        detail::throwNotEvaluable(table_, node);
    combine(node, rule);
}

void SymbolicExprEvalImpl::on(const SymbolicTernaryExpr& node) {
    detail::throwNotEvaluable(table_, node);
}

void SymbolicExprEvalImpl::on(const SymbolicMultiExpr& node) {
    detail::throwNotEvaluable(table_, node);
}

void SymbolicExprEvalImpl::push(Elements elements) {
    if (elements.size() > limits::evaluatedElements - elementCount_)
        throw std::length_error("evaluation: too many elements of vectors");
    elementCount_ += elements.size();
    vectors_.push_front(std::move(elements));
    push({}, &vectors_.front());
}

/// The value of the last operand that was not taken.
std::size_t SymbolicExprEvalImpl::take(const SymbolicExpr& node) {
    if (stack_.empty()) // an operand that no node stands for was not visited
        detail::throwNotEvaluable(table_, node);
    const std::size_t value = stack_.back();
    stack_.pop_back();
    return value;
}

/// Takes the operands of an operator and leaves its value.
void SymbolicExprEvalImpl::combine(const SymbolicExpr& node, ScalarRuleIndex index) {
    const ScalarRule& rule = scalarRules[static_cast<std::size_t>(index)];
    if (stack_.size() < rule.operands) // an operand that no node stands for was not visited
        detail::throwNotEvaluable(table_, node);
    const Entry& right = values_[stack_.back()];
    const Entry& left = values_[stack_[stack_.size() - rule.operands]];
    stack_.resize(stack_.size() - rule.operands);
    if (left.elements == nullptr && right.elements == nullptr)
        push(evaluateScalars(rule, left.scalar, right.scalar));
    else
        combineElements(node, rule, left, right);
}

void SymbolicExprEvalImpl::combineElements(const SymbolicExpr& node, const ScalarRule& rule, const Entry& left,
                                           const Entry& right) {
    const Elements& longer = left.elements != nullptr ? *left.elements : *right.elements;
    if (right.elements != nullptr && right.elements->size() != longer.size())
        detail::throwSizeMismatch(table_, node, longer.size(), right.elements->size());
    Elements elements;
    elements.reserve(longer.size());
    for (std::size_t i = 0; i < longer.size(); ++i)
        elements.push_back(evaluateScalars(rule, left.elements != nullptr ? (*left.elements)[i] : left.scalar,
                                           right.elements != nullptr ? (*right.elements)[i] : right.scalar));
    push(std::move(elements));
}

} // namespace VT
