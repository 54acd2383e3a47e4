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

/// Whether some boxes have every point of a region.
bool isCovered(const Cube& region, const std::vector<Cube>& boxes) {
    for (std::int64_t a = least; a <= most; ++a)
        for (std::int64_t b = least; b <= most; ++b)
            for (std::int64_t c = least; c <= most; ++c) {
                const BoxPoint point{a, b, c};
                if (contains(region, point) &&
                    std::ranges::none_of(boxes, [&](const Cube& box) { return contains(box, point); }))
                    return false;
            }
    return true;
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
            const bool isGap = !isCovered(region, all);
            std::uint64_t steps = 100'000;
            const BoxGap gap = boxes.gap(region, further, steps);
            ASSERT_EQ(gap.answer, isGap ? Answer::Yes : Answer::No);
            ASSERT_TRUE(!isGap || isLeft(region, gap.point));
            std::vector<Cube> named = further; // by a proof
            for (const std::uint32_t box : gap.covering)
                named.push_back(all[box]);
            ASSERT_TRUE(isGap || isCovered(region, named));
            covered += isGap ? 0U : 1U;
        }
    }
    EXPECT_GT(covered, 100U);
}

TEST(BoxUnion, HasMoreBoxesThanABlock) {
    std::mt19937_64 random(72);
    BoxUnion boxes(atoms);
    std::vector<Cube> all;
    std::array<std::size_t, 2> seen{};
    for (int i = 0; i < 1500; ++i) {
        Cube box; // a cell of a grid of 12 for each atom
        for (Atom atom = 0; atom < atoms; ++atom)
            box.restrict(atom, IntegerSet::point(static_cast<std::int64_t>(random() % 12)));
        const bool isNew = std::ranges::find(all, box) == all.end();
        std::uint64_t steps = 100'000;
        const BoxGap gap = boxes.gap(box, {}, steps);
        ASSERT_EQ(gap.answer, isNew ? Answer::Yes : Answer::No);
        ASSERT_TRUE(isNew ? contains(box, gap.point) : all.at(gap.covering.front()) == box);
        ++seen[isNew ? 0 : 1];
        boxes.add(all.emplace_back(box));
    }
    EXPECT_GT(seen[0], 700U);
    EXPECT_GT(seen[1], 400U);
}

TEST(BoxUnion, SaysWhereItsStepsRanOut) {
    BoxUnion holes(6); // box i leaves out the value i of each atom: six leave a point out, seven do not
    for (std::int64_t i = 0; i < 7; ++i) {
        Cube box;
        for (Atom atom = 0; atom < 6; ++atom)
            box.restrict(atom, IntegerSet::allBut(i));
        std::uint64_t few = 50;
        EXPECT_NE(holes.gap(Cube(), {}, few).answer, Answer::No);
        holes.add(box);
    }
    std::uint64_t few = 1000;
    EXPECT_EQ(holes.gap(Cube(), {}, few).answer, Answer::Undecided);
    EXPECT_EQ(few, 0U);
    std::uint64_t many = std::uint64_t{1} << 24U;
    EXPECT_EQ(holes.gap(Cube(), {}, many).answer, Answer::No);
    EXPECT_EQ(holes.gap(Cube(), {}, many).covering.size(), 7U);
}

} // namespace
} // namespace VT::Testing
