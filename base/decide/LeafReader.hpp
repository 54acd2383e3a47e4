// What a leaf of a condition stands for.
#pragma once

#include "base/core/Table.hpp"

#include <cstdint>

namespace VT {

struct LeafMeaning {
    enum class Kind : std::uint8_t {
        Compound, ///< no leaf: an operator with operands
        Integer,
        Real,
        Free,           ///< a symbol, a call, a member: a value of its own
        Simulation,     ///< 1 in simulation, 0 in generated code
        CodeGeneration, ///< the opposite
        Opaque,         ///< a member bound to an expression
    };

    Kind kind;
    std::int64_t integer = 0;
    double real = 0;
    SymbolicExprId node = invalidId; ///< of an unknown or a keyword
};

/// Reads leaves as the simplifier does: truth constants by name, members by the value bound to them, the variant
/// keywords as opposites while they are in force.  A call is one unknown, whose arguments are looked at where another
/// call of the same function takes part (CallCongruence); defined(A) says nothing about the value of A.
class LeafReader {
public:
    LeafReader(const SymbolicExprTable& table, bool keywordsInForce)
        : table_(table),
          keywordsInForce_(keywordsInForce) {}

    /// `id` is of the table.
    [[nodiscard]] LeafMeaning operator()(SymbolicExprId id) const;

    [[nodiscard]] const SymbolicExprTable& table() const noexcept { return table_; }

    [[nodiscard]] bool keywordsInForce() const noexcept { return keywordsInForce_; }

private:
    const SymbolicExprTable& table_;
    bool keywordsInForce_;
};

} // namespace VT
