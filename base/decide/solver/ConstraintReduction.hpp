// Reduces linear constraints over the integers until none is left, or until a core is left for a search.
//
// Method: equalities are solved by Euclid's algorithm on their columns, a change of variables that keeps the integers.
// Inequalities are divided by common factors and rounded; two opposite ones that leave one value are an equality.  Then
// one variable after the other is eliminated by adding each lower bound to each upper one, where that is exact, because
// all factors of one side are 1 (Pugh, "The Omega test: a fast and practical integer programming algorithm for
// dependence analysis", 1991), and adds next to no constraints.  What is left is searched for an integer point
// (IntegerBody).  The eliminations lead back to the values of all variables.
//
// Cost: steps for the factors of every constraint that is looked at, and those of the search.
#pragma once

#include "base/core/Check.hpp"
#include "base/core/Limits.hpp"
#include "base/decide/solver/IntegerBody.hpp"

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <iterator>
#include <map>
#include <optional>
#include <utility>
#include <vector>

namespace VT {

/// How a variable follows from the others.
template <class Number>
struct Elimination {
    std::size_t variable;
    std::vector<IntegerRows::Row<Number>>
        bounds;                     ///< of the variable, as inequalities; none where `value` says what it is
    IntegerRows::Row<Number> value; ///< what is to be added to what the variable became; its own factor is 0
};

template <class Number>
struct Problem {
    std::vector<IntegerRows::Row<Number>> equalities;
    std::vector<IntegerRows::Row<Number>> inequalities;
    std::vector<Elimination<Number>> eliminations;
};

/// Solves one problem in numbers of one kind.
template <class Number>
class ConstraintReduction {
public:
    ConstraintReduction(std::size_t variables, Steps& steps) : variables_(variables), steps_(steps) {}

    /// Values of the variables, or nothing where the constraints have no solution.  Throws StepsUsedUp.
    std::optional<std::vector<Number>> solve(Problem<Number> problem) {
        if (!reduce(problem))
            return std::nullopt;
        std::vector<Number> core(variables_, Number(0));
        if (!problem.inequalities.empty()) {
            auto found = solveCore(problem);
            if (!found)
                return std::nullopt;
            core = *std::move(found);
        }
        return valuesOf(problem, std::move(core));
    }

private:
    using Line = IntegerRows::Row<Number>;

    /// Takes steps for factors that are looked at or written.
    void charge(const Line& row) { IntegerRows::charge(steps_, row.size(), row.back()); }

    [[nodiscard]] const Number& constantOf(const Line& row) const { return row.back(); }

    [[nodiscard]] Number gcdOfFactors(const Line& row) const {
        Number gcd(0);
        for (std::size_t i = 0; i < variables_; ++i)
            if (row[i] != Number(0))
                gcd = IntegerRows::gcdOf(gcd, row[i]);
        return gcd;
    }

    /// a * factorA + b * factorB
    Line combined(const Line& a, const Number& factorA, const Line& b, const Number& factorB) {
        charge(a);
        Line sum(a.size());
        for (std::size_t i = 0; i < a.size(); ++i)
            sum[i] = a[i] * factorA + b[i] * factorB;
        return sum;
    }

    /// Works on a problem until it has no constraint left, or a core; false where it has a contradiction.
    bool reduce(Problem<Number>& problem) {
        for (;;) {
            steps_.take();
            if (!solveEqualities(problem))
                return false;
            bool foundEquality = false;
            if (!tighten(problem, foundEquality))
                return false;
            if (foundEquality || dropOneSided(problem))
                continue;
            if (problem.inequalities.empty())
                return true;
            const std::size_t variable = cheapest(problem);
            const Sides sides = sidesOf(problem, variable);
            if (!sides.isExact() || sides.growth() > limits::eliminationGrowth)
                return true;
            eliminate(problem, variable);
        }
    }

    // Equalities.

    bool solveEqualities(Problem<Number>& problem) {
        while (!problem.equalities.empty()) {
            Line row = std::move(problem.equalities.back());
            problem.equalities.pop_back();
            for (;;) {
                const std::size_t least = leastFactor(row);
                if (least == variables_) {
                    if (constantOf(row) != Number(0))
                        return false;
                    break;
                }
                if (isOnlyFactor(row, least)) {
                    const Number quotient = constantOf(row) / row[least];
                    if (quotient * row[least] != constantOf(row))
                        return false;
                    fix(problem, least, -quotient);
                    break;
                }
                changeVariables(problem, row, least);
            }
        }
        return true;
    }

    [[nodiscard]] std::size_t leastFactor(const Line& row) const {
        std::size_t least = variables_;
        for (std::size_t i = 0; i < variables_; ++i) {
            if (row[i] != Number(0) &&
                (least == variables_ || IntegerRows::magnitude(row[i]) < IntegerRows::magnitude(row[least])))
                least = i;
        }
        return least;
    }

