// An expression as the tree that it is.  The writers' stacks do not grow with its depth, and a shared node costs once.
#pragma once

#include "base/core/Table.hpp"
#include "tools/vtsym/io/Console.hpp"

#include <string>

namespace vtsym {

/// A drawing in lines.  Operators that occur again, and those too deep for the width of a screen, are drawn once and
/// referred to by their identifiers; the deep ones below the rest.
void appendDrawing(const VT::SymbolicExprTable& table, VT::SymbolicExprId root, const Style& style, std::string& out);

/// A JSON object in one line; an operator that was written before is its identifier alone.
void appendJsonTree(const VT::SymbolicExprTable& table, VT::SymbolicExprId root, std::string& out);

/// A digraph in the language of Graphviz, one vertex for each distinct node.
void appendDotGraph(const VT::SymbolicExprTable& table, VT::SymbolicExprId root, std::string& out);

} // namespace vtsym
