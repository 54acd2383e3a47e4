// The operators of evaluation over columns of values.
//
// Method: one plain loop for each operator and pair of operand types, from the functions of ScalarArithmetic.hpp, so
// that rows and single evaluations cannot differ.  The compiler vectorises the loops whose functions have no branches
// (Boncz, Zukowski, Nes, "MonetDB/X100: hyper-pipelining query execution", 2005).
// Cost: linear in the rows.
#include "base/eval/ColumnLoops.hpp"

#include <array>
#include <limits>
#include <type_traits>

// Compile a function for processors with wide registers, where the compiler can.
#ifdef __x86_64__
#define VTSYM_WIDE [[gnu::target("avx2")]]
#else
#define VTSYM_WIDE
#endif
#if defined(__x86_64__) && !defined(__clang__)
#define VTSYM_WIDEST [[gnu::target("avx512f,avx512dq,avx512bw,avx512vl,prefer-vector-width=512")]]
#else
#define VTSYM_WIDEST VTSYM_WIDE
#endif

namespace VT::detail {

namespace {

template <ScalarType Type>
using ValueOf = std::remove_const_t<decltype(cellValue<Type>({}))>;

template <ScalarType Left, ScalarType Right, class Function>
[[gnu::always_inline]] inline void apply(const void* left, const void* right, void* result, std::size_t rows) {
    using Answer = decltype(Function()(ValueOf<Left>(), ValueOf<Right>()));
    const auto* const a = static_cast<const ValueOf<Left>*>(left);
    const auto* const b = static_cast<const ValueOf<Right>*>(right);
    auto* const __restrict answers = static_cast<Answer*>(result);
    for (std::size_t i = 0; i < rows; ++i)
        answers[i] = Function()(a[i], b[i]);
}

template <std::size_t Operands, ScalarType Left, ScalarType Right, class Function>
void loop(const void* left, const void* right, void* result, std::size_t rows) noexcept {
    apply<Left, typeOfSecond(Operands, Left, Right), Function>(left, Operands == 1 ? left : right, result, rows);
}

/// The same, compiled for wide registers.  Results are the same: only the number of rows at a time differs.
template <std::size_t Operands, ScalarType Left, ScalarType Right, class Function>
VTSYM_WIDE void wideLoop(const void* left, const void* right, void* result, std::size_t rows) noexcept {
    apply<Left, typeOfSecond(Operands, Left, Right), Function>(left, Operands == 1 ? left : right, result, rows);
}

template <std::size_t Operands, ScalarType Left, ScalarType Right, class Function>
VTSYM_WIDEST void widestLoop(const void* left, const void* right, void* result, std::size_t rows) noexcept {
    apply<Left, typeOfSecond(Operands, Left, Right), Function>(left, Operands == 1 ? left : right, result, rows);
}

/// By the registers.
using Loops = std::array<ColumnLoop, registerKinds>;

template <std::size_t Operands, ScalarType Left, ScalarType Right, class Function>
constexpr Loops loopsOfTypes(Function) {
    return {loop<Operands, Left, Right, Function>, wideLoop<Operands, Left, Right, Function>,
            widestLoop<Operands, Left, Right, Function>};
}

template <std::size_t Operands, class Function>
constexpr std::array<Loops, typePairs> loopsOf(Function f) {
    using enum ScalarType;
    return {loopsOfTypes<Operands, Bool, Bool>(f),    loopsOfTypes<Operands, Bool, Int>(f),
            loopsOfTypes<Operands, Bool, Double>(f),  loopsOfTypes<Operands, Int, Bool>(f),
            loopsOfTypes<Operands, Int, Int>(f),      loopsOfTypes<Operands, Int, Double>(f),
            loopsOfTypes<Operands, Double, Bool>(f),  loopsOfTypes<Operands, Double, Int>(f),
            loopsOfTypes<Operands, Double, Double>(f)};
}

/// Mostly there is no NaN, and nothing is written.
[[gnu::always_inline]] inline void unify(double* values, std::size_t rows) {
    std::uint64_t any = 0;
    for (std::size_t i = 0; i < rows; ++i)
        any |= values[i] != values[i] ? 1U : 0U;
    if (any == 0)
        return;
    for (std::size_t i = 0; i < rows; ++i)
        values[i] = values[i] != values[i] ? std::numeric_limits<double>::quiet_NaN() : values[i];
}

void unifyPlainly(double* values, std::size_t rows) noexcept {
    unify(values, rows);
}

VTSYM_WIDE void unifyWidely(double* values, std::size_t rows) noexcept {
    unify(values, rows);
}

VTSYM_WIDEST void unifyWidest(double* values, std::size_t rows) noexcept {
    unify(values, rows);
}

/// In the order of ScalarRuleIndex, as operationCode() counts.
constexpr auto loops = std::to_array<std::array<Loops, typePairs>>({
#define VTSYM_RULE(Op, Operands, Function) loopsOf<Operands>([](auto a, auto b) { return rules::Function(a, b); }),
    VTSYM_SCALAR_RULES(VTSYM_RULE)
#undef VTSYM_RULE
});

} // namespace

ColumnLoop columnLoop(std::uint32_t code, Registers registers) noexcept {
    return loops[code / typePairs][code % typePairs][static_cast<std::size_t>(registers)];
}

Registers widestRegisters() noexcept {
#ifdef __x86_64__
    if (__builtin_cpu_supports("avx512f") && __builtin_cpu_supports("avx512dq") && __builtin_cpu_supports("avx512bw") &&
        __builtin_cpu_supports("avx512vl"))
        return Registers::Widest;
    if (__builtin_cpu_supports("avx2"))
        return Registers::Wide;
#endif
    return Registers::Plain;
}

void makeVisible(double* values, std::size_t rows, Registers registers) noexcept {
    constexpr std::array passes{unifyPlainly, unifyWidely, unifyWidest};
    passes[static_cast<std::size_t>(registers)](values, rows);
}

} // namespace VT::detail
