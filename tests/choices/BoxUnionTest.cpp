// Unions of boxes against brute force over a small grid: a point is found exactly where one is left out.
#include "base/choices/boxes/BoxUnion.hpp"

#include <algorithm>
#include <array>
#include <gtest/gtest.h>
#include <random>

namespace VT::Testing {
namespace {

constexpr std::size_t atoms = 3;
constexpr std::int64_t least = -1;
constexpr std::int64_t most = 5; // what is beyond is like these

Cube randomBox(std::mt19937_64& random) {
    Cube box;
    for (Atom atom = 0; atom < atoms; ++atom) {
        const auto value = static_cast<std::int64_t>(random() % 4);
        const std::array sets{IntegerSet(value, IntegerSet::plusInfinity), IntegerSet(IntegerSet::minusInfinity, value),
                              IntegerSet(value, value + 1), IntegerSet::allBut(value)};
        if (random() % 4 != 0)
            box.restrict(atom, sets[random() % sets.size()]);
    }
    return box;
}

TEST(BoxUnion, LeavesOutWhatBruteForceSees) {
    std::mt19937_64 random(71);
    std::size_t covered = 0;
    for (int round = 0; round < 1000; ++round) {
        BoxUnion boxes(atoms);
        std::vector<Cube> all;
        for (std::size_t i = random() % 12; i > 0; --i)
            boxes.add(all.emplace_back(randomBox(random)));
        std::vector<Cube> further;
        for (std::size_t i = random() % 3; i > 0; --i)
            further.push_back(all.emplace_back(randomBox(random)));
        const auto isLeft = [&](const Cube& region, const BoxPoint& point) {
            return contains(region, point) &&
                   std::ranges::none_of(all, [&](const Cube& box) { return contains(box, point); });
        };
        for (int question = 0; question < 4; ++question) { // points found before are tried first
            const Cube region = randomBox(random);
            bool isGap = false;
            for (std::int64_t a = least; a <= most; ++a)
                for (std::int64_t b = least; b <= most; ++b)
                    for (std::int64_t c = least; c <= most; ++c)
                        isGap = isGap || isLeft(region, {a, b, c});
            std::uint64_t steps = 100'000;
            const BoxGap gap = boxes.gap(region, further, steps);
            ASSERT_EQ(gap.answer, isGap ? Answer::Yes : Answer::No);
            ASSERT_TRUE(!isGap || isLeft(region, gap.point));
            covered += isGap ? 0U : 1U;
        }
    }
    EXPECT_GT(covered, 100U);
}

} // namespace
} // namespace VT::Testing
