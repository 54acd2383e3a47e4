// Reasons against brute force: they force the conclusion, and without any one of them it does not follow.
#include "base/core/Make.hpp"
#include "base/decide/reasons/MinimalSubset.hpp"
#include "base/decide/reasons/ReasonSearch.hpp"
#include "tests/decide/DecisionFixture.hpp"
#include "tests/support/generators/RandomCondition.hpp"

#include <algorithm>
#include <random>

namespace VT::Testing {
namespace {

/// A random monotone question: a set suffices where it contains one of a few sets.
TEST(MinimalSubset, SufficesAndLosesThatWithoutAnyElement) {
    std::mt19937_64 random(31);
    for (int round = 0; round < 3000; ++round) {
        const std::size_t count = random() % 12;
        std::vector<std::uint64_t> enough;
        for (std::size_t i = 0; i < 1 + random() % 3; ++i)
            enough.push_back(random() & random() & ((1U << count) - 1));
        const std::uint64_t unknown = random() % 4 == 0 ? random() & ((1U << count) - 1) : 0; // the answer is open
        std::size_t questions = 0;
        const auto maskOf = [](std::span<const std::size_t> positions) {
            std::uint64_t mask = 0;
            for (const std::size_t at : positions)
                mask |= std::uint64_t{1} << at;
            return mask;
        };
        const auto isEnough = [&](std::uint64_t mask) {
            return std::ranges::any_of(enough, [&](std::uint64_t each) { return (each & mask) == each; });
        };
        const MinimalSubset subset = minimalSubset(count, [&](std::span<const std::size_t> positions) {
            EXPECT_TRUE(std::ranges::is_sorted(positions));
            ++questions;
            const std::uint64_t mask = maskOf(positions);
            return mask == unknown && mask != 0 ? Answer::Undecided : isEnough(mask) ? Answer::Yes : Answer::No;
        });
        const std::uint64_t found = maskOf(subset.positions);
        ASSERT_TRUE(isEnough(found));
        bool isMinimal = true;
        for (const std::size_t at : subset.positions)
            isMinimal = isMinimal && !isEnough(found & ~(std::uint64_t{1} << at));
        ASSERT_TRUE(isMinimal || !subset.isMinimal);
        ASSERT_TRUE(subset.isMinimal || unknown != 0);
        ASSERT_LE(questions, 3 * count + 4);
    }
}

class Reasoning : public ::testing::Test {
protected:
    SymbolicExprId parse(const std::string& text) { return bench.parse(text); }

    std::string text(const Reasons& reasons) const {
        std::string result = reasons.isProven ? "" : "not proven";
        for (const SymbolicExprId id : reasons.operands)
            result += (result.empty() ? "" : ", ") + SymbolicExprPrinter(bench.table, false)(id);
        return result + (reasons.isProven && !reasons.isMinimal ? " (not minimal)" : "");
    }

    std::string lost(const std::string& condition, const std::string& shorter, const std::string& known) {
        const ShorteningReasons reasons =
            search().whyShorter(std::vector{parse(known)}, parse(condition), parse(shorter));
        std::string result = text(reasons.because);
        for (const LostOperand& each : reasons.lost)
            result += "; " + SymbolicExprPrinter(bench.table, false)(each.operand) + ": " + text(each.because);
        return result;
    }

    ReasonSearch search(std::uint64_t steps = limits::reasonSteps) { return {bench.table, bench.decider, steps}; }

