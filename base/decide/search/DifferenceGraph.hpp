// Bounds on differences of integers that are added and taken back one by one, with a solution at hand all the time.
//
// Method: potentials that satisfy all bounds are kept; a new bound that they break lowers one of them, and Dijkstra's
// algorithm carries that on along the bounds that break in turn.  When it comes back to where the new bound starts, its
// way is a cycle that sums up below 0 (Cotton and Maler, "Fast and flexible difference constraint propagation for
// DPLL(T)", 2006).  Taking bounds back breaks nothing.
//
// Cost: one step for each bound looked at; a bound that holds already costs one.
#pragma once

#include "base/decide/Steps.hpp"

#include <cstdint>
#include <queue>
#include <utility>
#include <vector>

namespace VT {

class DifferenceGraph {
public:
    using Vertex = std::uint32_t; ///< an integer; 0 is the constant 0

    /// to - from <= most
    struct Bound {
        Vertex from;
        Vertex to;
        std::int64_t most;
    };

    explicit DifferenceGraph(Steps& steps) : steps_(steps) {}

    void begin(std::size_t vertices);

    /// Adds a bound and what to call it; false where it contradicts those before, and is not added.  The names of the
    /// bounds that contradict each other are in contradiction() then.
    bool add(const Bound& bound, std::uint32_t name);

    [[nodiscard]] const std::vector<std::uint32_t>& contradiction() const noexcept { return contradiction_; }

    [[nodiscard]] std::size_t size() const noexcept { return bounds_.size(); }

    /// Takes the latest bounds back.
    void shrink(std::size_t size);

private:
    struct Named {
        Bound bound;
        std::uint32_t name;
    };

    struct Lowered {
        std::int64_t by = 0;       ///< below 0 while it waits
        std::uint32_t round = 0;   ///< in which `by` and `because` were set
        std::uint32_t because = 0; ///< the bound
        bool isDone = false;
    };

    bool lower(const Bound& bound);

    Steps& steps_;
    std::vector<Named> bounds_;
    std::vector<std::vector<std::uint32_t>> from_; ///< bounds by where they start
    std::vector<std::int64_t> potentials_;
    std::vector<Lowered> lowered_;
    std::uint32_t round_ = 0;
    std::priority_queue<std::pair<std::int64_t, Vertex>> waiting_; ///< by how much, as a positive number
    std::vector<std::pair<Vertex, std::int64_t>> changed_;         ///< with the potential before
    std::vector<std::uint32_t> contradiction_;
};

} // namespace VT
