#include "../core/Table.hpp"
#include "base/VCService.hpp"
#include "base/VTSymbolicExpr.hpp"
#include "base/variants/Features.hpp"
#include "parser/SymbolicExprParser.hpp"
#include <boost/spirit/include/qi.hpp>
namespace {
using Column = int;
class Row;
const char* padded(const char* text);
} // namespace
std::string joined(const Row& row);
