// Works on columns that hold the factors of the sums and the basis itself, so that both change alike.
//
// The orthogonal basis is kept as integers: the determinants of the Gram matrices of the first columns, and the
// coefficients times these.  Exact, so the result is the same on every machine.
#include "base/decide/solver/LatticeBasis.hpp"

#include <algorithm>

namespace VT {

using IntegerRows::charge;
using IntegerRows::nearestQuotient;

LatticeBasis::LatticeBasis(std::span<const Row> sums, std::size_t variables, Steps& steps)
    : steps_(steps),
      sums_(sums.size()),
      variables_(variables),
      columns_(variables, Row(sums.size() + 2 * variables)) {
    for (std::size_t j = 0; j < variables; ++j) {
        for (std::size_t i = 0; i < sums_; ++i)
            columns_[j][i] = sums[i][j];
        columns_[j][sums_ + j] = 1;
        columns_[j][sums_ + variables + j] = 1;
    }
}

void LatticeBasis::subtract(std::size_t from, std::size_t column, const BigInteger& times) {
    charge(steps_, sums_ + variables_, times);
    for (std::size_t i = 0; i < sums_ + variables_; ++i)
        if (columns_[column][i] != 0)
            columns_[from][i] -= times * columns_[column][i];
    for (std::size_t i = sums_ + variables_; i < columns_[from].size(); ++i)
        if (columns_[from][i] != 0)
            columns_[column][i] += times * columns_[from][i];
}

std::size_t LatticeBasis::separate() {
    std::size_t rank = 0;
    for (std::size_t sum = 0; sum < sums_ && rank < variables_; ++sum) {
        for (bool isAlone = false; !isAlone;) {
            std::size_t least = variables_;
            for (std::size_t j = rank; j < variables_; ++j)
                if (columns_[j][sum] != 0 && (least == variables_ || abs(columns_[j][sum]) < abs(columns_[least][sum])))
                    least = j;
            if (least == variables_)
                break;
            std::swap(columns_[rank], columns_[least]);
            isAlone = true;
            const BigInteger divisor = columns_[rank][sum];
            for (std::size_t j = rank + 1; j < variables_; ++j) {
                if (columns_[j][sum] == 0)
                    continue;
                BigInteger times = nearestQuotient(columns_[j][sum], BigInteger(abs(divisor)));
                if (divisor < 0)
                    times = -times;
                subtract(j, rank, times);
                isAlone = isAlone && columns_[j][sum] == 0;
            }
            if (isAlone)
                ++rank;
        }
    }
    return rank;
}

void LatticeBasis::orthogonalize(std::size_t rank, std::span<const BigInteger> weights) {
    coefficients_.assign(rank, Row(rank));
    determinants_.assign(rank + 1, 1);
    for (std::size_t k = 0; k < rank; ++k) {
        for (std::size_t j = 0; j <= k; ++j) {
            BigInteger product = 0;
            for (std::size_t i = 0; i < sums_; ++i)
                if (columns_[k][i] != 0 && columns_[j][i] != 0)
                    product += weights[i] * weights[i] * columns_[k][i] * columns_[j][i];
            for (std::size_t i = 0; i < j; ++i)
                product =
                    (determinants_[i + 1] * product - coefficients_[k][i] * coefficients_[j][i]) / determinants_[i];
            charge(steps_, sums_ + 2 * j, product);
            (j < k ? coefficients_[k][j] : determinants_[k + 1]) = std::move(product);
        }
    }
}

/// Takes a multiple of an earlier column away.
void LatticeBasis::shorten(std::size_t column, std::size_t by) {
    if (2 * abs(coefficients_[column][by]) <= determinants_[by + 1])
        return;
    const BigInteger times = nearestQuotient(coefficients_[column][by], determinants_[by + 1]);
    subtract(column, by, times);
    charge(steps_, by + 1, determinants_[by + 1]);
    coefficients_[column][by] -= times * determinants_[by + 1];
    for (std::size_t i = 0; i < by; ++i)
        coefficients_[column][i] -= times * coefficients_[by][i];
}

/// Exchanges a column and the one before.
void LatticeBasis::exchange(std::size_t column, std::size_t rank) {
    std::swap(columns_[column], columns_[column - 1]);
    for (std::size_t j = 0; j + 1 < column; ++j)
        std::swap(coefficients_[column][j], coefficients_[column - 1][j]);
    const BigInteger own = coefficients_[column][column - 1];
    const BigInteger determinant =
        (determinants_[column - 1] * determinants_[column + 1] + own * own) / determinants_[column];
    charge(steps_, 4 * (rank - column), determinant);
    for (std::size_t i = column + 1; i < rank; ++i) {
        const BigInteger before = coefficients_[i][column];
        coefficients_[i][column] =
            (determinants_[column + 1] * coefficients_[i][column - 1] - own * before) / determinants_[column];
        coefficients_[i][column - 1] =
            (determinant * before + own * coefficients_[i][column]) / determinants_[column + 1];
    }
    determinants_[column] = determinant;
}

void LatticeBasis::reduce(std::size_t rank, std::span<const BigInteger> weights) {
    orthogonalize(rank, weights);
    for (std::size_t k = 1; k < rank;) {
        shorten(k, k - 1);
        const BigInteger& own = coefficients_[k][k - 1];
        charge(steps_, 2, determinants_[k]);
        if (4 * (determinants_[k + 1] * determinants_[k - 1] + own * own) < 3 * determinants_[k] * determinants_[k]) {
            exchange(k, rank);
            k = std::max<std::size_t>(k - 1, 1);
            continue;
        }
        for (std::size_t j = k - 1; j-- > 0;)
            shorten(k, j);
        ++k;
    }
}

LatticeBasis::Row LatticeBasis::original(std::span<const BigInteger> y) const {
    Row x(variables_);
    for (std::size_t j = 0; j < y.size(); ++j)
        for (std::size_t i = 0; i < variables_; ++i)
            x[i] += columns_[j][sums_ + i] * y[j];
    return x;
}

} // namespace VT
