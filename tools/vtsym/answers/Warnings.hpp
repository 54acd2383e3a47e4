// Warnings about conditions that C or a preprocessor would reject or decide differently.
// The library finds the obstacles; this puts them into words.
#pragma once

#include "base/print/CTextObstacles.hpp"

#include <string>
#include <vector>

namespace vtsym {

/// A sentence without its full stop for each obstacle in a condition with C operators.
std::vector<std::string> warningsOf(const VT::SymbolicExprTable& table, VT::SymbolicExprId condition, VT::CTextUse use);

} // namespace vtsym
