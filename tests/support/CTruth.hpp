// What expressions are worth by the rules of C, computed in wide integers.
#pragma once

#include "tests/support/Truth.hpp"

#include <optional>

namespace VT::Testing {

/// An expression for many assignments.  Members are looked up as "S.x", calls by the name of their function; what the
/// assignment does not name is worth 0, and `defined(X)` tells whether it names X.  Element-wise logic is logic.
class CTruth {
public:
    CTruth(const SymbolicExprTable& table, SymbolicExprId root);

    /// The value; nothing where a value that C would compute divides by zero, shifts by what is no number of bits of an
    /// int, or is no int.  The right operands of && and || count only where C computes them.
    [[nodiscard]] std::optional<std::int64_t> under(const Assignment& assignment) const;

    /// What an assignment may give values to: names, members, and functions other than `defined`.
    [[nodiscard]] const std::vector<std::string>& names() const noexcept { return names_; }

    [[nodiscard]] const std::vector<std::string>& functions() const noexcept { return functions_; }

private:
    struct Step {
        SymbolicOp op;
        std::int64_t literal;
        std::string name; ///< what is looked up
        std::vector<std::size_t> inputs;
    };

    [[nodiscard]] static std::optional<std::int64_t> compute(SymbolicOp op, std::int64_t a, std::int64_t b);

    std::vector<Step> steps_; ///< operands before their operators
    std::vector<std::string> names_;
    std::vector<std::string> functions_;
};

} // namespace VT::Testing
