// Replaces the allocation of the process by one that counts, and fails where it is asked to.
#include "tests/memory/FailingMemory.hpp"

#include <algorithm>
#include <cstdlib>
#include <dlfcn.h>

namespace VT::Testing::FailingMemory {
namespace {

constexpr std::size_t never = ~std::size_t{0};

std::size_t made = 0; ///< since arm()
std::size_t failing = never;
How mode = How::FromThenOn;
bool failed = false;
std::size_t alive = 0;

bool fails() noexcept {
    const std::size_t number = made++;
    if (failing == never || (mode == How::Once ? number != failing : number < failing))
        return false;
    failed = true;
    return true;
}

void* allocate(std::size_t bytes, std::size_t alignment = alignof(std::max_align_t)) noexcept {
    if (fails())
        return nullptr;
    const std::size_t rounded = (bytes + alignment - 1) / alignment * alignment;
    void* place = alignment <= alignof(std::max_align_t) ? std::malloc(std::max<std::size_t>(bytes, 1))
                                                         : std::aligned_alloc(alignment, rounded);
    alive += place != nullptr ? 1 : 0;
    return place;
}

void* orThrow(void* place) {
    return place != nullptr ? place : throw std::bad_alloc();
}

void release(void* place) noexcept {
    alive -= place != nullptr ? 1 : 0;
    std::free(place);
}

} // namespace

void arm(std::size_t number, How how) noexcept {
    made = 0;
    failed = false;
    mode = how;
    failing = number;
}

std::size_t disarm() noexcept {
    failing = never;
    return made;
}

bool hasFailed() noexcept {
    return failed;
}

std::size_t living() noexcept {
    return alive;
}

} // namespace VT::Testing::FailingMemory

using namespace VT::Testing::FailingMemory;

// The forms for arrays call these.
void* operator new(std::size_t bytes) {
    return orThrow(allocate(bytes));
}

void* operator new(std::size_t bytes, std::align_val_t alignment) {
    return orThrow(allocate(bytes, static_cast<std::size_t>(alignment)));
}

void* operator new(std::size_t bytes, const std::nothrow_t&) noexcept {
    return allocate(bytes);
}

void operator delete(void* place) noexcept {
    release(place);
}

void operator delete(void* place, std::size_t) noexcept {
    release(place);
}

void operator delete(void* place, std::align_val_t) noexcept {
    release(place);
}

void operator delete(void* place, std::size_t, std::align_val_t) noexcept {
    release(place);
}

#if !defined(__SANITIZE_ADDRESS__)
// Stores that grow in place; the sanitizer has an allocator of its own.
extern "C" void* realloc(void* place, std::size_t bytes) noexcept {
    static const auto next = reinterpret_cast<void* (*)(void*, std::size_t)>(::dlsym(RTLD_NEXT, "realloc"));
    return fails() ? nullptr : next(place, bytes);
}
#endif