    DecisionFixture bench;
};

TEST_F(Reasoning, NamesTheOperandsThatForceAConclusion) {
    const auto implied = [&](const std::string& a, const std::string& b) {
        return text(search().whyImplied(std::vector{parse(a)}, parse(b)));
    };
    EXPECT_EQ(implied("X && (Gear > 4 && (Y && Mode == 1)) && Z", "Gear > 2"), "Gear>4");
    EXPECT_EQ(implied("A < B && C == 1 && B < C && A != 7", "A < 1"), "A<B, C==1, B<C");
    EXPECT_EQ(implied("A == 1", "A > 2"), "not proven");
    EXPECT_EQ(implied("A == 1", "B || !B"), "");
    EXPECT_EQ(implied("A && A && A && A", "A"), "A");
    EXPECT_EQ(implied("A*A == 2 && B*C == 3", "B*C > 2"), "B*C==3");
    const auto never = [&](const std::vector<std::string>& texts) {
        std::vector<SymbolicExprId> premises;
        for (const std::string& each : texts)
            premises.push_back(parse(each));
        return text(search().whyNever(premises));
    };
    EXPECT_EQ(never({"Mode == 1 && Gear > 2", "Sport && Gear <= 1"}), "Gear>2, Gear<=1");
    EXPECT_EQ(never({"A", "B"}), "not proven");
    EXPECT_EQ(never({"A", "false", "B"}), "false");
    EXPECT_EQ(never({}), "not proven");
    const SymbolicExprId nowhere = 1000000;
    EXPECT_FALSE(search().whyNever(std::vector{nowhere}).isProven);
    EXPECT_FALSE(search().whyImplied(std::vector{parse("A")}, nowhere).isProven);
    EXPECT_FALSE(search().whyShorter(std::vector{parse("A")}, parse("A"), nowhere).because.isProven);
}

TEST_F(Reasoning, NamesTheOperandsThatAShorterFormLostAndTheFactsForEach) {
    EXPECT_EQ(lost("V >= 4 && V >= 2", "V>=4", "V >= 3 && X"), "; V>=2: ");
    EXPECT_EQ(lost("V >= 2 && B", "B", "X && V >= 3"), "V>=3; V>=2: V>=3");
    EXPECT_EQ(lost("X && (A || B) && C", "X && B", "!A && Y && C > 0"), "!A, C>0; C: C>0; A: !A");
    EXPECT_EQ(lost("A >= 3 && A <= 3 && B", "A == 3", "B"), "B; B: B");
    EXPECT_EQ(lost("A >= 3 && A < 5", "A == 3", "A != 4"), "A!=4");
    EXPECT_EQ(lost("A", "B", "C"), "not proven");
}

TEST_F(Reasoning, EndsWithItsStepsAndSaysSo) {
    std::string chain = "A > 5";
    for (int i = 0; i < 2000; ++i)
        chain += " && N" + std::to_string(i) + " == " + std::to_string(i);
    chain += " && A < 5";
    ReasonSearch full = search(std::uint64_t{1} << 24U);
    EXPECT_EQ(text(full.whyNever(std::vector{parse(chain)})), "A>5, A<5");
    ReasonSearch cut = search(full.stepsTaken() / 4);
    const Reasons reasons = cut.whyNever(std::vector{parse(chain)});
    EXPECT_TRUE(!reasons.isProven || !reasons.isMinimal);
    EXPECT_FALSE(search(0).whyNever(std::vector{parse("A && !A")}).isProven);
    EXPECT_EQ(bench.decider.canHold(parse("A")).answer, Answer::Yes) << "its steps are its own again";
}

TEST_F(Reasoning, AgreesWithBruteForce) {
    std::mt19937_64 random(32);
    const ConditionShape shape{.lowest = 0, .highest = 2, .symbolPairs = true};
    const auto everywhere = [&](std::span<const SymbolicExprId> premises, SymbolicExprId conclusion) {
        bool isTrue = true;
        forEachAssignment(shape.symbols, -3, 4, [&](const Assignment& values) {
            const auto holdsHere = [&](SymbolicExprId id) { return holds(bench.table, id, values); };
            isTrue = isTrue && (!std::ranges::all_of(premises, holdsHere) || holdsHere(conclusion));
        });
        return isTrue;
    };
    std::size_t several = 0;
    for (int round = 0; round < 400; ++round) {
        std::vector<SymbolicExprId> premises;
        for (std::size_t i = 0; i < 3 + random() % 4; ++i)
            premises.push_back(parse(randomCondition(random, 1 + random() % 2, shape)));
        const bool isContradiction = random() % 2 == 0;
        const SymbolicExprId conclusion =
            isContradiction ? bench.table.getIdFALSE() : parse(randomCondition(random, 1 + random() % 2, shape));
        const SymbolicExprId one = makeChain(bench.table, SymbolicOp::And, premises);
        const Reasons reasons =
            isContradiction ? search().whyNever(premises) : search().whyImplied(std::vector{one}, conclusion);
        ASSERT_EQ(reasons.isProven, everywhere(premises, conclusion));
        if (!reasons.isProven)
            continue;
        ASSERT_TRUE(reasons.isMinimal);
        ASSERT_TRUE(everywhere(reasons.operands, conclusion));
        for (std::size_t i = 0; i < reasons.operands.size(); ++i) {
            std::vector<SymbolicExprId> without = reasons.operands;
            without.erase(without.begin() + static_cast<std::ptrdiff_t>(i));
            ASSERT_FALSE(everywhere(without, conclusion)) << text(reasons);
        }
        several += reasons.operands.size() > 1 ? 1U : 0U;
    }
    EXPECT_GT(several, 50U);
}

} // namespace
} // namespace VT::Testing
