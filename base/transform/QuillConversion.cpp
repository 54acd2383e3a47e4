// Converts between the two shapes of one operation: the C operator and the call of a Quill function.
//
// Method: one rebuilding pass in each direction.  Names of functions are compared as identifiers.
// Cost: linear in the distinct nodes.
// Relies on: QuillCalls for names and for the amounts of shifts.
#include "base/transform/QuillConversion.hpp"

#include "base/core/Make.hpp"

#include <algorithm>
#include <boost/container/small_vector.hpp>
#include <string>

namespace VT {

QuillCallVisitor::QuillCallVisitor(SymbolicExprTable& target) : SymbolicExprXFormVisitor(target) {
    std::ranges::transform(quillCalls, names_.begin(), [&](SymbolicOp op) {
        return factory_.make<SymbolicString>(std::string(operatorInfo(op).quillCall));
    });
}

SymbolicExprId QuillCallVisitor::nameOf(SymbolicOp op) const {
    const auto call = std::ranges::find(quillCalls, quillCallLeader(op));
    return names_[static_cast<std::size_t>(call - quillCalls.begin())];
}

SymbolicOp QuillCallVisitor::operatorOf(SymbolicExprId name, std::size_t arguments) const {
    const auto known = std::ranges::find(names_, name);
    if (known == names_.end())
        return SymbolicOp::None;
    const SymbolicOp op = quillCalls[static_cast<std::size_t>(known - names_.begin())];
    return quillCallArguments(op) == arguments ? op : SymbolicOp::None;
}

SymbolicExprId QuillCallVisitor::make(const ShiftAmount& amount) {
    switch (amount.form) {
    case ShiftAmount::Form::Literal:
        return factory_.make<SymbolicIntValue>(amount.literal);
    case ShiftAmount::Form::Negated:
        return factory_.make<SymbolicUnaryMinusExpr>(amount.expression);
    case ShiftAmount::Form::Expression:
        break;
    }
    return amount.expression;
}

// Quill to C.

void SymbolicExprQ2CVisitor::visit(const SymbolicFcnCall0UExpr& node) {
    convert(node);
}

void SymbolicExprQ2CVisitor::visit(const SymbolicFcnCall1UExpr& node) {
    convert(node);
}

void SymbolicExprQ2CVisitor::visit(const SymbolicFcnCall2UExpr& node) {
    convert(node);
}

void SymbolicExprQ2CVisitor::visit(const SymbolicFcnCallExpr& node) {
    convert(node);
}

template <class Call>
void SymbolicExprQ2CVisitor::convert(const Call& node) {
    if (lacksOperand(node))
        return SymbolicExprXFormVisitor::visit(node);
    boost::container::small_vector<SymbolicExprId, 4> inputs(node.getNumInputs());
    for (std::size_t i = inputs.size(); i-- > 0;)
        inputs[i] = pop();
    if (!inputs.empty()) {
        const std::span<const SymbolicExprId> arguments(inputs.data() + 1, inputs.size() - 1);
        const SymbolicOp op = operatorOf(inputs.front(), arguments.size());
        if (op != SymbolicOp::None) {
            push(build(op, arguments));
            return;
        }
    }
    for (const SymbolicExprId input : inputs)
        push(input);
    SymbolicExprXFormVisitor::visit(node);
}

/// The C operator on the arguments.
SymbolicExprId SymbolicExprQ2CVisitor::build(SymbolicOp op, std::span<const SymbolicExprId> arguments) {
    if (arguments.size() == 1)
        return makeUnary(table(), op, arguments[0]);
    if (op != SymbolicOp::ShiftLeft)
        return makeBinary(table(), op, arguments[0], arguments[1]);
    const CShift shift = shiftOfQuillCall(table(), arguments[1]);
    return makeBinary(table(), shift.op, arguments[0], make(shift.amount));
}

// C to Quill.

/// Replaces the results of the operands by the call that stands for the operator.
void SymbolicExprC2QVisitor::callFor(SymbolicOp op) {
    SymbolicExprId last = pop();
    if (quillCallArguments(op) == 1)
        return push(factory_.make<SymbolicFcnCall1UExpr>(nameOf(op), last));
    if (op == SymbolicOp::ShiftLeft || op == SymbolicOp::ShiftRight)
        last = make(quillShiftAmount(table(), op, last));
    const SymbolicExprId first = pop();
    push(factory_.make<SymbolicFcnCall2UExpr>(nameOf(op), first, last));
}

// Drivers.

SymbolicExprId SymbolicExprQ2C::operator()(SymbolicExprId id) const {
    // Asked before the visitor interns its names, which may take the very next identifiers.
    return table_.has(id) ? SymbolicExprQ2CVisitor(table_).rebuild(table_, id) : invalidId;
}

SymbolicExprId SymbolicExprC2Q::operator()(SymbolicExprId id) const {
    return table_.has(id) ? SymbolicExprC2QVisitor(table_).rebuild(table_, id) : invalidId;
}

} // namespace VT
