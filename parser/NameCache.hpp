// The names that a converter has resolved.
#pragma once

#include "base/core/NodeHash.hpp"
#include "base/core/Nodes.hpp"

#include <cstddef>
#include <cstdint>
#include <string_view>
#include <vector>

namespace VT {

/// A map from names to the identifiers of their nodes in one table.  The texts are those of the nodes, so that a name
/// is neither copied nor allocated.
class NameCache {
public:
    /// `table` outlives the cache.
    explicit NameCache(const SymbolicExprTable& table) : table_(table) {}

    /// The node of a name, or the invalid identifier.  O(1) on average.
    [[nodiscard]] SymbolicExprId find(std::string_view name) const {
        return slots_.empty() ? invalidId : slots_[probe(name, tagOf(name))].id;
    }

    /// Adds the node of a name, a SymbolicString of the table, unless it is there.  When memory runs out,
    /// std::bad_alloc passes and the cache is as before.  Amortised O(1).
    void insert(SymbolicExprId id) {
        if (2 * (size_ + 1) > slots_.size())
            grow();
        const std::string_view name = nameOf(id);
        const std::uint32_t tag = tagOf(name);
        Slot& slot = slots_[probe(name, tag)];
        size_ += slot.id == invalidId ? 1 : 0;
        slot = {tag, id};
    }

private:
    struct Slot {
        std::uint32_t tag = 0; ///< a part of the hash
        SymbolicExprId id = invalidId;
    };

    static std::uint32_t tagOf(std::string_view name) { return static_cast<std::uint32_t>(NodeKeys::ofText(name)); }

    [[nodiscard]] std::string_view nameOf(SymbolicExprId id) const {
        return static_cast<const SymbolicString*>(table_.get(id))->getName();
    }

    /// Returns the slot of a name, or the free one where it would go.
    [[nodiscard]] std::size_t probe(std::string_view name, std::uint32_t tag) const {
        std::size_t at = tag & (slots_.size() - 1);
        while (slots_[at].id != invalidId && (slots_[at].tag != tag || nameOf(slots_[at].id) != name))
            at = (at + 1) & (slots_.size() - 1);
        return at;
    }

    void grow() {
        constexpr std::size_t first = 64;
        std::vector<Slot> larger(slots_.empty() ? first : 2 * slots_.size());
        for (const Slot& slot : slots_) {
            std::size_t at = slot.tag & (larger.size() - 1);
            while (slot.id != invalidId && larger[at].id != invalidId)
                at = (at + 1) & (larger.size() - 1);
            if (slot.id != invalidId)
                larger[at] = slot;
        }
        slots_.swap(larger);
    }

    const SymbolicExprTable& table_;
    std::vector<Slot> slots_; ///< open addressing, linear probing, a power of two of slots
    std::size_t size_ = 0;
};

} // namespace VT
