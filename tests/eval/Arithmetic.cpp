// Every operator on every pair of corner values, and expressions in every way of evaluation, against arithmetic written
// down again over wide integers.
#include "base/eval/EvalVisitor.hpp"
#include "base/print/ExpressionPrinter.hpp"
#include "tests/eval/Scalars.hpp"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <functional>
#include <map>
#include <random>
#include <set>

namespace VT::Testing {
namespace {

constexpr double infinity = std::numeric_limits<double>::infinity();
constexpr double threshold = 1.4901161193847656e-08;
constexpr std::int64_t greatest = 2147483647;
constexpr std::int64_t least = -2147483648;

/// A scalar in the oracle's hands: an integer without bounds, or a real.
struct Wide {
    bool isReal;
    bool isBool;
    std::int64_t integer;
    double real;

    explicit Wide(const SymbolicScalar& scalar)
        : isReal(scalar.index() == 2),
          isBool(scalar.index() == 0),
          integer(isReal   ? 0
                  : isBool ? (scalar.getBool() ? 1 : 0)
                           : scalar.getInt()),
          real(isReal ? scalar.getDouble() : static_cast<double>(integer)) {}

    /// What bit operators see.
    [[nodiscard]] std::int64_t bits() const {
        if (!isReal)
            return static_cast<std::int64_t>(integer);
        if (std::isnan(real))
            return 0;
        const double cut = std::trunc(real);
        return cut > 2147483647.0 ? greatest : cut < -2147483648.0 ? least : static_cast<std::int64_t>(cut);
    }

