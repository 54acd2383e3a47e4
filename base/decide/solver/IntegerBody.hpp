// Finds an integer point between bounds on sums: for what substitution and elimination leave over.
//
// Method: a sum is open if it can grow without end within all bounds.  There is a direction along which all open sums
// grow and no other sum changes, so that they can be met from any point that meets the others, and are left out.  The
// others bound a body, perhaps along with directions that change none of them; each bound is rounded to the integers
// that the real solutions leave (Chvatal, 1973), the directions are separated, and the variables that remain are
// changed so that the body becomes round (LatticeBasis).  Then the body is split at a variable that has a fraction in a
// real solution (branch and bound, Land and Doig, 1960), the last one first.  The body is bounded, so this ends; in
// round bodies it ends soon.
//
// Cost: exponential in the variables at worst, polynomial in the length of numbers before the first split.
#pragma once

#include "base/core/Check.hpp"
#include "base/core/Limits.hpp"
#include "base/decide/solver/LatticeBasis.hpp"
#include "base/decide/solver/Simplex.hpp"

#include <algorithm>
#include <limits>
#include <optional>
#include <utility>
#include <vector>

namespace VT {

template <class Number>
class IntegerBody {
public:
    using Row = IntegerRows::Row<Number>;

    /// Bounds on a sum: from below, or on both sides.
    struct Slab {
        Row factors;
        Bounds<Number> bounds;
    };

    IntegerBody(std::vector<Slab> slabs, std::size_t variables, Steps& steps)
        : slabs_(std::move(slabs)),
          variables_(variables),
          steps_(steps) {}

    /// Values of the variables, or nothing where there are none.  Throws StepsUsedUp.
    std::optional<Row> solve() {
        Simplex<Number> real(rows(), variables_, steps_);
        for (std::size_t i = 0; i < slabs_.size(); ++i)
            real.restrict(variables_ + i, slabs_[i].bounds);
        if (!real.solve())
            return std::nullopt;
        if (fraction(real, variables_) == variables_)
            return whole(real, variables_);
        try {
            return branch(real, variables_, limits::firstBranches, Pick::First);
        } catch (const TooManyBranches&) { // it takes variables in which the body is round
        }
        findDirection();
        VTSYM_CHECK(real.solve());
        return tightenAll(real) ? solveBounded() : std::nullopt;
    }

private:
    struct TooManyBranches {};
    enum class Pick : std::uint8_t { First, Last }; ///< of the variables that have a fraction

    [[nodiscard]] std::vector<Row> rows() const {
        std::vector<Row> rows;
        rows.reserve(slabs_.size() + 1);
        for (const Slab& slab : slabs_)
            rows.push_back(slab.factors);
        return rows;
    }

    /// A variable whose value is not an integer, or the number of variables.
    static std::size_t fraction(const Simplex<Number>& real, std::size_t variables, Pick pick = Pick::First) {
        for (std::size_t i = 0; i < variables; ++i) {
            const std::size_t at = pick == Pick::First ? i : variables - 1 - i;
            if (const Number value = real.numerator(at); value / real.denominator() * real.denominator() != value)
                return at;
        }
        return variables;
    }

    static Row whole(const Simplex<Number>& real, std::size_t variables) {
        Row values(variables);
        for (std::size_t i = 0; i < variables; ++i)
            values[i] = real.numerator(i) / real.denominator();
        return values;
    }

    /// Finds which sums are open, and a direction along which all of them grow.
    void findDirection() {
        isOpen_.assign(slabs_.size(), false);
        direction_.assign(variables_, Number(0));
        for (;;) {
            std::vector<Row> all = rows();
            all.emplace_back(variables_, Number(0)); // the sum of those that did not grow so far
            for (std::size_t i = 0; i < slabs_.size(); ++i) {
                if (!isOpen_[i] && !slabs_[i].bounds.high)
                    for (std::size_t j = 0; j < variables_; ++j)
                        all.back()[j] += slabs_[i].factors[j];
            }
            Simplex<Number> cone(all, variables_, steps_);
            for (std::size_t i = 0; i < slabs_.size(); ++i)
                cone.restrict(variables_ + i,
                              {Number(0), slabs_[i].bounds.high ? std::optional(Number(0)) : std::nullopt});
            cone.restrict(variables_ + slabs_.size(), {Number(1), std::nullopt});
            if (!cone.solve())
                return;
            Number common(0);
            Row step(variables_);
            for (std::size_t j = 0; j < variables_; ++j) {
                step[j] = cone.numerator(j);
                common = IntegerRows::gcdOf(common, step[j]);
            }
            for (std::size_t j = 0; j < variables_; ++j)
                direction_[j] += step[j] / common;
            for (std::size_t i = 0; i < slabs_.size(); ++i)
                isOpen_[i] = isOpen_[i] || cone.numerator(variables_ + i) > Number(0);
        }
    }

