// Syntax values: the result of reading a condition, before it becomes nodes.
#pragma once

#include "base/core/Operators.hpp"
#include "base/util/Arena.hpp"

#include <cstddef>
#include <cstdint>
#include <string_view>
#include <type_traits>
#include <variant>

namespace VT::Parser {

struct expression_ast;
struct expression_list;
struct binary_op;
struct unary_op;

/// A syntax value.  Compound values refer to parts that their SyntaxArena owns and a text is a range of the parsed
/// text, so a value is copied and destroyed in constant time, however deep it is.
struct expression_ast : std::variant<std::monostate,         // nothing
                                     std::int32_t,           // integer literal
                                     double,                 // real literal
                                     std::string_view,       // identifier or keyword
                                     const expression_ast*,  // nested value
                                     const expression_list*, // bracket list, arguments of a call
                                     const binary_op*, const unary_op*> {
    using variant::variant;
};

static_assert(std::is_trivially_copyable_v<expression_ast> && std::is_trivially_destructible_v<expression_ast>);

struct list_item {
    expression_ast value;
    list_item* next = nullptr;
};

/// The elements of a list, in order.
struct expression_list {
    list_item* first = nullptr;
    list_item* last = nullptr;
    std::size_t size = 0;
};

/// An infix operator; MemberValue with owner and name; FcnCall2U, whatever their number, with callee and list of
/// arguments.
struct binary_op {
    SymbolicOp op;
    expression_ast left;
    expression_ast right;
};

/// A prefix operator; FcnCall0U with the callee.
struct unary_op {
    SymbolicOp op;
    expression_ast operand;
};

/// The infix operators of the condition grammar.  Their spellings and strengths are those of the operator table.
inline constexpr OperatorSet conditionInfixOps{SymbolicOp::Or,          SymbolicOp::And,
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

static_assert((conditionInfixOps | quillInfixOps) == infixOps && (conditionInfixOps & quillInfixOps) == OperatorSet(),
              "say of every infix operator whether the condition grammar reads it");

/// Owns the parts of syntax values and frees them together.
class SyntaxArena {
public:
    // Every operation throws std::bad_alloc when memory runs out.

    expression_ast unary(SymbolicOp op, const expression_ast& operand) { return make<unary_op>(op, operand); }

    expression_ast binary(SymbolicOp op, const expression_ast& left, const expression_ast& right) {
        return make<binary_op>(op, left, right);
    }

    /// Appends an element to a list; nullptr is the empty list.
    expression_list* append(expression_list* list, const expression_ast& element) {
        if (list == nullptr)
            list = make<expression_list>();
        auto* item = make<list_item>(element);
        (list->first == nullptr ? list->first : list->last->next) = item;
        list->last = item;
        ++list->size;
        return list;
    }

private:
    template <class Part, class... Fields>
    Part* make(const Fields&... fields) {
        static_assert(std::is_trivially_destructible_v<Part> && alignof(Part) <= Arena::alignment);
        return new (arena_.allocate(sizeof(Part))) Part{fields...};
    }

    Arena arena_;
};

} // namespace VT::Parser
