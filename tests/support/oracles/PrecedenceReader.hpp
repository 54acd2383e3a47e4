// A precedence parser for conditions in one pass: an independent reading for the tests of the grammar.
#pragma once

#include "base/core/Operators.hpp"

#include <charconv>
#include <string_view>

namespace VT::Testing {

/// Makes the nodes of a builder: `intern` an operator with one or two operands, `name`, `integer` and `real`.  Lists
/// are Rows of one and the rest, a call is a FcnCall of a name and perhaps a list, a member a MemberValue of two names.
/// Answers Builder::none for a text that is no condition.  Recurses.
template <class Builder>
class PrecedenceReader {
public:
    using Node = typename Builder::Node;

    PrecedenceReader(Builder& builder, std::string_view text)
        : builder_(builder),
          at_(text.data()),
          end_(text.data() + text.size()) {}

    Node run() {
        const Node id = expression(1);
        skipBlanks();
        return at_ == end_ ? id : none;
    }

private:
    static constexpr auto& none = Builder::none;

    struct Infix {
        int strength = 0; // 0 stands for no operator; a greater number binds tighter
        int length = 0;
        SymbolicOp op = SymbolicOp::None;
    };

    // NOLINTBEGIN(misc-no-recursion): only texts that are not deep are read

    Node expression(int weakest) {
        Node left = prefixed();
        while (left != none) {
            const Infix next = infix();
            if (next.strength < weakest || next.strength == 0)
                break;
            at_ += next.length;
            const Node right = expression(next.strength + 1);
            if (right == none)
                return none;
            left = builder_.intern(next.op, left, right);
        }
        return left;
    }

    Infix infix() {
        skipBlanks();
        const char next = peek(1);
        switch (peek()) {
        case '|':
            return next == '|' ? Infix{1, 2, SymbolicOp::Or} : Infix{3, 1, SymbolicOp::BitOr};
        case '&':
            return next == '&' ? Infix{2, 2, SymbolicOp::And} : Infix{5, 1, SymbolicOp::BitAnd};
        case '^':
            return {4, 1, SymbolicOp::BitXOr};
        case '=':
            return next == '=' ? Infix{6, 2, SymbolicOp::Equal} : Infix{};
        case '!':
            return next == '=' ? Infix{6, 2, SymbolicOp::NotEqual} : Infix{};
        case '~':
            return next == '=' && !builder_.cOperators() ? Infix{6, 2, SymbolicOp::NotEqual} : Infix{};
        case '<':
            return next == '='   ? Infix{7, 2, SymbolicOp::LessThanEqual}
                   : next == '<' ? Infix{8, 2, SymbolicOp::ShiftLeft}
                                 : Infix{7, 1, SymbolicOp::LessThan};
        case '>':
            return next == '='   ? Infix{7, 2, SymbolicOp::GreaterThanEqual}
                   : next == '>' ? Infix{8, 2, SymbolicOp::ShiftRight}
                                 : Infix{7, 1, SymbolicOp::GreaterThan};
        case '+':
            return {9, 1, SymbolicOp::Plus};
        case '-':
            return {9, 1, SymbolicOp::Minus};
        case '*':
            return {10, 1, SymbolicOp::Multiply};
        case '/':
            return {10, 1, SymbolicOp::Divide};
        case '%':
            return {10, 1, SymbolicOp::Modulo};
        default:
            return {};
        }
    }

    Node prefixed() {
        skipBlanks();
        SymbolicOp op = SymbolicOp::None;
        switch (peek()) {
        case '!':
            op = SymbolicOp::Not;
            break;
        case '~':
            op = builder_.cOperators() ? SymbolicOp::BitCompl : SymbolicOp::Not;
            break;
        case '-':
            if (isDigit(peek(1)) || (peek(1) == '.' && isDigit(peek(2))))
                return number();
            op = SymbolicOp::UnaryMinus;
            break;
        case '+':
            ++at_;
            return prefixed();
        default:
            return operand();
        }
        ++at_;
        const Node inner = prefixed();
        return inner == none ? none : builder_.intern(op, inner, none);
    }

    Node operand() {
        const char c = peek();
        if (isLetter(c))
            return named();
        if (isDigit(c) || c == '.')
            return number();
        if (c != '(' && c != '[')
            return none;
        for (const std::string_view keyword : {"(sim)", "(codegen)"})
            if (builder_.keywords() && std::string_view(at_, end_).starts_with(keyword)) {
                at_ += keyword.size();
                return builder_.name(keyword);
            }
        ++at_;
        const Node inner = c == '(' ? expression(1) : list();
        skipBlanks();
        if (inner == none || peek() != (c == '(' ? ')' : ']'))
            return none;
        ++at_;
        return c == '(' ? inner : builder_.intern(SymbolicOp::DimsND, inner, none);
    }

    Node named() {
        Node id = builder_.name(word());
        skipBlanks();
        if (peek() == '(') {
            ++at_;
            skipBlanks();
            const bool empty = peek() == ')';
            const Node arguments = empty ? none : list();
            skipBlanks();
            if ((!empty && arguments == none) || peek() != ')')
                return none;
            ++at_;
            return builder_.intern(SymbolicOp::FcnCall, id, arguments);
        }
        for (; peek() == '.'; skipBlanks()) {
            ++at_;
            skipBlanks();
            if (!isLetter(peek()))
                return none;
            id = builder_.intern(SymbolicOp::MemberValue, id, builder_.name(word()));
        }
        return id;
    }

    /// Arguments as pairs of one and the rest.
    Node list() {
        const Node first = expression(1);
        skipBlanks();
        if (first == none || peek() != ',')
            return first;
        ++at_;
        const Node rest = list();
        return rest == none ? none : builder_.intern(SymbolicOp::Row, first, rest);
    }

    // NOLINTEND(misc-no-recursion)

    Node number() {
        int integer = 0;
        const auto [end, error] = std::from_chars(at_, end_, integer);
        if (error != std::errc::invalid_argument && (end == end_ || *end != '.')) {
            at_ = end;
            return error == std::errc() ? builder_.integer(integer) : none;
        }
        double real = 0;
        const auto [after, failure] = std::from_chars(at_, end_, real);
        if (failure != std::errc())
            return none;
        at_ = after;
        return builder_.real(real);
    }

    std::string_view word() {
        const char* start = at_;
        while (isLetter(peek()) || isDigit(peek()))
            ++at_;
        return {start, static_cast<std::size_t>(at_ - start)};
    }

    static bool isDigit(char c) { return c >= '0' && c <= '9'; }

    static bool isLetter(char c) { return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || c == '_'; }

    void skipBlanks() {
        while (at_ < end_ && (*at_ == ' ' || (*at_ >= '\t' && *at_ <= '\r')))
            ++at_;
    }

    [[nodiscard]] char peek(std::ptrdiff_t ahead = 0) const { return end_ - at_ > ahead ? at_[ahead] : '\0'; }

    Builder& builder_;
    const char* at_;
    const char* end_;
};

} // namespace VT::Testing
