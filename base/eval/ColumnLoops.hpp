// The operators of evaluation over columns of values.
#pragma once

#include "base/eval/Execute.hpp"

#include <cstddef>
#include <cstdint>

namespace VT::detail {

/// Computes an operator for each row.  Operands and results are arrays of bool, std::int32_t or double, aligned for
/// their type; the results overlap no operand.  An operator of one operand ignores the second.
using ColumnLoop = void (*)(const void* left, const void* right, void* result, std::size_t rows) noexcept;

/// The loop of an operation's code; `wide` chooses the one for processors with wide registers.
ColumnLoop columnLoop(std::uint32_t code, bool wide) noexcept;

/// Whether this processor has the registers that wide loops use.
bool hasWideRegisters() noexcept;

/// Copies values and makes every NaN the same, as visibleScalar() does.
void copyVisible(const double* values, double* to, std::size_t rows, bool wide) noexcept;

} // namespace VT::detail
