// Simplified conditions, and every rule by its own example: it fires, the example comes out, and brute force finds both
// sides equal.
#include "base/variants/Features.hpp"
#include "tests/simplify/Workbench.hpp"
#include "tests/support/AnyNode.hpp"
#include "tests/support/ExactValue.hpp"
#include "tests/support/FlagSetting.hpp"
#include "tests/support/Sides.hpp"

#include <algorithm>
#include <array>
#include <limits>
#include <set>

namespace VT::Testing {
namespace {

TEST(Conditions, Become) {
    const std::vector<std::string> cases{
        // Ranges
        "A>2 && A<4 => A==3", "A>1 && B==2 && A>3 => A>3&&B==2", "A<3 || A>3 => A!=3", "A<=3 && A!=3 => A<=2",
        "A==1 || B==1 && A!=1 && A!=2 => A==1||A!=2&&B==1", "A!=1 && A!=2 && A!=3 => A!=1&&A!=2&&A!=3",
        "A<=2 && A>=1 => A<=2&&A>=1", "A>2147483647 || A<=2147483647 => true", "A>2147483647 && B => A>2147483647&&B",
        "A<-2147483648 && A<5 => A<-2147483648", "A && A==0 => false", "!A || A==0 => A==0",
        // Sums of products
        "A && B || A && !B => A", "A || !A && B => A||B", "!(A && B) => !A||!B",
        "!(A==1 || B<2 || C) => A!=1&&B>=2&&!C", "!!N => !(!N)", "(C || B) && A => A&&B||A&&C",
        // Comparisons of operands
        "A<B || B<=A => true", "A<=B && B<=A => A==B", "(A == 1) == 0 => A!=1", "(A == 1) > 1 => false",
        "1 + N == N + 1 => true",
        // Constants
        "0 || 0.0 => false", "A<=2.5 && A>=2.5 => A<=2.5&&A>=2.5", "A<=2.5 || A>2.5 => true",
        // Arithmetic
        "N*2+1 => N*2+1", "1-A => -A+1", "2147483647+1 => 2147483647+1", "N+2147483647+1 => N+2147483647+1",
        "1073741824*N+1073741824*N => 1073741824*N+1073741824*N", "A-B+A => 2*A-B", "7/2 => 7/2", "1.5*2 => 3.0",
        "1.0/0 => 1.0/0", "N+0.5+0.5 => N+0.5+0.5", "0.5+0.5+N => 1.0+N", "4*(N/3) => 4*(N/3)", "M-2*N => M-2*N",
        "0+N+0.5-0 => N+0.5", "-(-(N+0.5)) => N+0.5", "1.0/1.0e-9 => 1.0/1.0e-09", "2.0*(N+1.5) => 2.0*N+3.0",
        "2*(N-1.5) => 2*N-3.0", "2.0*(N+0.5+0.5) => 2.0*N+1.0+1.0", "1.0e300*(1.0e300*N) => 1.0e+300*(1.0e+300*N)",
        "1.0e-300*(1.0e-300*N) => 1.0e-300*(1.0e-300*N)",
        // Truth values as numbers
        "(A && A) < 2 => true", "(X && 1) + (Y && 1) == 2 => (X!=0)+(Y!=0)==2",
        "(X || false) == (Y || false) => X!=0==(Y!=0)", "f(A && 1) => f(A!=0)", "[A && 1, 2] => [A!=0,2]",
        "(A && 1) & B => A!=0&B", "!(A && 1) + 1 => !A+1", "(A==1 || false) + 1 => (A==1)+1",
        // Quotients, truncated in conditions and exact in dimensions
        "N/2*2 == N => N==N/2*2", "(N/M*M == 3) + N/M*M => (N/M*M==3)+N", "N/2*2 && 1 => N/2*2!=0",
        "4*(N/2) > 1 => 4*(N/2)>1", "4*(N/-1) > 1 => -4*N>1", "N/2+N/2 > 1 => 2*(N/2)>1", "8*(N/2/2) => 2*N",
        // Reals between integers
        "N*0.5>0 && N*0.5<1 => N*0.5<1&&N*0.5>0", "N*0.5>0 || N*0.5<=0 => true"};
    for (const std::string& text : cases) {
        const auto& [condition, result] = sides(text);
        EXPECT_EQ(Workbench().simplified(condition), result) << condition;
    }
}

TEST(Keywords, ObeyTheFeatureAndTheOwnersFlag) {
    for (const bool feature : {true, false}) {
        for (const bool flag : {true, false}) {
            Workbench bench;
            const FlagSetting setting(*VTFEAT_VariantKeywordsSimCodegen, feature ? 1 : 0);
            bench.simplifier.setKeywordsFlag(flag);
            EXPECT_EQ(bench.simplified("(sim) && (codegen)") == "false", feature && flag);
            EXPECT_EQ(bench.simplified("(sim) || (codegen)") == "true", feature && flag);
        }
    }
}

TEST(BoundMembers, DecideAndStay) {
    Workbench bench;
    const SymbolicExprId member = bench.parse("P.x");
    bench.table.registerValueId(member, bench.parse("3"));
    EXPECT_EQ(bench.simplified("P.x == 3"), "true");
    EXPECT_EQ(bench.simplified("P.x && A"), "A");
    EXPECT_EQ(bench.simplified("!P.x"), "false");
    EXPECT_EQ(bench.simplified("P.x < N"), "N>P.x");
    EXPECT_EQ(bench.simplified("P.y == 3 && P.y == 4"), "false");
}

TEST(Driver, CountsPassesAndStopsAtConstants) {
    Workbench bench;
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
    Asked(Workbench& bench, bool agrees)
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
    struct Case {
        const char* condition;
        const char* questions;
        const char* agreed;
        const char* refused;
    };

    for (const Case& c : std::to_array<Case>({
             {"A <= A", "A<=A to true", "true", "false"},
             {"A+1 < 1+A", "A+1<A+1 to false", "false", "true"},
             {"2 == 2", "2==2 to true", "true", "false"},
             {"2*(N+3)", "2*(N+3) to 2*N+6", "2*N+6", "2*(N+3)"},
             {"2.5*(N-2)", "2.5*(N-2) to 2.5*N-5.0", "2.5*N-5.0", "2.5*(N-2)"},
             {"2*(3*N+1)", "2*(3*N+1) to 2*(3*N)+2", "6*N+2", "2*(3*N+1)"},
             {"1*(N+3)", "1*(N+3) to 1*N+3", "N+3", "1*(N+3)"},
             {"2*(3*N) + 2*(N+M)", "", "6*N+2*(N+M)", "6*N+2*(N+M)"},
             {"A==1 && A<3 || A && !A || !(A<2 || B)", "", "A==1||A>=2&&!B", "A==1||A>=2&&!B"},
         })) {
        for (const bool agrees : {true, false}) {
            Workbench bench;
            Asked visitor(bench, agrees);
            const SymbolicExprId result = bench.simplifier.simplify(bench.parse(c.condition), bench.passes, visitor);
            EXPECT_EQ(SymbolicExprPrinter(bench.table, false)(result), agrees ? c.agreed : c.refused);
            EXPECT_EQ(visitor.questions, c.questions);
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
            Workbench bench;
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
    Workbench bench;
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
        Workbench bench;
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
            EXPECT_NE(firing.before, firing.after) << firing.rule->name;
    }
}

} // namespace
} // namespace VT::Testing
