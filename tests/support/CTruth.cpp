#include "tests/support/CTruth.hpp"

#include <limits>
#include <stdexcept>

namespace VT::Testing {

CTruth::CTruth(const SymbolicExprTable& table, SymbolicExprId root) {
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
        Step step{node.op(), 0, {}, {}};
        for (std::size_t i = 0; i < node.getNumInputs(); ++i)
            step.inputs.push_back(known.at(node.getInput(i)));
        if (node.op() == SymbolicOp::IntValue)
            step.literal = static_cast<const SymbolicIntValue&>(node).getValue();
        else if (node.op() == SymbolicOp::String)
            names_.push_back(step.name = static_cast<const SymbolicString&>(node).getName());
        else if (node.op() == SymbolicOp::MemberValue)
            names_.push_back(step.name = steps_[step.inputs[0]].name + "." +
                                         static_cast<const SymbolicMemberValue&>(node).getMemberName());
        else if (callOps.contains(node.op())) {
            step.name = steps_[step.inputs[0]].name;
            if (step.name == "defined")
                step.name = "defined " + steps_[step.inputs.at(1)].name;
            else
                functions_.push_back(step.name);
        }
        steps_.push_back(std::move(step));
    }
}

std::optional<std::int64_t> CTruth::compute(SymbolicOp op, std::int64_t a, std::int64_t b) {
    const bool isShift = b >= 0 && b < 32;
    const bool isQuotient =
        b != 0 && a / b <= std::numeric_limits<std::int32_t>::max(); // a % b is undefined with a / b
    switch (op) {
    case SymbolicOp::Plus:
        return a + b;
    case SymbolicOp::Minus:
        return a - b;
    case SymbolicOp::UnaryMinus:
        return -a;
    case SymbolicOp::Multiply:
        return a * b;
    case SymbolicOp::Divide:
        return isQuotient ? std::optional(a / b) : std::nullopt;
    case SymbolicOp::Modulo:
        return isQuotient ? std::optional(a % b) : std::nullopt;
    case SymbolicOp::Equal:
        return a == b;
    case SymbolicOp::NotEqual:
        return a != b;
    case SymbolicOp::LessThan:
        return a < b;
    case SymbolicOp::LessThanEqual:
        return a <= b;
    case SymbolicOp::GreaterThan:
        return a > b;
    case SymbolicOp::GreaterThanEqual:
        return a >= b;
    case SymbolicOp::SingleAnd:
        return a != 0 && b != 0;
    case SymbolicOp::SingleOr:
        return a != 0 || b != 0;
    case SymbolicOp::Not:
        return a == 0;
    case SymbolicOp::BitAnd:
        return a & b;
    case SymbolicOp::BitOr:
        return a | b;
    case SymbolicOp::BitXOr:
        return a ^ b;
    case SymbolicOp::BitCompl:
        return ~a;
    case SymbolicOp::ShiftLeft:
        return isShift ? std::optional(a * (std::int64_t{1} << b)) : std::nullopt;
    case SymbolicOp::ShiftRight:
        return isShift ? std::optional(a >> b) : std::nullopt;
    default:
        throw std::logic_error("C has no " + std::string(operatorInfo(op).className));
    }
}

std::optional<std::int64_t> CTruth::under(const Assignment& assignment) const {
    std::vector<std::optional<std::int64_t>> values;
    values.reserve(steps_.size());
    for (const Step& step : steps_) {
        const auto in = [&](std::size_t i) { return i < step.inputs.size() ? values[step.inputs[i]] : std::nullopt; };
        std::optional<std::int64_t> value;
        if (step.op == SymbolicOp::IntValue) {
            value = step.literal;
        } else if (step.name.starts_with("defined ")) {
            value = assignment.contains(step.name.substr(8)) ? 1 : 0;
        } else if (!step.name.empty()) {
            const auto found = assignment.find(step.name);
            value = found != assignment.end() ? found->second : (step.name == "true" ? 1 : 0);
        } else if (step.op == SymbolicOp::And || step.op == SymbolicOp::Or) {
            const bool decides = step.op == SymbolicOp::Or;
            if (in(0) && (*in(0) != 0) == decides)
                value = decides ? 1 : 0;
            else if (in(0) && in(1))
                value = *in(1) != 0 ? 1 : 0;
        } else if (in(0) && (in(1) || step.inputs.size() == 1)) {
            value = compute(step.op, *in(0), in(1).value_or(0));
        }
        if (value && *value != static_cast<std::int32_t>(*value))
            value.reset();
        values.push_back(value);
    }
    return values.back();
}

} // namespace VT::Testing
