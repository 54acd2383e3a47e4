// The operators of evaluation over columns of values.
#pragma once

#include "base/eval/Execute.hpp"

#include <cstddef>
#include <cstdint>

namespace VT::detail {

/// Computes an operator for each row.  Operands and results are arrays of bool, std::int32_t or double, aligned for
/// their type; the results overlap no operand.  An operator of one operand ignores the second.
using ColumnLoop = void (*)(const void* left, const void* right, void* result, std::size_t rows) noexcept;

/// What loops are compiled for: registers of 16, 32 or 64 bytes on x86.  Their results are the same.
enum class Registers : std::uint8_t { Plain, Wide, Widest };

inline constexpr std::size_t registerKinds = 3;

/// The loop of an operation's code.
ColumnLoop columnLoop(std::uint32_t code, Registers registers) noexcept;

/// The widest registers of this processor.
Registers widestRegisters() noexcept;

/// Makes every NaN the same, as visibleScalar() does.
void makeVisible(double* values, std::size_t rows, Registers registers) noexcept;

} // namespace VT::detail
