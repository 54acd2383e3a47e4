// Replaces the global operator new of this test program by one that can be told to fail.
#pragma once

#include <cstddef>

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

} // namespace VT::Testing
