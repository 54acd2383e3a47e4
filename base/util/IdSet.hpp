// A set of identifiers for walks, most of which meet few.
//
// Method: an array that is searched from its beginning, and an IdMap once it is full.
// Cost: no memory of its own while the array does; O(1) on average.
#pragma once

#include "base/util/IdMap.hpp"

#include <algorithm>
#include <array>
#include <cstddef>
#include <cstdint>

namespace VT {

/// The identifier with all bits set is not an element.
class IdSet {
public:
    using Id = std::uint64_t;

    /// Adds an identifier; false where it was there.
    bool add(Id id) {
        if (count_ <= few) {
            const auto end = first_.begin() + static_cast<std::ptrdiff_t>(count_);
            if (std::find(first_.begin(), end, id) != end)
                return false;
            if (count_ < few) {
                first_[count_++] = id;
                return true;
            }
            for (const Id each : first_)
                all_.insert(each, true);
            ++count_; // from now on in the map
        } else if (all_.find(id) != nullptr) {
            return false;
        }
        all_.insert(id, true);
        return true;
    }

private:
    static constexpr std::size_t few = 16;

    std::array<Id, few> first_;
    std::size_t count_ = 0; ///< in the array; beyond its size once all are in the map
    IdMap<bool> all_;
};

} // namespace VT
