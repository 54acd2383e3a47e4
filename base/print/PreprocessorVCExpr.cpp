// Prints conditions for generated code: what differs from the general printer, which are the truth constants, members,
// blanks and parentheses.  Costs what the general printer costs.
#include "base/print/PreprocessorVCExpr.hpp"

namespace VT {

namespace {

/// The logical operators whose mix with an operator is made clear by parentheses.
constexpr OperatorSet clarifiedUnder(SymbolicOp op) {
    switch (op) {
    case SymbolicOp::And:
        return {SymbolicOp::SingleAnd, SymbolicOp::SingleOr};
    case SymbolicOp::Or:
        return {SymbolicOp::And, SymbolicOp::SingleAnd, SymbolicOp::SingleOr};
    case SymbolicOp::SingleOr:
        return {SymbolicOp::SingleAnd};
    default:
        return {};
    }
}

} // namespace

PreprocessorVCExpr::PreprocessorVCExpr(const SymbolicExprTable& table, bool quillSyntax, bool clarifyLogicalMix,
                                       SymbolicExprPrinter::PredicateHandle predicate)
    : StringifySymbolicExpr(table, quillSyntax, clarifyLogicalMix, std::move(predicate)) {}

void PreprocessorVCExpr::visit(const SymbolicString& node) {
    std::string text = identifier(node);
    if (!isQuillSyntax() && (text == "true" || text == "false"))
        text = text == "true" ? "1" : "0";
    push(SymbolicOp::String, text, operatorInfo(SymbolicOp::String).precedence);
}

void PreprocessorVCExpr::visit(const SymbolicMemberValue& node) {
    constexpr const OperatorInfo& row = operatorInfo(SymbolicOp::MemberValue);
    push(SymbolicOp::String, node.getMemberName(), operatorInfo(SymbolicOp::String).precedence);
    appendBinary(row.op, isQuillSyntax() ? row.quill.data() : "_", row.precedence, row.associativity);
}

StringifySymbolicExpr::Delimiters PreprocessorVCExpr::isDelimitWithSpacesAndWrapParenthesis(const SymbolicOp& op,
                                                                                            unsigned char precedence,
                                                                                            OpAssociativity assoc,
                                                                                            const Printed& lhs,
                                                                                            const Printed& rhs) const {
    const bool relational = comparisonOps.contains(op);
    const OperatorSet clarified = hasSpacedLogicalOperators() ? clarifiedUnder(op) : OperatorSet();
    const auto wraps = [&](const Printed& operand, OpAssociativity side) {
        return operand.precedence > precedence || (operand.precedence == precedence && (relational || assoc == side)) ||
               clarified.contains(operand.op);
    };
    return {.wrapRight = wraps(rhs, OpAssociativity::Left),
            .wrapLeft = wraps(lhs, OpAssociativity::Right),
            .spaced = op != SymbolicOp::MemberValue};
}

} // namespace VT
