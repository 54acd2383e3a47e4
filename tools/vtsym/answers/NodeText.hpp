// What a tree shows of one node.
#pragma once

#include "base/core/Node.hpp"

#include <string>

namespace vtsym {

/// Whether a node has operands.
inline bool isOperator(const VT::SymbolicExpr& node) {
    return node.getNumInputs() > 0;
}

/// The name, number, or operator with its spelling, for people: bounded and fit for a terminal.
std::string labelOf(const VT::SymbolicExpr& node);

} // namespace vtsym
