// What the packaged solver decides, against brute force, and plugins that are missing, outdated or wrong.
#include "base/decide/external/SolverPlugin.hpp"
#include "tests/decide/DecisionFixture.hpp"
#include "tests/support/Cases.hpp"
#include "tests/support/TemporaryFolder.hpp"

#include <random>

namespace VT::Testing {
namespace {

DecisionOptions with(SolverPlugin& plugin) {
    return {.solver = &plugin};
}

TEST(ExternalSolver, AnswersWithTheSmallestAssignment) {
    for (const CaseRow& row : casesOf("solver.txt", "can hold", 2)) {
        DecisionFixture fixture(with(SolverPlugin::installed()));
        const SymbolicExprId condition = fixture.parse(row[0]);
        EXPECT_EQ(fixture.text(fixture.decider.canHold(condition)), row[1]) << row[0];
    }
}

TEST(ExternalSolver, AnswersEveryKindOfQuestion) {
    for (const CaseRow& row : casesOf("solver.txt", "pairs", 6)) {
        DecisionFixture fixture({.bits32 = row[5] == "32", .solver = &SolverPlugin::installed()});
        Decider& decider = fixture.decider;
        const SymbolicExprId a = fixture.parse(row[1]);
        const SymbolicExprId b = row[2].empty() ? fixture.table.getIdTRUE() : fixture.parse(row[2]);
        const SymbolicExprId known = row[3].empty() ? fixture.table.getIdTRUE() : fixture.parse(row[3]);
        const SymbolicExprId three[] = {a, b, known};
        const std::span pair(three, 2);
        const Decision decision = row[0] == "implies"      ? decider.implies(a, b)
                                  : row[0] == "equivalent" ? decider.equivalent(a, b)
                                  : row[0] == "given"      ? decider.equivalentGiven(a, b, known)
                                  : row[0] == "disjoint"   ? decider.disjoint(a, b)
                                  : row[0] == "covers"     ? Decision(decider.covers(pair))
                                  : row[0] == "always"     ? decider.mustHold(a)
                                                           : Decision(decider.disjoint(three));
        EXPECT_EQ(fixture.text(decision), row[4]) << row[0] << " " << row[1] << " " << row[2] << " " << row[3];
    }
}

/// Random conditions over products, quotients and bits of unknowns that a small box bounds.
TEST(ExternalSolver, AgreesWithBruteForce) {
    std::mt19937_64 random(7);
    const auto pick = [&](std::initializer_list<const char*> choices) {
        return std::data(choices)[random() % choices.size()];
    };
    const auto term = [&] {
        return std::string("(") + pick({"A", "B", "C", "-A", "~B", "3", "1"}) +
               pick({"*", "*", "/", "%", "&", "|", "^", "<<", ">>", "+", "-"}) + pick({"A", "B", "C", "2", "-3"}) + ")";
    };
    const auto comparison = [&] {
        return term() + pick({"*", "+", "-", "&"}) + pick({"A", "B", "1", "(A==C)"}) +
               pick({"==", "<", ">=", "!=", "=="}) + term();
    };
    constexpr std::int64_t reach = 4;
    constexpr std::size_t rounds = 400;
    std::size_t asked = 0;
    std::size_t decided = 0;
    for (std::size_t i = 0; i < rounds; ++i) {
        std::string text = "(" + comparison() + pick({" && ", " || "}) + "(" + comparison() + "))";
        for (const char* const name : {"A", "B", "C"})
            text += std::string(" && ") + name + " >= -4 && " + name + " <= 4";
        DecisionFixture own;
        if (!own.decider.canHold(own.parse(text)).isUndecided())
            continue;
        ++asked;
        DecisionFixture fixture(with(SolverPlugin::installed()));
        const SymbolicExprId condition = fixture.parse(text);
        const Decision decision = fixture.decider.canHold(condition);
        decided += decision.isUndecided() ? 0U : 1U;
        if (decision.isYes()) {
            EXPECT_TRUE(fixture.holdsFor(condition, decision)) << text << ": " << fixture.text(decision);
            continue;
        }
        if (decision.isUndecided())
            continue;
        const Truth truth(fixture.table, condition);
        for (std::int64_t a = -reach; a <= reach; ++a)
            for (std::int64_t b = -reach; b <= reach; ++b)
                for (std::int64_t c = -reach; c <= reach; ++c)
                    ASSERT_EQ(truth.under({{"A", a}, {"B", b}, {"C", c}}).value_or(0), 0)
                        << text << ": A=" << a << " B=" << b << " C=" << c;
    }
    RecordProperty("asked", static_cast<int>(asked));
    EXPECT_GE(asked, 20U);
    EXPECT_GE(decided, asked / 2) << "of " << asked;
}

TEST(ExternalSolver, IsAskedNoMoreThanAllowed) {
    DecisionFixture fixture(with(SolverPlugin::installed()));
    const SymbolicExprId condition = fixture.parse("X*X == 2");
    EXPECT_GT(fixture.decider.limitSolver(1), 1U);
    EXPECT_EQ(fixture.text(fixture.decider.canHold(condition)), "no");
    EXPECT_EQ(fixture.text(fixture.decider.canHold(condition)), "undecided terms");
    EXPECT_EQ(fixture.decider.limitSolver(1), 0U);
    EXPECT_EQ(fixture.text(fixture.decider.canHold(condition)), "no");
}

TEST(ExternalSolver, IsNotAskedOnceABudgetIsUsedUp) {
    DecisionFixture fixture(with(SolverPlugin::installed()));
    Budget budget(limits::commandSteps);
    fixture.decider.share(&budget);
    const SymbolicExprId condition = fixture.parse("X*X == 2");
    EXPECT_EQ(fixture.text(fixture.decider.canHold(condition)), "no");
    budget.take(budget.left());
    EXPECT_EQ(fixture.text(fixture.decider.canHold(condition)), "undecided steps");
}

/// The answer to a question that needs a solver.
std::string answerOf(SolverPlugin& plugin, const char* question = "X*X == 2") {
    DecisionFixture fixture(with(plugin));
    return fixture.text(fixture.decider.canHold(fixture.parse(question)));
}

TEST(SolverPlugin, IsQuietlyAbsent) {
    const TemporaryFolder folder;
    const std::string path = folder.path("libvtsym-z3.so");
    SolverPlugin absent(path);
    EXPECT_EQ(answerOf(absent), "undecided terms");
    EXPECT_EQ(absent.fault(), "");
    folder.write("libvtsym-z3.so", "no library");
    EXPECT_EQ(answerOf(absent), "undecided terms") << "what was found is remembered";
    EXPECT_EQ(absent.fault(), "");
    SolverPlugin broken(path);
    EXPECT_EQ(answerOf(broken), "undecided terms");
    EXPECT_EQ(broken.fault().find("the solver plugin " + path + " cannot be used: "), 0U) << broken.fault();
}

TEST(SolverPlugin, OfAnotherVersionIsNotUsed) {
    SolverPlugin old(VTSYM_OLD_PLUGIN);
    EXPECT_EQ(answerOf(old), "undecided terms");
    EXPECT_EQ(old.fault(), "the solver plugin " VTSYM_OLD_PLUGIN " cannot be used: it is of another version of vtsym");
}

TEST(SolverPlugin, WithWrongAssignmentsIsNotBelieved) {
    SolverPlugin wrong(VTSYM_WRONG_PLUGIN);
    EXPECT_EQ(answerOf(wrong), "undecided terms");
    EXPECT_EQ(wrong.fault(), "");
    // A right one among wrong ones counts: 1001 is the first value, and the smallest that the plugin ever says.
    EXPECT_EQ(answerOf(wrong, "X*X == 1002001"), "yes: X=1001");
    EXPECT_EQ(answerOf(wrong, "X*X == 3*Y*Y + 2"), "undecided terms");
}

} // namespace
} // namespace VT::Testing
