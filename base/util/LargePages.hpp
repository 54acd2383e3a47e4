// Large memory pages for storage that is read in random order.
#pragma once

#include <cstddef>
#include <cstdint>

#if defined(__linux__)
#include <sys/mman.h>
#endif

namespace VT {

/// Asks the system to back fresh storage with large pages where it can.  An index of a million slots touches a page at
/// each probe; with small pages finding the page takes as long as reading it.  A hint only: nothing fails without it.
inline void preferLargePages([[maybe_unused]] void* storage, [[maybe_unused]] std::size_t bytes) noexcept {
#if defined(__linux__) && defined(MADV_HUGEPAGE)
    constexpr std::uintptr_t largePage = std::uintptr_t{1} << 21U;
    const auto begin = reinterpret_cast<std::uintptr_t>(storage);
    const std::uintptr_t first = (begin + largePage - 1) & ~(largePage - 1);
    const std::uintptr_t last = (begin + bytes) & ~(largePage - 1);
    if (first < last)
        static_cast<void>(::madvise(reinterpret_cast<void*>(first), last - first, MADV_HUGEPAGE)); // NOLINT
#endif
}

} // namespace VT
