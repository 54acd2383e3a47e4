// Steps that many questions may cost together.
#pragma once

#include <algorithm>
#include <cstdint>
#include <limits>

namespace VT {

/// Counts down what all questions of one command may still cost, whichever decider they are asked of.
class Budget {
public:
    explicit Budget(std::uint64_t steps) noexcept : left_(steps) {}

    [[nodiscard]] std::uint64_t left() const noexcept { return left_; }

    /// Takes as many as are left.
    void take(std::uint64_t steps) noexcept { left_ -= std::min(left_, steps); }

    void add(std::uint64_t steps) noexcept {
        left_ += std::min(steps, std::numeric_limits<std::uint64_t>::max() - left_);
    }

private:
    std::uint64_t left_;
};

} // namespace VT
