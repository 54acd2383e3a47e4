// Bounds on integers and on their differences: whether they can be met, and by which smallest values.
//
// The bounds of one path through a diagram are a graph: unknowns are its nodes, x - y <= c is an edge.  They can be met
// unless a cycle of edges sums up below 0, and then by integers.  The tightest bounds of one unknown are shortest
// distances, and every integer within them extends to a solution, so taking the value nearest to 0 for one unknown
// after the other gives the smallest solution without going back.
//
// Cost: unknowns times bounds to find a cycle, and the same again at worst to place the values; paths of real
// conditions have a handful of either.
#pragma once

#include "base/decide/Steps.hpp"

#include <cstdint>
#include <optional>
#include <vector>

namespace VT {

class DifferenceSystem {
public:
    using Number = std::uint32_t; ///< of an unknown, from 1 on in their order; 0 is the constant 0

    /// x - y <= most
    struct Bound {
        Number x;
        Number y;
        std::int64_t most;
    };

    explicit DifferenceSystem(Steps& steps) : steps_(steps) {}

    /// No bounds, and so many unknowns.
    void begin(std::size_t unknowns);
    /// low <= x - y <= high, where the infinities bound nothing.
    void restrict(Number x, Number y, std::int64_t low, std::int64_t high);

    [[nodiscard]] std::size_t size() const noexcept { return bounds_.size(); }

    /// Takes the latest bounds away.
    void shrink(std::size_t size) { bounds_.resize(size); }

    [[nodiscard]] const std::vector<Bound>& bounds() const noexcept { return bounds_; }

    /// The smallest values of the unknowns, at their numbers; false where there are none.
    bool solve(std::vector<std::int64_t>& values);
    /// Finds the tightest bounds of every unknown, for low() and high().  The bounds can be met.
    void findRanges();

    [[nodiscard]] std::int64_t low(Number x) const { return low_[x]; }

    [[nodiscard]] std::int64_t high(Number x) const { return high_[x]; }

private:
    bool canBeMet();
    std::optional<bool> solveApart(std::vector<std::int64_t>& values);
    void tighten();

    Steps& steps_;
    std::size_t count_ = 1;
    std::vector<Bound> bounds_;
    std::vector<std::int64_t> distance_;
    std::vector<std::int64_t> low_;
    std::vector<std::int64_t> high_;
};

} // namespace VT