    [[nodiscard]] bool isTrue() const { return isReal ? !(real == 0.0) : integer != 0; }
};

/// The integer of 32 bits that is congruent.
SymbolicScalar wrap(std::int64_t value) {
    const std::int64_t modulus = std::int64_t{1} << 32;
    std::int64_t rest = value % modulus;
    if (rest < 0)
        rest += modulus;
    return static_cast<std::int32_t>((rest > greatest ? rest - modulus : rest));
}

SymbolicScalar saturate(std::int64_t value) {
    return static_cast<std::int32_t>((value > greatest ? greatest : value < least ? least : value));
}

/// By multiplication and division with a power of two, rounded down.
SymbolicScalar shift(std::int64_t value, std::int64_t amount) {
    if (amount >= 0)
        return amount > 31 ? SymbolicScalar(0) : wrap(value << amount);
    if (amount < -31)
        return value < 0 ? -1 : 0;
    const std::int64_t divisor = std::int64_t{1} << -amount;
    return static_cast<std::int32_t>((value - (((value % divisor) + divisor) % divisor)) / divisor);
}

SymbolicScalar divide(const Wide& a, const Wide& b) {
    if (a.isReal || b.isReal) {
        if (b.real >= threshold || b.real <= -threshold)
            return a.real / b.real;
        return std::isnan(a.real) ? a.real : std::signbit(a.real) && a.real != 0 ? -infinity : infinity;
    }
    if (b.integer != 0)
        return saturate(a.integer / b.integer);
    if (a.integer == 0)
        return !a.isBool && !b.isBool ? 0 : static_cast<std::int32_t>(greatest);
    return static_cast<std::int32_t>(a.integer > 0 ? greatest : least);
}

SymbolicScalar remainder(const Wide& a, const Wide& b) {
    if (a.isReal || b.isReal)
        return b.real > -threshold && b.real < threshold ? a.real : std::fmod(a.real, b.real);
    return saturate(b.integer == 0 ? a.integer : a.integer % b.integer);
}

bool equal(const Wide& a, const Wide& b) {
    if (!a.isReal && !b.isReal)
        return a.integer == b.integer;
    if (std::isnan(a.real) || std::isnan(b.real))
        return std::isnan(a.real) && std::isnan(b.real);
    return a.real == b.real || std::abs(a.real - b.real) < threshold;
}

bool less(const Wide& a, const Wide& b) {
    return a.isReal || b.isReal ? a.real < b.real : a.integer < b.integer;
}

SymbolicScalar expected(SymbolicOp op, const Wide& a, const Wide& b) {
    const bool real = a.isReal || b.isReal;
    const auto bitwise = [&](auto combine) { // bit by bit
        std::int64_t result = 0;
        for (int bit = 0; bit < 32; ++bit)
            if (combine((a.bits() >> bit) % 2 != 0, (b.bits() >> bit) % 2 != 0))
                result += std::int64_t{1} << bit;
        return wrap(result);
    };
    const auto number = [&](double inReals, std::int64_t inIntegers) {
        return real ? SymbolicScalar(inReals) : wrap(inIntegers);
    };
    using Op = SymbolicOp;
    const std::map<Op, std::function<SymbolicScalar()>> answers{
        {Op::Plus, [&] { return number(a.real + b.real, a.integer + b.integer); }},
        {Op::Minus, [&] { return number(a.real - b.real, a.integer - b.integer); }},
        {Op::Multiply, [&] { return number(a.real * b.real, a.integer * b.integer); }},
        {Op::UnaryMinus, [&] { return a.isReal ? SymbolicScalar(-a.real) : wrap(-a.integer); }},
        {Op::Divide, [&] { return divide(a, b); }},
        {Op::Modulo, [&] { return remainder(a, b); }},
        {Op::Equal, [&] { return equal(a, b); }},
        {Op::NotEqual, [&] { return !equal(a, b); }},
        {Op::LessThan, [&] { return less(a, b); }},
        {Op::GreaterThan, [&] { return less(b, a); }},
        {Op::LessThanEqual, [&] { return less(a, b) || equal(a, b); }},
        {Op::GreaterThanEqual, [&] { return less(b, a) || equal(a, b); }},
        {Op::And, [&] { return a.isTrue() && b.isTrue(); }},
        {Op::Or, [&] { return a.isTrue() || b.isTrue(); }},
        {Op::Not, [&] { return !a.isTrue(); }},
        {Op::BitAnd, [&] { return bitwise([](bool x, bool y) { return x && y; }); }},
        {Op::BitOr, [&] { return bitwise([](bool x, bool y) { return x || y; }); }},
        {Op::BitXOr, [&] { return bitwise([](bool x, bool y) { return x != y; }); }},
        {Op::BitCompl, [&] { return wrap(-1 - a.bits()); }},
        {Op::ShiftLeft, [&] { return shift(a.bits(), b.bits()); }},
        {Op::ShiftRight, [&] { return shift(a.bits(), -b.bits()); }},
    };
    return answers.at(op)();
}

std::string shown(const SymbolicScalar& value) {
    return std::string(1, "bid"[value.index()]) + ":" + std::to_string(value.toDouble());
}

TEST(Arithmetic, AgreesWithWideIntegersOnEveryPairOfCornerValues) {
    SymbolicExprTable table;
    const SymbolicExprId a = SymbolicString(table, "a").getId(table);
    const SymbolicExprId b = SymbolicString(table, "b").getId(table);
    std::vector<SymbolicExprId> literals;
    for (const SymbolicScalar& value : corners())
        literals.push_back(literal(table, value));
    std::size_t operators = 0;
    for (const OperatorInfo& row : operatorTable()) {
        if (row.shape != "Unary" && row.shape != "Binary")
            continue;
        const std::size_t operands = operandCount(row.op).value();
        const SymbolicExprId id = makeAny(table, row.op, {"", 0, 0, {a, b}});
        const SymbolicExprEval evaluator(table);
        if (scalarRuleIndex(row.op) == ScalarRuleIndex::None) {
            EXPECT_THROW(static_cast<void>(evaluator.eval(id)), HostDiagnostic) << row.name;
            EXPECT_THROW(static_cast<void>(evaluator.prepare(id)), HostDiagnostic) << row.name;
            continue;
        }
        ++operators;
        PreparedExpr prepared = evaluator.prepare(id);
        for (std::size_t i = 0; i < corners().size(); ++i)
            for (std::size_t j = 0; j < (operands == 1 ? 1 : corners().size()); ++j) {
                const SymbolicScalar& left = corners()[i];
                const SymbolicScalar& right = corners()[j];
                const SymbolicScalar wanted = visibleScalar(expected(row.op, Wide(left), Wide(right)));
                table.registerValueId(a, literals[i]);
                table.registerValueId(b, literals[j]);
                prepared.set(0, left);
                if (operands == 2)
                    prepared.set(1, right);
                const SymbolicScalar answer = evaluator.eval(id).scalar();
                ASSERT_EQ(answer, wanted) << shown(left) << " " << row.name << " " << shown(right) << " is "
                                          << shown(answer) << ", not " << shown(wanted);
                ASSERT_EQ(prepared.run().scalar(), wanted) << shown(left) << " " << row.name << " " << shown(right);
            }
    }
    EXPECT_EQ(operators, scalarRules.size());
}

/// What an expression is worth, or the key of what is reported about it.
struct Outcome {
    std::string error;
    bool isVector = false;
    std::vector<SymbolicScalar> values = {};

