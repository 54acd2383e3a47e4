// Every operator on every pair of corner values, against arithmetic written down again over wide integers.
#include "tests/eval/Scalars.hpp"

#include <gtest/gtest.h>

#include <cmath>
#include <functional>
#include <map>

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

} // namespace
} // namespace VT::Testing
