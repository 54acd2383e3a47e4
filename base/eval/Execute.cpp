// Runs the operations of prepared expressions.
//
// Method: direct-threaded code (Bell, "Threaded code", 1973).  One piece of code for each operator and pair of operand
// types, each of which jumps to the next one itself, so that the processor predicts a jump by where it comes from
// (Ertl, Gregg, "The structure and performance of efficient interpreters", 2003).
// Cost: one jump and the arithmetic for each operation.  Types cost nothing: they are part of the code.
#include "base/eval/Execute.hpp"

namespace VT::detail {

namespace {

/// Reads and writes no more of a cell than its type has: a wider access would have to wait for a narrower one.
template <ScalarType Left, ScalarType Right, class Function>
[[gnu::always_inline]] inline void apply(Function function, const ScalarCell& left, const ScalarCell& right,
                                         ScalarCell& result) {
    const auto value = function(cellValue<Left>(left), cellValue<Right>(right));
    if constexpr (rules::anyReal<std::remove_const_t<decltype(value)>>)
        result.real = value;
    else
        result.integer = value;
}

#define VTSYM_RULE(Op, Operands, Function) constexpr std::size_t operandsOf##Op = Operands;
VTSYM_SCALAR_RULES(VTSYM_RULE)
#undef VTSYM_RULE

} // namespace

#define VTSYM_PAIRS(VTSYM_PAIR, Op, Function)                                                                          \
    VTSYM_PAIR(Op, Function, Bool, Bool)                                                                               \
    VTSYM_PAIR(Op, Function, Bool, Int)                                                                                \
    VTSYM_PAIR(Op, Function, Bool, Double)                                                                             \
    VTSYM_PAIR(Op, Function, Int, Bool)                                                                                \
    VTSYM_PAIR(Op, Function, Int, Int)                                                                                 \
    VTSYM_PAIR(Op, Function, Int, Double)                                                                              \
    VTSYM_PAIR(Op, Function, Double, Bool)                                                                             \
    VTSYM_PAIR(Op, Function, Double, Int)                                                                              \
    VTSYM_PAIR(Op, Function, Double, Double)

// Addresses of labels are an extension of the compilers that this is built with.
#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wpedantic"

void execute(const Operation* operation, ScalarCell* cells, ScalarCell* result) noexcept {
    static const void* const places[] = {
#define VTSYM_PAIR(Op, Function, Left, Right) &&Op##Left##Right,
#define VTSYM_RULE(Op, Operands, Function) VTSYM_PAIRS(VTSYM_PAIR, Op, Function)
        VTSYM_SCALAR_RULES(VTSYM_RULE)
#undef VTSYM_RULE
#undef VTSYM_PAIR
        && end};
    static_assert(std::size(places) == endCode + 1);

    goto* places[operation->code];
#define VTSYM_PAIR(Op, Function, Left, Right)                                                                          \
    Op##Left##Right : apply<ScalarType::Left, typeOfSecond(operandsOf##Op, ScalarType::Left, ScalarType::Right)>(      \
                          [](auto a, auto b) { return rules::Function(a, b); }, cells[operation->left],                \
                          cells[operation->right], *result++);                                                         \
    goto* places[(++operation)->code];
#define VTSYM_RULE(Op, Operands, Function) VTSYM_PAIRS(VTSYM_PAIR, Op, Function)
    VTSYM_SCALAR_RULES(VTSYM_RULE)
#undef VTSYM_RULE
#undef VTSYM_PAIR
end:;
}

#pragma GCC diagnostic pop

} // namespace VT::detail
