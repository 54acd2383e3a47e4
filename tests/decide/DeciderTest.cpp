// Answers and witnesses as texts.
#include "base/integer/ExactArithmetic.hpp"
#include "tests/decide/DecisionFixture.hpp"
#include "tests/support/Cases.hpp"

namespace VT::Testing {
namespace {

TEST(Decider, ComputesEveryExactOperator) {
    for (const OperatorInfo& row : operatorTable()) {
        if (exactOps.contains(row.op)) {
            EXPECT_TRUE(integerResult(row.op, 6, 3) || integerResult(row.op, 6)) << row.name;
        }
    }
}

TEST(DecisionOfOne, CanAndMustHold) {
    for (const bool bits32 : {false, true})
        for (const CaseRow& row : casesOf("decide.txt", bits32 ? "of one, in 32 bits" : "of one", 3)) {
            SCOPED_TRACE(row[0]);
            DecisionFixture bench({.bits32 = bits32});
            const SymbolicExprId id = bench.parse(row[0]);
            EXPECT_EQ(bench.text(bench.decider.canHold(id)), row[1]);
            EXPECT_EQ(bench.text(bench.decider.mustHold(id)), row[2]);
        }
}

TEST(DecisionOfTwo, KeywordsAreOppositesWhileInForce) {
    for (const bool inForce : {false, true}) {
        DecisionFixture bench({.keywordsInForce = inForce});
        const SymbolicExprId sim = SymbolicString(bench.table, "(sim)").getId(bench.table);
        const SymbolicExprId codegen = SymbolicString(bench.table, " (codegen) ").getId(bench.table);
        EXPECT_EQ(bench.decider.overlaps(sim, codegen).isYes(), !inForce);
    }
}

TEST(DecisionOfTwo, RelationAndWitnesses) {
    const char* const kinds[] = {"equivalent", "disjoint", "implies", "implied by", "overlaps", "undecided"};
    for (const CaseRow& row : casesOf("decide.txt", "of two", 6)) {
        SCOPED_TRACE(row[0] + " with " + row[1]);
        DecisionFixture bench;
        const Relation relation = bench.decider.classify(bench.parse(row[0]), bench.parse(row[1]));
        EXPECT_EQ(kinds[static_cast<std::size_t>(relation.kind)], row[2]);
        EXPECT_EQ(bench.text(relation.onlyA), row[3]);
        EXPECT_EQ(bench.text(relation.onlyB), row[4]);
        EXPECT_EQ(bench.text(relation.both), row[5]);
        EXPECT_EQ(relation.bound == DecisionBound::None, relation.kind != RelationKind::Undecided);
    }
}

TEST(DecisionOfSets, CoverAndOverlap) {
    for (const CaseRow& row : casesOf("decide.txt", "of sets", 8)) {
        SCOPED_TRACE(testing::PrintToString(row));
        DecisionFixture bench;
        std::vector<SymbolicExprId> ids;
        for (std::size_t i = 3; i < row.size() && !row[i].empty(); ++i)
            ids.push_back(bench.parse(row[i]));
        EXPECT_EQ(bench.text(bench.decider.covers(ids)), row[0]);
        const SetDecision disjoint = bench.decider.disjoint(ids);
        EXPECT_EQ(bench.text(disjoint), row[1]);
        const auto members = disjoint.members;
        EXPECT_EQ(members ? std::to_string(members->first) + " " + std::to_string(members->second) : "", row[2]);
    }
}

TEST(DecisionOfSets, ScalesToTenThousandChoices) {
    DecisionFixture bench;
    std::vector<SymbolicExprId> ids;
    for (int i = 0; i < 10000; ++i)
        ids.push_back(bench.parse("A==" + std::to_string(i * 7919 % 10000) + " && B>0"));
    EXPECT_TRUE(bench.decider.disjoint(ids).isYes());
    ids.push_back(bench.parse("A<0 || A>=10000"));
    ids.push_back(bench.parse("B<0 || B==0 && A!=1234"));
    EXPECT_EQ(bench.text(bench.decider.covers(ids)), "no: A=1234 B=0");
    EXPECT_EQ(bench.decider.disjoint(ids).members, std::pair(std::size_t{10000}, std::size_t{10001}));
}

TEST(DecisionBounds, AreTold) {
    DecisionFixture bench;
    const SymbolicExprId a = bench.parse("A");
    const SymbolicExprId dangling = SymbolicNotExpr(bench.table, invalidId - 1).getId(bench.table);
    for (const SymbolicExprId bad : {invalidId, SymbolicExprId{bench.table.size()}, dangling}) {
        EXPECT_EQ(bench.text(bench.decider.canHold(bad)), "undecided no condition");
        EXPECT_EQ(bench.text(bench.decider.implies(a, bad)), "undecided no condition");
        EXPECT_EQ(bench.decider.classify(bad, a).bound, DecisionBound::NoCondition);
        const SymbolicExprId pair[] = {a, bad};
        EXPECT_EQ(bench.text(bench.decider.covers(pair)), "undecided no condition");
        EXPECT_EQ(bench.decider.holds(bad, {}), std::nullopt);
    }
    // Every product of two sums is one of differences; no order of them keeps the diagram small.
    std::string text = "1";
    for (int i = 0; i < 40; ++i)
        for (int j = 0; j < i; ++j)
            text += " && x" + std::to_string(i) + "*x" + std::to_string(j) + ">x" + std::to_string((i + j) % 40);
    const SymbolicExprId wide = bench.parse(text);
    bench.decider.limitSteps(limits::decisionSteps / 16);
    EXPECT_EQ(bench.text(bench.decider.canHold(wide)), "undecided steps");
    EXPECT_EQ(bench.text(bench.decider.canHold(wide)), "undecided steps");
    EXPECT_LE(bench.decider.stepsTaken(), limits::decisionSteps);
    EXPECT_TRUE(bench.decider.canHold(a).isYes());
}

/// The steps that a question takes, and no fewer, suffice: whether or not its conditions were read before.
TEST(DecisionBounds, DoNotDependOnEarlierQuestions) {
    DecisionFixture bench;
    const SymbolicExprId a = bench.parse("A<B && B<C || A==3 && !(C>B+2) || D");
    const SymbolicExprId b = bench.parse("B<C || A<C");
    bench.decider.implies(a, b);
    const std::uint64_t needed = bench.decider.stepsTaken();
    for (const bool readBefore : {false, true})
        for (const std::uint64_t missing : {0U, 1U}) {
            Decider decider(bench.table, {.steps = needed - missing});
            if (readBefore) {
                static_cast<void>(decider.canHold(a));
                static_cast<void>(decider.overlaps(b, a));
            }
            // A witness at hand is reported even where the proof that it is the smallest was cut short.
            const Decision decision = decider.implies(a, b);
            EXPECT_TRUE(decision.isNo());
            EXPECT_LE(decider.stepsTaken(), needed);
            Decider few(bench.table, {.steps = 20});
            if (readBefore)
                static_cast<void>(few.canHold(b));
            EXPECT_EQ(bench.text(few.implies(a, b)), "undecided steps");
        }
}

TEST(DecisionBounds, AreSharedByDecidersOfOneBudget) {
    DecisionFixture bench;
    Budget budget(20'000);
    std::uint64_t taken = 0;
    std::size_t decided = 0;
    std::size_t asked = 0;
    for (; budget.left() > 0; ++asked) {
        ASSERT_LT(asked, 20'000U);
        Decider decider(bench.table);
        decider.share(&budget);
        const Decision decision = decider.canHold(bench.parse("A<B && B<" + std::to_string(asked) + " || A==C"));
        taken += decider.stepsTaken();
        decided += decision.isYes() ? 1U : 0U;
        EXPECT_TRUE(decision.isYes() || budget.left() == 0);
    }
    EXPECT_LE(taken, 20'000U);
    EXPECT_GE(decided + 1, asked);
    bench.decider.share(&budget);
    EXPECT_EQ(bench.text(bench.decider.canHold(bench.parse("A<B"))), "undecided steps");
    budget.add(1000);
    EXPECT_TRUE(bench.decider.canHold(bench.parse("A<B")).isYes());
}

TEST(DecisionDepth, IsNotLimitedByTheStack) {
    DecisionFixture bench;
    SymbolicExprId deep = bench.parse("A");
    SymbolicExprId shared = deep;
    SymbolicExprId sum = deep;
    for (int i = 0; i < 200000; ++i) {
        deep = SymbolicNotExpr(bench.table, deep).getId(bench.table);
        sum = SymbolicPlusExpr(bench.table, sum, bench.parse("1")).getId(bench.table);
    }
    for (int i = 0; i < 200; ++i)
        shared = SymbolicAndExpr(bench.table, shared, SymbolicOrExpr(bench.table, shared, shared)).getId(bench.table);
    EXPECT_EQ(bench.text(bench.decider.equivalent(deep, shared)), "yes");
    EXPECT_EQ(bench.text(bench.decider.mustHold(sum)), "no: A=-200000");
}

TEST(DecisionOfMembers, TakesBoundValues) {
    DecisionFixture bench;
    const SymbolicExprId condition = bench.parse("s.m > 2");
    EXPECT_EQ(bench.text(bench.decider.mustHold(condition)), "no: s.m=0");
    bench.table.registerValueId(bench.parse("s.m"), bench.parse("3"));
    EXPECT_EQ(bench.text(bench.decider.mustHold(condition)), "no: s.m=0"); // was read before
    bench.decider.clear();
    EXPECT_EQ(bench.text(bench.decider.mustHold(condition)), "yes");
    bench.table.registerValueId(bench.parse("s.m"), bench.parse("N+1"));
    bench.decider.clear();
    EXPECT_EQ(bench.text(bench.decider.mustHold(condition)), "undecided terms");
}

} // namespace
} // namespace VT::Testing
