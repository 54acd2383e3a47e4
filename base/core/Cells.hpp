// Storage of a table's nodes, addressed by numbers of 32 bits, so that the slots of its index are small.
#pragma once

#include "base/core/Node.hpp"
#include "base/util/LargePages.hpp"

#include <algorithm>
#include <cstdint>
#include <memory>
#include <new>
#include <stdexcept>
#include <vector>

namespace VT {

/// The header of a node: all that a probe wants to know lies in one cache line.
struct NodeCell {
    /// The code of a node that was added from outside and may be of any class: the cell holds a pointer to it.
    static constexpr std::uint32_t foreign = ~std::uint32_t{0};

    std::uint32_t id;   ///< cells run out before these numbers do
    std::uint32_t code; ///< operator of a node whose class is the library's own

    [[nodiscard]] bool isOf(SymbolicOp op) const noexcept { return code == static_cast<std::uint32_t>(op); }

    [[nodiscard]] const SymbolicExpr* node() const noexcept {
        const void* content = this + 1;
        return code == foreign ? *static_cast<const SymbolicExpr* const*>(content)
                               : static_cast<const SymbolicExpr*>(content);
    }
};

/// Hands out cells from chunks that it frees together; the user destroys what is in them.  Never moves them.
class CellStore {
public:
    /// Names a cell; 0 is not a cell.
    using Number = std::uint32_t;

    /// Returns room for a cell followed by `bytes` bytes, for an object no more aligned than a pointer.  Throws
    /// std::bad_alloc, or std::length_error when the numbers run out at 128 GiB.
    Number allocate(std::size_t bytes) {
        const std::size_t units = (sizeof(NodeCell) + bytes + unit - 1) / unit;
        if (next_ + units > end_)
            grow();
        const auto number = static_cast<Number>(next_);
        next_ += units;
        return number;
    }

    /// Takes back the cell handed out last.
    void release(Number last) noexcept { next_ = last; }

    [[nodiscard]] void* at(Number number) const noexcept {
        return chunks_[number >> chunkBits].get() + (number & chunkMask) * unit;
    }

private:
    static constexpr std::size_t unit = 32;
    static constexpr std::align_val_t lineSize{64}; // so that the cell of a binary node lies in one cache line
    static constexpr unsigned chunkBits = 20;
    static constexpr std::uint32_t chunkMask = (std::uint32_t{1} << chunkBits) - 1;
    static constexpr std::size_t chunkCount = std::size_t{1} << (32 - chunkBits);
    static constexpr std::size_t firstUnits = 128;
    static constexpr std::size_t doublings = 13; // until a chunk is as large as its numbers allow
    static constexpr std::size_t reserved = 1;   // keeps number 0 free

    struct Free {
        void operator()(std::byte* chunk) const noexcept { ::operator delete(chunk, lineSize); }
    };

    void grow() {
        if (chunks_.size() == chunkCount)
            throw std::length_error("expression table: no room for another node");
        const std::size_t units = firstUnits << std::min(chunks_.size(), doublings);
        const std::size_t first = chunks_.size() << chunkBits;
        chunks_.reserve(chunks_.size() + 1);
        chunks_.emplace_back(static_cast<std::byte*>(::operator new(units* unit, lineSize)));
        preferLargePages(chunks_.back().get(), units * unit);
        next_ = first + (first == 0 ? reserved : 0);
        end_ = first + units;
    }

    std::vector<std::unique_ptr<std::byte, Free>> chunks_;
    std::size_t next_ = 0; // wider than a number: the end of the last chunk has none
    std::size_t end_ = 0;
};

} // namespace VT
