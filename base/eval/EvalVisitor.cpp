// Computes values bottom-up.
//
// Method: depth first over operands, bound values and list elements with explicit stacks of frames and values.  The
// value of each distinct node is kept.  A node whose value is being evaluated is marked open; meeting it again is a
// cycle.
// Cost: linear in the distinct nodes, times the length of the vectors; limits::evaluatedElements bounds those.
// Relies on: ScalarRules for the operators on scalars.
#include "base/eval/EvalVisitor.hpp"

#include "base/core/Check.hpp"
#include "base/core/Limits.hpp"
#include "base/eval/EvalReports.hpp"
#include "base/eval/Evaluation.hpp"

#include <algorithm>
#include <stdexcept>
#include <utility>

namespace VT {

using detail::Evaluation;

namespace {

/// Marks a node whose value is being evaluated.
const SymbolicValue::Elements open;

} // namespace

SymbolicValue SymbolicExprEvalImpl::evaluate(SymbolicExprId id) {
    return evaluateFrom([&] { enter(id, nullptr); });
}

SymbolicValue SymbolicExprEvalImpl::get() {
    const SymbolicExprId id = std::exchange(visited_, invalidId);
    if (visitedValue_)
        return *std::exchange(visitedValue_, std::nullopt);
    return evaluate(id);
}

void SymbolicExprEvalImpl::on(const SymbolicExpr& node) {
    visitedValue_.reset();
    visited_ = node.getId(table_);
    if (visited_ == invalidId)
        visitedValue_ = evaluateFrom([&] { enterNode(invalidId, node, node.op(), detail::evaluationOf(node.op())); });
}

/// Computes the value of the expression that `enterRoot` puts on the stack or the frames.
template <class Enter>
SymbolicValue SymbolicExprEvalImpl::evaluateFrom(Enter enterRoot) {
    try {
        enterRoot();
        while (!frames_.empty()) {
            Frame& top = frames_.back();
            if (top.next == top.count) {
                leave();
                continue;
            }
            const std::size_t at = top.next++;
            const bool listed = top.rule == ScalarRuleIndex::None && !top.isSymbol;
            enter(listed ? top.node->getInput(at) : at == 0 ? top.first : top.second, &top);
        }
        return takeValue();
    } catch (...) {
        frames_.clear();
        stack_.clear();
        known_.clear(); // some symbols are open
        values_.clear();
        vectors_.clear();
        elementCount_ = 0;
        throw;
    }
}

/// Takes the value from the stack and returns it as callers see it.
SymbolicValue SymbolicExprEvalImpl::takeValue() {
    const Entry& entry = values_[stack_.back()];
    stack_.pop_back();
    VTSYM_CHECK(stack_.empty() && frames_.empty());
    if (entry.elements == nullptr)
        return visibleScalar(entry.scalar);
    Elements elements(*entry.elements);
    std::ranges::transform(elements, elements.begin(), visibleScalar);
    return elements;
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
    enterNode(id, node, op, way);
}

/// The same for a node that is not known; the invalid identifier stands for a root that is not of the table.
void SymbolicExprEvalImpl::enterNode(SymbolicExprId id, const SymbolicExpr& node, SymbolicOp op, Evaluation way) {
    if (way == Evaluation::None)
        detail::throwNotEvaluable(table_, node);
    if (way == Evaluation::Literal) {
        push(detail::literalValue(node, op));
    } else if (way == Evaluation::Operands) {
        if (!table_.isPlain() && id != invalidId) // operands in a plain table lead in no circle
            markOpen(id);
        enterOperands(id, node, op);
    } else {
        enterSymbol(id, node, way == Evaluation::Member);
    }
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

/// Computes the value of the topmost frame's node from those of its operands, and remembers it.
void SymbolicExprEvalImpl::leave() {
    const Frame& done = frames_.back();
    if (done.rule != ScalarRuleIndex::None)
        combine(*done.node, done.rule);
    else if (!done.isSymbol)
        pushList(*done.node);
    if (done.id != invalidId)
        known_.insert(done.id, stack_.back());
    frames_.pop_back();
}

void SymbolicExprEvalImpl::pushList(const SymbolicExpr& node) {
    Elements elements(node.getNumInputs());
    for (std::size_t i = elements.size(); i-- > 0;) {
        const Entry& entry = values_[stack_.back()];
        stack_.pop_back();
        if (entry.elements != nullptr)
            detail::throwNotEvaluable(table_, node);
        elements[i] = entry.scalar;
    }
    push(std::move(elements));
}

void SymbolicExprEvalImpl::push(Elements elements) {
    if (elements.size() > limits::evaluatedElements - elementCount_)
        throw std::length_error("evaluation: too many elements of vectors");
    elementCount_ += elements.size();
    vectors_.push_front(std::move(elements));
    push({}, &vectors_.front());
}

/// Takes the operands of an operator and leaves its value.
void SymbolicExprEvalImpl::combine(const SymbolicExpr& node, ScalarRuleIndex index) {
    const ScalarRule& rule = scalarRules[static_cast<std::size_t>(index)];
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