    /// Rounds the bounds of the sums that are not open to what the others leave of them, which may leave less of
    /// others in turn; false where there is no integer between two bounds.
    bool tightenAll(Simplex<Number>& real) {
        bool isChanged = true;
        for (std::size_t round = 0; isChanged && round < limits::tighteningRounds; ++round) {
            isChanged = false;
            for (std::size_t i = 0; i < slabs_.size(); ++i) {
                if (isOpen_[i])
                    continue;
                Bounds<Number>& bounds = slabs_[i].bounds;
                Bounds<Number> tighter{real.least(variables_ + i), real.greatest(variables_ + i)};
                if (*tighter.high < *tighter.low)
                    return false;
                if (bounds.low == tighter.low && bounds.high == tighter.high)
                    continue;
                isChanged = true;
                bounds = std::move(tighter);
                real.restrict(variables_ + i, bounds);
                if (!real.solve())
                    return false;
            }
        }
        return true;
    }

    std::optional<Row> solveBounded() {
        std::vector<LatticeBasis::Row> sums;
        std::vector<Bounds<Number>> bounds;
        for (std::size_t i = 0; i < slabs_.size(); ++i) {
            if (isOpen_[i])
                continue;
            bounds.push_back(slabs_[i].bounds);
            sums.emplace_back();
            for (const Number& factor : slabs_[i].factors)
                sums.back().push_back(BigInteger(factor));
        }
        LatticeBasis basis(sums, variables_, steps_);
        const std::size_t rank = basis.separate();
        basis.reduce(rank, weightsOf(bounds));
        std::vector<Row> changed(sums.size(), Row(rank));
        for (std::size_t i = 0; i < sums.size(); ++i)
            for (std::size_t j = 0; j < rank; ++j)
                changed[i][j] = Number(basis.factor(i, j));
        const auto inner = solveRound(changed, rank, bounds);
        if (!inner)
            return std::nullopt;
        std::vector<BigInteger> wide;
        for (const Number& value : *inner)
            wide.push_back(BigInteger(value));
        Row values;
        for (const BigInteger& value : basis.original(wide))
            values.push_back(Number(value));
        meetOpen(values);
        return values;
    }

    /// The narrower a slab, the more it counts: so that all of them become about as wide.
    static std::vector<BigInteger> weightsOf(const std::vector<Bounds<Number>>& bounds) {
        constexpr int finer = 16;
        std::vector<BigInteger> weights;
        BigInteger widest = 1;
        for (const Bounds<Number>& each : bounds) {
            weights.push_back(BigInteger(Number(*each.high - *each.low)) + 1);
            widest = std::max(widest, weights.back());
        }
        for (BigInteger& weight : weights)
            weight = finer * widest / weight;
        return weights;
    }

    /// Searches a body whose slabs are about as wide.
    std::optional<Row> solveRound(const std::vector<Row>& sums, std::size_t variables,
                                  const std::vector<Bounds<Number>>& bounds) {
        try {
            return branch(sums, variables, bounds, limits::firstBranches);
        } catch (const TooManyBranches&) { // it may be flat in a direction that no slab shows
            return solveFlat(sums, variables, bounds);
        }
    }

    /// Searches a body in variables that change little between its corners: the first least.
    std::optional<Row> solveFlat(const std::vector<Row>& sums, std::size_t variables,
                                 const std::vector<Bounds<Number>>& bounds) {
        const std::vector<LatticeBasis::Row> corners = cornersOf(sums, variables, bounds);
        LatticeBasis basis(corners, variables, steps_);
        basis.reduce(variables, LatticeBasis::Row(corners.size(), 1));
        std::vector<Row> changed(sums.size(), Row(variables));
        for (std::size_t j = 0; j < variables; ++j) { // the last one is split first
            const auto column = basis.dual(variables - 1 - j);
            for (std::size_t i = 0; i < sums.size(); ++i)
                for (std::size_t k = 0; k < variables; ++k)
                    changed[i][j] += sums[i][k] * Number(column[k]);
        }
        const auto inner = branch(changed, variables, bounds, std::numeric_limits<std::size_t>::max());
        if (!inner)
            return std::nullopt;
        Row values(variables, Number(0));
        for (std::size_t j = 0; j < variables; ++j) {
            const auto column = basis.dual(variables - 1 - j);
            for (std::size_t k = 0; k < variables; ++k)
                values[k] += (*inner)[j] * Number(column[k]);
        }
        return values;
    }

