// The values that a command is told for symbols.
#pragma once

#include "base/core/Table.hpp"

#include <CLI/CLI.hpp>

#include <functional>
#include <string>
#include <vector>

namespace vtsym {

struct Definition {
    std::string name;
    std::string value; ///< an expression
};

using Definitions = std::vector<Definition>;

/// Reads an expression into the table that definitions are for.
using ReadExpression = std::function<VT::SymbolicExprId(const std::string&)>;

/// Gives a command -D, which adds to `definitions`.
void addDefinitions(CLI::App& command, Definitions& definitions);

/// Binds the definitions in a table, in order.  Throws CLI::ValidationError for what is none.
void bindDefinitions(VT::SymbolicExprTable& table, const Definitions& definitions, const ReadExpression& read);

} // namespace vtsym
