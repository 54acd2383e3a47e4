// Quill has no operators for integer division, remainder, bits and shifts: it calls functions.  This header relates the
// function to the C operator, and the amount of a shift in one language to that in the other.
#pragma once

#include "base/core/Nodes.hpp"

#include <array>
#include <cstddef>
#include <string_view>

namespace VT {

/// The C operators that are function calls in Quill.
inline constexpr OperatorSet quillCallOps =
    OperatorSet::where([](const OperatorInfo& r) { return !r.quillCall.empty(); });

/// Number of arguments of the Quill function that stands for a C operator.
constexpr std::size_t quillCallArguments(SymbolicOp op) {
    return operatorInfo(op).form == OperatorForm::Infix ? 2 : 1;
}

/// The first of the operators that one Quill function stands for: the operator itself, but for the shifts, which share
/// one.
constexpr SymbolicOp quillCallLeader(SymbolicOp op) {
    for (const OperatorInfo& row : operatorTable())
        if (row.quillCall == operatorInfo(op).quillCall)
            return row.op;
    return op;
}

namespace detail {
inline constexpr OperatorSet quillCallLeaders =
    OperatorSet::where([](const OperatorInfo& r) { return !r.quillCall.empty() && quillCallLeader(r.op) == r.op; });

constexpr auto listQuillCalls() {
    std::array<SymbolicOp, static_cast<std::size_t>(quillCallLeaders.size())> ops{};
    std::size_t next = 0;
    for (const OperatorInfo& row : operatorTable())
        if (quillCallLeaders.contains(row.op))
            ops[next++] = row.op;
    return ops;
}
} // namespace detail

/// One operator for each of the functions, in the order of the operator table.
inline constexpr auto quillCalls = detail::listQuillCalls();

/// The name of the Quill function that stands for a C operator, as a node of a table of its own.
VTSYM_API const SymbolicString& quillCallName(SymbolicOp op);

/// The amount of a shift in the other language, in terms of the amount it had.
struct ShiftAmount {
    enum class Form : unsigned char {
        Expression, ///< `expression` unchanged
        Literal,    ///< the integer literal `literal`
        Negated,    ///< minus `expression`
    };
    Form form;
    int literal;
    SymbolicExprId expression;
};

/// A C shift.
struct CShift {
    SymbolicOp op;
    ShiftAmount amount;
};

/// The C shift that equals bitshift(a, amount): to the left by a positive amount, to the right by a negative one.  Of
/// 2147483648 places, which no literal has, one is left out.
VTSYM_API CShift shiftOfQuillCall(const SymbolicExprTable& table, SymbolicExprId amount);

/// The second argument of the bitshift() that equals a C shift by `amount`.  A literal stays a literal where its
/// negative fits 32 bits, and a minus is taken away rather than doubled.
VTSYM_API ShiftAmount quillShiftAmount(const SymbolicExprTable& table, SymbolicOp shift, SymbolicExprId amount);

} // namespace VT
