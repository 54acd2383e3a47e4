// Claims about dimensions, whose quotients are exact, against brute force over rational values.
#include "base/decide/DimensionProofs.hpp"
#include "base/core/Make.hpp"
#include "tests/decide/DecisionFixture.hpp"

#include <algorithm>
#include <array>
#include <random>

namespace VT::Testing {
namespace {

struct DimensionBench : DecisionFixture {
    Assumptions assumptions{table};
    DimensionProofs proofs{table, decider, assumptions};
};

TEST(DimensionProofs, TakeQuotientsAsExact) {
    DimensionBench bench;
    ASSERT_TRUE(bench.assumptions.add(bench.parse("N >= 4 && N <= 64 && M == N + 1 && K > 0 && K < M")));
    const auto prove = [&](const std::string& claim) { return bench.text(bench.proofs.holds(bench.parse(claim))); };
    EXPECT_EQ(prove("N*2 >= 8"), "yes");
    EXPECT_EQ(prove("N/2*2 == N && M/3 > 1"), "yes");
    EXPECT_EQ(prove("N/2 + M/3 >= 3 && !(K > N)"), "yes");
    EXPECT_EQ(prove("N/8 >= 1"), "no: K=1 M=5 N=4");
    EXPECT_EQ(prove("N/K > 0"), "undecided terms");
    EXPECT_EQ(prove("f(N/2) > 0"), "undecided terms");
    EXPECT_EQ(prove("Other > 0"), "no: Other=0");
    const auto order = [&](const std::string& a, const std::string& b) {
        static const char* const names[] = {"==", "<", "<=", ">", ">=", "!=", "?"};
        return std::string(names[static_cast<std::size_t>(bench.proofs.compare(bench.parse(a), bench.parse(b)))]);
    };
    EXPECT_EQ(order("N", "M") + order("N*2", "N") + order("K", "N") + order("M/2", "N/2 + 0/2") + order("N", "Other"),
              "<><=>?");
    EXPECT_EQ(order("N + N", "2*N") + order("N", "K"), "==>=");
    EXPECT_TRUE(bench.proofs.isNonNegative(bench.parse("N/3 - 1")).isYes());
    EXPECT_TRUE(bench.proofs.isNonNegative(bench.parse("N - 5")).isNo());
    EXPECT_TRUE(bench.proofs.isEqual(bench.parse("M/2 - N/2"), bench.parse("1/2")).isYes());
    EXPECT_TRUE(bench.proofs.isDivisible(bench.parse("N"), 0).isUndecided());
    EXPECT_EQ(bench.proofs.isNonNegative(invalidId).bound, DecisionBound::NoCondition);
    EXPECT_EQ(bench.proofs.isDivisible(invalidId, 2).bound, DecisionBound::NoCondition);
}

/// Sums of a/b*N + c/d*M + e/f against a common denominator.
TEST(DimensionProofs, AgreeWithRationalsOverAllAssumedValues) {
    std::mt19937_64 random(51);
    DimensionBench bench;
    ASSERT_TRUE(bench.assumptions.add(bench.parse("N >= 1 && N <= 6 && M >= N && M <= 9")));
    constexpr int common = 60; // what 1 to 5 divide
    std::array<std::size_t, 7> orders{};
    for (int round = 0; round < 300; ++round) {
        struct Sum {
            std::string text;
            int n, m, constant; ///< over the common denominator
        };

        const auto sum = [&] {
            const auto part = [&](const std::string& name, int& value) {
                const int factor = static_cast<int>(random() % 4);
                const int divisor = 1 + static_cast<int>(random() % 5);
                value = factor * (common / divisor);
                return name + std::to_string(factor) + "/" + std::to_string(divisor);
            };
            Sum result{};
            result.text = part("N*", result.n);
            result.text += " + " + part("M*", result.m) + " + " + part("", result.constant);
            return result;
        };
        const Sum a = sum();
        const Sum b = random() % 8 == 0 ? a : sum();
        bool less = false;
        bool equal = false;
        bool greater = false;
        for (int n = 1; n <= 6; ++n)
            for (int m = n; m <= 9; ++m) {
                const int difference = (a.n - b.n) * n + (a.m - b.m) * m + a.constant - b.constant;
                (difference < 0 ? less : difference == 0 ? equal : greater) = true;
            }
        const DimensionOrder expected = !less && !greater ? DimensionOrder::Equal
                                        : less && greater ? equal ? DimensionOrder::Open : DimensionOrder::Different
                                        : less            ? equal ? DimensionOrder::LessOrEqual : DimensionOrder::Less
                                        : equal           ? DimensionOrder::GreaterOrEqual
                                                          : DimensionOrder::Greater;
        ASSERT_EQ(bench.proofs.compare(bench.parse(a.text), bench.parse(b.text)), expected) << a.text << "; " << b.text;
        ++orders[static_cast<std::size_t>(expected)];
    }
    EXPECT_GE(*std::ranges::min_element(orders), 1U);
}

} // namespace
} // namespace VT::Testing
