// The semantic actions of the condition grammar: an operator and its operands become a syntax value.
#pragma once

#include "parser/SyntaxValue.hpp"

namespace VT::Parser {

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
