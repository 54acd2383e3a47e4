// A vector that holds few elements without memory of its own.
#pragma once

#include <boost/container/small_vector.hpp>

#include <memory>
#include <utility>

namespace VT {

/// A small_vector whose move assignment needs no memory.  That of the base allocates where the target was moved from
/// before, and ends the program when memory runs out.
template <class Value, std::size_t Count>
class ShortVector final : public boost::container::small_vector<Value, Count> {
    using Base = boost::container::small_vector<Value, Count>;

public:
    using Base::Base;
    ShortVector() = default;
    ShortVector(const ShortVector&) = default;

    ShortVector(ShortVector&& other) noexcept : Base(std::move(static_cast<Base&>(other))) {}

    ShortVector& operator=(const ShortVector&) = default;

    ShortVector& operator=(ShortVector&& other) noexcept {
        if (this != &other) {
            std::destroy_at(this);
            std::construct_at(this, std::move(other));
        }
        return *this;
    }

    ~ShortVector() = default;
};

} // namespace VT
