// Solves linear constraints over the integers in numbers of one kind.
//
// Method: the Omega test (Pugh, "The Omega test: a fast and practical integer programming algorithm for dependence
// analysis", 1991).  Equalities are solved by Euclid's algorithm on their columns, a change of variables that keeps
// the integers.  Then one variable after the other is eliminated from the inequalities by adding each lower bound to
// each upper one.  That is exact where all factors of one side are 1; elsewhere the problem becomes alternatives: the
// dark shadow, whose solutions always extend, and equalities near a lower bound, which catch what it misses.  Where
// two parallel inequalities leave few values between them, these values are the alternatives instead.
//
// The number of constraints and of alternatives explodes where many variables are tied together or factors are large.
// So variables are eliminated only where that adds next to no constraints at first, and a problem is split at a
// variable that has a fraction in a solution over the real numbers (branch and bound, Land and Doig, 1960), which finds
// solutions fast where there is room for them but need not end.  After some such splits the Omega test takes over.
//
// Alternatives wait on an explicit stack, each with the eliminations that lead back to the values of its variables.
//
// Cost: one step for every few factors of a constraint that is looked at.
#pragma once

#include "base/core/Check.hpp"
#include "base/core/Limits.hpp"
#include "base/decide/solver/Simplex.hpp"

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <iterator>
#include <map>
#include <optional>
#include <utility>
#include <vector>

namespace VT::Omega {

template <class Number>
Number magnitude(const Number& value) {
    return value < Number(0) ? Number(-value) : value;
}

template <class Number>
Number floorDivide(const Number& value, const Number& divisor) { // the divisor is positive
    Number quotient = value / divisor;
    if (Number(quotient * divisor) > value)
        quotient = quotient - Number(1);
    return quotient;
}

template <class Number>
Number gcdOf(Number a, Number b) {
    a = magnitude(a);
    b = magnitude(b);
    while (b != Number(0)) {
        Number rest = a - Number(a / b) * b;
        a = std::move(b);
        b = std::move(rest);
    }
    return a;
}

/// Factors of the variables, then the constant.
template <class Number>
using Row = std::vector<Number>;

/// How a variable follows from the others.
template <class Number>
struct Elimination {
    std::size_t variable;
    std::vector<Row<Number>> bounds; ///< of the variable, as inequalities; none where `value` says what it is
    Row<Number> value;               ///< what is to be added to what the variable became; its own factor is 0
};

template <class Number>
struct Problem {
    std::vector<Row<Number>> equalities;
    std::vector<Row<Number>> inequalities;
    std::vector<Elimination<Number>> eliminations;
};

/// A problem, or several: with `equality` reduced by each number from 0 to `last`.
template <class Number>
struct Alternatives {
    Problem<Number> problem;
    Row<Number> equality; ///< empty where the problem is meant as it is
    Number last;
};

/// Solves one problem after the other; each takes steps.
template <class Number>
class OmegaTest {
public:
    /// @param branches  problems that are split along a variable before they are split in a way that ends
    OmegaTest(std::size_t variables, Steps& steps, int branches)
        : variables_(variables),
          steps_(steps),
          branches_(branches) {}

    /// Values of the variables, or nothing where the constraints have no solution.  Throws StepsUsedUp.
    std::optional<std::vector<Number>> solve(Problem<Number> problem) {
        open_.clear();
        open_.push_back({std::move(problem), {}, Number(0)});
        while (!open_.empty()) {
            Problem<Number> next = takeNext();
            if (reduce(next))
                return valuesOf(next);
        }
        return std::nullopt;
    }

private:
    using Line = Row<Number>;

    /// Takes steps for factors that are looked at or written.
    void charge(std::size_t factors) {
        constexpr std::size_t factorsPerStep = 8;
        steps_.take(1 + factors / factorsPerStep);
    }

    Problem<Number> takeNext() {
        Alternatives<Number>& top = open_.back();
        if (top.equality.empty()) {
            Problem<Number> only = std::move(top.problem);
            open_.pop_back();
            return only;
        }
        charge((top.problem.inequalities.size() + 1) * (variables_ + 1));
        Problem<Number> next = top.problem;
        next.equalities.push_back(top.equality);
        next.equalities.back().back() = top.equality.back() - top.last;
        if (top.last == Number(0))
            open_.pop_back();
        else
            top.last = top.last - Number(1);
        return next;
    }

    [[nodiscard]] const Number& constantOf(const Line& row) const { return row.back(); }

    [[nodiscard]] Number gcdOfFactors(const Line& row) const {
        Number gcd(0);
        for (std::size_t i = 0; i < variables_; ++i)
            if (row[i] != Number(0))
                gcd = gcdOf(gcd, row[i]);
        return gcd;
    }

    /// a * factorA + b * factorB
    Line combined(const Line& a, const Number& factorA, const Line& b, const Number& factorB) {
        charge(a.size());
        Line sum(a.size());
        for (std::size_t i = 0; i < a.size(); ++i)
            sum[i] = a[i] * factorA + b[i] * factorB;
        return sum;
    }

