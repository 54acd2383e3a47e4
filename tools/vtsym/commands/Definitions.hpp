// Definitions NAME=VALUE of `eval` and `dims`: option -D, and binding the names in a table.
// A value is an expression and may use the names of other definitions.
#pragma once

#include "base/core/Table.hpp"

#include <functional>
#include <string>
#include <vector>

namespace vtsym {

class Command;

struct Definition {
    std::string name;
    std::string value; ///< an expression
};

using Definitions = std::vector<Definition>;

/// Reads an expression into the table in which names are bound.
using ReadExpression = std::function<VT::SymbolicExprId(const std::string&)>;

/// Adds -D to a command, which adds to `definitions`.
void addDefinitions(Command& command, Definitions& definitions);

/// Binds the definitions in a table, in order.  Throws UsageError for one that cannot be read.
void bindDefinitions(VT::SymbolicExprTable& table, const Definitions& definitions, const ReadExpression& read);

} // namespace vtsym
