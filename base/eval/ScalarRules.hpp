// The arithmetic of evaluation as a table: for each operator and each pair of operand types, the function and the type
// of its result.  Built at compile time from the rows of ScalarArithmetic.hpp.
#pragma once

#include "base/core/Operators.hpp"
#include "base/eval/ScalarArithmetic.hpp"
#include "base/eval/Values.hpp"
#include "host/Diagnostics.hpp"

#include <array>
#include <cstddef>
#include <cstdint>
#include <type_traits>
#include <utility>

namespace VT {

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

/// An operator of one operand takes it twice, so both types are the same.
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

/// Returns the index of an operator's rule.
constexpr ScalarRuleIndex scalarRuleIndex(SymbolicOp op) {
    return detail::ruleIndices[static_cast<std::size_t>(op)];
}

/// The operators that scalars have no value for: those of matrices, and the element-wise logical ones.
inline constexpr OperatorSet unvaluedOps{
    SymbolicOp::Power,   SymbolicOp::DotPower,  SymbolicOp::DotMul,       SymbolicOp::DotDiv,    SymbolicOp::LDiv,
    SymbolicOp::DotLDiv, SymbolicOp::Transpose, SymbolicOp::DotTranspose, SymbolicOp::SingleAnd, SymbolicOp::SingleOr};

static_assert(OperatorSet::where([](const OperatorInfo& row) {
                  return scalarRuleIndex(row.op) != ScalarRuleIndex::None || unvaluedOps.contains(row.op);
              }) == symbolOps,
              "give every operator that is written as a symbol a value, or name it in unvaluedOps");

/// Computes an operator on two scalars; pass the operand of a unary one twice.  A scalar of no type is fatal.
inline SymbolicScalar evaluateScalars(const ScalarRule& rule, const SymbolicScalar& left, const SymbolicScalar& right) {
    if (left.index() >= scalarTypes || right.index() >= scalarTypes)
        vtsvFatalDiagnostic("scalar of no type", __FILE__, __LINE__, __PRETTY_FUNCTION__);
    const TypedRule& typed = rule.by[left.index()][right.index()];
    return {typed.result, typed.apply(left.cell(), right.cell())};
}

} // namespace VT
