// Every condition of at most three operators, and random ones, against all assignments of a small world.
#include "tests/decide/Bench.hpp"
#include "tests/support/RandomCondition.hpp"

#include <algorithm>
#include <array>
#include <random>

namespace VT::Testing {
namespace {

constexpr int highest = 8;
constexpr int side = 2 * highest + 1;
using Values = std::array<std::int8_t, std::size_t{side} * side>; ///< by assignment of A and B, the smallest first

std::int64_t fromSmall(std::size_t rank) {
    const auto half = static_cast<std::int64_t>((rank + 1) / 2);
    return rank % 2 == 1 ? half : -half; // 0, 1, -1, 2, ...
}

struct Entry {
    SymbolicExprId id;
    Values values;
    bool arithmetic; ///< whether a sum is in it
};

std::vector<Entry> leaves(SymbolicExprTable& table) {
    Entry a{SymbolicString(table, "A").getId(table), {}, false};
    Entry b{SymbolicString(table, "B").getId(table), {}, false};
    Entry two{SymbolicIntValue(table, 2).getId(table), {}, false};
    for (std::size_t i = 0; i < a.values.size(); ++i) {
        a.values[i] = static_cast<std::int8_t>(fromSmall(i / side));
        b.values[i] = static_cast<std::int8_t>(fromSmall(i % side));
        two.values[i] = 2;
    }
    return {a, b, two};
}

template <class Node, class Compute>
void combineAll(SymbolicExprTable& table, const std::vector<Entry>& left, const std::vector<Entry>& right,
                Compute compute, std::vector<Entry>& out, bool arithmetic = false) {
    for (const Entry& a : left)
        for (const Entry& b : right) {
            Entry entry{Node(table, a.id, b.id).getId(table), {}, arithmetic || a.arithmetic || b.arithmetic};
            for (std::size_t i = 0; i < entry.values.size(); ++i)
                entry.values[i] = static_cast<std::int8_t>(compute(a.values[i], b.values[i]));
            out.push_back(entry);
        }
}

/// The conditions of so many operators made of those of fewer.
std::vector<Entry> ofOperators(SymbolicExprTable& table, const std::vector<std::vector<Entry>>& smaller) {
    std::vector<Entry> all;
    const std::size_t count = smaller.size();
    for (const Entry& a : smaller[count - 1]) {
        Entry negated{SymbolicNotExpr(table, a.id).getId(table), {}, a.arithmetic};
        Entry minus{SymbolicUnaryMinusExpr(table, a.id).getId(table), {}, true};
        for (std::size_t i = 0; i < a.values.size(); ++i) {
            negated.values[i] = a.values[i] == 0;
            minus.values[i] = static_cast<std::int8_t>(-a.values[i]);
        }
        all.push_back(negated);
        all.push_back(minus);
    }
    for (std::size_t i = 0; i < count; ++i) {
        const std::vector<Entry>& a = smaller[i];
        const std::vector<Entry>& b = smaller[count - 1 - i];
        combineAll<SymbolicPlusExpr>(
            table, a, b, [](int x, int y) { return x + y; }, all, true);
        combineAll<SymbolicMinusExpr>(
            table, a, b, [](int x, int y) { return x - y; }, all, true);
        combineAll<SymbolicEqualExpr>(
            table, a, b, [](int x, int y) { return x == y; }, all);
        combineAll<SymbolicLessThanExpr>(
            table, a, b, [](int x, int y) { return x < y; }, all);
        combineAll<SymbolicGreaterThanEqualExpr>(
            table, a, b, [](int x, int y) { return x >= y; }, all);
        combineAll<SymbolicAndExpr>(
            table, a, b, [](int x, int y) { return x != 0 && y != 0; }, all);
        combineAll<SymbolicOrExpr>(
            table, a, b, [](int x, int y) { return x != 0 || y != 0; }, all);
    }
    return all;
}

/// Compares a witness with the first assignment of the world where the truth is `wanted`; an empty text if all is well.
std::string judge(const DecisionBench& bench, const Entry& entry, const Decision& decision, bool found, bool wanted) {
    const auto first = std::ranges::find_if(entry.values, [&](std::int8_t v) { return (v != 0) == wanted; });
    const bool there = first != entry.values.end();
    const std::string what = SymbolicExprPrinter(bench.table, false)(entry.id) + " " + bench.text(decision);
    if (decision.isUndecided() || found != there || found != decision.witness.has_value())
        return what;
    if (!found)
        return {};
    const Assignment values = bench.assignment(*decision.witness);
    if (holds(bench.table, entry.id, values) != wanted)
        return what + ": no witness";
    const auto at = static_cast<std::size_t>(first - entry.values.begin());
    const auto smallest = [&](const char* name, std::size_t rank) {
        const auto value = values.find(name);
        return value == values.end() || value->second == fromSmall(rank);
    };
    if (!entry.arithmetic && (!smallest("A", at / side) || !smallest("B", at % side)))
        return what + ": not the smallest";
    return {};
}

TEST(BruteForce, EveryConditionOfAtMostThreeOperators) {
    DecisionBench bench;
    std::vector<std::vector<Entry>> byOperators{leaves(bench.table)};
    for (int operators = 1; operators <= 3; ++operators)
        byOperators.push_back(ofOperators(bench.table, byOperators));
    std::size_t asked = 0;
    for (const auto& entries : byOperators)
        for (const Entry& entry : entries) {
            const Decision can = bench.decider.canHold(entry.id);
            ASSERT_EQ(judge(bench, entry, can, can.isYes(), true), "");
            const Decision must = bench.decider.mustHold(entry.id);
            ASSERT_EQ(judge(bench, entry, must, must.isNo(), false), "");
            ++asked;
        }
    EXPECT_GT(asked, 100000U);
}

TEST(BruteForce, RandomSets) {
    std::mt19937_64 random(20);
    const ConditionShape shape{.lowest = -1, .highest = 2, .symbolPairs = true, .truthValues = true};
    for (int round = 0; round < 300; ++round) {
        DecisionBench bench;
        std::vector<SymbolicExprId> set;
        for (std::size_t i = 0; i < 2 + random() % 5; ++i)
            set.push_back(bench.parse(randomCondition(random, 1 + random() % 4, shape)));
        bool leavesOut = false;
        bool overlap = false;
        forEachAssignment(shape.symbols, -4, 5, [&](const Assignment& assignment) {
            const auto count =
                std::ranges::count_if(set, [&](SymbolicExprId id) { return holds(bench.table, id, assignment); });
            leavesOut = leavesOut || count == 0;
            overlap = overlap || count > 1;
        });
        const SetDecision covers = bench.decider.covers(set);
        ASSERT_EQ(covers.answer, leavesOut ? Answer::No : Answer::Yes);
        for (const SymbolicExprId id : leavesOut ? set : std::vector<SymbolicExprId>()) {
            ASSERT_FALSE(bench.holdsFor(id, covers));
        }
        const SetDecision disjoint = bench.decider.disjoint(set);
        ASSERT_EQ(disjoint.answer, overlap ? Answer::No : Answer::Yes);
        if (overlap) {
            ASSERT_TRUE(bench.holdsFor(set[disjoint.members->first], disjoint));
            ASSERT_TRUE(bench.holdsFor(set[disjoint.members->second], disjoint));
        }
    }
}

/// A term of any arithmetic that has values, truth values among it.
std::string randomTerm(std::mt19937_64& random, int depth) {
    static const char* const leaves[] = {"A", "B", "C", "0", "1", "2", "3", "7"};
    static const char* const operators[] = {"+", "-", "*", "/", "%", "&", "|", "^", "+", "-", "==", "<", "&&"};
    if (depth == 0 || random() % 4 == 0)
        return leaves[random() % std::size(leaves)];
    if (random() % 8 == 0)
        return (random() % 2 == 0 ? "- (" : "~(") + randomTerm(random, depth - 1) + ")";
    return "(" + randomTerm(random, depth - 1) + operators[random() % std::size(operators)] +
           randomTerm(random, depth - 1) + ")";
}

/// Where arithmetic is not understood an answer may stay away, but it is never wrong.
TEST(BruteForce, RandomArithmetic) {
    std::mt19937_64 random(23);
    std::size_t decided = 0;
    constexpr int rounds = 2000;
    for (int round = 0; round < rounds; ++round) {
        DecisionBench bench;
        static const char* const comparisons[] = {"==", "<", ">=", "!="};
        const auto comparison = [&] {
            return randomTerm(random, 2) + comparisons[random() % 4] + randomTerm(random, 2);
        };
        const std::string text = comparison() + (random() % 2 == 0 ? " && " : " || ") + comparison();
        const SymbolicExprId id = bench.parse(text);
        const Decision can = bench.decider.canHold(id);
        const Decision must = bench.decider.mustHold(id);
        SCOPED_TRACE(text + "\ncan: " + bench.text(can) + "\nmust: " + bench.text(must));
        decided += (can.isUndecided() ? 0U : 1U) + (must.isUndecided() ? 0U : 1U);
        // A quotient that has no value for the witness says nothing, neither here nor there.
        const auto confirm = [&](const Decision& decision, bool truth) {
            const std::optional<bool> holds = bench.decider.holds(id, *decision.witness);
            ASSERT_EQ(holds.value_or(truth), truth);
            if (holds) {
                ASSERT_EQ(bench.holdsFor(id, decision), truth);
            }
        };
        if (can.isYes())
            confirm(can, true);
        if (must.isNo())
            confirm(must, false);
        forEachAssignment({"A", "B", "C"}, -3, 4, [&](const Assignment& assignment) {
            try {
                const bool truth = holds(bench.table, id, assignment);
                ASSERT_FALSE(truth && can.isNo());
                ASSERT_FALSE(!truth && must.isYes());
            } catch (const NoValue&) { // nothing holds or fails where a quotient has no value
            }
        });
        ASSERT_FALSE(HasFatalFailure());
    }
    EXPECT_GT(decided, std::size_t{2 * rounds * 8 / 10});
}

/// Another order of interning and other questions before change nothing, not even the steps.
TEST(BruteForce, AnswersDoNotDependOnHistory) {
    std::mt19937_64 random(21);
    const ConditionShape shape{
        .symbols = {"alpha", "beta", "gamma", "Delta"}, .symbolPairs = true, .truthValues = true};
    for (int round = 0; round < 200; ++round) {
        std::vector<std::string> texts;
        for (int i = 0; i < 6; ++i)
            texts.push_back(randomCondition(random, 1 + random() % 6, shape) +
                            (i % 2 == 0 ? " || gamma+alpha*2>beta%3" : ""));
        const auto answers = [&](bool otherHistory) {
            DecisionBench bench;
            if (otherHistory) {
                bench.parse("gamma < beta || aardvark > 3 && Delta*2 == alpha");
                for (auto text = texts.rbegin(); text != texts.rend(); ++text)
                    static_cast<void>(bench.decider.mustHold(bench.parse(*text + " && zebra < beta")));
            }
            std::string all;
            for (std::size_t i = 0; i + 1 < texts.size(); ++i) {
                const Relation relation = bench.decider.classify(bench.parse(texts[i]), bench.parse(texts[i + 1]));
                all += bench.text(relation.onlyA) + "; " + bench.text(relation.onlyB) + "; " +
                       bench.text(relation.both) + "; " + std::to_string(bench.decider.stepsTaken()) + "\n";
            }
            return all;
        };
        ASSERT_EQ(answers(false), answers(true)) << texts[0] << "\n" << texts[1];
    }
}

} // namespace
} // namespace VT::Testing
