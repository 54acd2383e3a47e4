// Prints conditions for generated code.
#pragma once

#include "base/print/StringifySymbolicExpr.hpp"

namespace VT {

/// Prints a condition as the text after `#if`, or as its Quill counterpart, for readers who need not know how mixed
/// operators bind.
///
/// Every binary operator has a blank on each side.  A comparison wraps operands of its own precedence on both sides.
/// In C, members become flat macro names (A.B is A_B) and the constants `true` and `false` are written 1 and 0, so
/// that TRUE is `1` and not the empty text.  What a preprocessor cannot decide is printed all the same;
/// findCTextObstacles() reports it.
class VTSYM_API PreprocessorVCExpr : public StringifySymbolicExpr {
public:
    /// @param quillSyntax        Quill's spellings; those of C otherwise
    /// @param clarifyLogicalMix  parentheses between different logical operators: A || (B && C)
    explicit PreprocessorVCExpr(const SymbolicExprTable& table, bool quillSyntax, bool clarifyLogicalMix = false,
                                SymbolicExprPrinter::PredicateHandle predicate = {});

    using StringifySymbolicExpr::visit;
    void visit(const SymbolicString& node) override;
    void visit(const SymbolicMemberValue& node) override;

protected:
    [[nodiscard]] Delimiters isDelimitWithSpacesAndWrapParenthesis(const SymbolicOp& op, unsigned char precedence,
                                                                   OpAssociativity assoc, const Printed& lhs,
                                                                   const Printed& rhs) const override;
};

} // namespace VT
