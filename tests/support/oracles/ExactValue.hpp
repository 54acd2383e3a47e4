// The value of an expression where all arithmetics agree on it.
#pragma once

#include "base/VTSymbolicExpr.hpp"
#include "tests/support/oracles/Truth.hpp"

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

namespace VT::Testing {

/// A number: an integer, which a truth value is too, or a real.
struct ExactNumber {
    double real = 0; ///< the value, exactly, also of an integer
    bool isReal = false;

    [[nodiscard]] bool holds() const noexcept { return real != 0; }
};

/// What a quotient of integers is worth: always without its remainder, or so only below operators of truth values.
enum class Quotients : bool { Truncated, ByContext };

/// An expression for many assignments.
///
/// Evaluation wraps at 32 bits, decisions are over unbounded integers, and C leaves much undefined.  There is a value
/// only where none of that matters: every integer on the way fits 32 bits, no real is rounded, infinite, NaN or within
/// the zero threshold of what it is compared with, nothing divides by zero and shifts are from 0 to 31.  What a name
/// stands for comes from the assignment.  A call is a function of its arguments' values: equal arguments, equal value.
class ExactValue {
public:
    ExactValue(const SymbolicExprTable& table, SymbolicExprId root, Quotients quotients = Quotients::Truncated);

    [[nodiscard]] std::optional<ExactNumber> under(const Assignment& assignment) const;

    /// Whether the latest value took a quotient with a remainder, which only a dimension takes for exact.
    [[nodiscard]] bool tookRemainder() const noexcept { return tookRemainder_; }

private:
    [[nodiscard]] std::optional<ExactNumber> compute(const Step& step, const std::vector<ExactNumber>& values) const;

    std::vector<Step> steps_;
    mutable bool tookRemainder_ = false;
};

} // namespace VT::Testing
