// Simplified conditions, and every rule by its own example: it fires, the example comes out, and brute force finds both
// sides equal.
#include "base/variants/Features.hpp"
#include "tests/simplify/SimplifierFixture.hpp"
#include "tests/support/Cases.hpp"
#include "tests/support/FlagSetting.hpp"
#include "tests/support/generators/AnyNode.hpp"
#include "tests/support/oracles/ExactValue.hpp"

#include <algorithm>
#include <limits>
#include <set>

namespace VT::Testing {
namespace {

TEST(Conditions, Become) {
    for (const CaseRow& row : casesOf("simplify.txt", "conditions", 2))
        EXPECT_EQ(SimplifierFixture().simplified(row[0]), row[1]) << row[0];
}

TEST(Keywords, ObeyTheFeatureAndTheOwnersFlag) {
    for (const bool feature : {true, false}) {
        for (const bool flag : {true, false}) {
            SimplifierFixture bench;
            const FlagSetting setting(*VTFEAT_VariantKeywordsSimCodegen, feature ? 1 : 0);
            bench.simplifier.setKeywordsFlag(flag);
            EXPECT_EQ(bench.simplified("(sim) && (codegen)") == "false", feature && flag);
            EXPECT_EQ(bench.simplified("(sim) || (codegen)") == "true", feature && flag);
        }
    }
}

TEST(BoundMembers, DecideAndStay) {
    SimplifierFixture bench;
    const SymbolicExprId member = bench.parse("P.x");
    bench.table.registerValueId(member, bench.parse("3"));
    for (const CaseRow& row : casesOf("simplify.txt", "bound members", 2))
        EXPECT_EQ(bench.simplified(row[0]), row[1]) << row[0];
}

TEST(Driver, CountsPassesAndStopsAtConstants) {
    SimplifierFixture bench;
    EXPECT_EQ(bench.simplified("A==1 && A==2"), "false");
    EXPECT_EQ(bench.passes, 1U);
    EXPECT_EQ(bench.simplify(bench.table.size()), invalidId);
    EXPECT_EQ(bench.simplify(invalidId), invalidId);
    SymbolicExprTable table; // without truth constants, which are interned
    const SymbolicExprId condition = SymbolicExprParser(table, true, true)("A && !A");
    const SymbolicExprId result = SymbolicExprSimplify(table).simplify(condition, bench.passes);
    EXPECT_EQ(result, table.getIdFALSE());
    EXPECT_NE(table.getIdTRUE(), invalidId);
}

/// A visitor that agrees with every rewrite or with none, and remembers what it was asked.
class Asked final : public SymbolicExprSimplifyVisitor {
public:
    Asked(SimplifierFixture& bench, bool agrees)
        : SymbolicExprSimplifyVisitor(bench.table, true, bench.simplifier.printer()),
          agrees_(agrees) {}

    bool confirmRewrite(SymbolicExprId expression, SymbolicExprId replacement) override {
        const SymbolicExprPrinter print(table(), false);
        questions += (questions.empty() ? "" : "; ") + print(expression) + " to " + print(replacement);
        return agrees_;
    }

