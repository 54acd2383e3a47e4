// Values of expressions and their arithmetic, which is total: every operator answers every pair of scalars.
//
// Sums, differences and products of doubles, and quotients by what does not count as zero, are those of IEEE 754:
// infinity minus infinity, zero times infinity and infinity by infinity are NaN.  A divisor that counts as zero, or is
// NaN, makes an infinity.
//
// The rules know nothing of nodes.  They are functions over bool, int and double, one for each operator; scalarRules
// holds them for every pair of operand types, with the type of the result.
#pragma once

#include "base/core/Limits.hpp"
#include "base/core/Operators.hpp"
#include "host/Diagnostics.hpp"

#include <array>
#include <bit>
#include <cmath>
#include <cstddef>
#include <cstdint>
#include <limits>
#include <type_traits>
#include <utility>
#include <variant>
#include <vector>

namespace VT {

/// The type of a scalar; the order is part of the interface.
enum class ScalarType : std::uint8_t { Bool, Int, Double };

inline constexpr std::uint32_t scalarTypes = 3;

/// What a scalar of known type holds: `integer` for an int, and 0 or 1 in it for a bool; `real` for a double.
union ScalarCell {
    std::int32_t integer = 0;
    double real;
};

/// A truth value, a signed integer of 32 bits, or a double.
class SymbolicScalar {
public:
    // NOLINTBEGIN(google-explicit-constructor): a value stands for its scalar
    template <class T>

    requires(std::is_same_v<T, bool> || std::is_same_v<T, std::int32_t> || std::is_same_v<T, double>)
        SymbolicScalar(T value) {
        if constexpr (std::is_same_v<T, double>) {
            cell_.real = value;
            type_ = ScalarType::Double;
        } else {
            cell_.integer = value;
            type_ = std::is_same_v<T, bool> ? ScalarType::Bool : ScalarType::Int;
        }
    }

    // NOLINTEND(google-explicit-constructor)

    SymbolicScalar() : SymbolicScalar(false) {}

    SymbolicScalar(ScalarType type, ScalarCell cell) : cell_(cell), type_(type) {}

    [[nodiscard]] ScalarType type() const noexcept { return type_; }

    /// The number of the type: 0 for bool, 1 for int, 2 for double.
    [[nodiscard]] std::size_t index() const noexcept { return static_cast<std::size_t>(type_); }

    [[nodiscard]] ScalarCell cell() const noexcept { return cell_; }

    /// The value, for the type that the scalar has.
    [[nodiscard]] bool getBool() const noexcept { return cell_.integer != 0; }

    [[nodiscard]] std::int32_t getInt() const noexcept { return cell_.integer; }

    [[nodiscard]] double getDouble() const noexcept { return cell_.real; }

    /// The value as a double, whichever type the scalar has.
    [[nodiscard]] double toDouble() const noexcept {
        return type_ == ScalarType::Double ? cell_.real : static_cast<double>(cell_.integer);
    }

    /// Whether type and value are the same, bit for bit: zeros of both signs differ, NaN is itself.
    [[nodiscard]] friend bool operator==(const SymbolicScalar& a, const SymbolicScalar& b) noexcept {
        if (a.type_ != b.type_)
            return false;
        return a.type_ == ScalarType::Double
                   ? std::bit_cast<std::uint64_t>(a.cell_) == std::bit_cast<std::uint64_t>(b.cell_)
                   : a.cell_.integer == b.cell_.integer;
    }

private:
    ScalarCell cell_;
    ScalarType type_ = ScalarType::Bool;
};

/// The value of an expression: one scalar, or the vector of scalars that a list of dimensions is.
class SymbolicValue {
public:
    using Elements = std::vector<SymbolicScalar>;

    // NOLINTBEGIN(google-explicit-constructor): a scalar, and a vector, is a value
    template <class T>

    requires std::is_constructible_v<SymbolicScalar, T> SymbolicValue(T scalar) : value_(SymbolicScalar(scalar)) {}

    SymbolicValue(Elements elements) : value_(std::move(elements)) {}

    // NOLINTEND(google-explicit-constructor)

    [[nodiscard]] bool isVector() const noexcept { return value_.index() == 1; }

    /// The scalar; throws std::bad_variant_access for a vector.
    [[nodiscard]] const SymbolicScalar& scalar() const { return std::get<0>(value_); }

    /// The elements of a vector; throws std::bad_variant_access for a scalar.
    [[nodiscard]] const Elements& elements() const { return std::get<1>(value_); }

