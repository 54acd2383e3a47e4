// Front door of the expression core: operator codes, node classes with their interning constructors, the table that
// owns the nodes and the visitor interface.
#pragma once

#include "base/core/Nodes.hpp"
#include "base/core/Operators.hpp"
#include "base/core/Table.hpp"
#include "base/core/Visitor.hpp"
