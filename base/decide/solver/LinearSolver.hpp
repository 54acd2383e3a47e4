// Decides whether linear constraints have a common solution in the integers, and finds a small one.
//
// Numbers are exact at any size: the work is done with 64 bits and done again with 128 bits or with packaged big
// integers where one overflows.  An answer is proven, or the steps were used up.
#pragma once

#include "base/decide/Steps.hpp"
#include "base/integer/BigInteger.hpp"

#include <cstdint>
#include <optional>
#include <span>
#include <vector>

namespace VT {

/// factors · x + constant, and how it compares with 0.
struct LinearConstraint {
    enum class Relation : std::uint8_t { Zero, NotNegative };

    std::vector<BigInteger> factors; ///< by variable; missing ones are 0
    BigInteger constant;
    Relation relation = Relation::NotNegative;
};

class LinearSolver {
public:
    explicit LinearSolver(Steps& steps) : steps_(steps) {}

    /// Returns values of the variables for which all constraints hold, or nothing where there are none.
    ///
    /// Throws StepsUsedUp.  Exponential in the number of variables at worst; systems of a few variables take
    /// microseconds.
    [[nodiscard]] std::optional<std::vector<BigInteger>> solve(std::span<const LinearConstraint> constraints,
                                                               std::size_t variables);
    /// Returns the smallest such values: the first variable is as near to 0 as it can be, of two equally near values
    /// the positive one; then the second, and so on for `minimized` of them.  Takes a logarithmic number of solutions
    /// for each; where these take many more steps than the first one did, the smallest values found so far.
    [[nodiscard]] std::optional<std::vector<BigInteger>> solveSmallest(std::span<const LinearConstraint> constraints,
                                                                       std::size_t variables, std::size_t minimized);

private:
    void minimize(std::vector<BigInteger>& best, std::span<const LinearConstraint> constraints, std::size_t minimized);

    Steps& steps_;
};

} // namespace VT
