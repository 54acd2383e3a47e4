// Sets of integers and sums of products against brute force over a window of values.
#include "base/cover/Cover.hpp"

#include <gtest/gtest.h>
#include <rapidcheck/gtest.h>

namespace VT::Testing {
namespace {

constexpr std::int64_t low = -6;
constexpr std::int64_t high = 6;

IntegerSet anySet() {
    IntegerSet set = *rc::gen::inRange(0, 2) == 0 ? IntegerSet::all() : IntegerSet();
    for (int i = *rc::gen::inRange(0, 4); i > 0; --i) {
        const SymbolicOp op = static_cast<SymbolicOp>(*rc::gen::inRange(9, 15));
        const IntegerSet next = IntegerSet::satisfying(op, *rc::gen::inRange<std::int64_t>(-4, 5));
        set = *rc::gen::inRange(0, 2) == 0 ? set.intersect(next) : set.unite(next);
    }
    return set;
}

RC_GTEST_PROP(IntegerSets, FollowTheirMembers, ()) {
    const IntegerSet a = anySet();
    const IntegerSet b = anySet();
    bool subset = true;
    bool common = false;
    for (std::int64_t x = low; x <= high; ++x) {
        const bool inA = a.contains(x);
        const bool inB = b.contains(x);
        RC_ASSERT(a.complement().contains(x) == !inA);
        RC_ASSERT(a.intersect(b).contains(x) == (inA && inB));
        RC_ASSERT(a.unite(b).contains(x) == (inA || inB));
        RC_ASSERT(a.minus(b).contains(x) == (inA && !inB));
        subset = subset && (!inA || inB);
        common = common || (inA && inB);
    }
    // The window reaches beyond every constant, so it decides for all integers.
    RC_ASSERT(a.isSubsetOf(b) == subset);
    RC_ASSERT(a.intersects(b) == common);
    RC_ASSERT(a.complement().complement() == a);
}

RC_GTEST_PROP(IntegerSets, JoinedSetsAreTheirUnionAndNoLonger, ()) {
    std::vector<IntegerSet> sets;
    std::size_t before = 0;
    for (int i = *rc::gen::inRange(1, 5); i > 0; --i) {
        const std::int64_t from = *rc::gen::inRange<std::int64_t>(-4, 5);
        const std::int64_t to = from + *rc::gen::inRange<std::int64_t>(0, 3);
        const IntegerSet shapes[] = {
            {from, to}, {IntegerSet::minusInfinity, to}, {from, IntegerSet::plusInfinity}, IntegerSet::allBut(from)};
        sets.push_back(shapes[*rc::gen::inRange(0, 4)]);
        before += sets.back().comparisons();
    }
    IntegerSet united;
    for (const IntegerSet& set : sets)
        united = united.unite(set);
    IntegerSet joined;
    std::size_t after = 0;
    for (const IntegerSet& set : joinSets(sets)) {
        joined = joined.unite(set);
        after += set.comparisons();
    }
    RC_ASSERT(joined == united);
    RC_ASSERT(after <= before);
}

constexpr Atom atoms = 3;

Cover anyCover() {
    Cover cover;
    for (int i = *rc::gen::inRange(0, 7); i > 0; --i) {
        Cube cube;
        bool possible = true;
        for (int j = *rc::gen::inRange(0, 4); j > 0; --j) {
            const SymbolicOp op = static_cast<SymbolicOp>(*rc::gen::inRange(9, 15));
            possible = cube.restrict(*rc::gen::inRange<Atom>(0, atoms),
                                     IntegerSet::satisfying(op, *rc::gen::inRange<std::int64_t>(-2, 3))) &&
                       possible;
        }
        if (possible)
            cover.push_back(cube);
    }
    return cover;
}

/// The truth of a cover at every point of the window.
std::vector<bool> truth(const Cover& cover) {
    std::vector<bool> result;
    std::int64_t values[atoms];
    for (values[0] = -4; values[0] <= 4; ++values[0])
        for (values[1] = -4; values[1] <= 4; ++values[1])
            for (values[2] = -4; values[2] <= 4; ++values[2])
                result.push_back(std::ranges::any_of(cover, [&](const Cube& cube) {
                    return std::ranges::all_of(cube.constraints(),
                                               [&](const Constraint& c) { return c.set.contains(values[c.atom]); });
                }));
    return result;
}

RC_GTEST_PROP(Covers, GetSmallerAndStayTheSame, ()) {
    const Cover before = anyCover();
    const std::vector<bool> expected = truth(before);
    for (int step = 0; step < 5; ++step) {
        Cover cover = before;
        CoverBudget budget{step < 4 ? 1000U : 0U};
        const bool changed = step == 0   ? absorb(cover)
                             : step == 1 ? joinCubes(cover)
                             : step == 2 ? dropComparisons(cover, budget)
                             : step == 3 ? dropCubes(cover, budget)
                                         : dropComparisons(cover, budget) || dropCubes(cover, budget);
        RC_ASSERT(truth(cover) == expected);
        RC_ASSERT(comparisons(cover) + cover.size() <= comparisons(before) + before.size());
        RC_ASSERT(changed == !(cover == before));
    }
}

RC_GTEST_PROP(Covers, HoldNothingRedundantOnceReduced, ()) {
    Cover cover = anyCover();
    if (*rc::gen::inRange(0, 2) == 0) { // sets of single atoms
        std::erase_if(cover, [](const Cube& cube) { return cube.constraints().size() > 1; });
        for (int i = *rc::gen::inRange(0, 12); i > 0; --i) {
            const auto any = [] { // changes within the window
                const SymbolicOp op = static_cast<SymbolicOp>(*rc::gen::inRange(9, 15));
                return IntegerSet::satisfying(op, *rc::gen::inRange<std::int64_t>(-3, 4));
            };
            Cube cube;
            cube.assign(*rc::gen::inRange<Atom>(0, 2), *rc::gen::inRange(0, 3) == 0 ? any().unite(any()) : any());
            if (!cube.alwaysHolds())
                cover.push_back(cube);
        }
    }
    CoverBudget budget{100000};
    RC_ASSERT(reduce(cover, budget));
    const std::vector<bool> expected = truth(cover);
    for (std::size_t i = 0; i < cover.size(); ++i) {
        Cover without = cover;
        without.erase(without.begin() + static_cast<std::ptrdiff_t>(i));
        RC_ASSERT(truth(without) != expected);
        for (const Constraint& constraint : cover[i].constraints()) {
            Cover wider = cover;
            wider[i].assign(constraint.atom, IntegerSet::all());
            RC_ASSERT(truth(wider) != expected);
        }
    }
}

RC_GTEST_PROP(Covers, CombineExactly, ()) {
    const Cover a = anyCover();
    const Cover b = anyCover();
    const std::vector<bool> inA = truth(a);
    const std::vector<bool> inB = truth(b);
    const std::vector<bool> both = truth(product(a, b));
    for (std::size_t i = 0; i < both.size(); ++i)
        RC_ASSERT(both[i] == (inA[i] && inB[i]));
    for (const Cube& cube : a) {
        const std::vector<bool> inCube = truth({cube});
        const std::vector<bool> outside = truth(complement(cube));
        bool covered = true;
        for (std::size_t i = 0; i < inCube.size(); ++i) {
            RC_ASSERT(outside[i] == !inCube[i]);
            covered = covered && (!inCube[i] || inB[i]);
        }
        CoverBudget budget{100000};
        RC_ASSERT(covers(b, cube, budget) == covered);
    }
}

/// The fewest comparisons of a sum of boxes that holds at some points of a small square, by trying them all.
class SmallestSum {
public:
    static constexpr int side = 5; ///< values from -2 to 2, of which the outer ones stand for all beyond

