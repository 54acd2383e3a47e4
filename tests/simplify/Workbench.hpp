// A table with everything that a test of the simplifier needs.
#pragma once

#include "base/simplify/Simplify.hpp"
#include "host/Diagnostics.hpp"
#include "parser/SymbolicExprParser.hpp"
#include "tests/support/Truth.hpp"

#include <string>
#include <vector>

namespace VT::Testing {

/// Remembers the rules that fired.
class FiredRules final : public RuleListener {
public:
    void fired(const RuleFiring& firing) override { firings.push_back(firing); }

    [[nodiscard]] bool has(std::string_view name) const {
        for (const RuleFiring& firing : firings)
            if (firing.rule->name == name)
                return true;
        return false;
    }

    std::vector<RuleFiring> firings;
};

struct Workbench {
    Workbench() { table.addBoolSymbols(); }

    SymbolicExprId parse(const std::string& text) { return SymbolicExprParser(table, false, true)(text); }

    SymbolicExprId simplify(SymbolicExprId id) { return simplifier.simplify(id, passes); }

    /// The simplified text in C.
    std::string simplified(const std::string& text) { return SymbolicExprPrinter(table, false)(simplify(parse(text))); }

    SymbolicExprTable table;
    SymbolicExprSimplify simplifier{table};
    std::uint64_t passes = 0;
};

} // namespace VT::Testing
