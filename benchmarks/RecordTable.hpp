// The floor of interning: an open-addressing table over records of 32 bytes.
#pragma once

#include "base/core/Node.hpp"
#include "base/core/NodeHash.hpp"

#include <array>
#include <cstring>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace VT::Benchmarks {

/// An operator with at most two operands, or a leaf.
struct Record {
    std::uint64_t hash;
    std::uint64_t left;  ///< operand, or offset of a name's text, or bits of a number
    std::uint64_t right; ///< operand, or length of a name's text
    SymbolicOp op;
    std::uint32_t unused = 0;
};

static_assert(sizeof(Record) == 32);

/// Gives one number to one record.  As plain as can be: no virtual calls, no nodes of their own, small slots that carry
/// a part of the hash, hashes of the library's quality.
class RecordTable {
public:
    RecordTable() : slots_(16), mask_(15) {}

    std::uint32_t intern(SymbolicOp op, std::uint64_t left, std::uint64_t right) {
        const std::uint64_t hash = hashStep(hashStep(seeds[static_cast<std::size_t>(op)], left), right);
        return find(hash, Record{hash, left, right, op},
                    [&](const Record& known) { return known.op == op && known.left == left && known.right == right; });
    }

    std::uint32_t name(std::string_view text) {
        const std::uint64_t hash = hashBytes(0, text);
        const Record fresh{hash, texts_.size(), text.size(), SymbolicOp::String};
        const std::uint32_t id = find(hash, fresh, [&](const Record& known) {
            return known.op == SymbolicOp::String && known.right == text.size() &&
                   std::memcmp(texts_.data() + known.left, text.data(), text.size()) == 0;
        });
        if (records_[id].left == texts_.size())
            texts_.append(text);
        return id;
    }

    [[nodiscard]] const Record& operator[](std::uint64_t id) const { return records_[id]; }

    [[nodiscard]] std::string_view text(const Record& name) const {
        return std::string_view(texts_).substr(name.left, name.right);
    }

    [[nodiscard]] std::size_t size() const { return records_.size(); }

private:
    struct Slot {
        std::uint32_t tag = 0;
        std::uint32_t id = free;
    };

    static constexpr std::uint32_t free = ~std::uint32_t{0};

    static constexpr auto seeds = [] {
        std::array<std::uint64_t, operatorCount> all{};
        for (std::size_t code = 0; code < all.size(); ++code)
            all[code] = hashSeed(static_cast<SymbolicOp>(code));
        return all;
    }();

    template <class Same>
    std::uint32_t find(std::uint64_t hash, const Record& fresh, Same same) {
        const auto tag = static_cast<std::uint32_t>(hash >> 32U);
        std::size_t at = hash & mask_;
        for (; slots_[at].id != free; at = (at + 1) & mask_)
            if (slots_[at].tag == tag && same(records_[slots_[at].id]))
                return slots_[at].id;
        const auto id = static_cast<std::uint32_t>(records_.size());
        slots_[at] = {tag, id};
        records_.push_back(fresh);
        if (records_.size() * 4 > slots_.size() * 3)
            grow();
        return id;
    }

    void grow() {
        slots_.assign(slots_.size() * 2, Slot{});
        mask_ = slots_.size() - 1;
        for (std::uint32_t id = 0; id < records_.size(); ++id) {
            std::size_t at = records_[id].hash & mask_;
            while (slots_[at].id != free)
                at = (at + 1) & mask_;
            slots_[at] = {static_cast<std::uint32_t>(records_[id].hash >> 32U), id};
        }
    }

    std::vector<Record> records_;
    std::vector<Slot> slots_;
    std::size_t mask_;
    std::string texts_;
};

} // namespace VT::Benchmarks
