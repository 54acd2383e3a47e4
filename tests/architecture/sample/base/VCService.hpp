#include "base/VTSymbolicExpr.hpp"
#include "host/embedded/Log.hpp"
#include "parser/SymbolicExprParser.hpp"
