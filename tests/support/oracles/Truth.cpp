#include "tests/support/oracles/Truth.hpp"

#include "base/print/ExpressionPrinter.hpp"

#include <algorithm>
#include <limits>

namespace VT::Testing {

namespace {

bool isNamed(SymbolicOp op) {
    return op == SymbolicOp::String || op == SymbolicOp::MemberValue || callOps.contains(op);
}

} // namespace

std::vector<Step> stepsOf(const SymbolicExprTable& table, SymbolicExprId root, bool namesAreLeaves, bool byContext) {
    using Place = std::pair<SymbolicExprId, bool>; // operands have smaller identifiers than their node
    std::map<Place, std::vector<Place>> inputs;
    std::vector<Place> pending{{root, !byContext || booleanOps.contains(table.get(root)->op())}};
    while (!pending.empty()) {
        const Place place = pending.back();
        pending.pop_back();
        const auto [entry, isNew] = inputs.try_emplace(place);
        const SymbolicExpr& node = *table.get(place.first);
        if (!isNew || (namesAreLeaves && isNamed(node.op())))
            continue;
        for (std::size_t i = 0; i < node.getNumInputs(); ++i) {
            const SymbolicExprId input = node.getInput(i);
            entry->second.emplace_back(input, place.second || booleanOps.contains(table.get(input)->op()));
            pending.push_back(entry->second.back());
        }
    }
    std::map<Place, std::size_t> known;
    std::vector<Step> steps;
    for (const auto& [place, operands] : inputs) {
        known.emplace(place, steps.size());
        const SymbolicExpr& node = *table.get(place.first);
        steps.push_back({node.op(), place.first, place.second, node.isNumValue() ? node.getNumValue() : 0});
        for (const Place& operand : operands)
            steps.back().inputs.push_back(known.at(operand));
    }
    return steps;
}

Truth::Truth(const SymbolicExprTable& table, SymbolicExprId root, Arithmetic arithmetic)
    : arithmetic_(arithmetic),
      steps_(stepsOf(table, root, true, false)) {
    for (Step& step : steps_)
        if (isNamed(step.op))
            name(step, SymbolicExprPrinter(table, false)(step.id));
}

void Truth::name(Step& step, const std::string& text) {
    step.name = text;
    if (arithmetic_ == Arithmetic::C && callOps.contains(step.op)) {
        const std::size_t open = text.find('(');
        step.name = text.substr(0, open);
        if (step.name != "defined") {
            functions_.push_back(step.name);
        } else {
            names_.push_back(text.substr(open + 1, text.size() - open - 2));
            step.name = "defined " + names_.back();
            return;
        }
    }
    names_.push_back(step.name);
}

std::optional<std::int64_t> computed(SymbolicOp op, std::int64_t a, std::int64_t b) {
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
    const bool isShift = op == Op::ShiftLeft || op == Op::ShiftRight;
    const auto rule = values.find(op);
    if (rule == values.end() || (isShift && b < 0) || ((op == Op::Divide || op == Op::Modulo) && b == 0))
        return std::nullopt;
    return rule->second(a, b);
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
            value = static_cast<std::int64_t>(step.literal);
        } else if (step.name.starts_with("defined ")) {
            value = assignment.contains(step.name.substr(8)) ? 1 : 0;
        } else if (!step.name.empty()) {
            const auto found = assignment.find(step.name);
            value = found != assignment.end() ? found->second : (step.name == "true" ? 1 : 0);
        } else if (inC && (decides || step.op == SymbolicOp::And) && in(0) && (*in(0) != 0) == decides) {
            value = decides ? 1 : 0;
        } else if (in(0) && (in(1) || step.inputs.size() == 1)) {
            const std::int64_t a = *in(0), b = in(1).value_or(0);
            const bool isShift = step.op == SymbolicOp::ShiftLeft || step.op == SymbolicOp::ShiftRight;
            const bool isQuotient = step.op == SymbolicOp::Divide || step.op == SymbolicOp::Modulo;
            // In C also a % b is undefined with a / b.
            if (!inC || !((isShift && b >= 32) || (isQuotient && b == -1 && -a > std::numeric_limits<int>::max())))
                value = computed(step.op, a, b);
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
