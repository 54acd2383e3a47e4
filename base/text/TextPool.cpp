// Texts that are made of texts (a pool of ropes; Boehm, Atkinson, Plass, "Ropes: an alternative to strings", 1995).
//
// Method: a record holds the length of a text and its first 16 bytes, and names the texts that it joins and the glue
// between them.  Appending fills one record, with the first bytes put together in a register.  A text is written, and
// two are compared, by a walk over the joins on an explicit stack; comparing steps over joins that both share, and
// first looks at the 16 bytes, which decide most comparisons.
// Cost: infix() and enclose() O(1), join() O(parts), str() O(bytes), compare() mostly O(1) and at most linear in
// limits::orderedTextBytes.  48 bytes a record, 4 a part of a longer join.
#include "base/text/TextPool.hpp"

#include "base/core/Check.hpp"
#include "base/core/Limits.hpp"

#include <algorithm>
#include <bit>
#include <cstring>
#include <limits>
#include <stdexcept>
#include <vector>

namespace VT {

namespace {

/// Up to sixteen bytes as a number, the first byte the least significant: in registers, texts append by shifting.
__extension__ using BytesValue = unsigned __int128;

constexpr bool littleEndian = std::endian::native == std::endian::little;

std::uint64_t loadEight(const char* bytes) {
    std::uint64_t value = 0;
    std::memcpy(&value, bytes, sizeof value);
    return littleEndian ? value : __builtin_bswap64(value);
}

/// Eight bytes as a number that orders like them.
std::uint64_t loadOrdered(const char* bytes) {
    return __builtin_bswap64(loadEight(bytes));
}

/// Writes the first bytes of a value.
template <std::size_t Count>
void store(std::uint64_t value, char* bytes) {
    const std::uint64_t ordered = littleEndian ? value : __builtin_bswap64(value);
    std::memcpy(bytes, &ordered, Count);
}

std::uint32_t valueOf(std::string_view glue) {
    std::uint32_t value = 0;
    for (std::size_t i = 0; i < glue.size(); ++i)
        value |= std::uint32_t{static_cast<unsigned char>(glue[i])} << 8U * i;
    return value;
}

template <class Glue>
bool fits(std::string_view text) {
    return text.size() <= sizeof(Glue::bytes);
}

template <class Glue>
std::string_view view(const Glue& glue) {
    return {glue.bytes.data(), glue.size};
}

/// Loads up to sixteen bytes, followed by zeros; in whole words where there are enough: names are short and many.
BytesValue loadUpTo16(std::string_view text) {
    const char* const bytes = text.data();
    const std::size_t size = text.size();
    if (size >= 8) {
        const BytesValue tail = loadEight(bytes + (size - 8));
        return tail << 8U * (size - 8) | loadEight(bytes);
    }
    std::uint64_t value = 0;
    for (std::size_t i = 0; i < size; ++i)
        value |= std::uint64_t{static_cast<unsigned char>(bytes[i])} << 8U * i;
    return value;
}

void storeHead(BytesValue value, char* head) {
    store<8>(static_cast<std::uint64_t>(value), head);
    store<8>(static_cast<std::uint64_t>(value >> 64U), head + 8);
}

/// Writes the whole array of a glue and steps over the bytes it holds: the rest is overwritten or falls into the slack.
template <class Glue>
char* put(char* out, const Glue& glue) {
    std::memcpy(out, glue.bytes.data(), glue.bytes.size());
    return out + glue.size;
}

} // namespace

/// Writes glue into a record and collects the head and the length of a join.  Does not read memory that was just
/// written in other pieces: that would wait for the writes.
class TextPool::JoinBuilder {
public:
    template <class Glue>
    void add(Glue& place, std::string_view glue) {
        const std::uint32_t value = valueOf(glue);
        store<sizeof(Glue::bytes)>(value, place.bytes.data());
        place.size = static_cast<std::uint8_t>(glue.size());
        append(value, glue.size());
    }

    void add(const Record& part) {
        const char* const head = part.head.data();
        append(BytesValue{loadEight(head + 8)} << 64U | loadEight(head), part.length);
    }

    void finish(Record& record) const {
        storeHead(head_, record.head.data());
        record.length = size_;
    }

    [[nodiscard]] std::uint64_t size() const noexcept { return size_; }

private:
    void append(BytesValue value, std::uint64_t size) {
        if (size_ < headBytes)
            head_ |= value << 8U * size_;
        size_ = std::min(size_ + size, unbounded);
    }

