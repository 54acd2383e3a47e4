// The slots of virtual functions, as hosts call them.
#pragma once

#include <cstddef>
#include <cstring>

namespace VT::Testing {

/// The slot of a virtual member in its class's table, counted from 0.  By the C++ ABI of this platform a pointer to a
/// virtual member holds one more than the offset of the slot.
template <class Member>
std::ptrdiff_t slotOf(Member member) {
    std::ptrdiff_t raw = 0;
    static_assert(sizeof member >= sizeof raw);
    std::memcpy(&raw, &member, sizeof raw);
    return (raw - 1) / static_cast<std::ptrdiff_t>(sizeof(void*));
}

} // namespace VT::Testing
