// A pool of texts that are made of texts: appending is O(1), and a shared part is stored once.
#pragma once

#include "base/util/PlainVector.hpp"

#include <array>
#include <cstddef>
#include <cstdint>
#include <limits>
#include <span>
#include <string>
#include <string_view>

namespace VT {

/// A text of a TextPool.
enum class Text : std::uint32_t {};

/// An append-only pool of immutable texts.  A text is a run of bytes or a join of other texts of the pool, so that a
/// graph of texts takes memory in its nodes though the text that it stands for may be exponentially long.  Nothing
/// recurses.
class TextPool {
public:
    /// Returns a text of these bytes, which are copied.  O(bytes).  Like all that add texts it throws std::length_error
    /// for more than 2^32 records, and std::bad_alloc.
    Text bytes(std::string_view bytes);
    /// Returns open, the parts with the separator between them, close.  O(parts).
    Text join(std::string_view open, std::span<const Text> parts, std::string_view separator, std::string_view close);

    /// Returns left, separator, right.  O(1).
    Text infix(Text left, std::string_view separator, Text right);

    /// Returns open, text, close.  O(1).
    Text enclose(std::string_view open, Text text, std::string_view close) {
        return join(open, std::span<const Text>(&text, 1), "", close);
    }

    /// The number of bytes, at most `unbounded`.  O(1).
    [[nodiscard]] std::uint64_t length(Text text) const { return record(text).length; }

    /// The length that length() returns for every text of that many bytes or more.
    static constexpr std::uint64_t unbounded = std::uint64_t{1} << 62U;

    /// Whether a text begins with a byte.  O(1).
    [[nodiscard]] bool beginsWith(Text text, char first) const {
        return record(text).length > 0 && record(text).head[0] == first;
    }

    /// Returns the bytes of a text.  Throws std::length_error where there are more than `bound`, before it allocates.
    /// O(bytes).
    [[nodiscard]] std::string str(Text text, std::size_t bound) const;

    /// Orders two texts by their first limits::orderedTextBytes bytes, as unsigned numbers; a beginning is before the
    /// longer text.  Negative, zero or positive.  Mostly O(1); at worst linear in that bound, however long or deep the
    /// texts are.
    [[nodiscard]] int compare(Text left, Text right) const;

    /// Number of records, each of 48 bytes.
    [[nodiscard]] std::size_t size() const noexcept { return records_.size(); }

    /// Makes room for `records` records.
    void reserve(std::size_t records) { records_.reserve(records); }

    /// Forgets all texts and frees their memory.
    void clear() noexcept;

private:
    static constexpr std::size_t headBytes = 16;

    /// A few bytes between or around parts, followed by zeros.
    template <std::size_t Capacity>
    struct Glue {
        std::array<char, Capacity> bytes;
        std::uint8_t size;
    };

    using Bracket = Glue<2>;
    using Separator = Glue<4>;
    enum class Kind : std::uint8_t {
        Short, ///< all bytes are in the head
        Long,  ///< the bytes are in bytes_, from position() on
        Join,  ///< of one or two parts, first and second
        List,  ///< of `second` parts in parts_, from `first` on
    };

    struct Record {
        std::uint64_t length;
        std::array<char, headBytes> head; ///< the first bytes of the text, followed by zeros
        std::uint32_t first;
        std::uint32_t second;
        std::uint32_t leading; ///< the smallest known text with the same first bytes, as many as are ever ordered
        Kind kind;
        std::uint8_t parts; ///< of a Join
        Bracket open;
        Bracket close;
        Separator separator;

        [[nodiscard]] std::size_t position() const noexcept {
            return static_cast<std::size_t>(first | static_cast<std::uint64_t>(second) << 32U);
        }
    };

    struct Pending {
        std::uint32_t record;
        std::uint32_t next;
    };
    class Cursor;
    class JoinBuilder;

    [[nodiscard]] const Record& record(Text text) const { return records_[static_cast<std::uint32_t>(text)]; }

    [[nodiscard]] std::uint32_t partCount(const Record& record) const noexcept {
        return record.kind == Kind::List ? record.second : record.parts;
    }

    [[nodiscard]] std::uint32_t part(const Record& record, std::uint32_t index) const noexcept {
        if (record.kind == Kind::List)
            return static_cast<std::uint32_t>(parts_[record.first + index]);
        return index == 0 ? record.first : record.second;
    }

    [[nodiscard]] std::string_view ownBytes(const Record& record) const noexcept {
        const char* const begin = record.kind == Kind::Short ? record.head.data() : &bytes_[record.position()];
        return {begin, static_cast<std::size_t>(record.length)};
    }

    /// A new record, to be written before it is read.
    Record& add() {
        if (records_.size() > std::numeric_limits<std::uint32_t>::max())
            throwTooLong();
        return *records_.extend(1);
    }

    [[noreturn]] static void throwTooLong();
    void setLeading(Record& joined, Text front, std::string_view open) const;

    [[nodiscard]] Text last() const noexcept { return Text{static_cast<std::uint32_t>(records_.size() - 1)}; }

    Text joinByGlue(std::string_view open, std::span<const Text> parts, std::string_view separator,
                    std::string_view close);
    char* write(Text text, char* out) const;

    PlainVector<Record> records_;
    PlainVector<Text> parts_;
    PlainVector<char> bytes_;
    mutable PlainVector<Pending> pending_; ///< room that write() keeps
};

} // namespace VT
