// Where a parser is in a text that it reads through iterators.
#pragma once

#include "host/embedded/EmbeddedModel.hpp"

#include <cstddef>
#include <cstdint>
#include <iterator>
#include <string>

namespace VT::Embedded {

/// Records how far the parser has read, which it does not report.
class CountingIterator {
public:
    using iterator_category = std::input_iterator_tag;
    using value_type = char;
    using difference_type = std::ptrdiff_t;
    using pointer = const char*;
    using reference = const char&;

    CountingIterator(const char* at, const char*& furthest) : at_(at), furthest_(&furthest) {}

    reference operator*() const { return *at_; }

    CountingIterator& operator++() {
        *furthest_ = ++at_;
        return *this;
    }

    bool operator==(const CountingIterator& other) const { return at_ == other.at_; }

    bool operator!=(const CountingIterator& other) const { return at_ != other.at_; }

private:
    const char* at_;
    const char** furthest_;
};

/// Lines and columns of a text, asked for from front to back.
class Places {
public:
    explicit Places(const std::string& text) : text_(text) {}

    /// The place of the bytes from begin to end, which hold no line break.
    TextPlace of(std::size_t begin, std::size_t end) {
        const std::uint64_t first = advance(begin);
        const std::uint64_t line = line_;
        return {line, first, advance(end)};
    }

private:
    std::uint64_t advance(std::size_t to) {
        for (; at_ < to && at_ < text_.size(); ++at_) {
            const auto byte = static_cast<unsigned char>(text_[at_]);
            if (byte == '\n') {
                ++line_;
                column_ = 1;
            } else if ((byte & 0xc0U) != 0x80U) {
                ++column_;
            }
        }
        return column_;
    }

    const std::string& text_;
    std::size_t at_ = 0;
    std::uint64_t line_ = 1;
    std::uint64_t column_ = 1;
};

} // namespace VT::Embedded
