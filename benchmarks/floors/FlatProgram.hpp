// The floor of evaluation: three-address code over one array of doubles, as one would write it for one formula.
#pragma once

#include "benchmarks/floors/FlatTable.hpp"

#include <cstdint>
#include <vector>

namespace Floor {

/// Knows the operators that the measured formulas have, doubles alone, and neither errors nor rules for zero.
class FlatProgram {
public:
    FlatProgram(const FlatTable& table, std::uint32_t root);

    /// Sets the variable that was read first, second ...
    void set(std::size_t variable, double value) { cells_[variables_[variable]] = value; }

    double run();

    [[nodiscard]] std::size_t nodes() const { return cells_.size(); }

private:
    struct Line {
        Kind kind;
        std::uint32_t result;
        std::uint32_t left;
        std::uint32_t right;
    };

    std::vector<double> cells_;
    std::vector<std::uint32_t> variables_;
    std::vector<Line> code_;
};

} // namespace Floor
