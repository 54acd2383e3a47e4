// The operators of evaluation over columns of values.
//
// Method: one plain loop for each operator and pair of operand types, from the functions of ScalarArithmetic.hpp, so
// that rows and single evaluations cannot differ.  The compiler vectorises the loops whose functions have no branches
// (Boncz, Zukowski, Nes, "MonetDB/X100: hyper-pipelining query execution", 2005).
// Cost: linear in the rows.
#include "base/eval/ColumnLoops.hpp"

#include <array>
#include <type_traits>

namespace VT::detail {

namespace {

template <ScalarType Type>
using ValueOf = std::remove_const_t<decltype(cellValue<Type>({}))>;

template <ScalarType Left, ScalarType Right, class Function>
void loop(const void* left, const void* right, void* result, std::size_t rows) noexcept {
    using Answer = decltype(Function()(ValueOf<Left>(), ValueOf<Right>()));
    const auto* const a = static_cast<const ValueOf<Left>*>(left);
    const auto* const b = static_cast<const ValueOf<Right>*>(right);
    auto* const __restrict answers = static_cast<Answer*>(result);
    for (std::size_t i = 0; i < rows; ++i)
        answers[i] = Function()(a[i], b[i]);
}

/// The same for an operator that takes its operand twice.
template <ScalarType Type, class Function>
void loopOfOne(const void* operand, const void*, void* result, std::size_t rows) noexcept {
    loop<Type, Type, Function>(operand, operand, result, rows);
}

template <std::size_t Operands, ScalarType Left, ScalarType Right, class Function>
constexpr ColumnLoop loopOfTypes(Function) {
    if constexpr (Operands == 1)
        return loopOfOne<Left, Function>;
    else
        return loop<Left, Right, Function>;
}

template <std::size_t Operands, class Function>
constexpr std::array<ColumnLoop, typePairs> loopsOf(Function f) {
    using enum ScalarType;
    return {loopOfTypes<Operands, Bool, Bool>(f),    loopOfTypes<Operands, Bool, Int>(f),
            loopOfTypes<Operands, Bool, Double>(f),  loopOfTypes<Operands, Int, Bool>(f),
            loopOfTypes<Operands, Int, Int>(f),      loopOfTypes<Operands, Int, Double>(f),
            loopOfTypes<Operands, Double, Bool>(f),  loopOfTypes<Operands, Double, Int>(f),
            loopOfTypes<Operands, Double, Double>(f)};
}

/// In the order of ScalarRuleIndex, as operationCode() counts.
constexpr auto loops = std::to_array<std::array<ColumnLoop, typePairs>>({
#define VTSYM_RULE(Op, Operands, Function) loopsOf<Operands>([](auto a, auto b) { return rules::Function(a, b); }),
    VTSYM_SCALAR_RULES(VTSYM_RULE)
#undef VTSYM_RULE
});

} // namespace

ColumnLoop columnLoop(std::uint32_t code) noexcept {
    return loops[code / typePairs][code % typePairs];
}

} // namespace VT::detail
