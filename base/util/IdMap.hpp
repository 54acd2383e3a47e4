// A small, fast map from identifiers to values, for memos that live during one walk.
//
// Method: open addressing with linear probing, filled to three quarters at most; multiplication spreads the keys.
// Cost: O(1) on average; no memory until the first insertion.
#pragma once

#include "base/util/Hash.hpp"

#include <bit>
#include <cstdint>
#include <utility>
#include <vector>

namespace VT {

/// Keys are never removed one by one.  The identifier with all bits set is not a key.
template <class Value>
class IdMap {
public:
    using Id = std::uint64_t;

    static constexpr Id noId = ~Id{0}; ///< marks a free slot

    /// The value of a key, or nullptr.  Valid until the next insertion.
    [[nodiscard]] Value* find(Id key) noexcept {
        if (slots_.empty() || key == noId)
            return nullptr;
        Slot& slot = slots_[position(key)];
        return slot.key == key ? &slot.value : nullptr;
    }

    [[nodiscard]] const Value* find(Id key) const noexcept { return const_cast<IdMap*>(this)->find(key); }

    /// Adds a key or replaces its value.
    Value& insert(Id key, Value value) {
        if ((size_ + 1) * 4 > slots_.size() * 3)
            grow();
        Slot& slot = slots_[position(key)];
        if (slot.key != key) {
            slot.key = key;
            ++size_;
        }
        slot.value = std::move(value);
        return slot.value;
    }

    [[nodiscard]] std::size_t size() const noexcept { return size_; }

    void clear() noexcept {
        slots_.clear();
        size_ = 0;
    }

private:
    struct Slot {
        Id key = noId;
        Value value{};
    };

    static constexpr std::size_t firstSlots = 32;

    /// The slot that holds a key or would.
    [[nodiscard]] std::size_t position(Id key) const noexcept {
        const std::size_t mask = slots_.size() - 1;
        std::size_t at = static_cast<std::size_t>((key * spread) >> shift_) & mask;
        while (slots_[at].key != key && slots_[at].key != noId)
            at = (at + 1) & mask;
        return at;
    }

    void grow() {
        std::vector<Slot> old(slots_.empty() ? firstSlots : slots_.size() * 2);
        old.swap(slots_);
        shift_ = static_cast<unsigned>(64 - std::countr_zero(slots_.size()));
        for (Slot& slot : old)
            if (slot.key != noId)
                slots_[position(slot.key)] = std::move(slot);
    }

    std::vector<Slot> slots_;
    std::size_t size_ = 0;
    unsigned shift_ = 0;
};

} // namespace VT