    /// Whether shape, types and values are the same, bit for bit.
    [[nodiscard]] friend bool operator==(const SymbolicValue&, const SymbolicValue&) = default;

private:
    std::variant<SymbolicScalar, Elements> value_;
};

/// The rules.  Operands are bool, std::int32_t or double; the result has the type of the function's answer.
namespace rules {

inline constexpr std::int32_t greatest = std::numeric_limits<std::int32_t>::max();
inline constexpr std::int32_t least = std::numeric_limits<std::int32_t>::min();

template <class... T>
inline constexpr bool anyReal = (std::is_same_v<T, double> || ...);

/// The integer that operators on bits take for a value: a real is truncated, at most to the bounds, and NaN is 0.
template <class T>
std::int32_t integer(T value) {
    if constexpr (anyReal<T>) {
        if (value >= 2147483648.0)
            return greatest;
        if (value <= -2147483649.0)
            return least;
        return std::isnan(value) ? 0 : static_cast<std::int32_t>(value);
    } else {
        return static_cast<std::int32_t>(value);
    }
}

template <class T>
std::uint32_t bits(T value) {
    return static_cast<std::uint32_t>(integer(value));
}

/// Sums, differences and products of integers wrap.
constexpr std::int32_t wrapped(std::uint32_t bits) {
    return static_cast<std::int32_t>(bits);
}

template <class T>
double real(T value) {
    return static_cast<double>(value);
}

template <class L, class R>
auto add(L a, R b) {
    if constexpr (anyReal<L, R>)
        return real(a) + real(b);
    else
        return wrapped(bits(a) + bits(b));
}

template <class L, class R>
auto subtract(L a, R b) {
    if constexpr (anyReal<L, R>)
        return real(a) - real(b);
    else
        return wrapped(bits(a) - bits(b));
}

template <class L, class R>
auto multiply(L a, R b) {
    if constexpr (anyReal<L, R>)
        return real(a) * real(b);
    else
        return wrapped(bits(a) * bits(b));
}

/// The quotient of doubles; a divisor that counts as zero, or is NaN, makes an infinity of the dividend's sign, that of
/// zero included.
inline double quotient(double a, double b) {
    constexpr double infinity = std::numeric_limits<double>::infinity();
    if (std::fabs(b) >= limits::zeroThreshold)
        return a / b;
    if (a >= 0)
        return infinity;
    return a < 0 ? -infinity : a;
}

/// Integers divide toward zero and saturate.  A zero divisor answers by the dividend's sign; only 0/0 of two ints is 0.
template <class L, class R>
auto divide(L a, R b) {
    if constexpr (anyReal<L, R>) {
        return quotient(real(a), real(b));
    } else {
        const std::int32_t dividend = integer(a);
        const std::int32_t divisor = integer(b);
        if (divisor == 0) {
            if constexpr (std::is_same_v<L, std::int32_t> && std::is_same_v<R, std::int32_t>)
                if (dividend == 0)
                    return 0;
            return dividend >= 0 ? greatest : least;
        }
        return divisor == -1 && dividend == least ? greatest : dividend / divisor;
    }
}

/// The remainder of the division toward zero; by zero it is the dividend.
template <class L, class R>
auto remainder(L a, R b) {
    if constexpr (anyReal<L, R>) {
        return std::fabs(real(b)) < limits::zeroThreshold ? real(a) : std::fmod(real(a), real(b));
    } else {
        const std::int32_t dividend = integer(a);
        const std::int32_t divisor = integer(b);
        if (divisor == 0)
            return dividend;
        return divisor == -1 ? 0 : dividend % divisor;
    }
}

/// Integers are compared exactly, doubles within the threshold; NaN equals NaN.
template <class L, class R>
bool equal(L a, R b) {
    if constexpr (anyReal<L, R>) {
        const double x = real(a);
        const double y = real(b);
        return x == y || std::fabs(x - y) < limits::zeroThreshold || (std::isnan(x) && std::isnan(y));
    } else {
        return integer(a) == integer(b);
    }
}

template <class L, class R>
bool notEqual(L a, R b) {
    return !equal(a, b);
}

/// Strict comparisons have no tolerance.
template <class L, class R>
bool less(L a, R b) {
    if constexpr (anyReal<L, R>)
        return real(a) < real(b);
    else
        return integer(a) < integer(b);
}

template <class L, class R>
bool greater(L a, R b) {
    return less(b, a);
}

template <class L, class R>
bool lessEqual(L a, R b) {
    if constexpr (anyReal<L, R>)
        return real(b) >= real(a) || equal(a, b);
    else
        return integer(a) <= integer(b);
}

template <class L, class R>
bool greaterEqual(L a, R b) {
    return lessEqual(b, a);
}

/// What is not zero is true; so is NaN.
template <class T>
bool truth(T value) {
    return value != T{};
}

template <class L, class R>
bool both(L a, R b) {
    return truth(a) & truth(b);
}

template <class L, class R>
bool either(L a, R b) {
    return truth(a) | truth(b);
}

template <class L, class R>
std::int32_t bitAnd(L a, R b) {
    return wrapped(bits(a) & bits(b));
}

template <class L, class R>
std::int32_t bitOr(L a, R b) {
    return wrapped(bits(a) | bits(b));
}

template <class L, class R>
std::int32_t bitXOr(L a, R b) {
    return wrapped(bits(a) ^ bits(b));
}

/// To the left by a positive amount, with the sign to the right by a negative one.
inline std::int32_t shifted(std::int32_t value, std::int64_t amount) {
    if (amount > 31 || amount < -31)
        return value < 0 && amount < 0 ? -1 : 0;
    return amount >= 0 ? wrapped(bits(value) << static_cast<unsigned>(amount))
                       : value >> static_cast<unsigned>(-amount);
}

template <class L, class R>
std::int32_t shiftLeft(L a, R b) {
    return shifted(integer(a), integer(b));
}

template <class L, class R>
std::int32_t shiftRight(L a, R b) {
    return shifted(integer(a), -static_cast<std::int64_t>(integer(b)));
}

// Operators of one operand take it twice, so that one table holds all rules.

template <class T>
auto negate(T a, T) {
    if constexpr (anyReal<T>)
        return -a;
    else
        return wrapped(0U - bits(a));
}

template <class T>
bool negateTruth(T a, T) {
    return !truth(a);
}

template <class T>
std::int32_t complement(T a, T) {
    return wrapped(~bits(a));
}

} // namespace rules

// The rules by operator: VTSYM_RULE(operator, operands, function).
// clang-format off
#define VTSYM_SCALAR_RULES(VTSYM_RULE)             \
    VTSYM_RULE(Plus, 2, add)                       \
    VTSYM_RULE(Minus, 2, subtract)                 \
    VTSYM_RULE(UnaryMinus, 1, negate)              \
    VTSYM_RULE(Multiply, 2, multiply)              \
    VTSYM_RULE(Divide, 2, divide)                  \
    VTSYM_RULE(Modulo, 2, remainder)               \
    VTSYM_RULE(Equal, 2, equal)                    \
    VTSYM_RULE(NotEqual, 2, notEqual)              \
    VTSYM_RULE(LessThan, 2, less)                  \
    VTSYM_RULE(LessThanEqual, 2, lessEqual)        \
    VTSYM_RULE(GreaterThan, 2, greater)            \
    VTSYM_RULE(GreaterThanEqual, 2, greaterEqual)  \
    VTSYM_RULE(And, 2, both)                       \
    VTSYM_RULE(Or, 2, either)                      \
    VTSYM_RULE(Not, 1, negateTruth)                \
    VTSYM_RULE(BitAnd, 2, bitAnd)                  \
    VTSYM_RULE(BitOr, 2, bitOr)                    \
    VTSYM_RULE(BitXOr, 2, bitXOr)                  \
    VTSYM_RULE(BitCompl, 1, complement)            \
    VTSYM_RULE(ShiftLeft, 2, shiftLeft)            \
    VTSYM_RULE(ShiftRight, 2, shiftRight)
// clang-format on

/// The place of a rule in the table.
enum class ScalarRuleIndex : std::uint8_t {
#define VTSYM_RULE(Op, Operands, Function) Op,
    VTSYM_SCALAR_RULES(VTSYM_RULE)
#undef VTSYM_RULE
        None ///< the operator has no rule
};

namespace detail {

template <ScalarType Type>
constexpr auto cellValue(const ScalarCell& cell) {
    if constexpr (Type == ScalarType::Double)
        return cell.real;
    else if constexpr (Type == ScalarType::Int)
        return cell.integer;
    else
        return cell.integer != 0;
}

template <class T>
constexpr ScalarCell cellOf(T value) {
    ScalarCell cell;
    if constexpr (std::is_same_v<T, double>)
        cell.real = value;
    else
        cell.integer = value;
    return cell;
}

template <class T>
inline constexpr ScalarType typeOf = std::is_same_v<T, bool>           ? ScalarType::Bool
                                     : std::is_same_v<T, std::int32_t> ? ScalarType::Int
                                                                       : ScalarType::Double;

} // namespace detail

/// A rule for operands of two types.
struct TypedRule {
    ScalarType result;
    ScalarCell (*apply)(ScalarCell left, ScalarCell right);
};

/// A rule for operands of all types.
struct ScalarRule {
    SymbolicOp op;
    std::size_t operands;
    std::array<std::array<TypedRule, scalarTypes>, scalarTypes> by; ///< by type of the left and of the right operand
};

namespace detail {

template <ScalarType Left, ScalarType Right, class Function>
constexpr TypedRule typedRule(Function) {
    using Answer = decltype(Function()(cellValue<Left>({}), cellValue<Right>({})));
    return {typeOf<Answer>, [](ScalarCell left, ScalarCell right) {
                return cellOf<Answer>(Function()(cellValue<Left>(left), cellValue<Right>(right)));
            }};
}

/// An operator of one operand is given it as both, so that the types are the same.
constexpr ScalarType typeOfSecond(std::size_t operands, ScalarType left, ScalarType right) {
    return operands == 1 ? left : right;
}

template <std::size_t Operands, ScalarType Left, ScalarType Right, class Function>
constexpr TypedRule ruleOfTypes(Function function) {
    return typedRule<Left, typeOfSecond(Operands, Left, Right)>(function);
}

template <std::size_t Operands, class Function>
constexpr ScalarRule scalarRule(SymbolicOp op, Function f) {
    using enum ScalarType;
    return {op,
            Operands,
            {{{{ruleOfTypes<Operands, Bool, Bool>(f), ruleOfTypes<Operands, Bool, Int>(f),
                ruleOfTypes<Operands, Bool, Double>(f)}},
              {{ruleOfTypes<Operands, Int, Bool>(f), ruleOfTypes<Operands, Int, Int>(f),
                ruleOfTypes<Operands, Int, Double>(f)}},
              {{ruleOfTypes<Operands, Double, Bool>(f), ruleOfTypes<Operands, Double, Int>(f),
                ruleOfTypes<Operands, Double, Double>(f)}}}}};
}

} // namespace detail

/// All rules, in the order of ScalarRuleIndex.
inline constexpr auto scalarRules = std::to_array<ScalarRule>({
#define VTSYM_RULE(Op, Operands, Function)                                                                             \
    detail::scalarRule<Operands>(SymbolicOp::Op, [](auto a, auto b) { return rules::Function(a, b); }),
    VTSYM_SCALAR_RULES(VTSYM_RULE)
#undef VTSYM_RULE
});

namespace detail {
inline constexpr auto ruleIndices = [] {
    std::array<ScalarRuleIndex, static_cast<std::size_t>(operatorCount)> indices{};
    indices.fill(ScalarRuleIndex::None);
    for (std::size_t i = 0; i < scalarRules.size(); ++i)
        indices[static_cast<std::size_t>(scalarRules[i].op)] = static_cast<ScalarRuleIndex>(i);
    return indices;
}();
} // namespace detail

/// Where the rule of an operator is.
constexpr ScalarRuleIndex scalarRuleIndex(SymbolicOp op) {
    return detail::ruleIndices[static_cast<std::size_t>(op)];
}

/// The value of an operator on two scalars; one of one operand is given it twice.  A scalar of no type is fatal.
inline SymbolicScalar evaluateScalars(const ScalarRule& rule, const SymbolicScalar& left, const SymbolicScalar& right) {
    if (left.index() >= scalarTypes || right.index() >= scalarTypes)
        vtsvFatalDiagnostic("scalar of no type", __FILE__, __LINE__, __PRETTY_FUNCTION__);
    const TypedRule& typed = rule.by[left.index()][right.index()];
    return {typed.result, typed.apply(left.cell(), right.cell())};
}

/// The scalar as it is handed out: there is one NaN, because what a processor makes of two depends on their order.
inline SymbolicScalar visibleScalar(const SymbolicScalar& scalar) {
    if (scalar.type() == ScalarType::Double && std::isnan(scalar.getDouble()))
        return std::numeric_limits<double>::quiet_NaN();
    return scalar;
}

} // namespace VT
