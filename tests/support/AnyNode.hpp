// Nodes of any class, chosen by operator at run time.
#pragma once

#include "base/core/Nodes.hpp"

#include <optional>
#include <random>
#include <string>
#include <vector>

namespace VT::Testing {

/// What a node can be made of; a class takes what it has room for.
struct NodeParts {
    std::string text;
    int integer = 0;
    double real = 0;
    std::vector<SymbolicExprId> inputs;
};

/// Number of operands of a class; nothing for those with any number.
std::optional<std::size_t> operandCount(SymbolicOp op);

/// Interns a node of an operator's class.
SymbolicExprId makeAny(SymbolicExprTable& table, SymbolicOp op, const NodeParts& parts);

/// Interns a random node over nodes that are there.  Leaves come from a small stock, so that many nodes are met again;
/// no real is NaN.
SymbolicExprId makeRandom(SymbolicExprTable& table, std::mt19937_64& random);

} // namespace VT::Testing
