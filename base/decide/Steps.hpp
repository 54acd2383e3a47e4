// Bounded work: every decision counts its steps.
#pragma once

#include "base/core/Limits.hpp"

#include <algorithm>
#include <cstdint>

namespace VT {

/// Thrown inside a decision whose steps are used up; never leaves the Decider.
struct StepsUsedUp {};

/// Counts down what a question may still cost.  Steps are counted, not seconds, so that answers are the same on every
/// machine.
class Steps {
public:
    void refill(std::uint64_t steps) noexcept { left_ = total_ = steps; }

    void take(std::uint64_t steps = 1) {
        if (steps > left_) {
            left_ = 0;
            throw StepsUsedUp{};
        }
        left_ -= steps;
    }

    [[nodiscard]] std::uint64_t left() const noexcept { return left_; }

    /// What the question may cost in all.
    [[nodiscard]] std::uint64_t total() const noexcept { return total_; }

    /// While it lives, no more than some of the steps that are left can be taken.
    class Share {
    public:
        Share(Steps& steps, std::uint64_t most) noexcept
            : steps_(steps),
              kept_(steps.left_ - std::min(steps.left_, most)) {
            steps_.left_ -= kept_;
            steps_.kept_ += kept_;
        }

        Share(const Share&) = delete;
        Share& operator=(const Share&) = delete;

        ~Share() {
            steps_.left_ += kept_;
            steps_.kept_ -= kept_;
        }

    private:
        Steps& steps_;
        std::uint64_t kept_;
    };

    /// Work that depends on how unknowns are spelt: it may take several times what the question took so far, and at
    /// most that is charged.  So the spelling changes what a question costs by no more than a factor of two, and never
    /// whether it is decided.  Such work inside of such work shares its steps.
    template <class Work>
    void spellOut(Work work) {
        if (isSpelling_) {
            try {
                work();
            } catch (const StepsUsedUp&) {
                left_ = 0;
            }
            return;
        }
        const std::uint64_t spent = total_ - left_ - kept_;
        const std::uint64_t before = left_;
        const std::uint64_t allowed =
            std::min(limits::spellingFactor * spent + limits::spellingSteps, limits::witnessSteps);
        left_ = allowed;
        isSpelling_ = true;
        try {
            work();
        } catch (const StepsUsedUp&) { // what was found by then counts
            left_ = 0;
        } catch (...) {
            isSpelling_ = false;
            throw;
        }
        isSpelling_ = false;
        const std::uint64_t taken = allowed - left_;
        left_ = before - std::min({before, spent, taken});
    }

private:
    std::uint64_t left_ = 0;
    std::uint64_t total_ = 0;
    std::uint64_t kept_ = 0; ///< by shares
    bool isSpelling_ = false;
};

} // namespace VT
