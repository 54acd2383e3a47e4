// A sparse array over identifiers, for memos that live long.
#pragma once

#include "base/core/Node.hpp"
#include "base/print/PlainVector.hpp"

#include <array>
#include <cstdint>
#include <cstring>
#include <limits>

namespace VT {

/// Values by identifier, in pages that come into being where an identifier is first stored.  Identifiers are dense and
/// those of one expression lie close together, so pages fill well and neighbours share cache lines.
template <class Value>
class IdPages {
public:
    /// The place of a value, or nullptr where its page was never written; a page starts with zeros.  Valid until the
    /// next at().
    [[nodiscard]] const Value* find(SymbolicExprId id) const noexcept {
        if (id / pageSize == lastNumber_)
            return &pages_[lastPage_][id % pageSize];
        const SymbolicExprId outer = id / (pageSize * chapterSize);
        if (outer >= root_.size() || root_[outer] == 0)
            return nullptr;
        const std::uint32_t page = chapters_[root_[outer] - 1][id / pageSize % chapterSize];
        return page == 0 ? nullptr : &pages_[page - 1][id % pageSize];
    }

    /// The place of a value, made if it was not there.  Valid until the next at().
    Value& at(SymbolicExprId id) {
        if (id / pageSize != lastNumber_)
            turnTo(id);
        return pages_[lastPage_][id % pageSize];
    }

    /// Room for the values of so many neighbours.
    void reserve(std::size_t count) {
        chapters_.reserve(count / (pageSize * chapterSize) + 1);
        pages_.reserve(count / pageSize + 1);
    }

    void clear() noexcept {
        root_.clear();
        chapters_.clear();
        pages_.clear();
        lastNumber_ = none;
    }

private:
    static constexpr std::size_t pageSize = 16;
    static constexpr std::size_t chapterSize = 64;
    static constexpr SymbolicExprId none = std::numeric_limits<SymbolicExprId>::max();

    /// Makes the page of an identifier the last one, and makes it if it was not there.
    void turnTo(SymbolicExprId id) {
        const SymbolicExprId outer = id / (pageSize * chapterSize);
        if (outer >= root_.size())
            addZeros(root_, outer + 1 - root_.size());
        if (root_[outer] == 0)
            root_[outer] = addZeros(chapters_, 1);
        std::uint32_t& page = chapters_[root_[outer] - 1][id / pageSize % chapterSize];
        if (page == 0)
            page = addZeros(pages_, 1);
        lastPage_ = page - 1;
        lastNumber_ = id / pageSize;
    }

    /// The number of elements behind the addition: the number of a page or chapter, from 1 on.
    template <class Element>
    static std::uint32_t addZeros(PlainVector<Element>& vector, std::size_t count) {
        std::memset(static_cast<void*>(vector.extend(count)), 0, count * sizeof(Element));
        return static_cast<std::uint32_t>(vector.size());
    }

    PlainVector<std::uint32_t> root_;                              ///< numbers of chapters; 0 for none
    PlainVector<std::array<std::uint32_t, chapterSize>> chapters_; ///< numbers of pages; 0 for none
    PlainVector<std::array<Value, pageSize>> pages_;
    SymbolicExprId lastNumber_ = none; ///< id / pageSize of the page that at() wrote last
    std::uint32_t lastPage_ = 0;       ///< where it stands in pages_
};

} // namespace VT
