// The search over comparisons against the diagrams, which share nothing but the question.
#include "base/decide/DeciderState.hpp"
#include "tests/decide/DecisionFixture.hpp"
#include "tests/support/generators/RandomCondition.hpp"

#include <random>

namespace VT::Testing {
namespace {

/// Everything that a decision needs, with the ways to decide apart from each other.
struct SearchBench : DecisionFixture, DecisionParts {
    SearchBench() : DecisionParts(table, false, minusInfinite, plusInfinite) {}

    std::pair<Decision, Decision> bothWays(SymbolicExprId id) {
        steps.refill(limits::decisionSteps);
        const ReadCondition condition = reader.read(id);
        if (condition.truth == never)
            return {};
        question.begin();
        question.mention(condition.met);
        question.ask(circuit, unknowns, steps, condition.truth);
        Decision byDiagrams = witnesses.find(question, diagrams.of(question), condition.leaves);
        return {std::move(byDiagrams), search.find(question, condition.leaves)};
    }
};

TEST(ConditionSearch, AgreesWithDiagrams) {
    std::mt19937_64 random(40);
    const ConditionShape shape{.symbols = {"A", "B", "C", "D", "E"}, .symbolPairs = true, .truthValues = true};
    SearchBench bench;
    std::size_t decided = 0;
    for (int round = 0; round < 4000; ++round) {
        std::string text = randomCondition(random, 1 + random() % 12, shape);
        const bool hasSum = random() % 4 == 0;
        if (hasSum)
            text = "(" + text + ") && (2*A-3*B<=C || A+B+C>7 && A+C!=B)";
        SCOPED_TRACE(text);
        const auto [byDiagrams, bySearch] = bench.bothWays(bench.parse(text));
        if (byDiagrams.isUndecided() || bySearch.isUndecided())
            continue;
        ++decided;
        ASSERT_EQ(byDiagrams.answer, bySearch.answer);
        if (bySearch.isYes() && !hasSum) {
            ASSERT_EQ(bench.text(byDiagrams), bench.text(bySearch)); // both find the smallest witness
        }
        if (bySearch.isYes() && hasSum) {
            ASSERT_TRUE(bench.holdsFor(bench.parse(text), bySearch));
        }
    }
    EXPECT_GT(decided, 3000U);
}

} // namespace
} // namespace VT::Testing