    BytesValue head_ = 0;
    std::uint64_t size_ = 0;
};

void TextPool::throwTooLong() {
    throw std::length_error("basic_string::append");
}

Text TextPool::bytes(std::string_view bytes) {
    const std::uint64_t position = bytes_.size();
    if (bytes.size() > headBytes)
        std::memcpy(bytes_.extend(bytes.size()), bytes.data(), bytes.size());
    Record& run = add();
    run.length = bytes.size();
    storeHead(loadUpTo16(bytes.substr(0, headBytes)), run.head.data());
    run.kind = bytes.size() > headBytes ? Kind::Long : Kind::Short;
    run.first = static_cast<std::uint32_t>(position);
    run.second = static_cast<std::uint32_t>(position >> 32U);
    run.leading = static_cast<std::uint32_t>(last());
    return last();
}

void TextPool::setLeading(Record& joined, Text front, std::string_view open) const {
    const Record& begin = record(front);
    const bool beginsAlike = open.empty() && begin.length >= limits::orderedTextBytes;
    joined.leading = beginsAlike ? begin.leading : static_cast<std::uint32_t>(last());
}

/// The commonest join, without the loops of the general one.
Text TextPool::infix(Text left, std::string_view separator, Text right) {
    const std::array<Text, 2> parts{left, right};
    if (!fits<Separator>(separator) || length(left) == 0 || length(right) == 0)
        return join("", parts, separator, "");
    Record& joined = add();
    setLeading(joined, left, "");
    JoinBuilder builder;
    builder.add(record(left));
    builder.add(joined.separator, separator);
    builder.add(record(right));
    builder.finish(joined);
    joined.kind = Kind::Join;
    joined.parts = 2;
    joined.open = {};
    joined.close = {};
    joined.first = static_cast<std::uint32_t>(left);
    joined.second = static_cast<std::uint32_t>(right);
    return last();
}

Text TextPool::join(std::string_view open, std::span<const Text> parts, std::string_view separator,
                    std::string_view close) {
    if (fits<Bracket>(open) && fits<Bracket>(close) && fits<Separator>(separator))
        return joinByGlue(open, parts, separator, close);
    // Spellings of unusual length become texts of their own.
    std::vector<Text> all{bytes(open)};
    for (const Text& part : parts) {
        if (&part != parts.data())
            all.push_back(bytes(separator));
        all.push_back(part);
    }
    all.push_back(bytes(close));
    return joinByGlue("", all, "", "");
}

Text TextPool::joinByGlue(std::string_view open, std::span<const Text> parts, std::string_view separator,
                          std::string_view close) {
    if (parts.empty())
        return bytes(std::string(open).append(close));
    if (parts.size() == 1 && open.empty() && close.empty())
        return parts.front();
    if (parts_.size() + parts.size() > std::numeric_limits<std::uint32_t>::max())
        throwTooLong();
    const auto firstPart = static_cast<std::uint32_t>(parts_.size());
    if (parts.size() > 2)
        std::ranges::copy(parts, parts_.extend(parts.size()));

    Record& joined = add();
    const Record& front = record(parts.front());
    setLeading(joined, parts.front(), open);
    JoinBuilder builder;
    builder.add(joined.open, open);
    builder.add(front);
    for (const Text part : parts.subspan(1)) {
        builder.add(joined.separator, separator);
        builder.add(record(part));
    }
    builder.add(joined.close, close);
    builder.finish(joined);
    joined.kind = parts.size() > 2 ? Kind::List : Kind::Join;
    joined.parts = static_cast<std::uint8_t>(std::min<std::size_t>(parts.size(), 2));
    joined.first = parts.size() > 2 ? firstPart : static_cast<std::uint32_t>(parts.front());
    joined.second = static_cast<std::uint32_t>(parts.size() > 2 ? static_cast<Text>(parts.size()) : parts.back());
    return builder.size() == 0 ? parts.front() : last();
}

std::string TextPool::str(Text text, std::size_t bound) const {
    // Short bytes and glue are written in whole words, so there is room after the end.
    constexpr std::size_t slack = headBytes;
    constexpr std::size_t small = 256;
    const std::uint64_t length = this->length(text);
    if (length > bound)
        throwTooLong();
    const auto size = static_cast<std::size_t>(length);
    if (size <= small) {
        std::array<char, small + slack> buffer;
        [[maybe_unused]] const char* const end = write(text, buffer.data());
        VTSYM_CHECK(end == buffer.data() + size);
        return {buffer.data(), size};
    }
    std::string result(size + slack, '\0');
    [[maybe_unused]] const char* const end = write(text, result.data());
    VTSYM_CHECK(end == result.data() + size);
    result.resize(size);
    return result;
}

/// Writes a text from left to right.  The stack holds the joins that are open and, for each, the part that comes next.
char* TextPool::write(Text text, char* out) const {
    pending_.truncate(0); // what a write left for which memory ran out
    auto at = static_cast<std::uint32_t>(text);
    while (true) {
        const Record& record = records_[at];
        if (record.kind >= Kind::Join) {
            out = put(out, record.open);
            pending_.push_back({at, 1});
            at = part(record, 0);
            continue;
        }
        if (record.kind == Kind::Short) {
            std::memcpy(out, record.head.data(), headBytes);
        } else {
            std::memcpy(out, &bytes_[record.position()], static_cast<std::size_t>(record.length));
        }
        out += record.length;
        while (true) {
            if (pending_.size() == 0)
                return out;
            Pending& top = pending_[pending_.size() - 1];
            const Record& join = records_[top.record];
            const std::uint32_t count = partCount(join);
            if (top.next == count) {
                out = put(out, join.close);
                pending_.pop_back();
                continue;
            }
            out = put(out, join.separator);
            at = part(join, top.next);
            if (++top.next == count && join.close.size == 0)
                pending_.pop_back();
            break;
        }
    }
}

void TextPool::clear() noexcept {
    records_.clear();
    parts_.clear();
    bytes_.clear();
    pending_.clear();
}

// Order.

/// Runs over a text in pieces: joins that the caller may step over or into, and runs of bytes.
class TextPool::Cursor {
public:
    Cursor(const TextPool& pool, Text text) : pool_(pool) { enter(static_cast<std::uint32_t>(text)); }