    using Square = std::uint32_t;

    explicit SmallestSum(Square points) : points_(points) {
        std::vector<IntegerSet> sets;
        for (unsigned values = 1; values < 1U << side; ++values) {
            std::vector<IntegerSet::Interval> intervals;
            for (int value = 0; value < side; ++value)
                if ((values >> value & 1U) != 0)
                    intervals.push_back({value == 0 ? IntegerSet::minusInfinity : value - 2,
                                         value == side - 1 ? IntegerSet::plusInfinity : value - 2});
            sets.push_back(IntegerSet::of(intervals));
        }
        for (const IntegerSet& a : sets)
            for (const IntegerSet& b : sets)
                if (const Square held = pointsOf(a, b); (held & ~points) == 0)
                    boxes_.emplace_back(held, (a.isAll() ? 0 : a.comparisons()) + (b.isAll() ? 0 : b.comparisons()));
    }

    static Square pointsOf(const IntegerSet& a, const IntegerSet& b) {
        Square held = 0;
        for (int x = 0; x < side; ++x)
            for (int y = 0; y < side; ++y)
                if (a.contains(x - 2) && b.contains(y - 2))
                    held |= Square{1} << (x * side + y);
        return held;
    }

    /// Whether the points can be held with so many comparisons.
    [[nodiscard]] bool takes(std::size_t comparisons) const { return takes(points_, comparisons); }

private:
    [[nodiscard]] bool takes(Square open, std::size_t comparisons) const {
        if (open == 0)
            return true;
        const Square first = open & (~open + 1);
        return std::ranges::any_of(boxes_, [&](const auto& box) {
            return (box.first & first) != 0 && box.second <= comparisons &&
                   takes(open & ~box.first, comparisons - box.second);
        });
    }