    /// How corners of a body in many directions lie from one of them, in small fractions of 1; then the unit vectors,
    /// so that no direction is left out.
    std::vector<LatticeBasis::Row> cornersOf(const std::vector<Row>& sums, std::size_t variables,
                                             const std::vector<Bounds<Number>>& bounds) {
        constexpr unsigned fractionBits = 16;
        Simplex<Number> real(sums, variables, steps_);
        for (std::size_t i = 0; i < bounds.size(); ++i)
            real.restrict(variables + i, bounds[i]);
        std::vector<LatticeBasis::Row> corners;
        if (real.solve()) {
            for (std::size_t i = 0; i < variables + sums.size(); ++i) {
                for (const bool up : {true, false}) {
                    static_cast<void>(up ? real.greatest(i) : real.least(i));
                    const BigInteger denominator(real.denominator());
                    corners.emplace_back();
                    for (std::size_t j = 0; j < variables; ++j)
                        corners.back().push_back((BigInteger(real.numerator(j)) << fractionBits) / denominator);
                }
            }
        }
        for (std::size_t i = corners.size(); i-- > 0;)
            for (std::size_t j = 0; j < variables; ++j)
                corners[i][j] -= corners[0][j];
        for (std::size_t j = 0; j < variables; ++j) {
            corners.emplace_back(variables);
            corners.back()[j] = 1;
        }
        return corners;
    }

    struct Branch {
        std::size_t variable;
        Bounds<Number> before;
        Bounds<Number> other; ///< the side that is left to try
        bool isLast;
    };

    /// Values of bounded variables: depth first, the nearer side first.
    std::optional<Row> branch(const std::vector<Row>& sums, std::size_t variables,
                              const std::vector<Bounds<Number>>& bounds, std::size_t most) {
        Simplex<Number> real(sums, variables, steps_);
        for (std::size_t i = 0; i < bounds.size(); ++i)
            real.restrict(variables + i, bounds[i]);
        return branch(real, variables, most, Pick::Last);
    }

    /// The same from the bounds of a simplex, which has these again where there are too many branches.
    std::optional<Row> branch(Simplex<Number>& real, std::size_t variables, std::size_t most, Pick pick) {
        std::vector<Branch> branches;
        for (;;) {
            if (real.solve()) {
                const std::size_t variable = fraction(real, variables, pick);
                if (variable == variables)
                    return whole(real, variables);
                if (most-- == 0) {
                    for (; !branches.empty(); branches.pop_back())
                        real.restrict(branches.back().variable, std::move(branches.back().before));
                    throw TooManyBranches{};
                }
                const Number value = real.numerator(variable);
                const Number below = IntegerRows::floorDivide(value, real.denominator());
                const Number rest = value - below * real.denominator();
                const Bounds<Number> before = real.bounds(variable);
                Bounds<Number> near{before.low, below};
                Bounds<Number> other{Number(below + Number(1)), before.high};
                if (Number(rest + rest) > real.denominator())
                    std::swap(near, other);
                branches.push_back({variable, before, std::move(other), false});
                real.restrict(variable, std::move(near));
                continue;
            }
            while (!branches.empty() && branches.back().isLast) {
                real.restrict(branches.back().variable, std::move(branches.back().before));
                branches.pop_back();
            }
            if (branches.empty())
                return std::nullopt;
            branches.back().isLast = true;
            real.restrict(branches.back().variable, branches.back().other);
        }
    }

    /// Goes along the direction until the open sums are within their bounds.
    void meetOpen(Row& values) {
        Number times(0);
        for (std::size_t i = 0; i < slabs_.size(); ++i) {
            if (isOpen_[i]) {
                const Number missing = *slabs_[i].bounds.low - product(slabs_[i].factors, values);
                if (missing > Number(0))
                    times = std::max(times, IntegerRows::ceilDivide(missing, product(slabs_[i].factors, direction_)));
            }
        }
        for (std::size_t j = 0; j < values.size(); ++j)
            values[j] += times * direction_[j];
    }

    Number product(const Row& factors, const Row& values) const {
        Number sum(0);
        for (std::size_t j = 0; j < values.size(); ++j)
            sum += factors[j] * values[j];
        return sum;
    }

    std::vector<Slab> slabs_;
    std::size_t variables_;
    Steps& steps_;
    std::vector<bool> isOpen_; ///< by slab
    Row direction_;
};

} // namespace VT
