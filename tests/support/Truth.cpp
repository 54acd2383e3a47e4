#include "tests/support/Truth.hpp"

#include "base/print/ExpressionPrinter.hpp"

#include <limits>
#include <stdexcept>

namespace VT::Testing {

Truth::Truth(const SymbolicExprTable& table, SymbolicExprId root, Arithmetic arithmetic) : arithmetic_(arithmetic) {
    const SymbolicExprPrinter printer(table, false);
    const auto isNamed = [](SymbolicOp op) {
        return op == SymbolicOp::String || op == SymbolicOp::MemberValue || callOps.contains(op);
    };
    std::map<SymbolicExprId, std::size_t> known; // operands have smaller identifiers than their node
    std::vector<SymbolicExprId> pending{root};
    while (!pending.empty()) {
        const SymbolicExprId id = pending.back();
        pending.pop_back();
        if (known.emplace(id, 0).second && !isNamed(table.get(id)->op()))
            for (std::size_t i = 0; i < table.get(id)->getNumInputs(); ++i)
                pending.push_back(table.get(id)->getInput(i));
    }
    for (auto& [id, position] : known) {
        const SymbolicExpr& node = *table.get(id);
        position = steps_.size();
        if (isNamed(node.op())) {
            steps_.push_back(named(node.op(), printer(id)));
            continue;
        }
        Step step{node.op()};
        for (std::size_t i = 0; i < node.getNumInputs(); ++i)
            step.inputs.push_back(known.at(node.getInput(i)));
        if (node.op() == SymbolicOp::IntValue)
            step.literal = static_cast<const SymbolicIntValue&>(node).getValue();
        steps_.push_back(std::move(step));
    }
}

Truth::Step Truth::named(SymbolicOp op, std::string text) {
    if (arithmetic_ == Arithmetic::C && callOps.contains(op)) {
        const std::size_t open = text.find('(');
        const std::string function = text.substr(0, open);
        names_.push_back(function == "defined" ? text.substr(open + 1, text.size() - open - 2) : function);
        if (function == "defined")
            return {op, 0, "defined " + names_.back()};
        functions_.push_back(function);
        return {op, 0, function};
    }
    names_.push_back(text);
    return {op, 0, std::move(text)};
}

std::optional<std::int64_t> Truth::compute(SymbolicOp op, std::int64_t a, std::int64_t b) const {
    const bool isShift = b >= 0 && b < 32;
    const bool isQuotient = // a % b is undefined with a / b
        b != 0 && (arithmetic_ == Arithmetic::Unbounded || a / b <= std::numeric_limits<std::int32_t>::max());
    const auto x = static_cast<std::uint64_t>(a);
    const auto y = static_cast<std::uint64_t>(b);
    switch (op) {
    case SymbolicOp::Plus:
        return static_cast<std::int64_t>(x + y);
    case SymbolicOp::Minus:
        return static_cast<std::int64_t>(x - y);
    case SymbolicOp::UnaryMinus:
        return static_cast<std::int64_t>(0 - x);
    case SymbolicOp::Multiply:
        return static_cast<std::int64_t>(x * y);
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
    case SymbolicOp::And:
    case SymbolicOp::SingleAnd:
        return a != 0 && b != 0;
    case SymbolicOp::Or:
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
        throw std::logic_error("no brute-force value of " + std::string(operatorInfo(op).className));
    }
}

std::optional<std::int64_t> Truth::under(const Assignment& assignment) const {
    const bool inC = arithmetic_ == Arithmetic::C;
    std::vector<std::optional<std::int64_t>> values;
    values.reserve(steps_.size());
    for (const Step& step : steps_) {
        const auto in = [&](std::size_t i) { return i < step.inputs.size() ? values[step.inputs[i]] : std::nullopt; };
        const bool decides = step.op == SymbolicOp::Or;
        std::optional<std::int64_t> value;
        if (step.op == SymbolicOp::IntValue) {
            value = step.literal;
        } else if (step.name.starts_with("defined ")) {
            value = assignment.contains(step.name.substr(8)) ? 1 : 0;
        } else if (!step.name.empty()) {
            const auto found = assignment.find(step.name);
            value = found != assignment.end() ? found->second : (step.name == "true" ? 1 : 0);
        } else if (inC && (decides || step.op == SymbolicOp::And) && in(0) && (*in(0) != 0) == decides) {
            value = decides ? 1 : 0;
        } else if (in(0) && (in(1) || step.inputs.size() == 1)) {
            value = compute(step.op, *in(0), in(1).value_or(0));
        }
        if (inC && value && *value != static_cast<std::int32_t>(*value))
            value.reset();
        values.push_back(value);
    }
    return values.back();
}

void forEachAssignment(const std::vector<std::string>& symbols, std::int64_t low, std::int64_t high,
                       const std::function<void(const Assignment&)>& visit) {
    Assignment assignment;
    for (const std::string& symbol : symbols)
        assignment[symbol] = low;
    for (;;) {
        visit(assignment);
        auto next = assignment.begin();
        while (next != assignment.end() && next->second == high) {
            next->second = low;
            ++next;
        }
        if (next == assignment.end())
            return;
        ++next->second;
    }
}

std::size_t countComparisons(const SymbolicExprTable& table, SymbolicExprId id) {
    const SymbolicExpr& node = *table.get(id);
    if (node.op() != SymbolicOp::And && node.op() != SymbolicOp::Or && node.op() != SymbolicOp::Not)
        return id == table.getIdTRUE() || id == table.getIdFALSE() ? 0 : 1;
    std::size_t count = 0;
    for (std::size_t i = 0; i < node.getNumInputs(); ++i)
        count += countComparisons(table, node.getInput(i));
    return count;
}

} // namespace VT::Testing