    std::string questions;

private:
    bool agrees_;
};

TEST(Driver, AsksBeforeSelfComparisonsAndDistributionsOnly) {
    for (const CaseRow& row : casesOf("simplify.txt", "questions", 4)) {
        SCOPED_TRACE(row[0]);
        for (const bool agrees : {true, false}) {
            SimplifierFixture bench;
            Asked visitor(bench, agrees);
            const SymbolicExprId result = bench.simplifier.simplify(bench.parse(row[0]), bench.passes, visitor);
            EXPECT_EQ(SymbolicExprPrinter(bench.table, false)(result), row[agrees ? 2 : 3]);
            EXPECT_EQ(visitor.questions, row[1]);
        }
    }
}

// Beside a missing operand everything stays, and nothing that has one is dropped.
TEST(MissingOperands, StayMissing) {
    for (int code = 3; code < operatorCount; ++code) {
        const auto op = static_cast<SymbolicOp>(code);
        if (callOps.contains(op) && operandCount(op) == 1)
            continue;
        for (const SymbolicExprId hole : {invalidId, SymbolicExprId{1} << 40U}) {
            SimplifierFixture bench;
            const Trees tree{bench.table};
            const SymbolicExprId contradiction = bench.parse("!(A || !A)");
            std::vector<SymbolicExprId> inputs(operandCount(op).value_or(4), contradiction);
            inputs.back() = hole;
            const SymbolicExprId broken = makeNode(bench.table, op, inputs);
            for (const SymbolicExprId root :
                 {broken, tree(SymbolicOp::And, broken, bench.parse("0")), tree(SymbolicOp::Not, broken),
                  tree(SymbolicOp::Multiply, tree.integer(2), tree(SymbolicOp::Plus, broken, tree.integer(0)))}) {
                const SymbolicExprId result = bench.simplify(root);
                const SymbolicExpr* node = bench.table.get(result);
                ASSERT_NE(node, nullptr);
                EXPECT_EQ(node->op(), bench.table.get(root)->op());
                EXPECT_EQ(bench.simplify(result), result);
                if (root != broken)
                    continue;
                EXPECT_EQ(node->getInput(node->getNumInputs() - 1), invalidId);
                if (inputs.size() > 1) {
                    EXPECT_EQ(node->getInput(0), bench.table.getIdFALSE());
                }
            }
        }
    }
    SimplifierFixture bench;
    const SymbolicExprId nan =
        SymbolicDoubleValue(bench.table, std::numeric_limits<double>::quiet_NaN()).getId(bench.table);
    const SymbolicExprId sum = SymbolicPlusExpr(bench.table, bench.parse("x"), nan).getId(bench.table);
    EXPECT_EQ(bench.simplify(sum), sum);
}

const std::vector<std::string> symbols{"A", "B", "C", "N", "M", "(sim)"};

/// Whether both expressions are worth the same wherever exactly one of the keywords is in force.
void expectSameValues(const SymbolicExprTable& table, SymbolicExprId before, SymbolicExprId after) {
    const bool asTruth = booleanOps.contains(table.get(before)->op());
    const ExactValue given(table, before, Quotients::ByContext), simplified(table, after, Quotients::ByContext);
    forEachAssignment(symbols, -1, 4, [&](Assignment assignment) {
        const std::int64_t sim = assignment.at("(sim)");
        assignment["(codegen)"] = 1 - sim;
        const std::optional<ExactNumber> x = given.under(assignment);
        if (!x || (sim != 0 && sim != 1))
            return;
        const ExactNumber y = simplified.under(assignment).value();
        ASSERT_EQ(asTruth ? x->holds() : x->real, asTruth ? y.holds() : y.real);
    });
}

/// Remembers the rules that fired.
class FiredRules final : public RuleListener {
public:
    void fired(const RuleFiring& firing) override { firings.push_back(firing); }

    std::vector<RuleFiring> firings;
};

TEST(Rules, EachFiresOnItsExampleAndKeepsTheMeaning) {
    std::set<std::string_view> names;
    for (const RuleInfo* rule : simplificationRules()) {
        SCOPED_TRACE(rule->name);
        EXPECT_TRUE(names.insert(rule->name).second);
        SimplifierFixture bench;
        FiredRules fired;
        bench.simplifier.setListener(&fired);
        const SymbolicExprId before = bench.parse(std::string(rule->before));
        const SymbolicExprId after = bench.simplify(before);
        const SymbolicExprPrinter print(bench.table, true);
        EXPECT_EQ(print(after), print(bench.parse(std::string(rule->after))));
        EXPECT_TRUE(std::ranges::any_of(fired.firings, [&](const auto& f) { return f.rule->name == rule->name; }));
        expectSameValues(bench.table, before, after);
        if (booleanOps.contains(bench.table.get(before)->op())) {
            EXPECT_EQ(fired.firings.at(fired.firings.size() - 1).after, after);
        }
        for (const RuleFiring& firing : fired.firings)
            EXPECT_TRUE(firing.before != firing.after &&
                        firing.rule->operators.contains(bench.table.get(firing.before)->op()))
                << firing.rule->name;
    }
}

} // namespace
} // namespace VT::Testing
