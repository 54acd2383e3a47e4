// Every condition of at most three operators and random ones against all assignments of a small world; random pairs
// against an independent solver; witnesses of pairs of the corpus.
#include "tests/decide/DecisionFixture.hpp"
#include "tests/support/Parsing.hpp"
#include "tests/support/generators/AnyNode.hpp"
#include "tests/support/generators/Corpus.hpp"
#include "tests/support/generators/RandomCondition.hpp"
#include "tests/support/oracles/Solver.hpp"

#include <algorithm>
#include <array>
#include <cstdlib>
#include <random>
#include <span>

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
    Values values{};
};

std::vector<Entry> leaves(SymbolicExprTable& table) {
    Entry a{SymbolicString(table, "A").getId(table)};
    Entry b{SymbolicString(table, "B").getId(table)};
    Entry two{SymbolicIntValue(table, 2).getId(table)};
    for (std::size_t i = 0; i < a.values.size(); ++i) {
        a.values[i] = static_cast<std::int8_t>(fromSmall(i / side));
        b.values[i] = static_cast<std::int8_t>(fromSmall(i % side));
        two.values[i] = 2;
    }
    return {a, b, two};
}

/// The conditions of so many operators made of those of fewer.
std::vector<Entry> ofOperators(SymbolicExprTable& table, const std::vector<std::vector<Entry>>& smaller) {
    static const struct {
        SymbolicOp op;
        int (*compute)(int, int);
    } operators[] = {
        {SymbolicOp::Not, [](int x, int) { return int{x == 0}; }},
        {SymbolicOp::UnaryMinus, [](int x, int) { return -x; }},
        {SymbolicOp::Plus, [](int x, int y) { return x + y; }},
        {SymbolicOp::Minus, [](int x, int y) { return x - y; }},
        {SymbolicOp::Equal, [](int x, int y) { return int{x == y}; }},
        {SymbolicOp::LessThan, [](int x, int y) { return int{x < y}; }},
        {SymbolicOp::GreaterThanEqual, [](int x, int y) { return int{x >= y}; }},
        {SymbolicOp::And, [](int x, int y) { return int{x != 0 && y != 0}; }},
        {SymbolicOp::Or, [](int x, int y) { return int{x != 0 || y != 0}; }},
    };

    using Ids = std::vector<SymbolicExprId>;
    std::vector<Entry> all;
    const std::size_t count = smaller.size();
    for (const auto& [op, compute] : operators) {
        const bool isUnary = op == SymbolicOp::Not || op == SymbolicOp::UnaryMinus;
        for (std::size_t i = isUnary ? count - 1 : 0; i < count; ++i)
            for (const Entry& x : smaller[i])
                for (const Entry& y : isUnary ? std::span(&x, 1) : std::span(smaller[count - 1 - i])) {
                    const SymbolicExprId id = makeNode(table, op, isUnary ? Ids{x.id} : Ids{x.id, y.id});
                    all.push_back({id, {}});
                    for (std::size_t at = 0; at < x.values.size(); ++at)
                        all.back().values[at] = static_cast<std::int8_t>(compute(x.values[at], y.values[at]));
                }
    }
    return all;
}

/// Compares a witness with the first assignment of the world where the truth is `wanted`; an empty text if all is well.
std::string judge(const DecisionFixture& bench, const Entry& entry, const Decision& decision, bool found, bool wanted) {
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
    if (!smallest("A", at / side) || !smallest("B", at % side))
        return what + ": not the smallest";
    return {};
}

TEST(BruteForce, EveryConditionOfAtMostThreeOperators) {
    DecisionFixture bench;
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
        DecisionFixture bench;
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
            DecisionFixture bench;
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

/// Each "yes" comes with a witness, for which the conditions hold as asked; a solver, if there is one, says the same.
void expectRight(const DecisionFixture& bench, SymbolicExprId a, SymbolicExprId b, const Relation& relation,
                 Solver* solver = nullptr) {
    const auto expectOne = [&](const Decision& decision, bool wantsA, bool wantsB) {
        ASSERT_EQ(decision.isYes(), decision.witness.has_value());
        if (decision.isYes()) {
            ASSERT_EQ(bench.holdsFor(a, decision), wantsA);
            ASSERT_EQ(bench.holdsFor(b, decision), wantsB);
        }
        if (solver != nullptr) {
            const Z3_ast inA = wantsA ? solver->truth(a) : solver->negated(solver->truth(a));
            const Z3_ast inB = wantsB ? solver->truth(b) : solver->negated(solver->truth(b));
            ASSERT_EQ(decision.answer, solver->canHold(inA, inB) ? Answer::Yes : Answer::No);
        }
    };
    const SymbolicExprPrinter print(bench.table, false);
    SCOPED_TRACE(print(a) + "\n" + print(b));
    expectOne(relation.onlyA, true, false);
    expectOne(relation.onlyB, false, true);
    expectOne(relation.both, true, true);
}

TEST(AgainstSolver, RandomPairs) {
    const char* asked = std::getenv("VTSYM_SOLVER_PAIRS");
    const std::size_t pairs = asked != nullptr ? std::strtoul(asked, nullptr, 10) : 10000;
    std::mt19937_64 random(22);
    const ConditionShape shape{.symbols = {"A", "B", "C", "D"}, .symbolPairs = true, .truthValues = true};
    std::size_t done = 0;
    while (done < pairs) {
        DecisionFixture bench; // a fresh one now and then, so that neither side grows without end
        Solver solver(bench.table);
        for (int i = 0; i < 500 && done < pairs; ++i, ++done) {
            static const char* const sums[] = {" || A+2<=C",     " && 3*B-1>D-D+2*B+(C<2)", " && A+B>C+2",
                                               " && 2*A-3*B==C", " || A+B+C+D<=3",          " && 7*A-5*D>=2*B+C"};
            const auto text = [&] {
                std::string condition = randomCondition(random, 1 + random() % 5, shape);
                if (random() % 4 == 0)
                    condition += sums[random() % std::size(sums)];
                return condition;
            };
            const SymbolicExprId a = bench.parse(text());
            const SymbolicExprId b = bench.parse(text());
            expectRight(bench, a, b, bench.decider.classify(a, b), &solver);
            ASSERT_FALSE(HasFatalFailure());
        }
    }
}

/// Neighbours among the lines that share a symbol.
TEST(CorpusPairs, AreDecidedAndWitnessesHold) {
    DecisionFixture bench;
    std::map<std::string, std::vector<SymbolicExprId>> bySymbol;
    for (const CorpusFile& file : corpusFiles)
        for (const std::string& line : corpusLines(file.name)) {
            const SymbolicExprId id = parse(bench.table, line).id;
            std::vector<std::string> symbols; // none of a text that is no condition
            bench.table.getSymbolsFromExpression(id, symbols);
            for (const std::string& symbol : symbols)
                if (symbol != "defined")
                    bySymbol[symbol].push_back(id);
        }
    std::size_t pairs = 0;
    std::size_t undecided = 0;
    for (const auto& [symbol, ids] : bySymbol)
        for (std::size_t i = 1; i < ids.size(); ++i) {
            const Relation relation = bench.decider.classify(ids[i - 1], ids[i]);
            ++pairs;
            undecided += relation.kind == RelationKind::Undecided ? 1U : 0U;
            expectRight(bench, ids[i - 1], ids[i], relation);
        }
    EXPECT_GT(pairs, 10000U);
    EXPECT_EQ(undecided, 0U);
}

} // namespace
} // namespace VT::Testing
