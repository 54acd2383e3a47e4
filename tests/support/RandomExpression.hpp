// Random expressions over every class of nodes, whether or not a text stands for them.
#pragma once

#include "base/core/Nodes.hpp"

#include <cstddef>
#include <random>
#include <string>
#include <vector>

namespace VT::Testing {

/// Adds a node of a random class, all classes alike.  Its operands are among `operands`, but for the names of calls; a
/// leaf where there are none, mostly an identifier.  Literals include the bounds of int, infinities and NaN.
SymbolicExprId randomNode(std::mt19937_64& random, SymbolicExprTable& table,
                          const std::vector<SymbolicExprId>& operands);

/// Adds random nodes, a quarter of them leaves and then each on operands among those before it, so that much is shared.
/// Answers their identifiers.
std::vector<SymbolicExprId> randomGraph(std::mt19937_64& random, SymbolicExprTable& table, std::size_t nodes);

/// The names of the identifiers in random expressions.
const std::vector<std::string>& randomNames();

} // namespace VT::Testing
