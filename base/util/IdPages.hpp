// A sparse array over identifiers, for memos that live long.
//
// Method: two levels of page tables as of virtual memory, with pages of 16 values; identifiers beyond any dense table
// are kept in a map instead.
// Cost: O(1) for each access, no table look-up where it is the page that was written last; memory in the pages written.
#pragma once

#include "base/util/IdMap.hpp"
#include "base/util/PlainVector.hpp"

#include <array>
#include <cstdint>
#include <cstring>
#include <limits>

namespace VT {

/// Values by identifier, in pages that come into being where an identifier is first stored.  Identifiers are dense and
/// those of one expression lie close together, so pages fill well and neighbours share cache lines.  Those that a
/// host's table may have beyond any dense ones cost more, but no more memory.
template <class Value>
class IdPages {
public:
    using Id = std::uint64_t;

    /// Returns the place of a value, or nullptr where its page was never written; a page starts with zeros.  Valid
    /// until the next at().
    [[nodiscard]] const Value* find(Id id) const noexcept {
        if (id / pageSize == lastNumber_)
            return &pages_[lastPage_][id % pageSize];
        const Id outer = id / (pageSize * chapterSize);
        const std::uint32_t* const chapter = outer < root_.size() ? &root_[outer] : farRoot_.find(outer);
        if (chapter == nullptr || *chapter == 0)
            return nullptr;
        const std::uint32_t page = chapters_[*chapter - 1][id / pageSize % chapterSize];
        return page == 0 ? nullptr : &pages_[page - 1][id % pageSize];
    }

    /// Returns the place of a value and makes it if it was not there.  Valid until the next at().
    Value& at(Id id) {
        if (id / pageSize != lastNumber_)
            turnTo(id);
        return pages_[lastPage_][id % pageSize];
    }

    /// Makes room for the values of `count` neighbouring identifiers.
    void reserve(std::size_t count) {
        chapters_.reserve(count / (pageSize * chapterSize) + 1);
        pages_.reserve(count / pageSize + 1);
    }

    void clear() noexcept {
        root_.clear();
        farRoot_.clear();
        chapters_.clear();
        pages_.clear();
        lastNumber_ = none;
    }

private:
    static constexpr std::size_t pageSize = 16;
    static constexpr std::size_t chapterSize = 64;
    static constexpr Id denseChapters = Id{1} << 22U; ///< of as many nodes as a table can hold
    static constexpr Id none = std::numeric_limits<Id>::max();

    /// Makes the page of an identifier the last one, and makes it if it was not there.
    void turnTo(Id id) {
        const Id outer = id / (pageSize * chapterSize);
        std::uint32_t& chapter = chapterOf(outer);
        if (chapter == 0)
            chapter = addZeros(chapters_, 1);
        std::uint32_t& page = chapters_[chapter - 1][id / pageSize % chapterSize];
        if (page == 0)
            page = addZeros(pages_, 1);
        lastPage_ = page - 1;
        lastNumber_ = id / pageSize;
    }

    /// The number of a chapter, 0 for a new one.
    std::uint32_t& chapterOf(Id outer) {
        if (outer >= denseChapters) {
            std::uint32_t* const known = farRoot_.find(outer);
            return known != nullptr ? *known : farRoot_.insert(outer, 0);
        }
        if (outer >= root_.size())
            addZeros(root_, outer + 1 - root_.size());
        return root_[outer];
    }

    /// Returns the number of elements after the addition: the number of the new page or chapter, from 1 on.
    template <class Element>
    static std::uint32_t addZeros(PlainVector<Element>& vector, std::size_t count) {
        std::memset(static_cast<void*>(vector.extend(count)), 0, count * sizeof(Element));
        return static_cast<std::uint32_t>(vector.size());
    }

    PlainVector<std::uint32_t> root_;                              ///< numbers of chapters; 0 for none
    IdMap<std::uint32_t> farRoot_;                                 ///< the same beyond the dense ones
    PlainVector<std::array<std::uint32_t, chapterSize>> chapters_; ///< numbers of pages; 0 for none
    PlainVector<std::array<Value, pageSize>> pages_;
    Id lastNumber_ = none;       ///< id / pageSize of the page that at() wrote last
    std::uint32_t lastPage_ = 0; ///< its index in pages_
};

} // namespace VT