    [[nodiscard]] bool atEnd() const noexcept { return !isJoin_ && run_.empty(); }

    /// Whether the piece is a join; bytes() is the piece otherwise, and never empty.
    [[nodiscard]] bool isJoin() const noexcept { return isJoin_; }

    [[nodiscard]] std::uint32_t join() const noexcept { return join_; }

    [[nodiscard]] std::uint64_t joinLength() const noexcept { return pool_.records_[join_].length; }

    [[nodiscard]] std::string_view bytes() const noexcept { return run_; }

    void stepOverJoin() { next(); }

    void stepIntoJoin() {
        stack_.push_back({join_, 0});
        isJoin_ = false;
        run_ = view(pool_.records_[join_].open);
        if (run_.empty())
            next();
    }

    void consume(std::size_t count) {
        run_.remove_prefix(count);
        if (run_.empty())
            next();
    }

private:
    /// Each join counts its steps: part 0, separator, part 1, ..., close.
    void next() {
        isJoin_ = false;
        run_ = {};
        while (run_.empty() && !isJoin_ && !stack_.empty()) {
            Pending& top = stack_.back();
            const Record& join = pool_.records_[top.record];
            const std::uint64_t step = top.next++;
            const std::uint64_t last = 2 * std::uint64_t{pool_.partCount(join)} - 1;
            if (step == last) {
                stack_.pop_back();
                run_ = view(join.close);
            } else if (step % 2 == 1) {
                run_ = view(join.separator);
            } else {
                enter(pool_.part(join, static_cast<std::uint32_t>(step / 2)));
            }
        }
    }

    void enter(std::uint32_t record) {
        join_ = pool_.records_[record].leading;
        const Record& piece = pool_.records_[join_];
        isJoin_ = piece.kind >= Kind::Join;
        if (!isJoin_)
            run_ = pool_.ownBytes(piece);
    }

    const TextPool& pool_;
    std::vector<Pending> stack_;
    std::string_view run_;
    std::uint32_t join_ = 0;
    bool isJoin_ = false;
};

int TextPool::compare(Text left, Text right) const {
    if (left == right)
        return 0;
    const Record& a = record(left);
    const Record& b = record(right);
    for (const std::size_t at : {0, 8}) {
        const std::uint64_t one = loadOrdered(a.head.data() + at);
        const std::uint64_t two = loadOrdered(b.head.data() + at);
        if (one != two)
            return one < two ? -1 : 1;
    }
    if (a.length <= headBytes || b.length <= headBytes)
        return a.length < b.length ? -1 : static_cast<int>(a.length > b.length);

    Cursor one(*this, left);
    Cursor two(*this, right);
    std::uint64_t position = 0;
    while (position < limits::orderedTextBytes) {
        if (one.atEnd() || two.atEnd())
            return static_cast<int>(two.atEnd()) - static_cast<int>(one.atEnd());
        if (one.isJoin() && two.isJoin() && one.join() == two.join()) {
            position += one.joinLength();
            one.stepOverJoin();
            two.stepOverJoin();
        } else if (one.isJoin() && (!two.isJoin() || one.joinLength() >= two.joinLength())) {
            one.stepIntoJoin();
        } else if (two.isJoin()) {
            two.stepIntoJoin();
        } else {
            const auto count = std::min<std::size_t>({one.bytes().size(), two.bytes().size(),
                                                      static_cast<std::size_t>(limits::orderedTextBytes - position)});
            if (const int order = std::memcmp(one.bytes().data(), two.bytes().data(), count); order != 0)
                return order < 0 ? -1 : 1;
            position += count;
            one.consume(count);
            two.consume(count);
        }
    }
    return 0;
}

} // namespace VT
