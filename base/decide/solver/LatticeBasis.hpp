// Changes of variables that keep the integers, chosen so that a body becomes round.
//
// Integer variables x become integers y with x = basis * y.  Sums of x are sums of y then, and the columns of their
// factors generate the same lattice.  Two such changes are made here: one that leaves as many columns with factors as
// the sums have rank, by Euclid's algorithm, and one that makes these columns short and nearly orthogonal (Lenstra,
// Lenstra and Lovász, "Factoring polynomials with rational coefficients", 1982, in integers: Cohen, "A Course in
// Computational Algebraic Number Theory", 1993, algorithm 2.6.7).  In such variables a body holds few integers between
// its bounds in any direction of an axis, if it holds few at all (Krishnamoorthy and Pataki, "Column basis reduction
// and decomposable knapsack problems", 2009).
//
// Cost: polynomial in the variables and in the length of the numbers; steps for the numbers written.
#pragma once

#include "base/decide/solver/IntegerRows.hpp"

#include <cstddef>
#include <span>
#include <vector>

namespace VT {

class LatticeBasis {
public:
    using Row = IntegerRows::Row<BigInteger>;

    /// Sums of variables by their factors; at first y is x.
    LatticeBasis(std::span<const Row> sums, std::size_t variables, Steps& steps);

    /// Leaves factors in the first columns only, and returns how many these are.
    std::size_t separate();
    /// Makes the first columns short, which are independent; differences of a sum count that many times.
    void reduce(std::size_t rank, std::span<const BigInteger> weights);

    /// The factor of y in a sum.
    [[nodiscard]] const BigInteger& factor(std::size_t sum, std::size_t y) const { return columns_[y][sum]; }

    /// The column of x that shows y: the product of both is y.
    [[nodiscard]] std::span<const BigInteger> dual(std::size_t y) const {
        return std::span(columns_[y]).subspan(sums_ + variables_);
    }

    /// x for values of the first y, the others being 0.
    [[nodiscard]] Row original(std::span<const BigInteger> y) const;

private:
    void subtract(std::size_t from, std::size_t column, const BigInteger& times);
    void orthogonalize(std::size_t rank, std::span<const BigInteger> weights);
    void shorten(std::size_t column, std::size_t by);
    void exchange(std::size_t column, std::size_t rank);

    Steps& steps_;
    std::size_t sums_;
    std::size_t variables_;
    std::vector<Row> columns_; ///< factors in the sums, the column of the basis, and that of the dual basis

    // Of the orthogonal basis after Gram and Schmidt: coefficients, times determinants[column + 1].
    std::vector<Row> coefficients_;
    Row determinants_;
};

} // namespace VT
