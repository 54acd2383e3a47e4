// Decides whether bounds on sums have a common solution in the real numbers, and how far a sum can go.
//
// Method: the general simplex of Dutertre and de Moura ("A fast linear-arithmetic solver for DPLL(T)", 2006): every row
// is a variable that equals a sum of others, and any variable may have bounds, which may change between two solutions.
// Bland's rule ends both the search for a solution and that for a greatest value.  The tableau is kept in integers over
// one denominator, as in fraction-free elimination (Bareiss, 1968), so that no fraction is reduced; what is not in the
// basis has an integer as its value.
//
// Cost: a pivot takes steps for the entries of the tableau that are not 0 and their length.
#pragma once

#include "base/decide/solver/IntegerRows.hpp"

#include <cstddef>
#include <optional>
#include <span>
#include <utility>
#include <vector>

namespace VT {

template <class Number>
struct Bounds {
    std::optional<Number> low = {};
    std::optional<Number> high = {};
};

template <class Number>
class Simplex {
public:
    /// So many variables, and after them one that equals each row of factors; none has bounds.
    Simplex(std::span<const IntegerRows::Row<Number>> rows, std::size_t variables, Steps& steps)
        : variables_(variables),
          steps_(steps),
          tableau_(rows.begin(), rows.end()),
          values_(variables + rows.size(), Number(0)),
          bounds_(variables + rows.size()) {
        for (std::size_t i = 0; i < values_.size(); ++i) {
            (i < variables_ ? columns_ : basis_).push_back(i);
            at_.push_back(i < variables_ ? i : i - variables_);
            isBasic_.push_back(i >= variables_);
        }
    }

    [[nodiscard]] const Bounds<Number>& bounds(std::size_t variable) const { return bounds_[variable]; }

    void restrict(std::size_t variable, Bounds<Number> bounds) {
        bounds_[variable] = std::move(bounds);
        const Bounds<Number>& own = bounds_[variable];
        if (own.low && values_[variable] < *own.low)
            values_[variable] = *own.low;
        else if (own.high && values_[variable] > *own.high)
            values_[variable] = *own.high;
    }

    /// Whether all bounds can be met.  Throws StepsUsedUp.
    bool solve() {
        for (;;) {
            const auto [row, rises] = violated();
            charge(denominator_);
            if (row == basis_.size())
                return true;
            const std::size_t column = entering(row, rises);
            if (column == columns_.size())
                return false;
            const std::size_t leaving = basis_[row];
            const Number bound = rises ? *bounds_[leaving].low : *bounds_[leaving].high;
            pivot(row, column);
            values_[leaving] = bound;
        }
    }

    /// After solve() found a solution: the greatest integer that a variable does not exceed, or nothing where there is
    /// no such bound.  The solution at hand becomes another one.
    std::optional<Number> greatest(std::size_t variable) {
        return push(variable, true) ? std::optional(IntegerRows::floorDivide(numerator(variable), denominator_))
                                    : std::nullopt;
    }

    /// The same for the least integer that a variable does not fall below.
    std::optional<Number> least(std::size_t variable) {
        return push(variable, false) ? std::optional(IntegerRows::ceilDivide(numerator(variable), denominator_))
                                     : std::nullopt;
    }

    /// The value of a variable is this number divided by the denominator, which is positive.
    [[nodiscard]] Number numerator(std::size_t variable) const {
        return isBasic_[variable] ? numeratorOf(at_[variable]) : Number(values_[variable] * denominator_);
    }

    [[nodiscard]] const Number& denominator() const noexcept { return denominator_; }

private:
    /// Takes steps for the products since the last time, and for looking at the tableau.
    void charge(const Number& typical) {
        constexpr std::size_t looksPerStep = 64;
        steps_.take(tableau_.size() * columns_.size() / looksPerStep);
        IntegerRows::charge(steps_, std::exchange(products_, 0), typical);
    }

    [[nodiscard]] Number numeratorOf(std::size_t row) const {
        Number sum(0);
        for (std::size_t j = 0; j < columns_.size(); ++j) {
            if (const Number& value = values_[columns_[j]]; value != Number(0) && tableau_[row][j] != Number(0)) {
                ++products_;
                sum += tableau_[row][j] * value;
            }
        }
        return sum;
    }

    /// The row of the first variable out of its bounds, and whether it has to rise.
    [[nodiscard]] std::pair<std::size_t, bool> violated() const {
        std::pair first(basis_.size(), false);
        for (std::size_t i = 0; i < basis_.size(); ++i) {
            if (first.first < basis_.size() && basis_[i] > basis_[first.first])
                continue;
            const Bounds<Number>& bounds = bounds_[basis_[i]];
            if (!bounds.low && !bounds.high)
                continue;
            const Number numerator = numeratorOf(i);
            if (bounds.low && numerator < *bounds.low * denominator_)
                first = {i, true};
            else if (bounds.high && numerator > *bounds.high * denominator_)
                first = {i, false};
        }
        return first;
    }

