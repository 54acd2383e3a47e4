// Brute force: what expressions are worth under an assignment of integers, without any rule of the library.
#pragma once

#include "base/VTSymbolicExpr.hpp"

#include <cstdint>
#include <functional>
#include <map>
#include <optional>
#include <string>
#include <vector>

namespace VT::Testing {

using Assignment = std::map<std::string, std::int64_t>;

/// One operator of an expression in a list in which operands come first.
struct Step {
    SymbolicOp op;
    SymbolicExprId id;
    bool inTruth; ///< whether it is, or is below, an operator of truth values
    double literal = 0;
    std::string name = {}; ///< what is looked up
    std::vector<std::size_t> inputs = {};
};

/// An expression as a list, each node once, or once in truth values and once elsewhere.  Where so asked, members and
/// calls have no inputs.
std::vector<Step> stepsOf(const SymbolicExprTable& table, SymbolicExprId root, bool namesAreLeaves, bool byContext);

/// What an operator makes of integers of 64 bits; nothing where it divides by zero or shifts by less than zero.
std::optional<std::int64_t> computed(SymbolicOp op, std::int64_t a, std::int64_t b);

/// Integers without bounds (sums and products are right modulo 2^64), where calls and members are worth what the
/// assignment says of their text; or C, where a call is looked up by the name of its function, `defined(X)` says
/// whether the assignment names X, and the right operands of && and || count only where C computes them.
enum class Arithmetic : bool { Unbounded, C };

/// An expression for many assignments; what they do not name is worth 0.  Element-wise logic is logic.
class Truth {
public:
    Truth(const SymbolicExprTable& table, SymbolicExprId root, Arithmetic arithmetic = Arithmetic::Unbounded);

    /// The value; nothing where one that counts divides by zero, shifts by what is no number of bits, or, in C, is no
    /// int.
    [[nodiscard]] std::optional<std::int64_t> under(const Assignment& assignment) const;

    /// What an assignment may give values to: names, members, and functions other than `defined`.
    [[nodiscard]] const std::vector<std::string>& names() const noexcept { return names_; }

    [[nodiscard]] const std::vector<std::string>& functions() const noexcept { return functions_; }

private:
    void name(Step& step, const std::string& text);

    Arithmetic arithmetic_;
    std::vector<Step> steps_;
    std::vector<std::string> names_;
    std::vector<std::string> functions_;
};

/// The value, which there must be.
inline std::int64_t valueOf(const SymbolicExprTable& table, SymbolicExprId id, const Assignment& assignment) {
    return Truth(table, id).under(assignment).value();
}

inline bool holds(const SymbolicExprTable& table, SymbolicExprId id, const Assignment& assignment) {
    return valueOf(table, id, assignment) != 0;
}

/// Calls `visit` with every assignment of values from `low` to `high` to the symbols.
void forEachAssignment(const std::vector<std::string>& symbols, std::int64_t low, std::int64_t high,
                       const std::function<void(const Assignment&)>& visit);

/// Comparisons, and other truth values, that an expression is made of.
std::size_t countComparisons(const SymbolicExprTable& table, SymbolicExprId id);

} // namespace VT::Testing
