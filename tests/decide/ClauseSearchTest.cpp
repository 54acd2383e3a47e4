// Clauses against all assignments, bounds that come and go against a solver that starts anew each time.
#include "base/decide/search/ClauseSearch.hpp"
#include "base/core/Limits.hpp"
#include "base/decide/solver/DifferenceSystem.hpp"
#include "base/integer/LinearForm.hpp"

#include <gtest/gtest.h>

#include <algorithm>
#include <random>

namespace VT::Testing {
namespace {

/// Clauses are added and assumptions change between questions.
TEST(ClauseSearch, AgreesWithAllAssignments) {
    constexpr std::uint32_t variables = 10;
    std::mt19937_64 random(50);
    std::size_t satisfied = 0;
    std::size_t asked = 0;
    for (int round = 0; round < 200; ++round) {
        Steps steps;
        steps.refill(limits::decisionSteps);
        ClauseSearch search(steps);
        search.begin(1);
        for (std::uint32_t i = 0; i < variables; ++i)
            search.addVariable(random() % 2 == 0);
        std::vector<std::vector<Literal>> clauses;
        const auto literals = [&](std::size_t count) {
            std::vector<Literal> some(count);
            std::ranges::generate(some, [&] { return static_cast<Literal>(random() % (2 * variables)); });
            return some;
        };
        for (int step = 0; step < 30; ++step) {
            for (int i = 0; i < 2; ++i) {
                clauses.push_back(literals(2 + random() % 3));
                search.addClause(clauses.back());
            }
            const std::vector<Literal> assumptions = literals(random() % 3);
            const auto isMet = [&](auto holds) {
                return std::ranges::all_of(assumptions, holds) && std::ranges::all_of(clauses, [&](const auto& clause) {
                           return std::ranges::any_of(clause, holds);
                       });
            };
            bool expected = false;
            for (std::uint32_t bits = 0; bits < 1U << variables; ++bits)
                expected = expected || isMet([&](Literal l) { return (bits >> (l / 2) & 1U) != (l & 1U); });
            ASSERT_EQ(search.solve(assumptions), expected);
            if (expected) {
                ASSERT_TRUE(isMet([&](Literal l) { return search.holds(l); }));
            }
            satisfied += expected ? 1U : 0U;
            ++asked;
        }
    }
    EXPECT_GT(satisfied, asked / 10);
    EXPECT_LT(satisfied, asked);
}

TEST(DifferenceGraph, AgreesWithStartingAnew) {
    constexpr std::uint32_t vertices = 7;
    std::mt19937_64 random(51);
    Steps steps;
    steps.refill(~std::uint64_t{0} / 2);
    DifferenceGraph graph(steps);
    DifferenceSystem system(steps);
    std::size_t refused = 0;
    for (int round = 0; round < 300; ++round) {
        graph.begin(vertices);
        std::vector<DifferenceGraph::Bound> bounds;
        const auto canBeMet = [&](const std::vector<DifferenceGraph::Bound>& some) {
            system.begin(vertices - 1);
            for (const auto& [from, to, most] : some)
                system.restrict(to, from, minusInfinite, most);
            std::vector<std::int64_t> values;
            return system.solve(values);
        };
        for (int step = 0; step < 60; ++step) {
            if (random() % 5 == 0) {
                bounds.resize(random() % (bounds.size() + 1));
                graph.shrink(bounds.size());
            }
            const auto from = static_cast<std::uint32_t>(random() % vertices);
            const auto to = static_cast<std::uint32_t>((from + 1 + random() % (vertices - 1)) % vertices);
            bounds.push_back({from, to, static_cast<std::int64_t>(random() % 9) - 3});
            const bool expected = canBeMet(bounds);
            ASSERT_EQ(graph.add(bounds.back(), static_cast<std::uint32_t>(bounds.size() - 1)), expected);
            if (expected)
                continue;
            ++refused;
            std::vector<DifferenceGraph::Bound> named;
            for (const std::uint32_t name : graph.contradiction())
                named.push_back(bounds[name]);
            ASSERT_FALSE(canBeMet(named));
            bounds.pop_back();
        }
    }
    EXPECT_GT(refused, 1000U);
}

} // namespace
} // namespace VT::Testing