    [[nodiscard]] bool isOnlyFactor(const Line& row, std::size_t variable) const {
        for (std::size_t i = 0; i < variables_; ++i)
            if (i != variable && row[i] != Number(0))
                return false;
        return true;
    }

    /// Puts x - q·others in the place of x, so that the other factors of `row` become remainders of x's.
    void changeVariables(Problem<Number>& problem, Line& row, std::size_t variable) {
        Line shift(variables_ + 1);
        for (std::size_t i = 0; i < variables_; ++i)
            if (i != variable && row[i] != Number(0))
                shift[i] = -Number(row[i] / row[variable]);
        const auto apply = [&](Line& line) {
            if (line[variable] == Number(0))
                return;
            charge(line);
            for (std::size_t i = 0; i < variables_; ++i)
                if (shift[i] != Number(0))
                    line[i] += shift[i] * line[variable];
        };
        apply(row);
        for (Line& line : problem.equalities)
            apply(line);
        for (Line& line : problem.inequalities)
            apply(line);
        problem.eliminations.push_back({variable, {}, std::move(shift)});
    }

    void fix(Problem<Number>& problem, std::size_t variable, const Number& value) {
        for (std::vector<Line>* rows : {&problem.equalities, &problem.inequalities}) {
            for (Line& line : *rows) {
                line.back() += line[variable] * value;
                line[variable] = Number(0);
            }
        }
        Line constant(variables_ + 1);
        constant.back() = value;
        problem.eliminations.push_back({variable, {}, std::move(constant)});
    }

    // Inequalities.

    /// The factors of the opposite direction, without a constant.
    [[nodiscard]] Line oppositeFactors(const Line& row) const {
        Line opposite(variables_);
        for (std::size_t i = 0; i < variables_; ++i)
            opposite[i] = -row[i];
        return opposite;
    }

    /// Divides by common factors, keeps the tightest of parallel ones and turns opposite ones that leave one value into
    /// an equality; false where two contradict each other.
    bool tighten(Problem<Number>& problem, bool& foundEquality) {
        std::map<Line, Number> tightest; // constant by factors
        for (Line& line : problem.inequalities) {
            charge(line);
            const Number gcd = gcdOfFactors(line);
            if (gcd == Number(0)) {
                if (constantOf(line) < Number(0))
                    return false;
                continue;
            }
            for (std::size_t i = 0; i < variables_; ++i)
                line[i] = line[i] / gcd;
            Number constant = IntegerRows::floorDivide(line.back(), gcd);
            line.pop_back();
            const auto [at, added] = tightest.try_emplace(std::move(line), constant);
            if (!added && constant < at->second)
                at->second = std::move(constant);
        }
        problem.inequalities.clear();
        for (auto& [factors, constant] : tightest) {
            const Line opposite = oppositeFactors(factors);
            Line line(factors);
            line.push_back(constant);
            if (const auto other = tightest.find(opposite); other != tightest.end()) {
                const Number width = constant + other->second;
                if (width < Number(0))
                    return false;
                if (width == Number(0)) {
                    if (factors < opposite)
                        problem.equalities.push_back(std::move(line));
                    foundEquality = true;
                    continue;
                }
            }
            problem.inequalities.push_back(std::move(line));
        }
        return true;
    }

    struct Sides {
        std::size_t lower = 0;
        std::size_t upper = 0;
        Number greatestLower{0}; ///< factor
        Number greatestUpper{0};

        [[nodiscard]] bool isExact() const { return greatestLower <= Number(1) || greatestUpper <= Number(1); }

        /// Constraints that an elimination adds.
        [[nodiscard]] std::int64_t growth() const {
            return static_cast<std::int64_t>(lower * upper) - static_cast<std::int64_t>(lower + upper);
        }
    };

    [[nodiscard]] Sides sidesOf(const Problem<Number>& problem, std::size_t variable) const {
        Sides sides;
        for (const Line& line : problem.inequalities) {
            if (line[variable] > Number(0)) {
                ++sides.lower;
                sides.greatestLower = std::max(sides.greatestLower, line[variable]);
            } else if (line[variable] < Number(0)) {
                ++sides.upper;
                sides.greatestUpper = std::max(sides.greatestUpper, IntegerRows::magnitude(line[variable]));
            }
        }
        return sides;
    }

    /// Takes away the constraints on a variable that is bounded on one side only: it can always be far enough out.
    bool dropOneSided(Problem<Number>& problem) {
        for (std::size_t variable = 0; variable < variables_; ++variable) {
            const Sides sides = sidesOf(problem, variable);
            if ((sides.lower == 0) == (sides.upper == 0))
                continue;
            takeBounds(problem, variable);
            return true;
        }
        return false;
    }

