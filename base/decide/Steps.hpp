// Bounded work: every decision counts its steps.
#pragma once

#include <cstdint>

namespace VT {

/// Thrown inside a decision whose steps are used up; never leaves the Decider.
struct StepsUsedUp {};

/// Counts down what a question may still cost.  Steps are counted, not seconds, so that answers are the same on every
/// machine.
class Steps {
public:
    void refill(std::uint64_t steps) noexcept { left_ = steps; }

    void take(std::uint64_t steps = 1) {
        if (steps > left_) {
            left_ = 0;
            throw StepsUsedUp{};
        }
        left_ -= steps;
    }

    [[nodiscard]] std::uint64_t left() const noexcept { return left_; }

private:
    std::uint64_t left_ = 0;
};

} // namespace VT
