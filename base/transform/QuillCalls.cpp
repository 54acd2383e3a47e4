// Which Quill function stands for which C operator, and how the amount of a shift reads in the other language.  All
// O(1).
//
// Quill's bitshift() shifts to the left by a positive amount and to the right by a negative one, so a C shift to the
// right negates its amount.  -2147483648 has no negative of 32 bits; shifting by one place less yields the same.
#include "base/transform/QuillCalls.hpp"

#include <limits>
#include <optional>

namespace VT {

namespace {

std::optional<int> negated(int value) {
    if (value == std::numeric_limits<int>::min())
        return std::nullopt;
    return -value;
}

/// The negative of a number of places.  No integer has 2147483648 bits, so a shift by one place less yields the same.
int opposite(int places) {
    return negated(places).value_or(std::numeric_limits<int>::max());
}

const SymbolicIntValue* asLiteral(const SymbolicExprTable& table, SymbolicExprId id) {
    const SymbolicExpr* const node = table.get(id);
    return node != nullptr && node->op() == SymbolicOp::IntValue ? static_cast<const SymbolicIntValue*>(node) : nullptr;
}

/// The operand of an unary minus that has one, or nothing.
std::optional<SymbolicExprId> operandOfMinus(const SymbolicExprTable& table, SymbolicExprId id) {
    const SymbolicExpr* const node = table.get(id);
    if (node == nullptr || node->op() != SymbolicOp::UnaryMinus || !table.hasOperand(id, node->getInput(0)))
        return std::nullopt;
    return node->getInput(0);
}

ShiftAmount expression(SymbolicExprId id) {
    return {ShiftAmount::Form::Expression, 0, id};
}

ShiftAmount literal(int value) {
    return {ShiftAmount::Form::Literal, value, invalidId};
}

ShiftAmount minus(SymbolicExprId id) {
    return {ShiftAmount::Form::Negated, 0, id};
}

/// The names live in a table because nodes are made by interning only.
class CallNames {
public:
    CallNames() {
        for (const SymbolicOp op : quillCalls)
            SymbolicString(table_, std::string(operatorInfo(op).quillCall));
    }

    [[nodiscard]] const SymbolicString& name(SymbolicOp op) const {
        SymbolicExprId id = 0;
        while (quillCalls[id] != quillCallLeader(op))
            ++id;
        return static_cast<const SymbolicString&>(*table_.get(id));
    }

private:
    SymbolicExprTable table_;
};

} // namespace

const SymbolicString& quillCallName(SymbolicOp op) {
    static const CallNames names;
    return names.name(op);
}

CShift shiftOfQuillCall(const SymbolicExprTable& table, SymbolicExprId amount) {
    if (const SymbolicIntValue* const value = asLiteral(table, amount)) {
        if (value->getValue() >= 0)
            return {SymbolicOp::ShiftLeft, expression(amount)};
        return {SymbolicOp::ShiftRight, literal(opposite(value->getValue()))};
    }
    const std::optional<SymbolicExprId> operand = operandOfMinus(table, amount);
    if (!operand)
        return {SymbolicOp::ShiftLeft, expression(amount)};
    if (const SymbolicIntValue* const value = asLiteral(table, *operand); value != nullptr && value->getValue() <= 0)
        return {SymbolicOp::ShiftLeft, literal(opposite(value->getValue()))};
    return {SymbolicOp::ShiftRight, expression(*operand)};
}

ShiftAmount quillShiftAmount(const SymbolicExprTable& table, SymbolicOp shift, SymbolicExprId amount) {
    const bool right = shift == SymbolicOp::ShiftRight;
    if (const SymbolicIntValue* const value = asLiteral(table, amount)) {
        if (!right)
            return expression(amount);
        const std::optional<int> opposite = negated(value->getValue());
        return opposite ? literal(*opposite) : minus(amount);
    }
    const std::optional<SymbolicExprId> operand = operandOfMinus(table, amount);
    if (right)
        return operand ? expression(*operand) : minus(amount);
    if (const SymbolicIntValue* const value = operand ? asLiteral(table, *operand) : nullptr)
        if (const std::optional<int> opposite = negated(value->getValue()))
            return literal(*opposite);
    return expression(amount);
}

} // namespace VT