    /// Moves the constraints on a variable to the eliminations; returns where they are.
    const std::vector<Line>& takeBounds(Problem<Number>& problem, std::size_t variable) {
        const auto first = std::partition(problem.inequalities.begin(), problem.inequalities.end(),
                                          [&](const Line& line) { return line[variable] == Number(0); });
        problem.eliminations.push_back(
            {variable, {std::make_move_iterator(first), std::make_move_iterator(problem.inequalities.end())}, {}});
        problem.inequalities.erase(first, problem.inequalities.end());
        return problem.eliminations.back().bounds;
    }

    /// The variable whose elimination is exact, if any is, and adds the fewest constraints.
    [[nodiscard]] std::size_t cheapest(const Problem<Number>& problem) const {
        std::size_t best = variables_;
        std::pair<bool, std::int64_t> bestCost;
        Number bestFactor(0);
        for (std::size_t variable = 0; variable < variables_; ++variable) {
            const Sides sides = sidesOf(problem, variable);
            if (sides.lower == 0)
                continue;
            const bool exact = sides.isExact();
            const std::pair<bool, std::int64_t> cost{!exact, sides.growth()};
            const Number factor = std::min(sides.greatestLower, sides.greatestUpper);
            const bool better = exact ? cost < bestCost : bestCost.first && factor < bestFactor;
            if (best == variables_ || better) {
                best = variable;
                bestCost = cost;
                bestFactor = factor;
            }
        }
        return best;
    }

    /// Adds each lower bound of a variable to each upper one.
    void eliminate(Problem<Number>& problem, std::size_t variable) {
        const std::vector<Line>& bounds = takeBounds(problem, variable);
        for (const Line& lower : bounds) {
            if (lower[variable] < Number(0))
                continue;
            for (const Line& upper : bounds)
                if (upper[variable] < Number(0))
                    problem.inequalities.push_back(combined(lower, Number(-upper[variable]), upper, lower[variable]));
        }
    }

    // The core.

    /// Searches for values of the variables that are left; the others are 0.
    std::optional<std::vector<Number>> solveCore(const Problem<Number>& problem) {
        std::vector<std::size_t> left;
        for (std::size_t i = 0; i < variables_; ++i)
            if (std::ranges::any_of(problem.inequalities, [&](const Line& line) { return line[i] != Number(0); }))
                left.push_back(i);
        std::map<Line, Bounds<Number>> slabs; // by factors
        for (const Line& line : problem.inequalities) {
            Line factors;
            for (const std::size_t variable : left)
                factors.push_back(line[variable]);
            Line opposite(factors.size());
            std::ranges::transform(factors, opposite.begin(), [](const Number& factor) { return -factor; });
            if (const auto other = slabs.find(opposite); other != slabs.end())
                other->second.high = constantOf(line);
            else
                slabs[std::move(factors)].low = -constantOf(line);
        }
        std::vector<typename IntegerBody<Number>::Slab> all;
        all.reserve(slabs.size());
        for (const auto& [factors, bounds] : slabs)
            all.push_back({factors, bounds});
        const auto core = IntegerBody<Number>(std::move(all), left.size(), steps_).solve();
        if (!core)
            return std::nullopt;
        std::vector<Number> values(variables_, Number(0));
        for (std::size_t i = 0; i < left.size(); ++i)
            values[left[i]] = (*core)[i];
        return values;
    }

    // Values.

    std::vector<Number> valuesOf(const Problem<Number>& problem, std::vector<Number> values) {
        for (std::size_t i = problem.eliminations.size(); i-- > 0;) {
            const Elimination<Number>& step = problem.eliminations[i];
            steps_.take(1 + step.bounds.size() * variables_ / 8);
            if (step.bounds.empty())
                values[step.variable] += sumOf(step.value, step.variable, values);
            else
                values[step.variable] = withinBounds(step, values);
        }
        return values;
    }

    Number sumOf(const Line& row, std::size_t without, const std::vector<Number>& values) const {
        Number sum = row.back();
        for (std::size_t i = 0; i < variables_; ++i)
            if (i != without && row[i] != Number(0))
                sum += row[i] * values[i];
        return sum;
    }

    /// The value nearest to 0 that the bounds allow.
    Number withinBounds(const Elimination<Number>& step, const std::vector<Number>& values) const {
        std::optional<Number> low;
        std::optional<Number> high;
        for (const Line& bound : step.bounds) {
            const Number& factor = bound[step.variable];
            const Number rest = sumOf(bound, step.variable, values);
            if (factor > Number(0)) {
                Number least = -IntegerRows::floorDivide(rest, factor);
                if (!low || least > *low)
                    low = std::move(least);
            } else {
                Number most = IntegerRows::floorDivide(rest, Number(-factor));
                if (!high || most < *high)
                    high = std::move(most);
            }
        }
        VTSYM_CHECK(!low || !high || *low <= *high); // eliminations leave a value
        if (low && *low > Number(0))
            return *low;
        return high && *high < Number(0) ? *high : Number(0);
    }

    std::size_t variables_;
    Steps& steps_;
};

} // namespace VT
