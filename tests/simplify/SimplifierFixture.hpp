// A table with everything that a test of the simplifier needs.
#pragma once

#include "base/simplify/Simplify.hpp"
#include "host/Diagnostics.hpp"
#include "parser/SymbolicExprParser.hpp"
#include "tests/support/oracles/Truth.hpp"

#include <string>

namespace VT::Testing {

struct SimplifierFixture {
    SimplifierFixture() { table.addBoolSymbols(); }

    SymbolicExprId parse(const std::string& text) { return SymbolicExprParser(table, false, true)(text); }

    SymbolicExprId simplify(SymbolicExprId id) { return simplifier.simplify(id, passes); }

    /// The simplified text in C.
    std::string simplified(const std::string& text) { return SymbolicExprPrinter(table, false)(simplify(parse(text))); }

    SymbolicExprTable table;
    SymbolicExprSimplify simplifier{table};
    std::uint64_t passes = 0;
};

} // namespace VT::Testing
