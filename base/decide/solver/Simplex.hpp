// Decides whether linear inequalities have a common solution in the real numbers, and finds one.
//
// Method: the general simplex of Dutertre and de Moura ("A fast linear-arithmetic solver for DPLL(T)", 2006) with
// Bland's rule, which ends.  Every inequality is a slack with a lower bound; the variables have no bounds.  The tableau
// is kept in integers over one denominator, as in fraction-free elimination (Bareiss, 1968), so that no fraction is
// reduced.
//
// Cost: a pivot takes a step for every few entries of the tableau.
#pragma once

#include "base/decide/Steps.hpp"

#include <cstddef>
#include <optional>
#include <span>
#include <utility>
#include <vector>

namespace VT {

/// Values of variables: each is a numerator over the one denominator, which is positive.
template <class Number>
struct RealPoint {
    std::vector<Number> numerators;
    Number denominator;
};

template <class Number>
class Simplex {
public:
    /// Inequalities `factors · x + constant >= 0`, the constant being the last number of a row.
    Simplex(std::span<const std::vector<Number>> rows, std::size_t variables, Steps& steps)
        : variables_(variables),
          steps_(steps) {
        for (std::size_t i = 0; i < variables_ + rows.size(); ++i)
            (i < variables_ ? columns_ : basis_).push_back(i);
        for (const std::vector<Number>& row : rows) {
            least_.push_back(-row.back());
            tableau_.emplace_back(row.begin(), row.end() - 1);
        }
    }

    /// A point where all inequalities hold, or nothing.  Throws StepsUsedUp.
    std::optional<RealPoint<Number>> solve() {
        for (;;) {
            const std::size_t row = violated();
            if (row == basis_.size())
                return point();
            const std::size_t column = entering(row);
            if (column == columns_.size())
                return std::nullopt;
            pivot(row, column);
        }
    }

private:
    [[nodiscard]] bool isSlack(std::size_t variable) const { return variable >= variables_; }

    /// What is not in the basis lies at its bound; a variable without bounds is 0.
    [[nodiscard]] Number numeratorOf(std::size_t row) const {
        Number sum(0);
        for (std::size_t j = 0; j < columns_.size(); ++j)
            if (isSlack(columns_[j]) && tableau_[row][j] != Number(0))
                sum += tableau_[row][j] * least_[columns_[j] - variables_];
        return sum;
    }

    /// The row of the first slack below its bound.
    [[nodiscard]] std::size_t violated() const {
        std::size_t first = basis_.size();
        for (std::size_t i = 0; i < basis_.size(); ++i) {
            const bool isCandidate = isSlack(basis_[i]) && (first == basis_.size() || basis_[i] < basis_[first]);
            if (isCandidate && numeratorOf(i) < least_[basis_[i] - variables_] * denominator_)
                first = i;
        }
        return first;
    }

    /// The first variable outside of the basis that can lift a row.
    [[nodiscard]] std::size_t entering(std::size_t row) const {
        std::size_t first = columns_.size();
        for (std::size_t j = 0; j < columns_.size(); ++j) {
            const Number& factor = tableau_[row][j];
            const bool lifts = isSlack(columns_[j]) ? factor > Number(0) : factor != Number(0);
            if (lifts && (first == columns_.size() || columns_[j] < columns_[first]))
                first = j;
        }
        return first;
    }

    void pivot(std::size_t row, std::size_t column) {
        constexpr std::size_t entriesPerStep = 16;
        steps_.take(1 + basis_.size() * columns_.size() / entriesPerStep);
        const Number by = tableau_[row][column];
        for (std::size_t i = 0; i < tableau_.size(); ++i) {
            if (i == row)
                continue;
            const Number factor = tableau_[i][column];
            for (std::size_t j = 0; j < columns_.size(); ++j)
                if (j != column)
                    tableau_[i][j] = Number(tableau_[i][j] * by - factor * tableau_[row][j]) / denominator_;
        }
        for (std::size_t j = 0; j < columns_.size(); ++j)
            if (j != column)
                tableau_[row][j] = -tableau_[row][j];
        tableau_[row][column] = denominator_;
        denominator_ = by;
        if (by < Number(0)) {
            denominator_ = -denominator_;
            for (std::vector<Number>& line : tableau_)
                for (Number& entry : line)
                    entry = -entry;
        }
        std::swap(basis_[row], columns_[column]);
    }

    [[nodiscard]] RealPoint<Number> point() const {
        RealPoint<Number> result{std::vector<Number>(variables_, Number(0)), denominator_};
        for (std::size_t i = 0; i < basis_.size(); ++i)
            if (!isSlack(basis_[i]))
                result.numerators[basis_[i]] = numeratorOf(i);
        return result;
    }

    std::size_t variables_;
    Steps& steps_;
    std::vector<std::vector<Number>> tableau_; ///< basis = tableau * columns / denominator
    std::vector<std::size_t> basis_;           ///< variable or slack of each row
    std::vector<std::size_t> columns_;
    std::vector<Number> least_; ///< of each slack
    Number denominator_{1};
};

} // namespace VT
