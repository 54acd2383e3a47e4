#include "tests/support/oracles/ExactValue.hpp"

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
        return std::fabs(b) < limits::zeroThreshold ? std::nullopt : realIf(std::fma(a / b, b, -a) == 0, a / b);
    default: // bits of reals, remainders
        return std::nullopt;
    }
}

} // namespace

ExactValue::ExactValue(const SymbolicExprTable& table, SymbolicExprId root, Quotients quotients)
    : steps_(stepsOf(table, root, false, quotients == Quotients::ByContext)) {
    for (Step& step : steps_) {
        if (step.op != Op::String)
            continue;
        const std::string name = static_cast<const SymbolicString&>(*table.get(step.id)).getName();
        if (name == "true" || name == "false") {
            step.op = Op::IntValue;
            step.literal = name == "true" ? 1 : 0;
        } else {
            step.name = name;
        }
    }
}

std::optional<ExactNumber> ExactValue::compute(const Step& step, const std::vector<ExactNumber>& values) const {
    const auto input = [&](std::size_t i) { return i < step.inputs.size() ? values[step.inputs[i]] : ExactNumber{}; };
    const ExactNumber a = input(0);
    const ExactNumber b = input(1);
    const auto ofIntegers = [&](std::int64_t x, std::int64_t y) -> std::optional<ExactNumber> {
        const std::optional<std::int64_t> value = computed(step.op, x, y);
        return value ? integer(*value) : std::nullopt;
    };
    if (comparisonOps.contains(step.op)) {
        const bool near = a.real != b.real && std::fabs(a.real - b.real) < limits::zeroThreshold;
        return near ? std::nullopt : ofIntegers(a.real < b.real ? -1 : a.real > b.real ? 1 : 0, 0);
    }
    switch (step.op) {
    case Op::IntValue:
        return integer(static_cast<std::int64_t>(step.literal));
    case Op::DoubleValue:
        return realIf(true, step.literal);
    case Op::And:
    case Op::SingleAnd:
    case Op::Or:
    case Op::SingleOr:
    case Op::Not:
        return ofIntegers(a.holds() ? 1 : 0, b.holds() ? 1 : 0);
    case Op::FcnCall1U:
    case Op::FcnCall:
        return integer(static_cast<std::int64_t>(std::fmod(b.real * 7 + 3, 5)));
    default:
        break;
    }
    if (step.op == Op::UnaryMinus && a.isReal)
        return realIf(true, -a.real);
    if (a.isReal || b.isReal)
        return ofReals(step.op, a.real, b.real);
    if ((step.op == Op::ShiftLeft || step.op == Op::ShiftRight) && b.real > 31)
        return std::nullopt;
    if (step.op == Op::Divide && b.real != 0 && std::fmod(a.real, b.real) != 0) {
        if (!step.inTruth)
            return ofReals(Op::Divide, a.real, b.real);
        tookRemainder_ = true;
    }
    return ofIntegers(static_cast<std::int64_t>(a.real), static_cast<std::int64_t>(b.real));
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
