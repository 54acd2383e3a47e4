// What the condition grammar makes of an operator and its operands.
#pragma once

#include "parser/SyntaxValue.hpp"

namespace VT::Parser {

/// The infix operators of the condition grammar.  Their spellings and strengths are those of the operator table.
inline constexpr OperatorSet grammarInfixOps{SymbolicOp::Or,          SymbolicOp::And,
                                             SymbolicOp::BitOr,       SymbolicOp::BitXOr,
                                             SymbolicOp::BitAnd,      SymbolicOp::Equal,
                                             SymbolicOp::NotEqual,    SymbolicOp::LessThanEqual,
                                             SymbolicOp::LessThan,    SymbolicOp::GreaterThanEqual,
                                             SymbolicOp::GreaterThan, SymbolicOp::ShiftRight,
                                             SymbolicOp::ShiftLeft,   SymbolicOp::Plus,
                                             SymbolicOp::Minus,       SymbolicOp::Multiply,
                                             SymbolicOp::Divide,      SymbolicOp::Modulo};

/// The infix operators that only Quill text has, whatever C spelling is printed for them.
inline constexpr OperatorSet quillInfixOps{SymbolicOp::Power,     SymbolicOp::DotPower, SymbolicOp::DotMul,
                                           SymbolicOp::DotDiv,    SymbolicOp::LDiv,     SymbolicOp::DotLDiv,
                                           SymbolicOp::SingleAnd, SymbolicOp::SingleOr};

static_assert((grammarInfixOps | quillInfixOps) == infixOps && (grammarInfixOps & quillInfixOps) == OperatorSet(),
              "say of every infix operator whether the condition grammar reads it");

/// Makes the syntax value of an operator with one operand.
template <SymbolicOp Op>
struct unary_expr {
    expression_ast operator()(SyntaxArena& arena, const expression_ast& operand) const {
        return arena.unary(Op, operand);
    }
};

/// Makes the syntax value of an operator with two operands.
template <SymbolicOp Op>
struct binary_expr {
    expression_ast operator()(SyntaxArena& arena, const expression_ast& left, const expression_ast& right) const {
        return arena.binary(Op, left, right);
    }
};

struct negate_expr : unary_expr<SymbolicOp::UnaryMinus> {};

struct not_expr : unary_expr<SymbolicOp::Not> {};

/// The complement; without C operators it becomes the logical not when nodes are made.
struct cmp_expr : unary_expr<SymbolicOp::BitCompl> {};

struct void_fcn_call_expr : unary_expr<SymbolicOp::FcnCall0U> {};

struct modulo_expr : binary_expr<SymbolicOp::Modulo> {};

/// The owner and the name of a member.
struct member_val : binary_expr<SymbolicOp::MemberValue> {};

/// The callee and the list of its arguments.
struct fcn_call_expr : binary_expr<SymbolicOp::FcnCall2U> {};

} // namespace VT::Parser
