// What the rewritten sources call: each function computes what the source said, unless its mutant is the active one.
//
// Every mutant is in the program at once (mutant schemata; Untch, Offutt and Harrold, "Mutation analysis using mutant
// schemata", 1993), so that a run switches rather than compiles.  Constant evaluation sees the source as it was.
#pragma once

#include <type_traits>

namespace VT::Mutation {

extern int active;             ///< the mutant that is on; 0 means none
extern unsigned char* reached; ///< per mutant, whether it was evaluated; shared by processes

inline bool isActive(int id) noexcept {
    reached[id] = 1;
    return id == active;
}

constexpr bool on(int id) noexcept {
    return !std::is_constant_evaluated() && isActive(id);
}

constexpr bool flip(int id, bool value) noexcept {
    return value != on(id);
}

template <class Number>
constexpr Number next(int id, Number value) noexcept {
    return on(id) ? static_cast<Number>(value + Number{1}) : value;
}

#define VTSYM_MUTATED(name, usual, mutated)                                                                            \
    template <class Left, class Right>                                                                                 \
    constexpr auto name(int id, Left left, Right right) {                                                              \
        return on(id) ? (mutated) : (usual);                                                                           \
    }
VTSYM_MUTATED(less, left < right, left <= right)
VTSYM_MUTATED(lessEqual, left <= right, left < right)
VTSYM_MUTATED(greater, left > right, left >= right)
VTSYM_MUTATED(greaterEqual, left >= right, left > right)
VTSYM_MUTATED(equal, left == right, left != right)
VTSYM_MUTATED(notEqual, left != right, left == right)
VTSYM_MUTATED(plus, left + right, left - right)
VTSYM_MUTATED(minus, left - right, left + right)
VTSYM_MUTATED(times, left* right, left + right)
VTSYM_MUTATED(divided, left / right, left* right)
VTSYM_MUTATED(remainder, left % right, left / right)
VTSYM_MUTATED(bitAnd, left& right, left | right)
VTSYM_MUTATED(bitOr, left | right, left& right)
VTSYM_MUTATED(bitXor, left ^ right, left& right)
VTSYM_MUTATED(shiftLeft, left << right, left >> right)
VTSYM_MUTATED(shiftRight, left >> right, left << right)
#undef VTSYM_MUTATED

} // namespace VT::Mutation