    /// Works on a problem until it has no constraint left (true), or a contradiction or alternatives (false).
    bool reduce(Problem<Number>& problem) {
        for (;;) {
            steps_.take();
            if (!solveEqualities(problem))
                return false;
            bool foundEquality = false;
            if (!tighten(problem, foundEquality))
                return false;
            if (foundEquality)
                continue;
            if (dropOneSided(problem))
                continue;
            if (problem.inequalities.empty())
                return true;
            const std::size_t variable = cheapest(problem);
            const Sides sides = sidesOf(problem, variable);
            if (sides.isExact() && (branches_ == 0 || sides.growth() <= limits::eliminationGrowth)) {
                eliminate(problem, variable, false);
                continue;
            }
            return split(problem, variable);
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
        for (std::size_t i = 0; i < variables_; ++i)
            if (row[i] != Number(0) && (least == variables_ || magnitude(row[i]) < magnitude(row[least])))
                least = i;
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
            charge(line.size());
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
        for (std::vector<Line>* rows : {&problem.equalities, &problem.inequalities})
            for (Line& line : *rows) {
                line.back() += line[variable] * value;
                line[variable] = Number(0);
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
            charge(line.size());
            const Number gcd = gcdOfFactors(line);
            if (gcd == Number(0)) {
                if (constantOf(line) < Number(0))
                    return false;
                continue;
            }
            for (std::size_t i = 0; i < variables_; ++i)
                line[i] = line[i] / gcd;
            Number constant = floorDivide(line.back(), gcd);
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
                sides.greatestUpper = std::max(sides.greatestUpper, magnitude(line[variable]));
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

    /// Adds each lower bound of a variable to each upper one; `dark` leaves room for an integer between any two.
    void eliminate(Problem<Number>& problem, std::size_t variable, bool dark) {
        const std::vector<Line>& bounds = takeBounds(problem, variable);
        for (const Line& lower : bounds) {
            if (lower[variable] < Number(0))
                continue;
            for (const Line& upper : bounds) {
                if (upper[variable] > Number(0))
                    continue;
                const Number a = magnitude(upper[variable]);
                const Number& b = lower[variable];
                Line sum = combined(lower, a, upper, b);
                if (dark)
                    sum.back() = sum.back() - Number(a - Number(1)) * Number(b - Number(1));
                problem.inequalities.push_back(std::move(sum));
            }
        }
    }

    // Alternatives.

    bool split(Problem<Number>& problem, std::size_t variable) {
        const auto real = Simplex<Number>(problem.inequalities, variables_, steps_).solve();
        if (!real)
            return false;
        if (branches_ > 0) {
            --branches_;
            branch(problem, *real);
            return false;
        }
        if (splitAlongNarrowest(problem, variable))
            return false;
        const Number a = sidesOf(problem, variable).greatestUpper;
        for (const Line& lower : problem.inequalities)
            if (const Number& b = lower[variable]; b > Number(1))
                open_.push_back({problem, lower, floorDivide(Number(Number(a * b) - a - b), a)});
        eliminate(problem, variable, true);
        open_.push_back({std::move(problem), {}, Number(0)}); // the dark shadow is tried first
        return false;
    }

    /// Alternatives below and above the value of a variable that is no integer in a real solution, the nearer one
    /// first; where there is none, the solution itself.
    void branch(Problem<Number>& problem, const RealPoint<Number>& real) {
        std::size_t variable = 0;
        Number whole(0);
        for (; variable < variables_; ++variable) {
            whole = floorDivide(real.numerators[variable], real.denominator);
            if (whole * real.denominator != real.numerators[variable])
                break;
        }
        if (variable == variables_) {
            for (std::size_t i = 0; i < variables_; ++i) {
                problem.equalities.emplace_back(variables_ + 1);
                problem.equalities.back()[i] = Number(1);
                problem.equalities.back().back() = -Number(real.numerators[i] / real.denominator);
            }
            open_.push_back({std::move(problem), {}, Number(0)});
            return;
        }
        const Number fraction = real.numerators[variable] - whole * real.denominator;
        const bool nearAbove = Number(fraction + fraction) > real.denominator;
        charge((problem.inequalities.size() + 1) * (variables_ + 1));
        for (const bool above : {!nearAbove, nearAbove}) {
            Problem<Number> half = problem;
            half.inequalities.emplace_back(variables_ + 1);
            half.inequalities.back()[variable] = Number(above ? 1 : -1);
            half.inequalities.back().back() = above ? Number(-whole - Number(1)) : whole;
            open_.push_back({std::move(half), {}, Number(0)});
        }
    }

    /// Alternatives for the values between two opposite constraints, where these are fewer than the splinters.
    bool splitAlongNarrowest(const Problem<Number>& problem, std::size_t variable) {
        std::map<Line, const Line*> byFactors;
        const Line* narrowest = nullptr;
        Number width(0);
        for (const Line& line : problem.inequalities) {
            const Line opposite = oppositeFactors(line);
            if (const auto other = byFactors.find(opposite); other != byFactors.end()) {
                const Number between = line.back() + other->second->back();
                if (narrowest == nullptr || between < width) {
                    narrowest = &line;
                    width = between;
                }
            }
            byFactors.emplace(Line(line.begin(), line.end() - 1), &line);
        }
        if (narrowest == nullptr || width > sidesOf(problem, variable).greatestLower)
            return false;
        open_.push_back({problem, *narrowest, width});
        return true;
    }

    // Values.

    std::vector<Number> valuesOf(const Problem<Number>& problem) {
        std::vector<Number> values(variables_, Number(0));
        for (std::size_t i = problem.eliminations.size(); i-- > 0;) {
            const Elimination<Number>& step = problem.eliminations[i];
            charge((step.bounds.size() + 1) * (variables_ + 1));
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
                Number least = -floorDivide(rest, factor);
                if (!low || least > *low)
                    low = std::move(least);
            } else {
                Number most = floorDivide(rest, Number(-factor));
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
    std::vector<Alternatives<Number>> open_;
    int branches_; ///< left
};

} // namespace VT::Omega
