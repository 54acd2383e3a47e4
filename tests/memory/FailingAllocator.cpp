#include "tests/memory/FailingAllocator.hpp"

#include <cstdlib>
#include <new>

namespace VT::Testing {

namespace {

constexpr std::size_t never = ~std::size_t{0};

std::size_t untilFailure = never;
bool failed = false;
std::size_t living = 0;

void* allocate(std::size_t bytes, std::size_t alignment) noexcept {
    if (untilFailure == 0) {
        failed = true;
        return nullptr;
    }
    if (untilFailure != never)
        --untilFailure;
    const std::size_t rounded = (bytes + alignment - 1) / alignment * alignment;
    void* place = alignment <= alignof(std::max_align_t) ? std::malloc(bytes) : std::aligned_alloc(alignment, rounded);
    living += place != nullptr ? 1 : 0;
    return place;
}

void* allocateOrThrow(std::size_t bytes, std::size_t alignment) {
    void* place = allocate(bytes > 0 ? bytes : 1, alignment);
    if (place == nullptr)
        throw std::bad_alloc();
    return place;
}

void release(void* place) noexcept {
    living -= place != nullptr ? 1 : 0;
    std::free(place);
}

constexpr std::size_t usual = alignof(std::max_align_t);

} // namespace

MemoryRunsOut::MemoryRunsOut(std::size_t after) {
    failed = false;
    untilFailure = after;
}

MemoryRunsOut::~MemoryRunsOut() {
    untilFailure = never;
}

bool MemoryRunsOut::happened() {
    return failed;
}

std::size_t livingAllocations() {
    return living;
}

} // namespace VT::Testing

using namespace VT::Testing;

// The forms for arrays call these.
void* operator new(std::size_t bytes) {
    return allocateOrThrow(bytes, usual);
}

void* operator new(std::size_t bytes, std::align_val_t alignment) {
    return allocateOrThrow(bytes, static_cast<std::size_t>(alignment));
}

void* operator new(std::size_t bytes, const std::nothrow_t&) noexcept {
    return allocate(bytes, usual);
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
