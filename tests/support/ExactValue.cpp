#include "tests/support/ExactValue.hpp"

#include "base/core/Limits.hpp"

#include <algorithm>
#include <cmath>
#include <limits>

namespace VT::Testing {

namespace {

using Op = SymbolicOp;

std::optional<ExactNumber> integer(std::int64_t value) {
    if (value < std::numeric_limits<std::int32_t>::min() || value > std::numeric_limits<std::int32_t>::max())
        return std::nullopt;
    return ExactNumber{static_cast<double>(value)};
}

ExactNumber truth(bool value) {
    return {value ? 1.0 : 0.0, false, true};
}

std::optional<ExactNumber> realIf(bool exact, double value) {
    return exact && std::isfinite(value) ? std::optional(ExactNumber{value, true}) : std::nullopt;
}

/// Whether nothing was rounded (Knuth's error term of a sum, and the remainder of a fused multiplication).
std::optional<ExactNumber> ofReals(Op op, double a, double b) { // NOLINT(misc-no-recursion): once, for a difference
    switch (op) {
    case Op::Plus: {
        const double sum = a + b;
        const double virtualB = sum - a;
        return realIf((a - (sum - virtualB)) + (b - virtualB) == 0, sum);
    }
    case Op::Minus:
        return ofReals(Op::Plus, a, -b);
    case Op::Multiply:
        return realIf(std::fma(a, b, -(a * b)) == 0, a * b);
    case Op::Divide:
        return realIf(std::fabs(b) >= limits::zeroThreshold && std::fma(a / b, b, -a) == 0, a / b);
    default: // bits of reals, remainders
        return std::nullopt;
    }
}

} // namespace

ExactValue::ExactValue(const SymbolicExprTable& table, SymbolicExprId root) {
    std::map<SymbolicExprId, std::size_t> known; // operands have smaller identifiers than their node
    std::vector<SymbolicExprId> pending{root};
    while (!pending.empty()) {
        const SymbolicExprId id = pending.back();
        pending.pop_back();
        if (known.emplace(id, 0).second)
            for (std::size_t i = 0; i < table.get(id)->getNumInputs(); ++i)
                pending.push_back(table.get(id)->getInput(i));
    }
    for (auto& [id, position] : known) {
        const SymbolicExpr& node = *table.get(id);
        position = steps_.size();
        Step step{node.op(), {}, {}, {}};
        for (std::size_t i = 0; i < node.getNumInputs(); ++i)
            step.inputs.push_back(known.at(node.getInput(i)));
        if (node.isNumValue())
            step.literal = {node.getNumValue(), node.op() == Op::DoubleValue};
        if (node.op() == Op::String) {
            step.name = static_cast<const SymbolicString&>(node).getName();
            if (step.name == "true" || step.name == "false")
                step = {Op::IntValue, truth(step.name == "true"), {}, {}};
            else
                names_.push_back(step.name);
        }
        steps_.push_back(std::move(step));
    }
}

std::optional<ExactNumber> ExactValue::ofIntegers(Op op, std::int64_t a, std::int64_t b) const {
    switch (op) {
    case Op::Plus:
        return integer(a + b);
    case Op::Minus:
        return integer(a - b);
    case Op::Multiply:
        return integer(a * b);
    case Op::Divide:
        if (b == 0)
            return std::nullopt;
        tookRemainder_ = tookRemainder_ || a % b != 0;
        return integer(a / b);
    case Op::Modulo:
        return b == 0 ? std::nullopt : integer(a % b);
    case Op::BitAnd:
        return integer(a & b);
    case Op::BitOr:
        return integer(a | b);
    case Op::BitXOr:
        return integer(a ^ b);
    case Op::ShiftLeft:
        return b < 0 || b > 31 ? std::nullopt : integer(a * (std::int64_t{1} << b));
    case Op::ShiftRight:
        return b < 0 || b > 31 ? std::nullopt : integer(a >> b);
    default:
        return std::nullopt;
    }
}

std::optional<ExactNumber> ExactValue::compute(const Step& step, const std::vector<ExactNumber>& values) const {
    const auto input = [&](std::size_t i) { return values[step.inputs[i]]; };
    const ExactNumber a = step.inputs.empty() ? step.literal : input(0);
    const ExactNumber b = step.inputs.size() < 2 ? ExactNumber{} : input(1);
    const auto compared = [&](bool result) -> std::optional<ExactNumber> {
        const bool near = a.real != b.real && std::fabs(a.real - b.real) < limits::zeroThreshold;
        return near ? std::nullopt : std::optional(truth(result));
    };
    switch (step.op) {
    case Op::IntValue:
    case Op::DoubleValue:
        return std::isfinite(a.real) ? std::optional(a) : std::nullopt;
    case Op::Equal:
        return compared(a.real == b.real);
    case Op::NotEqual:
        return compared(a.real != b.real);
    case Op::LessThan:
        return compared(a.real < b.real);
    case Op::LessThanEqual:
        return compared(a.real <= b.real);
    case Op::GreaterThan:
        return compared(a.real > b.real);
    case Op::GreaterThanEqual:
        return compared(a.real >= b.real);
    case Op::And:
    case Op::SingleAnd:
        return truth(a.holds() && b.holds());
    case Op::Or:
    case Op::SingleOr:
        return truth(a.holds() || b.holds());
    case Op::Not:
        return truth(!a.holds());
    case Op::UnaryMinus:
        return a.isReal ? realIf(true, -a.real) : integer(-static_cast<std::int64_t>(a.real));
    case Op::BitCompl:
        return a.isReal ? std::nullopt : integer(~static_cast<std::int64_t>(a.real));
    case Op::FcnCall1U:
    case Op::FcnCall:
        return integer(static_cast<std::int64_t>(std::fmod(b.real * 7 + 3, 5)));
    default:
        if (a.isReal || b.isReal)
            return ofReals(step.op, a.real, b.real);
        return ofIntegers(step.op, static_cast<std::int64_t>(a.real), static_cast<std::int64_t>(b.real));
    }
}

std::optional<ExactNumber> ExactValue::under(const Assignment& assignment) const {
    tookRemainder_ = false;
    std::vector<ExactNumber> values;
    values.reserve(steps_.size());
    for (const Step& step : steps_) {
        if (step.op == Op::String) {
            const auto value = assignment.find(step.name);
            values.push_back({value == assignment.end() ? 0.0 : static_cast<double>(value->second)});
            continue;
        }
        const std::optional<ExactNumber> value = compute(step, values);
        if (!value)
            return std::nullopt;
        values.push_back(*value);
    }
    return values.back();
}

} // namespace VT::Testing
