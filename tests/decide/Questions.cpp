// Answers and witnesses, as they are told.
#include "tests/decide/Bench.hpp"

namespace VT::Testing {
namespace {

struct OneRow {
    const char* condition;
    const char* canHold;
    const char* mustHold;
};

void expectRows(std::span<const OneRow> rows, const DecisionOptions& options = {}) {
    for (const OneRow& row : rows) {
        SCOPED_TRACE(row.condition);
        DecisionBench bench(options);
        const SymbolicExprId id = bench.parse(row.condition);
        EXPECT_EQ(bench.text(bench.decider.canHold(id)), row.canHold);
        EXPECT_EQ(bench.text(bench.decider.mustHold(id)), row.mustHold);
    }
}

TEST(DecisionOfOne, Condition) {
    constexpr OneRow rows[] = {
        // Constants and numbers where a truth value is asked for.
        {"true", "yes:", "yes"},
        {"0.0", "no", "no:"},
        {"0.5 && A", "yes: A=1", "no: A=0"},
        {"true == 1 && false < 1", "yes:", "yes"},
        // One unknown.
        {"3-2*A>=8", "yes: A=-3", "no: A=0"},
        {"A<=2147483647 && A>=-2147483648", "yes: A=0", "no: A=2147483648"},
        {"A-2147483647-2147483647>2147483647", "yes: A=6442450942", "no: A=0"},
        // Real literals.
        {"A<2.5 && A>1.5", "yes: A=2", "no: A=0"},
        {"-0.5<=A && A<0.5 && A", "no", "no: A=0"},
        {"A<1.0e300", "yes: A=0", "undecided terms"},
        {"A*0.5<1 && !(A*0.5<1)", "no", "no: A=0"},
        {"A*0.5<1", "undecided terms", "undecided terms"},
        // Two and three unknowns.
        {"C+1<B && B<A-3", "yes: A=0 B=-4 C=-6", "no: A=0 B=0 C=0"},
        {"A!=B && B!=C && A!=C && A>=0 && A<=1 && B>=0 && B<=1 && C>=0 && C<=1", "no", "no: A=0 B=0 C=0"},
        {"A-2147483647>B && B>2147483647", "yes: A=4294967296 B=2147483648", "no: A=0 B=0"},
        // Truth values as numbers.
        {"A+(B==1)>3 && A<=3", "yes: A=3 B=1", "no: A=0 B=0"},
        {"(A>0)*(B>0)*5==5", "yes: A=1 B=1", "no: A=0 B=0"},
        // Calls and members are unknowns, whatever their arguments.
        {"A==B && defined(A) && !defined(B)", "yes: A=0 B=0 defined(A)=1 defined(B)=0",
         "no: A=0 B=0 defined(A)=0 defined(B)=0"},
        {"f(x,1)>f(x,2) && s.m>2", "yes: f(x,1)=0 f(x,2)=-1 s.m=3", "no: f(x,1)=0 f(x,2)=0 s.m=0"},
        // The variant keywords.
        {"!(sim) && (codegen) == 1", "yes: (codegen)=1 (sim)=0", "no: (codegen)=0 (sim)=1"},
        // Arithmetic that is not understood.
        {"A*B==391 && A>17 && A<391", "yes: A=23 B=17", "no: A=0 B=0"},
        {"A%16==20 || (A&3)>3 || (A&3)<0", "no", "no: A=0"},
        {"(A&5)-B==2 && B==2", "yes: A=4 B=2", "no: A=0 B=0"},
        {"A%B>0 && !(A%C>0)", "yes: A=1 B=2 C=1", "no: A=1 B=1 C=1"},
        {"A+B>64 && A==5", "yes: A=5 B=60", "no: A=0 B=0"},
        {"X>>4 > Y && Y>100", "yes: X=1632 Y=101", "no: X=0 Y=0"},
        {"1/A==2", "undecided terms", "no: A=1"},
    };
    expectRows(rows);
}

TEST(DecisionOfOne, UnderOptions) {
    for (const bool inForce : {false, true}) {
        DecisionBench bench({.keywordsInForce = inForce});
        const SymbolicExprId sim = SymbolicString(bench.table, "(sim)").getId(bench.table);
        const SymbolicExprId codegen = SymbolicString(bench.table, " (codegen) ").getId(bench.table);
        EXPECT_EQ(bench.decider.overlaps(sim, codegen).isYes(), !inForce);
    }
    constexpr OneRow narrow[] = {
        {"A<=2147483647 && A>=-2147483648", "yes: A=0", "yes"},
        {"A>2147483646", "yes: A=2147483647", "no: A=0"},
        {"A-2147483647>B && B>0", "no", "no: A=0 B=0"},
        {"A+B>2147483647", "yes: A=1 B=2147483647", "no: A=0 B=0"},
    };
    expectRows(narrow, {.bits32 = true});
}

TEST(DecisionOfTwo, RelationAndWitnesses) {
    struct Row {
        const char* a;
        const char* b;
        RelationKind kind;
        const char* onlyA;
        const char* onlyB;
        const char* both;
    };

    constexpr Row rows[] = {
        {"a&&b || !a&&c || b&&c", "a&&b || !a&&c", RelationKind::Equivalent, "no", "no", "yes: a=0 b=0 c=1"},
        {"A<A", "B!=B", RelationKind::Equivalent, "no", "no", "no"},
        {"A<A", "B", RelationKind::Disjoint, "no", "yes: A=0 B=1", "no"},
        {"A==1", "A>0", RelationKind::Implies, "no", "yes: A=2", "yes: A=1"},
        {"A<B", "B<C", RelationKind::Overlaps, "yes: A=0 B=1 C=0", "yes: A=0 B=0 C=1", "yes: A=0 B=1 C=2"},
        {"A*A==2", "A*A>1", RelationKind::Undecided, "no", "yes: A=2", "undecided terms"},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(std::string(row.a) + " with " + row.b);
        DecisionBench bench;
        const Relation relation = bench.decider.classify(bench.parse(row.a), bench.parse(row.b));
        EXPECT_EQ(relation.kind, row.kind);
        EXPECT_EQ(bench.text(relation.onlyA), row.onlyA);
        EXPECT_EQ(bench.text(relation.onlyB), row.onlyB);
        EXPECT_EQ(bench.text(relation.both), row.both);
        EXPECT_EQ(relation.bound == DecisionBound::None, row.kind != RelationKind::Undecided);
    }
}

TEST(DecisionOfSets, CoverAndOverlap) {
    struct Row {
        std::vector<const char*> conditions;
        const char* covers;
        const char* disjoint;
        std::optional<std::pair<std::size_t, std::size_t>> members;
    };

    const Row rows[] = {
        {{}, "no:", "yes", std::nullopt},
        {{"A==1", "A==2", "A<1", "A>3"}, "no: A=3", "yes", std::nullopt},
        {{"A==1", "B", "A<0", "A<3 && A>1", "A==2 && !B"}, "no: A=0 B=0", "no: A=1 B=1", {{0, 1}}},
        {{"A<B", "A>B", "B==A+1"}, "no: A=0 B=0", "no: A=0 B=1", {{0, 2}}},
    };
    for (const Row& row : rows) {
        DecisionBench bench;
        std::vector<SymbolicExprId> ids;
        for (const char* text : row.conditions)
            ids.push_back(bench.parse(text));
        EXPECT_EQ(bench.text(bench.decider.covers(ids)), row.covers);
        const SetDecision disjoint = bench.decider.disjoint(ids);
        EXPECT_EQ(bench.text(disjoint), row.disjoint);
        EXPECT_EQ(disjoint.members, row.members);
    }
}

TEST(DecisionOfSets, ScalesToTenThousandChoices) {
    DecisionBench bench;
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
    DecisionBench bench;
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
    // Every a comes before every b, so the diagram doubles with each pair.
    std::string text = "false";
    for (int i = 100; i < 124; ++i)
        text += " || a" + std::to_string(i) + " && b" + std::to_string(i);
    const SymbolicExprId wide = bench.parse(text);
    EXPECT_EQ(bench.text(bench.decider.canHold(wide)), "undecided steps");
    EXPECT_EQ(bench.text(bench.decider.canHold(wide)), "undecided steps");
    EXPECT_LE(bench.decider.stepsTaken(), limits::decisionSteps);
    EXPECT_TRUE(bench.decider.canHold(a).isYes());
}

/// The steps that a question takes, and no fewer, suffice: whether or not its conditions were read before.
TEST(DecisionBounds, DoNotDependOnEarlierQuestions) {
    DecisionBench bench;
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
            // A witness at hand is told even where the proof that it is the smallest was cut short.
            const Decision decision = decider.implies(a, b);
            EXPECT_TRUE(decision.isNo());
            EXPECT_LE(decider.stepsTaken(), needed);
            Decider few(bench.table, {.steps = 20});
            if (readBefore)
                static_cast<void>(few.canHold(b));
            EXPECT_EQ(bench.text(few.implies(a, b)), "undecided steps");
        }
}

TEST(DecisionDepth, IsNotLimitedByTheStack) {
    DecisionBench bench;
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
    DecisionBench bench;
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
