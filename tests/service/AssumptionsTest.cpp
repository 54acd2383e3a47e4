// Answers under assumptions, and their reasons, against brute force over the assignments for which the assumptions
// hold.
#include "base/VCService.hpp"
#include "base/core/Table.hpp"
#include "tests/service/Customizers.hpp"
#include "tests/support/generators/RandomCondition.hpp"
#include "tests/support/oracles/Truth.hpp"

#include <gtest/gtest.h>
#include <random>

namespace VT::Testing {
namespace {

TEST(Assumptions, RestrictEveryAnswer) {
    const FreshService service;
    const SymbolicExprTable& table = service->table();
    std::mt19937_64 random(41);
    const ConditionShape shape{.lowest = 0, .highest = 2, .symbolPairs = true};
    std::size_t shortened = 0;
    for (int round = 0; round < 300; ++round) {
        service->clearAssumptions();
        std::vector<SymbolicExprId> assumed;
        for (std::size_t i = 0; i < 1 + random() % 2; ++i) {
            assumed.push_back(service->parseC(randomCondition(random, 1 + random() % 2, shape)));
            ASSERT_TRUE(service->assume(assumed.back()));
        }
        const SymbolicExprId a = service->parseC(randomCondition(random, 1 + random() % 3, shape));
        const SymbolicExprId b = service->parseC(randomCondition(random, 1 + random() % 3, shape));
        const SymbolicExprId shortest = service->shortestCondition(a, false).id();
        const SymbolicExprId implied = service->getImpliedCondition(a, b).id();

        struct {
            bool any = false, onlyA = false, onlyB = false, both = false, neither = false;
        } seen;

        forEachAssignment(shape.symbols, -3, 4, [&](const Assignment& values) {
            for (const SymbolicExprId each : assumed)
                if (!holds(table, each, values))
                    return;
            const bool isA = holds(table, a, values);
            const bool isB = holds(table, b, values);
            seen.any = true;
            (isA ? isB ? seen.both : seen.onlyA : isB ? seen.onlyB : seen.neither) = true;
            ASSERT_EQ(holds(table, shortest, values), isA) << service->printCExpr(shortest);
            ASSERT_TRUE(!isB || holds(table, implied, values) == isA) << service->printCExpr(implied);
        });
        if (!seen.any) // contradictions have no say in questions about other names
            continue;
        const auto expect = [](bool isNo, const Decision& decision) {
            EXPECT_EQ(decision.answer, isNo ? Answer::No : Answer::Yes);
        };
        for (int again = 0; again < 2; ++again) { // from the cache too
            expect(seen.onlyA, service->implies(a, b));
            expect(seen.both, service->isDisjoint(a, b));
            expect(seen.onlyA || seen.onlyB, service->isEquivalent(a, b));
            expect(seen.neither, service->covers({a, b}));
            expect(seen.both, service->isDisjoint(std::vector<VCSymbolicExprId>{a, b}));
            expect(!seen.onlyA && !seen.both, service->canHold(a));
        }
        EXPECT_EQ(service->explainImplies(a, b).isProven, !seen.onlyA);
        EXPECT_EQ(service->explainEquivalent(a, b).firstFromSecond.isProven, !seen.onlyB);
        EXPECT_EQ(service->explainDisjoint({a, b}).isProven, !seen.both);
        EXPECT_TRUE(service->explainImpliedCondition(a, implied, b).because.isProven);
        shortened += service->printCExpr(shortest).size() < service->printCExpr(a).size() ? 1U : 0U;
        service->clearAssumptions();
        ASSERT_NE(service->shortestCondition(a, false).id(), invalidId);
    }
    EXPECT_GT(shortened, 100U);
}

TEST(Assumptions, HaveASayWhereTheyShareNames) {
    const FreshService service;
    EXPECT_FALSE(service->assume(VCSymbolicExprId(invalidId)));
    EXPECT_TRUE(service->assumeFromCCondition("A < B && B < C && X == 1"));
    EXPECT_TRUE(service->assumeFromQCondition("rem(N,4) == 0 && (f(Y) || Z)"));
    EXPECT_EQ(service->assumptions().size(), 5U);
    EXPECT_TRUE(service->impliesFromCConditions("true", "A < C - 1").isYes());
    const Decision open = service->impliesFromCConditions("D", "A == 0");
    EXPECT_EQ(service->printWitness(open.witness.value()), "A=1, B=2, C=3, D=1");
    EXPECT_EQ(service->shortestCExprFromCCondition("X == 1 && D"), "D");
    EXPECT_EQ(service->getImpliedCExprFromCConditions("N % 4 < 2 && D", "E"), "D");
    EXPECT_TRUE(service->impliesFromCConditions("!Z", "f(Y)").isYes());
    const auto why = service->explainImpliesFromCConditions("C == 3 && D && A >= 1", "B == 2");
    EXPECT_EQ(why, (std::vector<std::string>{"A<B", "B<C", "C==3", "A>=1"}));
    EXPECT_EQ(service->explainDisjointFromQConditions({"D", "rem(N,4) == 2 && E"}),
              (std::vector<std::string>{"rem(N,4)==0", "rem(N,4)==2"}));
    EXPECT_FALSE(service->explainImpliesFromQConditions("D", "E"));
    const auto bothWays = service->explainEquivalentFromQConditions("E && rem(N,2) == 0", "E");
    ASSERT_TRUE(bothWays);
    EXPECT_EQ(bothWays->first, std::vector<std::string>{"E"});
    EXPECT_EQ(bothWays->second, (std::vector<std::string>{"rem(N,4)==0", "E"}));
    EXPECT_FALSE(service->explainEquivalentFromCConditions("E && D", "E"));
    service->clearAssumptions();
    EXPECT_TRUE(service->impliesFromCConditions("true", "A < C - 1").isNo());
    EXPECT_TRUE(service->assumeFromCCondition("false"));
    EXPECT_TRUE(service->canHold(service->parseC("A")).isNo());
    EXPECT_EQ(service->explainDisjointFromCConditions({"A", "B"}), std::vector<std::string>{"false"});
}

} // namespace
} // namespace VT::Testing