    bool operator==(const Outcome&) const = default;
};

/// The value of an expression by recursion over the tree; expressions are small.
class Model {
public:
    explicit Model(const SymbolicExprTable& table) : table_(table) {}

    Outcome of(SymbolicExprId id) { // NOLINT(misc-no-recursion)
        const SymbolicExpr& node = *table_.get(id);
        const SymbolicOp op = node.op();
        if (op == SymbolicOp::IntValue)
            return scalar(static_cast<const SymbolicIntValue&>(node).getValue());
        if (op == SymbolicOp::DoubleValue)
            return scalar(static_cast<const SymbolicDoubleValue&>(node).getValue());
        if (op == SymbolicOp::String || op == SymbolicOp::MemberValue)
            return ofSymbol(id, node);
        const bool isList = dimensionOps.contains(op);
        if (!isList && scalarRuleIndex(op) == ScalarRuleIndex::None)
            return {"NotEvaluable"};
        std::vector<Outcome> operands;
        for (std::size_t i = 0; i < node.getNumInputs(); ++i) {
            if (node.getInput(i) >= id)
                return {"NotEvaluable"};
            operands.push_back(of(node.getInput(i)));
            if (!operands.back().error.empty())
                return operands.back();
        }
        return isList ? listed(operands) : combined(op, operands.front(), operands.back());
    }

private:
    static Outcome scalar(SymbolicScalar value) { return {"", false, {value}}; }

    Outcome ofSymbol(SymbolicExprId id, const SymbolicExpr& node) { // NOLINT(misc-no-recursion)
        const bool isMember = node.op() == SymbolicOp::MemberValue;
        const std::string name = isMember ? "" : static_cast<const SymbolicString&>(node).getName();
        if (name == "true" || name == "false")
            return scalar(name == "true");
        const SymbolicExprId value = table_.getValueId(id);
        if (value == invalidId)
            return {isMember ? "NotEvaluable" : "UnboundSymbol"};
        if (!open_.insert(id).second)
            return {"CyclicValue"};
        const Outcome outcome = of(value);
        open_.erase(id);
        return outcome;
    }

    static Outcome listed(const std::vector<Outcome>& elements) {
        Outcome list{"", true, {}};
        for (const Outcome& element : elements) {
            if (element.isVector)
                return {"NotEvaluable"};
            list.values.push_back(element.values.front());
        }
        return list;
    }

    static Outcome combined(SymbolicOp op, const Outcome& a, const Outcome& b) {
        if (a.isVector && b.isVector && a.values.size() != b.values.size())
            return {"SizeMismatch"};
        Outcome result{"", a.isVector || b.isVector, {}};
        const std::size_t count = a.isVector ? a.values.size() : b.values.size();
        for (std::size_t i = 0; i < count; ++i)
            result.values.push_back(
                expected(op, Wide(a.values[a.isVector ? i : 0]), Wide(b.values[b.isVector ? i : 0])));
        return result;
    }

