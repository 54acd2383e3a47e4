// What the program says of conditions whose C text would be decided differently.
#pragma once

#include "base/print/CTextObstacles.hpp"

#include <string>
#include <vector>

namespace vtsym {

/// A sentence without its end for each obstacle in a condition in C shape.
std::vector<std::string> warningsOf(const VT::SymbolicExprTable& table, VT::SymbolicExprId condition, VT::CTextUse use);

} // namespace vtsym