    [[nodiscard]] bool canMove(std::size_t variable, bool up) const {
        const Bounds<Number>& bounds = bounds_[variable];
        return up ? !bounds.high || values_[variable] < *bounds.high : !bounds.low || values_[variable] > *bounds.low;
    }

    /// The column of the first variable that can move a row.
    [[nodiscard]] std::size_t entering(std::size_t row, bool rises) const {
        std::size_t first = columns_.size();
        for (std::size_t j = 0; j < columns_.size(); ++j) {
            const Number& factor = tableau_[row][j];
            if (factor != Number(0) && (first == columns_.size() || columns_[j] < columns_[first]) &&
                canMove(columns_[j], (factor > Number(0)) == rises))
                first = j;
        }
        return first;
    }

    /// Moves a variable as far as it can go; false where that has no end.
    bool push(std::size_t variable, bool up) {
        while (!isBasic_[variable]) {
            if (!canMove(variable, up))
                return true;
            if (!move(at_[variable], up))
                return false;
        }
        while (isBasic_[variable]) { // or else it is at its own bound
            const std::size_t row = at_[variable];
            const std::size_t column = entering(row, up);
            if (column == columns_.size())
                return true;
            if (!move(column, (tableau_[row][column] > Number(0)) == up))
                return false;
        }
        return true;
    }

    /// Moves the variable of a column until one is at a bound; false where none ever is.
    bool move(std::size_t column, bool up) {
        const std::size_t variable = columns_[column];
        const std::optional<Number>& own = up ? bounds_[variable].high : bounds_[variable].low;
        std::size_t blocking = basis_.size();
        std::optional<std::pair<Number, Number>> least; // how far, as a fraction
        if (own)
            least.emplace(IntegerRows::magnitude(Number(*own - values_[variable])), Number(1));
        for (std::size_t i = 0; i < basis_.size(); ++i) {
            const Number& factor = tableau_[i][column];
            if (factor == Number(0))
                continue;
            const bool rises = (factor > Number(0)) == up;
            const std::optional<Number>& bound = rises ? bounds_[basis_[i]].high : bounds_[basis_[i]].low;
            if (!bound)
                continue;
            std::pair room(IntegerRows::magnitude(Number(*bound * denominator_ - numeratorOf(i))),
                           IntegerRows::magnitude(factor));
            if (least) {
                const Number here = room.first * least->second;
                const Number there = least->first * room.second;
                if (here > there || (here == there && blocking < basis_.size() && basis_[i] > basis_[blocking]))
                    continue;
            }
            least = std::move(room);
            blocking = i;
        }
        charge(denominator_);
        if (!least)
            return false;
        if (blocking == basis_.size()) {
            values_[variable] = *own;
            return true;
        }
        const std::size_t leaving = basis_[blocking];
        const bool rises = (tableau_[blocking][column] > Number(0)) == up;
        const Number bound = rises ? *bounds_[leaving].high : *bounds_[leaving].low;
        pivot(blocking, column);
        values_[leaving] = bound;
        return true;
    }

    void pivot(std::size_t row, std::size_t column) {
        const Number by = tableau_[row][column];
        charge(by);
        for (std::size_t i = 0; i < tableau_.size(); ++i) {
            const Number factor = tableau_[i][column];
            if (i == row || (factor == Number(0) && by == denominator_))
                continue;
            for (std::size_t j = 0; j < columns_.size(); ++j) {
                Number& entry = tableau_[i][j];
                const bool changes = factor != Number(0) && tableau_[row][j] != Number(0);
                if (j == column || (!changes && entry == Number(0)))
                    continue;
                products_ += changes ? 2 : 1;
                entry = (changes ? Number(entry * by - factor * tableau_[row][j]) : Number(entry * by)) / denominator_;
            }
        }
        for (std::size_t j = 0; j < columns_.size(); ++j)
            if (j != column)
                tableau_[row][j] = -tableau_[row][j];
        tableau_[row][column] = denominator_;
        denominator_ = by;
        if (by < Number(0)) {
            denominator_ = -denominator_;
            for (IntegerRows::Row<Number>& line : tableau_)
                for (Number& entry : line)
                    entry = -entry;
        }
        std::swap(basis_[row], columns_[column]);
        at_[basis_[row]] = row;
        isBasic_[basis_[row]] = true;
        at_[columns_[column]] = column;
        isBasic_[columns_[column]] = false;
    }

    std::size_t variables_;
    Steps& steps_;
    std::vector<IntegerRows::Row<Number>> tableau_; ///< basis = tableau * columns / denominator
    std::vector<std::size_t> basis_;                ///< variable of each row
    std::vector<std::size_t> columns_;              ///< variable of each column
    std::vector<std::size_t> at_;                   ///< row or column of each variable
    std::vector<bool> isBasic_;
    std::vector<Number> values_; ///< of those that are not in the basis
    std::vector<Bounds<Number>> bounds_;
    Number denominator_{1};
    mutable std::size_t products_ = 0; ///< computed since steps were taken for them
};

} // namespace VT
