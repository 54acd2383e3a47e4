// Every bound of the library: its unit, why it is there and what happens at it.
#pragma once

#include <cstddef>
#include <cstdint>

namespace VT::limits {

/// Passes of the simplifier over one condition.  Rules reach a fixed point in two or three; the bound ends what
/// oscillates. The result of the last pass is returned.
inline constexpr std::uint64_t simplifyPasses = 10;

/// Operands of one flattened And or Or chain, and products of one distribution.  Distribution multiplies operands;
/// beyond the bound the simplifier gives up the pass and returns what it was given.
inline constexpr std::uint64_t chainOperands = 1000;

/// Nesting of brackets and runs of prefix operators in a text: what the strictest common C compilers read.  One more is
/// a parse error at that place.
inline constexpr std::size_t nesting = 256;

/// Bytes of one printed text.  A shared graph of a few nodes can stand for more text than any memory holds; beyond the
/// bound printing throws std::length_error.
inline constexpr std::size_t textBytes = std::size_t{1} << 30U;

/// Bytes of two operands' texts that the simplifier compares when it sorts them; operands that agree in so many are
/// ordered by their structure.
inline constexpr std::size_t orderedTextBytes = std::size_t{1} << 16U;

/// Elements of all vectors that one evaluation makes, and operations of a prepared expression.  Each node of a graph may
/// make one more vector as long as the longest; beyond the bound evaluation throws std::length_error.
inline constexpr std::size_t evaluatedElements = std::size_t{1} << 26U;

} // namespace VT::limits
