#include "tests/support/Truth.hpp"

#include "base/print/ExpressionPrinter.hpp"

#include <algorithm>
#include <limits>

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
    using Op = SymbolicOp;
    using I = std::int64_t;
    using U = std::uint64_t;
    static const std::map<SymbolicOp, I (*)(I, I)> values{
        {Op::Plus, [](I x, I y) { return static_cast<I>(static_cast<U>(x) + static_cast<U>(y)); }},
        {Op::Minus, [](I x, I y) { return static_cast<I>(static_cast<U>(x) - static_cast<U>(y)); }},
        {Op::UnaryMinus, [](I x, I) { return static_cast<I>(0 - static_cast<U>(x)); }},
        {Op::Multiply, [](I x, I y) { return static_cast<I>(static_cast<U>(x) * static_cast<U>(y)); }},
        {Op::Divide, [](I x, I y) { return x / y; }},
        {Op::Modulo, [](I x, I y) { return x % y; }},
        {Op::Equal, [](I x, I y) { return I{x == y}; }},
        {Op::NotEqual, [](I x, I y) { return I{x != y}; }},
        {Op::LessThan, [](I x, I y) { return I{x < y}; }},
        {Op::LessThanEqual, [](I x, I y) { return I{x <= y}; }},
        {Op::GreaterThan, [](I x, I y) { return I{x > y}; }},
        {Op::GreaterThanEqual, [](I x, I y) { return I{x >= y}; }},
        {Op::And, [](I x, I y) { return I{x != 0 && y != 0}; }},
        {Op::Or, [](I x, I y) { return I{x != 0 || y != 0}; }},
        {Op::SingleAnd, [](I x, I y) { return I{x != 0 && y != 0}; }},
        {Op::SingleOr, [](I x, I y) { return I{x != 0 || y != 0}; }},
        {Op::Not, [](I x, I) { return I{x == 0}; }},
        {Op::BitAnd, [](I x, I y) { return x & y; }},
        {Op::BitOr, [](I x, I y) { return x | y; }},
        {Op::BitXOr, [](I x, I y) { return x ^ y; }},
        {Op::BitCompl, [](I x, I) { return ~x; }},
        {Op::ShiftLeft, [](I x, I y) { return y > 63 ? 0 : static_cast<I>(static_cast<U>(x) << y); }},
        {Op::ShiftRight, [](I x, I y) { return x >> std::min(y, I{63}); }},
    };
    const bool inC = arithmetic_ == Arithmetic::C;
    if ((op == Op::ShiftLeft || op == Op::ShiftRight) && (b < 0 || (inC && b >= 32)))
        return std::nullopt;
    if ((op == Op::Divide || op == Op::Modulo) && // a % b is undefined with a / b
        (b == 0 || (inC && a / b > std::numeric_limits<std::int32_t>::max())))
        return std::nullopt;
    return values.at(op)(a, b);
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
