// Storage for objects that live as long as their owner.
#pragma once

#include <cstddef>
#include <memory>
#include <vector>

namespace VT {

/// Hands out storage from chunks that it frees together.  Never moves what it handed out.
class Arena {
public:
    /// Of every storage: enough for pointers and for numbers of 64 bits.
    static constexpr std::size_t alignment = alignof(std::max_align_t) < 8 ? alignof(std::max_align_t) : 8;

    /// Uninitialised storage for an object no more aligned than a pointer.  Throws std::bad_alloc.
    void* allocate(std::size_t bytes) {
        bytes = (bytes + alignment - 1) & ~(alignment - 1);
        if (bytes > static_cast<std::size_t>(end_ - next_))
            grow(bytes);
        std::byte* place = next_;
        next_ += bytes;
        return place;
    }

    /// Takes back the storage handed out last; any other storage stays until the arena goes.
    void release(void* place, std::size_t bytes) noexcept {
        bytes = (bytes + alignment - 1) & ~(alignment - 1);
        if (static_cast<std::byte*>(place) + bytes == next_)
            next_ -= bytes;
    }

private:
    static constexpr std::size_t firstChunk = std::size_t{1} << 12U;
    static constexpr std::size_t lastChunkSize = std::size_t{1} << 20U;

    void grow(std::size_t bytes) {
        const std::size_t size = bytes > chunk_ ? bytes : chunk_;
        chunks_.push_back(std::make_unique_for_overwrite<std::byte[]>(size));
        next_ = chunks_.back().get();
        end_ = next_ + size;
        if (chunk_ < lastChunkSize)
            chunk_ *= 2;
    }

    std::vector<std::unique_ptr<std::byte[]>> chunks_;
    std::byte* next_ = nullptr;
    std::byte* end_ = nullptr;
    std::size_t chunk_ = firstChunk;
};

} // namespace VT
