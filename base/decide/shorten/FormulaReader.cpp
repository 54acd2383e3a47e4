// Reads a condition as a formula with an explicit stack, each distinct node once.
//
// Cost: linear in the operands of all distinct nodes, at most limits::shortenComparisons leaves.
#include "base/decide/shorten/FormulaReader.hpp"

#include "base/core/Chains.hpp"
#include "base/core/Limits.hpp"
#include "base/core/Nodes.hpp"
#include "base/integer/ExactArithmetic.hpp"

#include <algorithm>

namespace VT {

namespace {

constexpr OperatorSet conjunctions{SymbolicOp::And, SymbolicOp::SingleAnd};
constexpr OperatorSet disjunctions{SymbolicOp::Or, SymbolicOp::SingleOr};

/// One operator for both spellings of a chain.
SymbolicOp chainOf(SymbolicOp op) {
    return conjunctions.contains(op) ? SymbolicOp::And : disjunctions.contains(op) ? SymbolicOp::Or : SymbolicOp::None;
}

} // namespace

ChainOps FormulaReader::chainOps() const {
    const auto only = [&](SymbolicOp single, SymbolicOp both) {
        return seen_.contains(single) && !seen_.contains(both) ? single : both;
    };
    return {only(SymbolicOp::SingleAnd, SymbolicOp::And), only(SymbolicOp::SingleOr, SymbolicOp::Or)};
}

std::optional<ReadFormula> FormulaReader::read(SymbolicExprId condition) {
    frames_.clear();
    operands_.clear();
    if (!enter(condition))
        return std::nullopt;
    while (!frames_.empty()) {
        Frame& top = frames_.back();
        if (top.next < operands_.size()) {
            const SymbolicExprId operand = operands_[top.next++];
            if (read_.find(operand) == nullptr && !enter(operand))
                return std::nullopt;
            continue;
        }
        const Frame done = top;
        frames_.pop_back();
        const ReadFormula result = leave(done);
        if (result.comparisons > limits::shortenComparisons)
            return std::nullopt;
        read_.insert(done.id, result);
        operands_.resize(done.operands);
    }
    return *read_.find(condition);
}

/// The side of a comparison that is a truth value, where the other is a number.
std::optional<std::size_t> FormulaReader::truthSide(const SymbolicExpr& comparison) {
    for (const std::size_t side : {0U, 1U}) {
        const SymbolicExpr* truth = table_.get(comparison.getInput(side));
        const SymbolicExprId other = comparison.getInput(1 - side);
        if (truth != nullptr && booleanOps.contains(truth->op()) && terms_.constant(other))
            return side;
    }
    return std::nullopt;
}

/// Begins a node, or reads a leaf; false where an operand is missing.
bool FormulaReader::enter(SymbolicExprId id) {
    const SymbolicExpr* node = table_.get(id);
    if (node == nullptr)
        return false;
    const SymbolicOp op = node->op();
    const std::size_t first = operands_.size();
    if (chainOf(op) != SymbolicOp::None) {
        seen_.add(op);
        if (!collectChain(id, chainOf(op)))
            return false;
        frames_.push_back({id, chainOf(op), first, first});
        return true;
    }
    if (op == SymbolicOp::Not) {
        operands_.push_back(node->getInput(0));
        frames_.push_back({id, op, first, first});
        return operands_.back() < id;
    }
    if (comparisonOps.contains(op)) {
        if (const auto side = truthSide(*node)) {
            operands_.push_back(node->getInput(*side));
            frames_.push_back({id, op, first, first});
            return operands_.back() < id;
        }
    }
    const std::optional<Constraint> constraint = terms_.read(id);
    if (constraint)
        read_.insert(id, {formulas_.leaf(*constraint), 1});
    return constraint.has_value();
}

/// Appends the operands of a chain, as often as they occur; false where one is missing or there are too many.
bool FormulaReader::collectChain(SymbolicExprId root, SymbolicOp op) {
    const std::size_t left = limits::shortenComparisons - std::min(operands_.size(), limits::shortenComparisons);
    return walkChain(
        table_, root, left,
        [&](SymbolicExprId, const SymbolicExpr& node) {
            if (chainOf(node.op()) != op)
                return false;
            seen_.add(node.op());
            return true;
        },
        [&](SymbolicExprId id, const SymbolicExpr* node) {
            operands_.push_back(id);
            return node != nullptr;
        });
}

ReadFormula FormulaReader::leave(const Frame& frame) {
    Formulas::Operands parts;
    std::size_t comparisons = 0;
    for (std::size_t i = frame.operands; i < operands_.size(); ++i) {
        const ReadFormula& operand = *read_.find(operands_[i]);
        parts.push_back(operand.formula);
        comparisons += operand.comparisons;
    }
    if (frame.op == SymbolicOp::And || frame.op == SymbolicOp::Or)
        return {formulas_.chain(frame.op == SymbolicOp::And ? Formulas::Kind::And : Formulas::Kind::Or, parts),
                comparisons};
    if (frame.op == SymbolicOp::Not)
        return {formulas_.negated(parts.front()), comparisons};
    const SymbolicExpr& node = *table_.get(frame.id);
    const std::size_t side = *truthSide(node);
    const double number = *terms_.constant(node.getInput(1 - side));
    const SymbolicOp op = side == 0 ? frame.op : operatorInfo(frame.op).mirrored;
    const bool whereTrue = compareNumbers(op, 1.0, number);
    const bool whereFalse = compareNumbers(op, 0.0, number);
    if (whereTrue == whereFalse)
        return {whereTrue ? Formulas::yes : Formulas::no, comparisons};
    return {whereTrue ? parts.front() : formulas_.negated(parts.front()), comparisons};
}

} // namespace VT
