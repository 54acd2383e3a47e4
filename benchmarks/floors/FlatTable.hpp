// The floor of interning: an open-addressing table over records of 12 bytes in one vector.
//
// A separate program: nothing of the library is included here or in the other floors.
#pragma once

#include <cstdint>
#include <cstring>
#include <string_view>
#include <vector>

namespace Floor {

enum class Kind : std::uint32_t {
    Name,
    Integer,
    Real,
    Or,
    And,
    BitOr,
    BitXor,
    BitAnd,
    Equal,
    NotEqual,
    Less,
    LessEqual,
    Greater,
    GreaterEqual,
    ShiftLeft,
    ShiftRight,
    Plus,
    Minus,
    Times,
    Divide,
    Modulo,
    Negate,
    Not,
    Complement,
    Member,
    Call,
    List,
    Row,
};

/// The operand that is missing.
inline constexpr std::uint32_t none = ~std::uint32_t{0};

struct Record {
    Kind kind;
    std::uint32_t left;  ///< operand, or offset of a name's text, or half of the bits of a number
    std::uint32_t right; ///< operand, or length of a name's text, or the other half
};

/// Gives one number to one record.  Slots of 8 bytes hold 32 bits of the hash, which also choose the slot, and an
/// index.
class FlatTable {
public:
    FlatTable() : slots_(std::size_t{1} << firstBits) {}

    std::uint32_t intern(Kind kind, std::uint32_t left, std::uint32_t right) {
        const std::uint64_t operands = std::uint64_t{left} << 32U | right;
        const std::uint64_t hash = (operands ^ static_cast<std::uint64_t>(kind) * first) * second;
        return find(
            static_cast<std::uint32_t>((hash ^ hash >> 32U) * first >> 32U), {kind, left, right},
            [&](const Record& known) { return known.left == left && known.right == right && known.kind == kind; });
    }

    std::uint32_t name(std::string_view text) {
        const auto length = static_cast<std::uint32_t>(text.size());
        const auto offset = static_cast<std::uint32_t>(texts_.size());
        const std::uint32_t id = find(hashOf(text), {Kind::Name, offset, length}, [&](const Record& known) {
            return known.kind == Kind::Name && known.right == length &&
                   std::memcmp(texts_.data() + known.left, text.data(), length) == 0;
        });
        if (records_[id].left == offset)
            texts_.insert(texts_.end(), text.begin(), text.end());
        return id;
    }

    [[nodiscard]] const Record& operator[](std::uint32_t id) const { return records_[id]; }

    [[nodiscard]] std::string_view text(const Record& name) const { return {texts_.data() + name.left, name.right}; }

    [[nodiscard]] std::size_t size() const { return records_.size(); }

private:
    struct Slot {
        std::uint32_t tag = 0;
        std::uint32_t id = none;
    };

    static constexpr unsigned firstBits = 8;
    static constexpr std::uint64_t first = 0x9e3779b97f4a7c15U;
    static constexpr std::uint64_t second = 0xd6e8feb86659fd93U;

    static std::uint32_t hashOf(std::string_view text) {
        std::uint64_t hash = text.size();
        const char* at = text.data();
        std::size_t left = text.size();
        for (; left > 8; left -= 8, at += 8) {
            std::uint64_t word = 0;
            std::memcpy(&word, at, 8);
            hash = (hash ^ word) * second;
            hash ^= hash >> 32U;
        }
        std::uint64_t word = 0;
        std::memcpy(&word, at, left);
        hash = (hash ^ word) * second;
        return static_cast<std::uint32_t>((hash ^ hash >> 32U) * first >> 32U);
    }

    template <class Same>
    std::uint32_t find(std::uint32_t tag, const Record& fresh, Same same) {
        const std::size_t mask = slots_.size() - 1;
        std::size_t at = tag >> shift_;
        for (; slots_[at].id != none; at = (at + 1) & mask)
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
        std::vector<Slot> larger(slots_.size() * 2);
        const std::size_t mask = larger.size() - 1;
        --shift_;
        for (const Slot& slot : slots_) {
            if (slot.id == none)
                continue;
            std::size_t at = slot.tag >> shift_;
            while (larger[at].id != none)
                at = (at + 1) & mask;
            larger[at] = slot;
        }
        slots_.swap(larger);
    }

    std::vector<Record> records_;
    std::vector<Slot> slots_;
    std::vector<char> texts_;
    unsigned shift_ = 32 - firstBits;
};

} // namespace Floor
