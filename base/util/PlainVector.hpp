// A vector of plain data for large, long-lived stores.
//
// Method: std::realloc, which moves large blocks by their page tables where the system can.  Capacity doubles.
#pragma once

#include <algorithm>
#include <cstddef>
#include <cstdlib>
#include <new>
#include <type_traits>

namespace VT {

/// Grows in place where the system can, so that a large store does not touch its pages once more at each doubling. When
/// memory runs out, the vector is as before and std::bad_alloc passes.
template <class Value>
class PlainVector {
    static_assert(std::is_trivially_copyable_v<Value>);

public:
    PlainVector() = default;
    PlainVector(const PlainVector&) = delete;
    PlainVector& operator=(const PlainVector&) = delete;

    ~PlainVector() { clear(); }

    Value& operator[](std::size_t index) noexcept { return data_[index]; }

    const Value& operator[](std::size_t index) const noexcept { return data_[index]; }

    [[nodiscard]] std::size_t size() const noexcept { return size_; }

    /// The values for which there is room, those that are there among them.
    [[nodiscard]] std::size_t capacity() const noexcept { return capacity_; }

    /// Makes room for `count` values in all.
    void reserve(std::size_t count) {
        if (capacity_ < count)
            grow(count - size_);
    }

    /// Appends `count` values, to be written before they are read, and returns the first.  Moves the others.
    Value* extend(std::size_t count) {
        if (capacity_ - size_ < count)
            grow(count);
        Value* const first = data_ + size_;
        size_ += count;
        return first;
    }

    void push_back(const Value& value) {
        const Value copy = value;
        *extend(1) = copy;
    }

    /// Appends a value for which there is room.
    void append(const Value& value) noexcept { data_[size_++] = value; }

    void pop_back() noexcept { --size_; }

    /// Forgets the values from a position on and keeps their memory.
    void truncate(std::size_t size) noexcept { size_ = std::min(size_, size); }

    /// Forgets all values and frees their memory.
    void clear() noexcept {
        std::free(data_);
        data_ = nullptr;
        size_ = 0;
        capacity_ = 0;
    }

private:
    // NOLINTBEGIN(bugprone-sizeof-expression): of pointers where these are the values
    void grow(std::size_t count) {
        constexpr std::size_t firstBytes = 960; // of a size that allocators keep ready
        const std::size_t capacity =
            std::max({firstBytes / sizeof(Value), std::size_t{1}, 2 * capacity_, size_ + count});
        void* const grown = std::realloc(static_cast<void*>(data_), capacity * sizeof(Value));
        if (grown == nullptr)
            throw std::bad_alloc();
        data_ = static_cast<Value*>(grown);
        capacity_ = capacity;
    }

    // NOLINTEND(bugprone-sizeof-expression)

    Value* data_ = nullptr;
    std::size_t size_ = 0;
    std::size_t capacity_ = 0;
};

} // namespace VT
