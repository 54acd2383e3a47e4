// What the linear solver is made of, in small worlds: real solutions, changes of variables and bounded searches against
// all points of a box.
#include "base/decide/solver/IntegerBody.hpp"
#include "base/decide/solver/LatticeBasis.hpp"
#include "base/decide/solver/Simplex.hpp"

#include <gtest/gtest.h>
#include <random>

namespace VT::Testing {
namespace {

using Row = IntegerRows::Row<BigInteger>;
using WholeBounds = Bounds<BigInteger>;

constexpr std::uint64_t plenty = std::uint64_t{1} << 21U;

int between(std::mt19937_64& random, int low, int high) {
    return low + static_cast<int>(random() % static_cast<unsigned>(high - low + 1));
}

std::vector<Row> randomRows(std::mt19937_64& random, std::size_t count, std::size_t variables, int reach) {
    std::vector<Row> rows(count, Row(variables));
    for (Row& row : rows)
        for (BigInteger& factor : row)
            factor = random() % 4 == 0 ? 0 : between(random, -reach, reach);
    return rows;
}

BigInteger product(const Row& row, const Row& values) {
    BigInteger sum = 0;
    for (std::size_t i = 0; i < row.size(); ++i)
        sum += row[i] * values[i];
    return sum;
}

/// Calls f with the points of a box around 0 whose sides are 2 * reach.
template <class Function>
void forEachPoint(std::size_t variables, int reach, Function f) {
    Row point(variables, -reach);
    for (std::size_t i = 0; i < variables;) {
        f(point);
        for (i = 0; i < variables && point[i] == reach; ++i)
            point[i] = -reach;
        if (i < variables)
            point[i] += 1;
    }
}

/// Its own solution meets all bounds; no point of the box meets bounds without a solution, or lies beyond what a sum is
/// said to reach; a sum that goes through a corner of the box reaches the corner.
TEST(Simplex, BoundsEverySumOverABox) {
    constexpr int reach = 3;
    std::size_t unsolvable = 0;
    for (std::size_t round = 0; round < 400; ++round) {
        std::mt19937_64 random(round);
        const std::size_t variables = 1 + round % 3;
        const std::vector<Row> rows = randomRows(random, 4, variables, 5);
        Steps steps;
        steps.refill(plenty);
        Simplex<BigInteger> simplex(rows, variables, steps);
        std::vector<WholeBounds> bounds(variables + rows.size());
        for (std::size_t i = 0; i < variables; ++i)
            bounds[i] = {-reach, reach};
        for (std::size_t i = 0; i + 1 < rows.size(); ++i) // the last one is free
            bounds[variables + i] = {BigInteger(between(random, -9, 4)), std::nullopt};
        for (std::size_t i = 0; i < bounds.size(); ++i)
            simplex.restrict(i, bounds[i]);
        std::vector<Row> points;
        forEachPoint(variables, reach, [&](const Row& point) {
            for (std::size_t i = 0; i + 1 < rows.size(); ++i)
                if (product(rows[i], point) < *bounds[variables + i].low)
                    return;
            points.push_back(point);
        });
        SCOPED_TRACE(round);
        if (!simplex.solve()) {
            ++unsolvable;
            ASSERT_TRUE(points.empty());
            continue;
        }
        const auto expectSolution = [&] {
            ASSERT_GT(simplex.denominator(), 0);
            Row values(variables);
            for (std::size_t i = 0; i < variables; ++i)
                values[i] = simplex.numerator(i);
            for (std::size_t i = 0; i < bounds.size(); ++i) {
                const BigInteger value = i < variables ? values[i] : product(rows[i - variables], values);
                ASSERT_EQ(simplex.numerator(i), value);
                ASSERT_TRUE(!bounds[i].low || value >= *bounds[i].low * simplex.denominator());
                ASSERT_TRUE(!bounds[i].high || value <= *bounds[i].high * simplex.denominator());
            }
        };
        expectSolution();
        const std::size_t last = variables + rows.size() - 1;
        const auto greatest = simplex.greatest(last);
        expectSolution();
        ASSERT_TRUE(greatest);
        ASSERT_EQ(*greatest, IntegerRows::floorDivide(simplex.numerator(last), simplex.denominator()));
        const auto least = simplex.least(last);
        expectSolution();
        ASSERT_TRUE(least);
        for (const Row& point : points) {
            ASSERT_LE(product(rows.back(), point), *greatest);
            ASSERT_GE(product(rows.back(), point), *least);
        }
        for (std::size_t i = 0; i + 1 < rows.size(); ++i) // now the box alone, where corners are whole
            simplex.restrict(variables + i, {});
        ASSERT_TRUE(simplex.solve());
        BigInteger corner = 0;
        for (const BigInteger& factor : rows.back())
            corner += reach * abs(factor);
        ASSERT_EQ(simplex.greatest(last), corner);
        ASSERT_EQ(simplex.least(last), BigInteger(-corner));
        simplex.restrict(0, {});
        ASSERT_TRUE(simplex.solve());
        ASSERT_EQ(simplex.greatest(last).has_value(), rows.back()[0] == 0);
    }
    EXPECT_GT(unsolvable, 20U);
    EXPECT_LT(unsolvable, 380U);
}

/// The determinant of a small matrix, by cofactors.
BigInteger determinant(std::vector<Row> matrix) {
    BigInteger result = 1; // as a fraction-free elimination keeps it
    BigInteger before = 1;
    for (std::size_t k = 0; k < matrix.size(); ++k) {
        std::size_t at = k;
        while (at < matrix.size() && matrix[at][k] == 0)
            ++at;
        if (at == matrix.size())
            return 0;
        if (at != k) {
            std::swap(matrix[at], matrix[k]);
            result = -result;
        }
        for (std::size_t i = k + 1; i < matrix.size(); ++i)
            for (std::size_t j = k + 1; j < matrix.size(); ++j)
                matrix[i][j] = (matrix[k][k] * matrix[i][j] - matrix[i][k] * matrix[k][j]) / before;
        before = matrix[k][k];
    }
    return result * before;
}

/// New variables reach the same integers, sums stay what they are, and columns become no longer.
TEST(LatticeBasis, ChangesVariablesAndKeepsTheIntegers) {
    for (std::size_t round = 0; round < 300; ++round) {
        std::mt19937_64 random(round);
        const std::size_t variables = 1 + round % 5;
        const std::vector<Row> sums = randomRows(random, 1 + random() % 5, variables, round % 2 == 0 ? 4 : 100000);
        Steps steps;
        steps.refill(plenty);
        LatticeBasis basis(sums, variables, steps);
        const std::size_t rank = basis.separate();
        const auto columns = [&] {
            BigInteger lengths = 1; // their product, each squared
            for (std::size_t j = 0; j < rank; ++j) {
                BigInteger length = 0;
                for (std::size_t i = 0; i < sums.size(); ++i)
                    length += basis.factor(i, j) * basis.factor(i, j);
                lengths *= length;
            }
            return lengths;
        };
        SCOPED_TRACE(round);
        const BigInteger before = columns();
        basis.reduce(rank, Row(sums.size(), 1));
        const BigInteger after = columns();
        ASSERT_GT(after, 0) << "a column without factors";
        // What the determinant of the lattice allows, as for every such basis: lengths are at most 2^(n(n-1)/4) of it.
        std::vector<Row> gram(rank, Row(rank));
        for (std::size_t a = 0; a < rank; ++a)
            for (std::size_t b = 0; b < rank; ++b)
                for (std::size_t i = 0; i < sums.size(); ++i)
                    gram[a][b] += basis.factor(i, a) * basis.factor(i, b);
        const BigInteger volume = determinant(gram);
        ASSERT_GE(after, volume);
        ASSERT_LE(after, volume << static_cast<unsigned>(rank * (rank - 1) / 2));
        ASSERT_GE(before, volume);
        std::vector<Row> change; // the columns of the basis
        for (std::size_t j = 0; j < variables; ++j) {
            Row unit(variables, 0);
            unit[j] = 1;
            change.push_back(basis.original(unit));
            for (std::size_t i = 0; i < sums.size(); ++i)
                ASSERT_EQ(product(sums[i], change.back()), basis.factor(i, j));
            for (std::size_t k = 0; k < variables; ++k) // the dual shows the new variables
                ASSERT_EQ(product(Row(basis.dual(k).begin(), basis.dual(k).end()), change.back()), j == k ? 1 : 0);
            for (std::size_t i = 0; j >= rank && i < sums.size(); ++i)
                ASSERT_EQ(basis.factor(i, j), 0);
        }
        ASSERT_EQ(abs(determinant(change)), 1);
    }
}

template <class Number>
std::optional<Row> solveBody(const std::vector<Row>& rows, const std::vector<WholeBounds>& bounds,
                             std::size_t variables) {
    std::vector<typename IntegerBody<Number>::Slab> slabs;
    for (std::size_t i = 0; i < rows.size(); ++i) {
        slabs.emplace_back();
        for (const BigInteger& factor : rows[i])
            slabs.back().factors.push_back(Number(factor));
        slabs.back().bounds.low = Number(*bounds[i].low);
        if (bounds[i].high)
            slabs.back().bounds.high = Number(*bounds[i].high);
    }
    Steps steps;
    steps.refill(plenty);
    const auto found = IntegerBody<Number>(std::move(slabs), variables, steps).solve();
    if (!found)
        return std::nullopt;
    Row values;
    for (const Number& value : *found)
        values.push_back(BigInteger(value));
    return values;
}

/// Thin slabs around a box, some of them open above: an integer point is found where the box has one.
template <class Number>
void expectRightBodies() {
    constexpr int reach = 3;
    std::size_t empty = 0;
    std::size_t solved = 0;
    for (std::size_t round = 0; round < 500; ++round) {
        std::mt19937_64 random(round);
        const std::size_t variables = 2 + round % 3;
        std::vector<Row> rows = randomRows(random, 3, variables, round % 2 == 0 ? 7 : 60);
        std::vector<WholeBounds> bounds;
        for (std::size_t i = 0; i < rows.size(); ++i) {
            const BigInteger low = between(random, -12, 12);
            bounds.push_back({low, BigInteger(low + between(random, 0, 12))});
        }
        const bool isOpen = random() % 3 == 0;
        for (std::size_t i = isOpen ? 1 : 0; i < variables; ++i) {
            rows.emplace_back(variables, 0);
            rows.back()[i] = 1;
            bounds.push_back({-reach, reach});
        }
        if (isOpen) {
            rows.emplace_back(variables, 0);
            rows.back()[0] = 1;
            bounds.push_back({-reach, std::nullopt});
        }
        const auto meets = [&](const Row& point) {
            for (std::size_t i = 0; i < rows.size(); ++i) {
                const BigInteger sum = product(rows[i], point);
                if (sum < *bounds[i].low || (bounds[i].high && sum > *bounds[i].high))
                    return false;
            }
            return true;
        };
        bool isThere = false;
        forEachPoint(variables, reach, [&](const Row& point) { isThere = isThere || meets(point); });
        SCOPED_TRACE(round);
        const auto found = solveBody<Number>(rows, bounds, variables);
        ASSERT_TRUE(found ? meets(*found) : !isThere);
        if (!isOpen) {
            ASSERT_EQ(found.has_value(), isThere);
        }
        (found ? solved : empty) += 1;
    }
    EXPECT_GT(solved, 50U);
    EXPECT_GT(empty, 50U);
}

TEST(IntegerBody, FindsAPointWhereThereIsOne) {
    expectRightBodies<CheckedInteger>();
    expectRightBodies<CheckedInt128>();
    expectRightBodies<BigInteger>();
}

/// Flat bodies in variables that do not show it: a point and its translation by a lattice without short axes.
TEST(IntegerBody, LooksAlongFlatDirections) {
    for (std::size_t round = 0; round < 60; ++round) {
        std::mt19937_64 random(round);
        const int a = between(random, 1000, 9000);
        const int b = between(random, 1000, 9000);
        const BigInteger gcd = IntegerRows::gcdOf(BigInteger(a), BigInteger(b));
        const BigInteger goal = between(random, -100000, 100000);
        // goal <= a * x - b * y <= goal + width has a solution for widths of gcd - 1 and more; far below only by luck.
        const int width = between(random, 0, 2);
        const std::vector<Row> rows{{BigInteger(a), BigInteger(-b)}, {1, 0}, {0, 1}};
        const std::vector<WholeBounds> bounds{{goal, BigInteger(goal + width)}, {-100000, 100000}, {-100000, 100000}};
        const bool isThere = IntegerRows::floorDivide(BigInteger(goal + width), gcd) * gcd >= goal;
        const auto found = solveBody<BigInteger>(rows, bounds, 2);
        ASSERT_EQ(found.has_value(), isThere) << a << " " << b << " " << goal;
    }
}

} // namespace
} // namespace VT::Testing