    const SymbolicExprTable& table_;
    std::set<SymbolicExprId> open_;
};

template <class Evaluate>
Outcome outcomeOf(Evaluate evaluate) {
    try {
        const SymbolicValue value = evaluate();
        return value.isVector() ? Outcome{"", true, value.elements()} : Outcome{"", false, {value.scalar()}};
    } catch (const HostDiagnostic& diagnostic) {
        return {diagnostic.messageId().substr(diagnostic.messageId().rfind(':') + 1)};
    }
}

/// Asks in every way; how the answers differ from the model's, in words.
std::string differences(const SymbolicExprTable& table, SymbolicExprId id, bool& hasValue) {
    Outcome wanted = Model(table).of(id);
    std::ranges::transform(wanted.values, wanted.values.begin(), visibleScalar);
    hasValue = wanted.error.empty();
    SymbolicExprEvalImpl executed(table);
    SymbolicExprEvalImpl accepted(table);
    const SymbolicExprEval evaluator(table);
    const std::vector<std::pair<std::string, Outcome>> answers{
        {"eval", outcomeOf([&] { return evaluator.eval(id); })},
        {"execute", outcomeOf([&] { return executed.execute(table, id), executed.get(); })},
        {"accept", outcomeOf([&] { return table.get(id)->accept(table, accepted), accepted.get(); })},
        {"prepare", outcomeOf([&] { return evaluator.prepare(id).run(); })},
    };
    std::string words;
    for (const auto& [way, answer] : answers) {
        // A prepared expression may come upon another fault first.
        const bool same = way == "prepare" && !hasValue ? !answer.error.empty() : answer == wanted;
        if (!same)
            words += way + " of node " + std::to_string(id) + ": " + answer.error + ", not " + wanted.error + "; ";
        for (std::size_t i = 0; !same && i < std::min(answer.values.size(), wanted.values.size()); ++i)
            words += shown(answer.values[i]) + ", not " + shown(wanted.values[i]) + "; ";
    }
    return words;
}

TEST(Ways, AgreeWhereEveryOperatorIsUnderEveryOther) {
    std::mt19937_64 random(6);
    SymbolicExprTable table;
    std::vector<SymbolicExprId> leaves;
    for (const SymbolicScalar& value : corners())
        leaves.push_back(literal(table, value));
    const auto node = [&](SymbolicOp op, SymbolicExprId operand, std::size_t place) {
        std::vector<SymbolicExprId> inputs(operandCount(op).value_or(2));
        for (SymbolicExprId& input : inputs)
            input = leaves[random() % leaves.size()];
        inputs.at(std::min(place, inputs.size() - 1)) = operand;
        return makeNode(table, op, inputs);
    };
    bool hasValue = false;
    std::size_t values = 0;
    for (const OperatorInfo& outer : operatorTable())
        for (const OperatorInfo& inner : operatorTable())
            for (const std::size_t place : {0U, 1U}) {
                if (outer.op <= SymbolicOp::DoubleValue || inner.op <= SymbolicOp::DoubleValue)
                    continue; // a leaf
                for (int i = 0; i < 12; ++i) {
                    const SymbolicExprId id =
                        node(outer.op, node(inner.op, leaves[random() % leaves.size()], 0), place);
                    ASSERT_EQ(differences(table, id, hasValue), "") << SymbolicExprPrinter(table, false)(id);
                    values += hasValue ? 1 : 0;
                }
            }
    EXPECT_GT(values, 8000U);
}

TEST(Ways, AgreeOnRandomGraphsOfBoundAndMissingParts) {
    std::size_t values = 0, faults = 0;
    for (unsigned seed = 0; seed < 400; ++seed) {
        std::mt19937_64 random(seed);
        SymbolicExprTable table;
        const Trees tree{table};
        std::vector<SymbolicExprId> symbols{tree.name("a"), tree.name("b"), tree.name("s"), tree.name("true")};
        for (const std::size_t owner : {0U, 2U, 2U, 4U})
            symbols.push_back(SymbolicMemberValue(table, symbols[owner], "x").getId(table));
        std::vector<SymbolicExprId> nodes = symbols;
        for (int i = 0; i < 8; ++i)
            nodes.push_back(literal(table, corners()[random() % corners().size()]));
        while (nodes.size() < 50) {
            const auto any = [&] {
                return nodes[nodes.size() - 1 - random() % std::min<std::size_t>(20, nodes.size())];
            };
            const auto operand = [&] {
                return random() % 200 == 0 ? table.size() + random() % 3 : random() % 300 == 0 ? invalidId : any();
            };
            const SymbolicOp op = random() % 30 == 0   ? operatorTable()[random() % operatorTable().size()].op
                                  : random() % 15 == 0 ? SymbolicOp::DimsND
                                                       : scalarRules[random() % scalarRules.size()].op;
            if (op > SymbolicOp::DoubleValue)
                nodes.push_back(makeNode(table, op, {operand(), operand(), operand()}));
        }
        for (const SymbolicExprId symbol : symbols)
            if (random() % 4 != 0)
                table.registerValueId(symbol, nodes[random() % 3 == 0 ? random() % nodes.size() : symbols.size()]);
        for (const SymbolicExprId id : nodes) {
            bool hasValue = false;
            ASSERT_EQ(differences(table, id, hasValue), "") << "seed " << seed;
            ++(hasValue ? values : faults);
        }
    }
    EXPECT_GT(values, 4000U);
    EXPECT_GT(faults, 4000U);
}

} // namespace
} // namespace VT::Testing
