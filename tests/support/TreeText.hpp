// Expressions as prefix text for the expectations of tests: Or(a,Equal(b,2)).
#pragma once

#include "base/core/Node.hpp"

#include <string>

namespace VT::Testing {

/// The node kinds by the names of their operators, names and integers as they are, a real with an r behind it, a
/// member's name behind its owner.  The invalid identifier is "invalid".  Recurses; for small expressions only.
std::string treeText(const SymbolicExprTable& table, SymbolicExprId id);

/// A real as it stands there.
std::string realText(double value);

} // namespace VT::Testing
