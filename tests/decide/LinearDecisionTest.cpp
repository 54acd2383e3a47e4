// Linear arithmetic in decisions: an example for each rule, and random pairs against an independent solver and the
// evaluator.
#include "tests/decide/DecisionFixture.hpp"
#include "tests/support/Cases.hpp"
#include "tests/support/generators/RandomLinear.hpp"
#include "tests/support/oracles/Solver.hpp"

#include <chrono>
#include <cstdlib>
#include <iostream>
#include <random>

namespace VT::Testing {
namespace {

TEST(LinearDecisions, Relations) {
    const char* const kinds[] = {"equivalent", "disjoint", "implies", "implied by", "overlaps", "undecided"};
    for (const CaseRow& row : casesOf("decide.txt", "linear", 5)) {
        SCOPED_TRACE(row[0] + " with " + row[1]);
        DecisionFixture bench;
        const SymbolicExprId a = bench.parse(row[0]);
        const SymbolicExprId b = bench.parse(row[1]);
        const Relation relation = bench.decider.classify(a, b);
        EXPECT_EQ(kinds[static_cast<std::size_t>(relation.kind)], row[2]);
        EXPECT_EQ(bench.text(relation.onlyA), row[3]);
        EXPECT_EQ(bench.text(relation.onlyB), row[4]);
        for (const auto& [decision, inA, inB] :
             {std::tuple(&relation.onlyA, true, false), std::tuple(&relation.onlyB, false, true),
              std::tuple(&relation.both, true, true)}) {
            if (!decision->witness)
                continue;
            EXPECT_EQ(bench.decider.holds(a, *decision->witness), inA);
            EXPECT_EQ(bench.decider.holds(b, *decision->witness), inB);
        }
    }
}

/// Quotients of quotients against C's own, and the smallest witness.
TEST(LinearDecisions, NestedQuotientsAreThoseOfC) {
    std::mt19937_64 random(47);
    constexpr int far = 3000;
    std::size_t held = 0;
    for (int round = 0; round < 300; ++round) {
        std::string text = "X";
        std::vector<std::pair<int, int>> links; // a divisor and what is added
        for (std::size_t i = 0; i < 1 + random() % 5; ++i) {
            links.emplace_back(static_cast<int>(2 + random() % 3) * (random() % 4 == 0 ? -1 : 1),
                               static_cast<int>(random() % 5) - 2);
            text =
                "(" + text + "/" + std::to_string(links.back().first) + "+" + std::to_string(links.back().second) + ")";
        }
        const auto valueAt = [&](int x) {
            for (const auto& [divisor, added] : links)
                x = x / divisor + added;
            return x;
        };
        const int wanted = static_cast<int>(random() % 7) - 3;
        int smallest = 0; // 0, 1, -1, 2, ...
        while (smallest < far && valueAt(smallest) != wanted)
            smallest = smallest > 0 ? -smallest : 1 - smallest;
        DecisionFixture bench;
        const Decision decision = bench.decider.canHold(bench.parse(text + "==" + std::to_string(wanted)));
        SCOPED_TRACE(text + "==" + std::to_string(wanted));
        ASSERT_EQ(decision.answer, smallest < far ? Answer::Yes : Answer::No);
        if (decision.isNo())
            continue;
        ++held;
        ASSERT_EQ(bench.text(decision), "yes: X=" + std::to_string(smallest));
    }
    EXPECT_GT(held, 100U);
}

/// What the solver decides within its limit is decided alike; witnesses hold by evaluation.  VTSYM_LINEAR_PAIRS asks
/// for more pairs; with VTSYM_LINEAR_FIRST they begin at that seed, and the solver, which takes most of the time, is
/// asked only what no witness proves.
TEST(LinearDecisions, RandomPairsAgreeWithTheSolver) {
    const char* asked = std::getenv("VTSYM_LINEAR_PAIRS");
    const std::size_t pairs = asked != nullptr ? std::strtoul(asked, nullptr, 10) : 200;
    const char* chunk = std::getenv("VTSYM_LINEAR_FIRST");
    const std::size_t first = chunk != nullptr ? std::strtoul(chunk, nullptr, 10) : 0;
    constexpr unsigned solverResources = 3000000;
    using Clock = std::chrono::steady_clock;
    Clock::duration own{};
    Clock::duration others{};
    std::size_t given = 0;
    std::string undecided;
    std::size_t withoutWitness = 0;
    constexpr std::size_t hard[] = {101405, 115147, 116021, // over as many as 20 variables, or far from their corners
                                    7603,   40395,  43743}; // with one hard path or sums to round
    const std::size_t all = pairs + std::size(hard);
    for (std::size_t done = 0; done < all;) {
        DecisionFixture bench; // a fresh one now and then, so that neither side grows without end
        Solver solver(bench.table);
        solver.limit(solverResources);
        for (int i = 0; i < 200 && done < all; ++i, ++done) {
            const std::size_t seed = done < pairs ? first + done : hard[done - pairs];
            std::mt19937_64 random(seed);
            const std::string textA = randomLinear(random);
            const std::string textB = randomLinear(random);
            SCOPED_TRACE(std::to_string(seed) + ": " + textA + "   " + textB);
            const SymbolicExprId a = bench.parse(textA);
            const SymbolicExprId b = bench.parse(textB);
            const auto begin = Clock::now();
            const Relation relation = bench.decider.classify(a, b);
            own += Clock::now() - begin;
            solver.forget();
            for (const auto& [decision, inA, inB] :
                 {std::tuple(&relation.onlyA, true, false), std::tuple(&relation.onlyB, false, true),
                  std::tuple(&relation.both, true, true)}) {
                for (const auto& [id, in] : {std::pair(a, inA), std::pair(b, inB)})
                    if (decision->witness) {
                        ASSERT_EQ(bench.decider.holds(id, *decision->witness), in);
                    }
                if (chunk != nullptr && decision->witness)
                    continue;
                const auto start = Clock::now();
                const Z3_ast left = inA ? solver.truth(a) : solver.negated(solver.truth(a));
                const Z3_ast right = inB ? solver.truth(b) : solver.negated(solver.truth(b));
                const std::optional<bool> known = solver.tryHold(left, right);
                others += Clock::now() - start;
                given += known ? 0U : 1U;
                withoutWitness += decision->isYes() && !decision->witness ? 1U : 0U; // a number beyond 64 bits
                if (known && decision->isUndecided()) {
                    undecided += " " + std::to_string(seed);
                } else if (known) {
                    ASSERT_EQ(decision->answer, *known ? Answer::Yes : Answer::No);
                }
            }
        }
    }
    const auto perPair = [&](Clock::duration time) {
        return std::to_string(std::chrono::duration_cast<std::chrono::nanoseconds>(time).count() /
                              static_cast<std::int64_t>(1000 * all));
    };
    RecordProperty("microseconds", perPair(own));
    RecordProperty("microsecondsOfSolver", perPair(others));
    EXPECT_EQ(undecided, "") << "questions left undecided, by pair";
    EXPECT_LE(withoutWitness * 50, pairs);
    EXPECT_LE(given * 20, pairs) << "questions that the solver gave up";
    if (asked != nullptr)
        std::cout << "us a pair: " << perPair(own) << ", solver " << perPair(others) << ", questions given up by it "
                  << given << ", answers without witness " << withoutWitness << "\n";
}

} // namespace
} // namespace VT::Testing
