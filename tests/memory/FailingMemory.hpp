// Allocations of the process, any of which can fail.
#pragma once

#include <cstddef>
#include <new>

namespace VT::Testing::FailingMemory {

enum class How : unsigned char { Once, FromThenOn };

/// Lets the allocation of a number, counted from 0, fail.
void arm(std::size_t number, How how) noexcept;
/// Lets no further one fail; how many there were since arm().
std::size_t disarm() noexcept;

/// Whether one has failed since arm().
bool hasFailed() noexcept;
/// Allocations that were not freed.
std::size_t living() noexcept;

/// Makes a call in which the allocation of that number fails; whether it returned.
template <class Call>
bool attempt(std::size_t number, Call call, How how = How::FromThenOn) {
    const struct Limit {
        ~Limit() { disarm(); }
    } limit;

    arm(number, how);
    try {
        call();
        return true;
    } catch (const std::bad_alloc&) {
        return false;
    }
}

} // namespace VT::Testing::FailingMemory
