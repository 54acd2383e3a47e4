// Storage of a table's nodes.
#pragma once

#include "base/util/LargePages.hpp"

#include <algorithm>
#include <cstddef>
#include <memory>
#include <new>
#include <vector>

namespace VT {

/// Hands out room for nodes from chunks that it frees together; the user destroys what is in them.  Never moves them.
class CellStore {
public:
    /// Returns room for `bytes` bytes, for an object no more aligned than a pointer.  Throws std::bad_alloc.
    void* allocate(std::size_t bytes) {
        bytes = (bytes + alignof(void*) - 1) & ~(alignof(void*) - 1);
        if (static_cast<std::size_t>(end_ - next_) < bytes)
            grow(bytes);
        void* const cell = next_;
        next_ += bytes;
        return cell;
    }

    /// Takes back the room handed out last.
    void release(void* last) noexcept { next_ = static_cast<std::byte*>(last); }

private:
    static constexpr std::size_t firstBytes = 4096;
    static constexpr std::size_t growth = 8; // a chunk is this part of what there is

    void grow(std::size_t bytes) {
        const std::size_t size = std::max({bytes, firstBytes, total_ / growth});
        chunks_.reserve(chunks_.size() + 1);
        chunks_.emplace_back(new std::byte[size]);
        preferLargePages(chunks_.back().get(), size);
        next_ = chunks_.back().get();
        end_ = next_ + size;
        total_ += size;
    }

    std::vector<std::unique_ptr<std::byte[]>> chunks_;
    std::size_t total_ = 0;
    std::byte* next_ = nullptr;
    std::byte* end_ = nullptr;
};

} // namespace VT
