// Replaces operands inside an expression.
//
// Method: one rebuilding pass.  Before a node is rebuilt, its operands on the stack are looked up, once each; the form
// of the operator decides which of them may be replaced.
// Cost: linear in the distinct nodes and their operands.
#include "base/transform/Replacement.hpp"

#include <boost/container/small_vector.hpp>
#include <limits>

namespace VT {

namespace {

constexpr std::size_t noOperand = std::numeric_limits<std::size_t>::max();

/// The operand from which on those of an operator are replaced.
constexpr std::size_t firstReplaced(SymbolicOp op) {
    switch (operatorInfo(op).form) {
    case OperatorForm::Infix:
    case OperatorForm::Prefix:
    case OperatorForm::Postfix:
    case OperatorForm::Range:
    case OperatorForm::Row:
        return 0;
    case OperatorForm::Call:
        return 1;
    case OperatorForm::Leaf:
    case OperatorForm::Field:
    case OperatorForm::Brackets:
    case OperatorForm::Rows:
    case OperatorForm::Cell:
    case OperatorForm::Function:
        break;
    }
    return noOperand;
}

} // namespace

SymbolicExprReplacementVisitor::SymbolicExprReplacementVisitor(SymbolicExprTable& target,
                                                               const SymbolicExprReplacements& replacements)
    : SymbolicExprXFormVisitor(target),
      replacements_(replacements) {}

SymbolicExprId SymbolicExprReplacementVisitor::replacementOf(SymbolicExprId operand) {
    const auto found = replacements_.find(operand);
    if (operand == invalidId || found == replacements_.end() || !table().has(found->second))
        return operand;
    replaced_ = true;
    return found->second;
}

/// Replaces the operands on the stack.
template <class Node>
void SymbolicExprReplacementVisitor::replaceOperands(const Node& node) {
    boost::container::small_vector<SymbolicExprId, 4> operands(node.getNumInputs());
    for (std::size_t i = operands.size(); i-- > 0;)
        operands[i] = pop();
    for (std::size_t i = 0; i < operands.size(); ++i)
        push(i < firstReplaced(Node::code) ? operands[i] : replacementOf(operands[i]));
}

#define VTSYM_OPERATOR(Code, Name, Class, ...)                                                                         \
    void SymbolicExprReplacementVisitor::visit(const Class& node) {                                                    \
        if constexpr (firstReplaced(SymbolicOp::Name) != noOperand)                                                    \
            replaceOperands(node);                                                                                     \
        SymbolicExprXFormVisitor::visit(node);                                                                         \
    }
#include "base/core/operators.def"
#undef VTSYM_OPERATOR

SymbolicExprId SymbolicExprReplacement::operator()(SymbolicExprId id) {
    SymbolicExprReplacementVisitor visitor(table_, replacements_);
    const SymbolicExprId result = visitor.rebuild(table_, id);
    replaced_ = visitor.replaced();
    return result;
}

} // namespace VT
