// How a node is labelled in trees and diagrams, and what replaces a text that is too long to show.
// Labels are bounded and safe for a terminal.
#pragma once

#include "base/core/Node.hpp"

#include <string>

namespace vtsym {

/// Whether a node has operands.
inline bool isOperator(const VT::SymbolicExpr& node) {
    return node.getNumInputs() > 0;
}

/// The name, the number, or the operator with its spelling.
std::string labelOf(const VT::SymbolicExpr& node);

/// A printed expression of more bytes is not shown, not even its beginning.
inline constexpr std::size_t printedBytes = 20'000;

/// Is shown in its place.
std::string lengthOfText(std::uint64_t bytes);

} // namespace vtsym
