// Every rule is tested by its own example: the rule fires, the example comes out, and brute force finds both sides
// equal.
#include "tests/simplify/Workbench.hpp"

#include <set>

namespace VT::Testing {
namespace {

const std::vector<std::string> symbols{"A", "B", "C", "N", "(sim)", "(codegen)"};

/// Whether both expressions are worth the same wherever exactly one of the keywords is in force.
void expectSameValues(const SymbolicExprTable& table, SymbolicExprId before, SymbolicExprId after, bool asTruth) {
    forEachAssignment(symbols, -1, 4, [&](const Assignment& assignment) {
        const std::int64_t sim = assignment.at("(sim)");
        if ((sim != 0 && sim != 1) || assignment.at("(codegen)") != 1 - sim)
            return;
        const std::int64_t x = valueOf(table, before, assignment);
        const std::int64_t y = valueOf(table, after, assignment);
        ASSERT_EQ(asTruth ? x != 0 : x, asTruth ? y != 0 : y) << SymbolicExprPrinter(table, true)(before);
    });
}

void expectExample(const RuleInfo& rule) {
    Workbench bench;
    FiredRules fired;
    bench.simplifier.setListener(&fired);
    const SymbolicExprId before = bench.parse(std::string(rule.before));
    const SymbolicExprId after = bench.simplify(before);
    EXPECT_EQ(SymbolicExprPrinter(bench.table, true)(after),
              SymbolicExprPrinter(bench.table, true)(bench.parse(std::string(rule.after))));
    EXPECT_TRUE(fired.has(rule.name));
    std::vector<SymbolicExprId> quotients;
    std::vector<SymbolicExprId> reals;
    bench.table.lookup(SymbolicOp::Divide, quotients);
    bench.table.lookup(SymbolicOp::DoubleValue, reals);
    if (quotients.empty() && reals.empty()) // integers cannot judge what is meant for exact quotients and reals
        expectSameValues(bench.table, before, after, booleanOps.contains(bench.table.get(before)->op()));
}

TEST(Rules, EachFiresOnItsExampleAndKeepsTheMeaning) {
    std::set<std::string_view> names;
    for (const RuleInfo* rule : simplificationRules()) {
        SCOPED_TRACE(rule->name);
        EXPECT_TRUE(names.insert(rule->name).second);
        expectExample(*rule);
    }
}

TEST(Rules, AnExplanationLeadsFromTheConditionToItsResult) {
    Workbench bench;
    FiredRules fired;
    bench.simplifier.setListener(&fired);
    const SymbolicExprId before = bench.parse("!(A < 3) && (B == 1 || B == 2) && A >= 3");
    const SymbolicExprId after = bench.simplify(before);
    ASSERT_FALSE(fired.firings.empty());
    EXPECT_EQ(fired.firings.back().after, after);
    for (const RuleFiring& firing : fired.firings)
        EXPECT_NE(firing.before, firing.after) << firing.rule->name;
}

} // namespace
} // namespace VT::Testing
