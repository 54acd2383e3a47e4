// What an expression is worth where integers, reals and truth values are operands of each other.
#pragma once

#include "tests/support/Truth.hpp"

#include <cmath>
#include <optional>
#include <string>

namespace VT::Testing {

/// The value of an expression under an assignment, without any rule of the library.  Truth values are 0 and 1.  Below
/// an operator of truth values a quotient of integers is truncated; elsewhere it is exact.  A call f(x) has the value
/// 3*x + 1, so that it counts what it is called with.  Nothing where a value is not defined or no double holds it.
class Meaning {
public:
    Meaning(const SymbolicExprTable& table, const Assignment& assignment) : table_(table), assignment_(assignment) {}

    [[nodiscard]] std::optional<double> of(SymbolicExprId id) const {
        const std::optional<Value> value = compute(id, false);
        return value ? std::optional(value->number) : std::nullopt;
    }

private:
    struct Value {
        double number;
        bool real = false;
    };

    // NOLINTNEXTLINE(misc-no-recursion): test trees are small
    [[nodiscard]] std::optional<Value> compute(SymbolicExprId id, bool inCondition) const {
        using Op = SymbolicOp;
        const SymbolicExpr& node = *table_.get(id);
        const Op op = node.op();
        if (op == Op::String) {
            const std::string name = static_cast<const SymbolicString&>(node).getName();
            if (name == "true" || name == "false")
                return Value{name == "true" ? 1.0 : 0.0};
            return Value{static_cast<double>(assignment_.at(name))};
        }
        if (node.isNumValue())
            return Value{node.getNumValue(), op == Op::DoubleValue};
        const bool below = inCondition || booleanOps.contains(op);
        const auto a = compute(node.getInput(callOps.contains(op) ? 1 : 0), below);
        const auto b = node.isBinaryExpr() && !callOps.contains(op) ? compute(node.getInput(1), below) : a;
        if (!a || !b)
            return std::nullopt;
        const bool real = a->real || b->real;
        const double x = a->number, y = b->number;
        const auto exact = [&](double value) -> std::optional<Value> {
            return std::fabs(value) < 0x1p40 ? std::optional(Value{value, real}) : std::nullopt;
        };
        switch (op) {
        case Op::FcnCall1U:
            return exact(3 * x + 1);
        case Op::Plus:
            return exact(x + y);
        case Op::Minus:
            return exact(x - y);
        case Op::UnaryMinus:
            return exact(-x);
        case Op::Multiply:
            return exact(x * y);
        case Op::Divide:
            if (y == 0 || (!(below && !real) && x / y * 64 != std::floor(x / y * 64)))
                return std::nullopt;
            return exact(below && !real ? std::trunc(x / y) : x / y);
        case Op::Equal:
            return Value{x == y ? 1.0 : 0};
        case Op::NotEqual:
            return Value{x != y ? 1.0 : 0};
        case Op::LessThan:
            return Value{x < y ? 1.0 : 0};
        case Op::LessThanEqual:
            return Value{x <= y ? 1.0 : 0};
        case Op::GreaterThan:
            return Value{x > y ? 1.0 : 0};
        case Op::GreaterThanEqual:
            return Value{x >= y ? 1.0 : 0};
        case Op::And:
        case Op::SingleAnd:
            return Value{x != 0 && y != 0 ? 1.0 : 0};
        case Op::Or:
        case Op::SingleOr:
            return Value{x != 0 || y != 0 ? 1.0 : 0};
        case Op::Not:
            return Value{x == 0 ? 1.0 : 0};
        case Op::Modulo:
        case Op::BitXOr:
            if (real || (op == Op::Modulo && y == 0))
                return std::nullopt;
            return op == Op::Modulo
                       ? exact(std::fmod(x, y))
                       : exact(static_cast<double>(static_cast<std::int64_t>(x) ^ static_cast<std::int64_t>(y)));
        default:
            return std::nullopt;
        }
    }

    const SymbolicExprTable& table_;
    const Assignment& assignment_;
};

} // namespace VT::Testing
