// Random expressions over every class of nodes, whether or not a text stands for them.
#pragma once

#include "base/core/Nodes.hpp"

#include <cstddef>
#include <functional>
#include <random>
#include <vector>

namespace VT::Testing {

/// Adds random nodes, a quarter of them leaves and then all classes alike, each on operands among those before it, so
/// that much is shared.  Calls are of names.  Literals include the bounds of int, infinities and NaN.  Answers the
/// identifiers.
std::vector<SymbolicExprId> randomGraph(std::mt19937_64& random, SymbolicExprTable& table, std::size_t nodes);

/// Interns one random node over all nodes that are there, calls included.  Leaves come from a small stock, so that many
/// nodes are met again; no real is NaN.
SymbolicExprId makeRandom(SymbolicExprTable& table, std::mt19937_64& random);

/// A random tree of these operators; what is called or has a member "field" is the name "f".  Its leaves are what the
/// function makes, else a few names and numbers.
SymbolicExprId randomTree(SymbolicExprTable& table, std::mt19937_64& random, const std::vector<SymbolicOp>& operators,
                          int depth, const std::function<SymbolicExprId()>& leaf = nullptr);

} // namespace VT::Testing
