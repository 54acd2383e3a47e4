// Hands linear constraints to the reduction, with numbers of 64 bits first, and narrows a solution down to the
// smallest.
//
// Method: a system whose numbers leave 64 bits is solved again from the start with 128 bits, and then with big
// integers.  The smallest solution is found by bisection: the values within a distance of 0 are the more the greater
// the distance is.
//
// Cost: that of the reduction and of the search for an integer point; the smallest solution takes a logarithmic number
// of them for each variable.
#include "base/decide/solver/LinearSolver.hpp"

#include "base/core/Limits.hpp"
#include "base/decide/solver/ConstraintReduction.hpp"
#include "base/integer/CheckedInteger.hpp"

namespace VT {

namespace {

template <class Number>
std::optional<std::vector<BigInteger>> solveWith(std::span<const LinearConstraint> constraints, std::size_t variables,
                                                 Steps& steps) {
    Problem<Number> problem;
    for (const LinearConstraint& constraint : constraints) {
        IntegerRows::Row<Number> row(variables + 1);
        for (std::size_t i = 0; i < constraint.factors.size(); ++i)
            row[i] = Number(constraint.factors[i]);
        row.back() = Number(constraint.constant);
        (constraint.relation == LinearConstraint::Relation::Zero ? problem.equalities : problem.inequalities)
            .push_back(std::move(row));
    }
    const auto values = ConstraintReduction<Number>(variables, steps).solve(std::move(problem));
    if (!values)
        return std::nullopt;
    std::vector<BigInteger> result;
    for (const Number& value : *values)
        result.push_back(BigInteger(value));
    return result;
}

} // namespace

std::optional<std::vector<BigInteger>> LinearSolver::solve(std::span<const LinearConstraint> constraints,
                                                           std::size_t variables) {
    try {
        return solveWith<CheckedInteger>(constraints, variables, steps_);
    } catch (const Overflow&) { // a wider kind may do
    }
    try {
        return solveWith<CheckedInt128>(constraints, variables, steps_);
    } catch (const Overflow&) {
        return solveWith<BigInteger>(constraints, variables, steps_);
    }
}

std::optional<std::vector<BigInteger>> LinearSolver::solveSmallest(std::span<const LinearConstraint> constraints,
                                                                   std::size_t variables, std::size_t minimized) {
    const std::uint64_t before = steps_.left();
    auto best = solve(constraints, variables);
    if (!best)
        return best;
    const Steps::Share share(steps_, limits::minimizingSteps + limits::minimizingFactor * (before - steps_.left()));
    try {
        minimize(*best, constraints, minimized);
    } catch (const StepsUsedUp&) { // a solution is at hand
    }
    return best;
}

void LinearSolver::minimize(std::vector<BigInteger>& best, std::span<const LinearConstraint> constraints,
                            std::size_t minimized) {
    std::vector<LinearConstraint> all(constraints.begin(), constraints.end());
    for (std::size_t variable = 0; variable < minimized; ++variable) {
        using Compared = LinearConstraint::Relation;
        const auto bound = [&](int factor, const BigInteger& constant, Compared relation) {
            LinearConstraint added{{}, constant, relation};
            added.factors.resize(variable + 1);
            added.factors.back() = factor;
            all.push_back(std::move(added));
        };
        // The values within a distance of 0 are the more the greater the distance is.
        BigInteger low = 0;
        BigInteger high = abs(best[variable]);
        const std::size_t before = all.size();
        while (low < high) {
            const BigInteger middle = (low + high) / 2;
            bound(1, middle, Compared::NotNegative);
            bound(-1, middle, Compared::NotNegative);
            if (auto nearer = solve(all, best.size())) {
                high = abs((*nearer)[variable]);
                best = *std::move(nearer);
            } else {
                low = middle + 1;
            }
            all.resize(before);
        }
        bound(1, BigInteger(-high), Compared::Zero);
        if (best[variable] != high) {
            if (auto positive = solve(all, best.size())) {
                best = *std::move(positive);
            } else {
                all.pop_back();
                bound(1, high, Compared::Zero);
            }
        }
    }
}

} // namespace VT
