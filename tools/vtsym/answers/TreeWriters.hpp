// Three pictures of an expression: a drawing, JSON and Graphviz.
// Each writes a shared node once and uses a stack that does not grow with the nesting of the expression.
#pragma once

#include "base/core/Table.hpp"
#include "tools/vtsym/io/Console.hpp"

#include <string>

namespace vtsym {

/// Appends a drawing in lines.  An operator that occurs again is referred to by its identifier; so is one that is too
/// deep for the width of a screen, which is drawn below the rest.
void appendDrawing(const VT::SymbolicExprTable& table, VT::SymbolicExprId root, const Style& style, std::string& out);

/// Appends a JSON object in one line; an operator that was written before is its identifier alone.
void appendJsonTree(const VT::SymbolicExprTable& table, VT::SymbolicExprId root, std::string& out);

/// Appends a digraph in the language of Graphviz, one vertex for each distinct node.
void appendDotGraph(const VT::SymbolicExprTable& table, VT::SymbolicExprId root, std::string& out);

} // namespace vtsym
