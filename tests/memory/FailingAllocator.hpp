// Replaces the global operator new of this test program by one that can be told to fail.
#pragma once

#include <gtest/gtest.h>

#include <cstddef>
#include <functional>
#include <new>

namespace VT::Testing {

/// While it lives, the allocation of that number (counted from 0) and all later ones throw std::bad_alloc.
class MemoryRunsOut {
public:
    explicit MemoryRunsOut(std::size_t after);
    MemoryRunsOut(const MemoryRunsOut&) = delete;
    MemoryRunsOut& operator=(const MemoryRunsOut&) = delete;
    ~MemoryRunsOut();

    /// Whether an allocation failed.
    [[nodiscard]] static bool happened();
};

/// Allocations that were not freed.
std::size_t livingAllocations();

/// Calls with the number of the allocation that fails, from the first on until none fails.  A call that leaves
/// allocations behind is an error.
inline void forEachFailure(const std::function<void(std::size_t number)>& run) {
    constexpr std::size_t enough = 100000;
    for (std::size_t number = 0; number < enough; ++number) {
        const std::size_t living = livingAllocations();
        run(number);
        ASSERT_EQ(livingAllocations(), living) << "allocation " << number;
        if (testing::Test::HasFatalFailure() || !MemoryRunsOut::happened())
            return;
    }
    FAIL() << "fails without end";
}

/// Makes a call while memory runs out; whether it returned.
template <class Call>
bool attempt(std::size_t number, Call call) {
    try {
        const MemoryRunsOut limit(number);
        call();
        return true;
    } catch (const std::bad_alloc&) {
        return false;
    }
}

} // namespace VT::Testing