    Square points_;
    std::vector<std::pair<Square, std::size_t>> boxes_; ///< points held and comparisons taken
};

Cover anySmallCover() {
    Cover cover;
    for (int i = *rc::gen::inRange(1, 6); i > 0; --i) {
        Cube cube;
        for (Atom atom = 0; atom < 2; ++atom) {
            const SymbolicOp op = static_cast<SymbolicOp>(*rc::gen::inRange(9, 15));
            if (*rc::gen::inRange(0, 4) != 0)
                cube.restrict(atom, IntegerSet::satisfying(op, *rc::gen::inRange<std::int64_t>(-1, 2)));
        }
        if (!cube.alwaysHolds())
            cover.push_back(cube);
    }
    return cover;
}

RC_GTEST_PROP(Covers, AreProvenSmallest, ()) {
    const Cover before = anySmallCover();
    Cover cover = before;
    CoverBudget budget{100000};
    reduce(cover, budget);
    RC_ASSERT(minimize(cover, budget, Ranges::Any));
    RC_ASSERT(truth(cover) == truth(before));
    SmallestSum::Square points = 0;
    const IntegerSet all = IntegerSet::all();
    for (const Cube& cube : before)
        points |= SmallestSum::pointsOf(cube.find(0) == nullptr ? all : *cube.find(0),
                                        cube.find(1) == nullptr ? all : *cube.find(1));
    RC_ASSERT(comparisons(cover) == 0 || !SmallestSum(points).takes(comparisons(cover) - 1));
}

RC_GTEST_PROP(Covers, StayWhereNothingIsProvenOrSmaller, ()) {
    const Cover before = anyCover();
    Cover cover = before;
    CoverBudget budget{*rc::gen::inRange<std::size_t>(0, 300)};
    const bool isProven = minimize(cover, budget, Ranges::NotOfPoints);
    RC_ASSERT(truth(cover) == truth(before));
    RC_ASSERT(cover == before || (isProven && comparisons(cover) < comparisons(before)));
    const Cover once = cover;
    CoverBudget further{100000};
    RC_ASSERT(!isProven || (minimize(cover, further, Ranges::NotOfPoints) && comparisons(cover) <= comparisons(once)));
}

TEST(Covers, OfAnySizeAreSmallestOrStay) {
    for (const std::size_t atomCount : {2U, 11U, 12U, 13U, 40U, 4000U}) {
        // A chain of implications: each atom differs from the next one somewhere.
        Cover cover;
        for (Atom atom = 0; atom < atomCount; ++atom) {
            Cube cube;
            cube.restrict(atom, IntegerSet::allBut(0));
            cube.restrict((atom + 1) % static_cast<Atom>(atomCount), IntegerSet::point(0));
            cover.push_back(cube);
        }
        const Cover before = cover;
        CoverBudget budget{50000};
        minimize(cover, budget, Ranges::Any);
        EXPECT_EQ(cover.size(), before.size());
    }
    Cover points; // more cells than a word has bits
    for (std::int64_t value = 0; value < 200; value += 2) {
        points.emplace_back();
        points.back().restrict(0, IntegerSet::point(value));
    }
    CoverBudget budget{50000};
    EXPECT_FALSE(minimize(points, budget, Ranges::Any));
    EXPECT_EQ(points.size(), 100U);
}

} // namespace
} // namespace VT::Testing
