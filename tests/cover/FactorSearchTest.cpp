// Smallest formulas on a small square against every formula there is, listed by the number of comparisons.
#include "base/cover/FactorSearch.hpp"

#include <gtest/gtest.h>

#include <random>

namespace VT::Testing {
namespace {

constexpr std::size_t points = 16;
constexpr Word everywhere = (Word{1} << points) - 1;
constexpr std::size_t listed = 6; ///< comparisons of the formulas that are listed

/// Two axes of four cells: below 0, 0, 1 and 2, above 2.
class Square {
public:
    Square() {
        Cover cuts;
        for (Atom atom = 0; atom < 2; ++atom) {
            for (const std::int64_t low : {0, 1, 3}) {
                cuts.emplace_back();
                cuts.back().restrict(atom, {low, IntegerSet::plusInfinity});
            }
        }
        EXPECT_TRUE(grid.read(cuts));
        listFormulas();
    }

    [[nodiscard]] Word pointsOf(std::size_t axis, Cells cells) const {
        Box box{};
        box.cells[0] = box.cells[1] = grid.axes()[0].all();
        box.cells[axis] = cells;
        Word result = 0;
        grid.points(box, &result);
        return result;
    }

    /// The points at which a formula holds; counts its comparisons.
    Word evaluate(const Factored& items, std::size_t& comparisons) const {
        std::vector<Word> stack;
        for (const FactoredItem& item : items) {
            if (item.kind == FactoredItem::Kind::Comparison) {
                stack.push_back(pointsOf(item.axis, item.cells));
                const IntegerSet set = grid.axes()[item.axis].setOf(item.cells);
                EXPECT_EQ(set.comparisons(), 1U);
                ++comparisons;
                continue;
            }
            const Word last = stack.back();
            stack.pop_back();
            stack.back() = item.kind == FactoredItem::Kind::And ? stack.back() & last : stack.back() | last;
        }
        EXPECT_EQ(stack.size(), 1U);
        return stack.back();
    }

    /// The fewest comparisons of a formula that holds at some points and fails at others; `listed` for more.
    [[nodiscard]] std::size_t fewest(Word on, Word off) const {
        for (std::size_t count = 1; count < byCount.size(); ++count)
            for (const Word each : byCount[count])
                if ((on & ~each) == 0 && (off & each) == 0)
                    return count;
        return listed;
    }

    Grid grid;
    std::vector<std::vector<Word>> byCount = std::vector<std::vector<Word>>(listed);

private:
    void listFormulas() {
        std::vector<bool> seen(everywhere + 1, false);
        const auto add = [&](std::size_t count, Word formula) {
            if (!seen[formula])
                byCount[count].push_back(formula);
            seen[formula] = true;
        };
        for (std::size_t axis = 0; axis < 2; ++axis) {
            for (const Cells cells : {0b0001U, 0b0011U, 0b0111U, 0b0010U}) {
                add(1, pointsOf(axis, cells));
                add(1, everywhere & ~pointsOf(axis, cells));
            }
        }
        for (std::size_t count = 2; count < listed; ++count)
            for (std::size_t left = 1; 2 * left <= count; ++left)
                for (const Word a : byCount[left])
                    for (const Word b : byCount[count - left])
                        for (const Word formula : {a & b, a | b})
                            if (formula != 0 && formula != everywhere)
                                add(count, formula);
    }
};

void expectFewest(const Square& square, Word on, Word off) {
    constexpr std::size_t steps = 100'000;
    SCOPED_TRACE(testing::Message() << "on " << on << " off " << off);
    const std::size_t fewest = square.fewest(on, off);
    const FactorAnswer answer = searchFactored(square.grid, {&on, 1}, {&off, 1}, listed, steps);
    ASSERT_TRUE(answer.isProven);
    ASSERT_EQ(answer.formula.has_value(), fewest < listed);
    if (!answer.formula)
        return;
    std::size_t comparisons = 0;
    const Word holds = square.evaluate(*answer.formula, comparisons);
    ASSERT_EQ(on & ~holds, 0U);
    ASSERT_EQ(off & holds, 0U);
    ASSERT_EQ(comparisons, fewest);
    const FactorAnswer none = searchFactored(square.grid, {&on, 1}, {&off, 1}, fewest, steps);
    ASSERT_TRUE(none.isProven && !none.formula);
    const FactorAnswer early = searchFactored(square.grid, {&on, 1}, {&off, 1}, listed, fewest);
    ASSERT_TRUE(early.formula || !early.isProven);
}

TEST(FactorSearch, FindsTheFewestComparisons) {
    const Square square;
    for (const auto& formulas : square.byCount)
        for (std::size_t i = 0; i < formulas.size(); i += 1 + formulas.size() / 500)
            expectFewest(square, formulas[i], everywhere & ~formulas[i]);
    std::mt19937_64 random(5);
    for (int round = 0; round < 2000; ++round) {
        const Word on = random() & everywhere;
        const Word off = random() & random() & everywhere & ~on;
        if (on != 0 && off != 0)
            expectFewest(square, on, off);
    }
}

} // namespace
} // namespace VT::Testing
