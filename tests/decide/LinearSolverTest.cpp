// Systems of a small world against all of its points, and systems of large numbers around a solution that is known.
#include "base/decide/solver/LinearSolver.hpp"

#include <gtest/gtest.h>
#include <random>

namespace VT::Testing {
namespace {

using Compared = LinearConstraint::Relation;
using System = std::vector<LinearConstraint>;
using Values = std::vector<BigInteger>;

BigInteger sumOf(const LinearConstraint& one, const Values& values) {
    BigInteger sum = one.constant;
    for (std::size_t i = 0; i < one.factors.size(); ++i)
        sum += one.factors[i] * values[i];
    return sum;
}

bool holds(const System& system, const Values& values) {
    return std::ranges::all_of(system, [&](const LinearConstraint& one) {
        return one.relation == Compared::Zero ? sumOf(one, values) == 0 : sumOf(one, values) >= 0;
    });
}

BigInteger number(std::mt19937_64& random, unsigned bits) {
    const BigInteger value = (BigInteger(random()) << 64U | random()) & ((BigInteger(1) << (1 + random() % bits)) - 1);
    return random() % 2 == 0 ? value : BigInteger(-value);
}

LinearConstraint constraint(std::mt19937_64& random, std::size_t variables, unsigned bits) {
    LinearConstraint one{{}, number(random, bits), random() % 4 == 0 ? Compared::Zero : Compared::NotNegative};
    for (std::size_t i = 0; i < variables; ++i)
        one.factors.push_back(random() % 3 == 0 ? BigInteger(0) : number(random, bits));
    return one;
}

TEST(LinearSolver, FindsTheSmallestSolution) {
    static constexpr int outward[] = {0, 1, -1, 2, -2, 3, -3, 4, -4};
    for (std::size_t round = 0; round < 1500; ++round) {
        std::mt19937_64 random(round);
        const std::size_t variables = 1 + round % 3;
        System system;
        for (std::size_t i = 0; i < 3 + round % 3; ++i)
            system.push_back(constraint(random, variables, 2 + static_cast<unsigned>(round % 3)));
        for (std::size_t i = 0; i < variables; ++i)
            for (const int sign : {1, -1}) {
                system.push_back({Values(variables), 4, Compared::NotNegative});
                system.back().factors[i] = sign;
            }
        std::optional<Values> right;
        Values values(variables);
        for (int point = 0; point < 729 && !right; ++point) {
            int rest = point;
            for (std::size_t i = variables; i-- > 0; rest /= 9)
                values[i] = outward[rest % 9];
            if (rest == 0 && holds(system, values))
                right = values;
        }
        Steps steps;
        steps.refill(1U << 22U);
        ASSERT_EQ(LinearSolver(steps).solveSmallest(system, variables, variables), right) << "seed " << round;
    }
}

TEST(LinearSolver, IsExactBeyond64Bits) {
    for (std::size_t round = 0; round < 400; ++round) {
        std::mt19937_64 random(round);
        const std::size_t variables = 2 + round % 3;
        const Values known{number(random, 70), number(random, 70), number(random, 70), number(random, 70)};
        System system;
        for (std::size_t i = 0; i < 4; ++i) { // each holds for the known values
            system.push_back(constraint(random, variables, 70));
            system.back().relation = i == 0 ? Compared::Zero : Compared::NotNegative;
            system.back().constant -=
                sumOf(system.back(), known) - (i == 0 ? BigInteger(0) : BigInteger(abs(number(random, 70))));
        }
        Steps steps;
        steps.refill(1U << 22U);
        const auto found = LinearSolver(steps).solve(system, variables);
        ASSERT_TRUE(found && holds(system, *found)) << "seed " << round;
        steps.refill(1U << 22U);
        LinearConstraint even = constraint(random, variables, 70); // twice a sum is never odd
        even.relation = Compared::Zero;
        even.constant = 2 * even.constant + 1;
        for (BigInteger& factor : even.factors)
            factor *= 2;
        system.push_back(even);
        ASSERT_FALSE(LinearSolver(steps).solve(system, variables)) << "seed " << round;
    }
}

} // namespace
} // namespace VT::Testing
