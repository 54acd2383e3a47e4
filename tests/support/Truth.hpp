// Brute force: what conditions are worth under an assignment of integers.
#pragma once

#include "base/VTSymbolicExpr.hpp"

#include <cstdint>
#include <exception>
#include <functional>
#include <map>
#include <string>
#include <vector>

namespace VT::Testing {

/// A quotient by zero.
struct NoValue : std::exception {};

using Assignment = std::map<std::string, std::int64_t>;

/// The value of an expression of integers, truth values and C's arithmetic over them, computed from the meaning of each
/// operator without any rule of the library.  Calls and members are worth what the assignment says of their text.
std::int64_t valueOf(const SymbolicExprTable& table, SymbolicExprId id, const Assignment& assignment);

inline bool holds(const SymbolicExprTable& table, SymbolicExprId id, const Assignment& assignment) {
    return valueOf(table, id, assignment) != 0;
}

/// Calls `visit` with every assignment of values from `low` to `high` to the symbols.
void forEachAssignment(const std::vector<std::string>& symbols, std::int64_t low, std::int64_t high,
                       const std::function<void(const Assignment&)>& visit);

/// Comparisons, and other truth values, that an expression is made of.
std::size_t countComparisons(const SymbolicExprTable& table, SymbolicExprId id);

} // namespace VT::Testing
