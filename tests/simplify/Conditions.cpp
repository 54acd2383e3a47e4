// What conditions become.
#include "tests/simplify/Workbench.hpp"

#include "base/variants/Features.hpp"

namespace VT::Testing {
namespace {

struct Case {
    const char* condition;
    const char* result;
};

void PrintTo(const Case& item, std::ostream* out) {
    *out << item.condition;
}

class Condition : public ::testing::TestWithParam<Case> {};

TEST_P(Condition, Becomes) {
    EXPECT_EQ(Workbench().simplified(GetParam().condition), GetParam().result);
}

INSTANTIATE_TEST_SUITE_P(
    Ranges, Condition,
    ::testing::Values(Case{"A<=3 && A>=3", "A==3"}, Case{"A==1 && A==2", "false"}, Case{"A==1 || A!=1", "true"},
                      Case{"A>2 && A>5", "A>5"}, Case{"A>2 && A<4", "A==3"}, Case{"A>=0 || A<=1", "true"},
                      Case{"A!=1 || A!=2", "true"}, Case{"A==1 && A!=2", "A==1"}, Case{"A==3 || A>3", "A>=3"},
                      Case{"A>1 && B==2 && A>3", "A>3&&B==2"}, Case{"A==1 && B==1 && B==2", "false"},
                      Case{"A<3 || A>3", "A!=3"}, Case{"A<=3 && A!=3", "A<=2"}, Case{"A>=3 && A!=3", "A>=4"},
                      Case{"A==1 || A==2", "A==1||A==2"}, Case{"A<2 && A>3", "false"},
                      Case{"A!=1 && A!=2 && A!=3", "A!=1&&A!=2&&A!=3"}, Case{"A<=2 && A>=1", "A<=2&&A>=1"},
                      Case{"A>2147483647 || A<=2147483647", "true"}, Case{"A>2147483647 && B", "A>2147483647&&B"},
                      Case{"A<-2147483648 && A<5", "A<-2147483648"}, Case{"A && A==0", "false"},
                      Case{"A && A==3", "A==3"}, Case{"!A || A==0", "A==0"}, Case{"A>=0 && A<=0", "A==0"},
                      Case{"A<0 || A>0", "A!=0"}));

INSTANTIATE_TEST_SUITE_P(
    SumsOfProducts, Condition,
    ::testing::Values(Case{"P && Q && !Q", "false"}, Case{"A || A && B", "A"},
                      Case{"A==1 && B==1 && true", "A==1&&B==1"}, Case{"A==1 || B==1 || false", "A==1||B==1"},
                      Case{"!(A<3)", "A>=3"}, Case{"(A==1||A==2) && B==3", "A==1&&B==3||A==2&&B==3"},
                      Case{"A && (A || B)", "A"}, Case{"A && B || A && !B", "A"}, Case{"A || !A && B", "A||B"},
                      Case{"!(A && B)", "!A||!B"}, Case{"!(A==1 || B<2 || C)", "A!=1&&B>=2&&!C"}, Case{"!!N", "!(!N)"},
                      Case{"!!(A == 1)", "A==1"}, Case{"B==2 && A==1", "A==1&&B==2"},
                      Case{"(C || B) && A", "A&&B||A&&C"}, Case{"A && (B && (C && A))", "A&&B&&C"}));

INSTANTIATE_TEST_SUITE_P(ComparisonsOfOperands, Condition,
                         ::testing::Values(Case{"A==B && A!=B", "false"}, Case{"A<B && A>=B", "false"},
                                           Case{"A<B || B<=A", "true"}, Case{"A<=B && B<=A", "A==B"},
                                           Case{"B == A", "A==B"}, Case{"3 < A", "A>3"}, Case{"A < A", "false"},
                                           Case{"A <= A", "true"}, Case{"(A==1) < 2", "true"},
                                           Case{"(A == 1) == 0", "A!=1"}, Case{"0 != (A == 1)", "A==1"},
                                           Case{"(A == 1) > 1", "false"}, Case{"f(A) && !f(A)", "false"},
                                           Case{"1 + N == N + 1", "true"}));

INSTANTIATE_TEST_SUITE_P(Constants, Condition,
                         ::testing::Values(Case{"0 && X", "false"}, Case{"2 || X", "true"}, Case{"0 || X", "X"},
                                           Case{"2 && 3", "true"}, Case{"0 || 0.0", "false"}, Case{"!0", "true"},
                                           Case{"!2.5", "false"}, Case{"true > 0", "true"},
                                           Case{"false < true", "true"}, Case{"2 < 3.5", "true"}, Case{"2 && X", "X"},
                                           Case{"A<=2.5 && A>=2.5", "A<=2.5&&A>=2.5"},
                                           Case{"A<=2.5 || A>2.5", "true"}));

INSTANTIATE_TEST_SUITE_P(Arithmetic, Condition,
                         ::testing::Values(Case{"N+N", "2*N"}, Case{"2*N+3*N", "5*N"}, Case{"N+1-N", "1"},
                                           Case{"N-N", "0"}, Case{"N*2+1", "N*2+1"}, Case{"1-A", "-A+1"},
                                           Case{"-(-A)", "A"}, Case{"- 5", "-5"}, Case{"2147483647+1", "2147483647+1"},
                                           Case{"N+2147483647+1", "N+2147483647+1"},
                                           Case{"1073741824*N+1073741824*N", "1073741824*N+1073741824*N"},
                                           Case{"A-B+A", "2*A-B"}, Case{"7/2", "7/2"}, Case{"8/2", "4"},
                                           Case{"1.5*2", "3.0"}, Case{"1.0/0", "1.0/0"}, Case{"N*0", "0"},
                                           Case{"3*(N-2)", "3*N-6"}, Case{"N+0.5+0.5", "N+0.5+0.5"},
                                           Case{"0.5+0.5+N", "1.0+N"}, Case{"4*(N/3)", "4*(N/3)"},
                                           Case{"-2*N+M", "-2*N+M"}, Case{"M-2*N", "M-2*N"}, Case{"0+N+0.5-0", "N+0.5"},
                                           Case{"-(-(N+0.5))", "N+0.5"}, Case{"1.0/1.0e-9", "1.0/1.0e-09"}));

TEST(Keywords, ObeyTheFeatureAndTheOwnersFlag) {
    for (const bool feature : {true, false}) {
        for (const bool flag : {true, false}) {
            Workbench bench;
            const SymbolicExprId both = bench.parse("(sim) && (codegen)");
            const SymbolicExprId either = bench.parse("(sim) || (codegen)");
            const std::int32_t before = VTFEAT_VariantKeywordsSimCodegen->value();
            VTFEAT_VariantKeywordsSimCodegen->setValue(feature ? 1 : 0);
            bench.simplifier.setKeywordsFlag(flag);
            EXPECT_EQ(bench.simplify(both) == bench.table.getIdFALSE(), feature && flag);
            EXPECT_EQ(bench.simplify(either) == bench.table.getIdTRUE(), feature && flag);
            VTFEAT_VariantKeywordsSimCodegen->setValue(before);
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
    EXPECT_EQ(bench.simplified("A==1"), "A==1");
    EXPECT_EQ(bench.passes, 1U);
    EXPECT_EQ(bench.simplified("A==1 && A==2"), "false");
    EXPECT_EQ(bench.passes, 1U);
    EXPECT_EQ(bench.simplify(bench.table.size()), invalidId);
    EXPECT_EQ(bench.simplify(invalidId), invalidId);
}

TEST(Driver, InternsTheTruthConstantsItNeeds) {
    SymbolicExprTable table;
    const SymbolicExprId condition = SymbolicExprParser(table, true, true)("A && !A");
    std::uint64_t passes = 0;
    const SymbolicExprId result = SymbolicExprSimplify(table).simplify(condition, passes);
    EXPECT_EQ(result, table.getIdFALSE());
    EXPECT_NE(table.getIdTRUE(), invalidId);
}

/// A visitor that refuses every rewrite.
class Refusing final : public SymbolicExprSimplifyVisitor {
public:
    using SymbolicExprSimplifyVisitor::SymbolicExprSimplifyVisitor;

    bool confirmRewrite(SymbolicExprId, SymbolicExprId) override { return false; }
};

TEST(Driver, ARefusedSelfComparisonBecomesTheOppositeAndARefusedDistributionStays) {
    Workbench bench;
    Refusing visitor(bench.table, true, bench.simplifier.printer());
    const SymbolicExprPrinter print(bench.table, false);
    EXPECT_EQ(print(bench.simplifier.simplify(bench.parse("A <= A"), bench.passes, visitor)), "false");
    EXPECT_EQ(print(bench.simplifier.simplify(bench.parse("2*(N+3)"), bench.passes, visitor)), "2*(N+3)");
}

} // namespace
} // namespace VT::Testing
