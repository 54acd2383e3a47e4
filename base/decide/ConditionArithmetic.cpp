// Reads arithmetic inside conditions: as linear forms where it is linear, otherwise as one unknown for each node.
//
// A sum or a product by a constant combines forms, guarded case by guarded case. Any other operator on constants is
// computed. What remains becomes an unknown with the bounds that its operator implies (`a % 8` lies in -7..7, `a & 6`
// is made of the bits 6) and with what its operands say about 0.
#include "base/core/Limits.hpp"
#include "base/decide/ConditionReader.hpp"
#include "base/integer/ExactArithmetic.hpp"

#include <algorithm>
#include <cstdlib>

namespace VT {

/// `a op b` where it is linear again.
std::optional<LinearForm> ConditionReader::combined(SymbolicOp op, const LinearForm& a, const LinearForm& b) const {
    switch (op) {
    case SymbolicOp::Plus:
        return combine(a, 1, b, 1);
    case SymbolicOp::Minus:
        return combine(a, 1, b, -1);
    case SymbolicOp::Multiply:
        if (a.isConstant() || b.isConstant())
            return a.isConstant() ? combine(b, a.constant, {}, 0) : combine(a, b.constant, {}, 0);
        return std::nullopt;
    default:
        break;
    }
    if (!a.isConstant() || !b.isConstant())
        return std::nullopt;
    const auto value = integerResult(op, a.constant, b.constant);
    return value && isWithinBound(*value) ? std::optional(LinearForm{{}, *value}) : std::nullopt;
}

ConditionReader::Value ConditionReader::arithmetic(const Frame& frame) {
    const SymbolicOp op = frame.node->op();
    const std::size_t count = operands_.size() - frame.firstOperand;
    if (op == SymbolicOp::UnaryMinus && operand(frame, 0).kind == Value::Kind::Real)
        return {Value::Kind::Real, never, -operand(frame, 0).real, {}, {}};
    for (std::size_t i = 0; i < count; ++i)
        if (operand(frame, i).kind == Value::Kind::Real || operand(frame, i).kind == Value::Kind::RealTerm)
            return {Value::Kind::RealTerm, never, 0, {}, {}};
    if (count == 0 || count > 2)
        return boundedTerm(frame);
    const Cases left = casesOf(operand(frame, 0));
    const Cases right = count == 2 ? casesOf(operand(frame, 1)) : Cases{};
    Value value{Value::Kind::Number, never, 0, {}, {}};
    for (const Case& x : left) {
        if (count == 1) {
            const bool minus = op == SymbolicOp::UnaryMinus;
            const auto bits = !minus && x.form.isConstant() ? integerResult(op, x.form.constant) : std::nullopt;
            const auto form = minus  ? combine(x.form, -1, {}, 0)
                              : bits ? std::optional(LinearForm{{}, *bits})
                                     : std::nullopt;
            if (!form)
                return boundedTerm(frame);
            addCase(value.cases, x.guard, *form);
        }
        for (const Case& y : right) {
            steps_.take();
            const auto form = combined(op, x.form, y.form);
            if (!form || value.cases.size() >= limits::termCases)
                return boundedTerm(frame);
            addCase(value.cases, diagrams_.both(x.guard, y.guard), *form);
        }
    }
    return value;
}

std::optional<std::int64_t> ConditionReader::constantOf(const Value& value) const {
    const bool one = value.kind == Value::Kind::Number && value.cases.size() == 1;
    return one && value.cases[0].form.isConstant() ? std::optional(value.cases[0].form.constant) : std::nullopt;
}

/// An unknown of its own for a node, within what the operator can give.
ConditionReader::Value ConditionReader::boundedTerm(const Frame& frame) {
    const SymbolicOp op = frame.node->op();
    std::int64_t low = minusInfinite;
    std::int64_t high = plusInfinite;
    if (op == SymbolicOp::Modulo) {
        if (const auto divisor = constantOf(operand(frame, 1)); divisor && *divisor != 0) {
            high = std::abs(*divisor) - 1;
            low = -high;
        }
    } else if (op == SymbolicOp::BitAnd) {
        for (const std::size_t at : {0U, 1U}) {
            if (const auto mask = constantOf(operand(frame, at)); mask && *mask >= 0) {
                low = 0;
                high = std::min(high, *mask);
            }
        }
        if (low == 0) {
            Value value = term(frame.id, low, high);
            unknowns_.setMask(value.cases.front().form.parts.front().unknown, high);
            return zeroTested(frame, std::move(value));
        }
    }
    return zeroTested(frame, term(frame.id, low, high));
}

/// Adds what is known of where a term is 0: a product where a factor is, bits joined by | where all are, bits joined by
/// & at least where an operand is.
ConditionReader::Value ConditionReader::zeroTested(const Frame& frame, Value value) {
    const SymbolicOp op = frame.node->op();
    if (op != SymbolicOp::Multiply && op != SymbolicOp::BitOr && op != SymbolicOp::BitAnd)
        return value;
    const Diagram a = truthOf(operands_[frame.firstOperand]);
    const Diagram b = truthOf(operands_[frame.firstOperand + 1]);
    if (op == SymbolicOp::BitOr) {
        value.nonZero = diagrams_.either(a, b);
        return value;
    }
    const Diagram both = diagrams_.both(a, b);
    if (op == SymbolicOp::Multiply) {
        value.nonZero = both;
        return value;
    }
    Value cases{Value::Kind::Number, never, 0, {}, {}};
    addCase(cases.cases, both, value.cases.front().form);
    addCase(cases.cases, opposite(both), {});
    return cases;
}

ConditionReader::Value ConditionReader::term(SymbolicExprId node, std::int64_t low, std::int64_t high) {
    Value value{Value::Kind::Number, never, 0, {}, {}};
    value.cases.push_back({always, {{{unknowns_.term(node, low, high), 1}}, 0}});
    return value;
}

} // namespace VT
