#include "tests/support/oracles/WideArithmetic.hpp"

#include "tests/support/generators/AnyNode.hpp"
#include "tests/support/oracles/Truth.hpp"

#include <algorithm>
#include <cmath>
#include <limits>

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
            return integer;
        if (std::isnan(real))
            return 0;
        return static_cast<std::int64_t>(std::clamp(std::trunc(real), -2147483648.0, 2147483647.0));
    }

    [[nodiscard]] bool isTrue() const { return isReal ? !(real == 0.0) : integer != 0; }
};

/// The integer of 32 bits that is congruent.
SymbolicScalar wrap(std::int64_t value) {
    return static_cast<std::int32_t>(value);
}

SymbolicScalar saturate(std::int64_t value) {
    return static_cast<std::int32_t>(std::clamp(value, least, greatest));
}

/// By a power of two, rounded down.
SymbolicScalar shift(std::int64_t value, std::int64_t amount) {
    if (amount < 0)
        return wrap(value >> std::min<std::int64_t>(-amount, 63));
    return amount > 31 ? SymbolicScalar(0) : wrap(value << amount);
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

SymbolicScalar computedWide(SymbolicOp op, const Wide& a, const Wide& b) {
    const bool real = a.isReal || b.isReal;
    const auto number = [&](double inReals, std::int64_t inIntegers) {
        return real ? SymbolicScalar(inReals) : wrap(inIntegers);
    };
    using Op = SymbolicOp;
    switch (op) {
    case Op::Plus:
        return number(a.real + b.real, a.integer + b.integer);
    case Op::Minus:
        return number(a.real - b.real, a.integer - b.integer);
    case Op::Multiply:
        return number(a.real * b.real, a.integer * b.integer);
    case Op::UnaryMinus:
        return a.isReal ? SymbolicScalar(-a.real) : wrap(-a.integer);
    case Op::Divide:
        return divide(a, b);
    case Op::Modulo:
        return remainder(a, b);
    case Op::Equal:
        return equal(a, b);
    case Op::NotEqual:
        return !equal(a, b);
    case Op::LessThan:
        return less(a, b);
    case Op::GreaterThan:
        return less(b, a);
    case Op::LessThanEqual:
        return less(a, b) || equal(a, b);
    case Op::GreaterThanEqual:
        return less(b, a) || equal(a, b);
    case Op::ShiftLeft:
        return shift(a.bits(), b.bits());
    case Op::ShiftRight:
        return shift(a.bits(), -b.bits());
    default:
        break;
    }
    return booleanOps.contains(op) ? SymbolicScalar(computed(op, a.isTrue(), b.isTrue()).value() != 0)
                                   : wrap(computed(op, a.bits(), b.bits()).value());
}

} // namespace

const std::vector<SymbolicScalar>& cornerScalars() {
    static const std::vector<SymbolicScalar> all = [] {
        std::vector<SymbolicScalar> values{false, true, std::numeric_limits<double>::quiet_NaN()};
        for (const int value :
             {-2147483647 - 1, -2147483647, -33, -32, -31, -7, -1, 0, 1, 2, 31, 32, 33, 46341, 2147483646, 2147483647})
            values.emplace_back(value);
        for (const double value : {threshold, std::nextafter(threshold, 0.0), std::nextafter(threshold, 1.0), 0.0, 0.5,
                                   0.3, 0.1 + 0.2, 1.0, 1.0 + threshold, 31.9, 32.0, 2147483647.5, 2147483648.0,
                                   2147483648.5, 2147483649.0, 1e300, 5e-324, infinity})
            values.insert(values.end(), {value, -value});
        return values;
    }();
    return all;
}

SymbolicExprId scalarLiteral(SymbolicExprTable& table, const SymbolicScalar& value) {
    if (value.type() == ScalarType::Bool)
        return SymbolicString(table, value.getBool() ? "true" : "false").getId(table);
    if (value.type() == ScalarType::Int)
        return SymbolicIntValue(table, value.getInt()).getId(table);
    if (value == SymbolicScalar(-0.0)) // as a literal it is that of 0
        return SymbolicUnaryMinusExpr(table, scalarLiteral(table, 0.0)).getId(table);
    const SymbolicExprId found = Trees{table}.real(value.getDouble());
    return found != invalidId ? found : table.size() - 1; // NaN is not found
}

SymbolicScalar expectedScalar(SymbolicOp op, const SymbolicScalar& a, const SymbolicScalar& b) {
    return computedWide(op, Wide(a), Wide(b));
}

} // namespace VT::Testing
