// Reads the base protocol of language servers.
//
// Method: a buffer and a place in it.  A line of a header that is not one may be the content of an earlier message
// whose length was wrong; the next header then begins inside of it, where its name is. Cost: linear; the buffer holds
// one message and one read.
#include "tools/vtsym/lsp/MessageFraming.hpp"

#include "tools/vtsym/io/Files.hpp"
#include "tools/vtsym/lsp/ServerBounds.hpp"

#include <algorithm>
#include <charconv>
#include <utility>

namespace vtsym {

namespace {

constexpr std::string_view lengthName = "content-length:";

bool isSame(char a, char lower) {
    return a == lower || (a >= 'A' && a <= 'Z' && a + ('a' - 'A') == lower);
}

/// The value of the last Content-Length on a line; nothing where it is no number.
std::optional<std::uint64_t> lengthOn(std::string_view line) {
    const auto* const name = std::find_end(line.begin(), line.end(), lengthName.begin(), lengthName.end(), isSame);
    if (name == line.end())
        return std::nullopt;
    std::string_view value = line.substr(static_cast<std::size_t>(name - line.begin()) + lengthName.size());
    value.remove_prefix(std::min(value.find_first_not_of(" \t"), value.size()));
    value = value.substr(0, value.find_last_not_of(" \t\r\n") + 1);
    std::uint64_t length = 0;
    const auto [end, error] = std::from_chars(value.data(), value.data() + value.size(), length);
    const bool isNumber = error == std::errc() && end == value.data() + value.size();
    return isNumber ? std::optional(length) : std::nullopt;
}

} // namespace

void FrameReader::feed(std::string_view bytes) {
    buffer_.append(bytes);
}

/// Forgets bytes at the place; makes room when most of the buffer was read.
void FrameReader::drop(std::size_t bytes) {
    at_ += bytes;
    if (at_ > buffer_.size() / 2) {
        buffer_.erase(0, at_);
        at_ = 0;
        if (buffer_.empty() && buffer_.capacity() > mostBytes / 8)
            buffer_.shrink_to_fit();
    }
    searched_ = 0;
}

/// The next line with its end; of a longer one than headers have, a part.
std::optional<std::string_view> FrameReader::line() {
    const std::string_view rest = std::string_view(buffer_).substr(at_);
    const std::size_t end = rest.find('\n', searched_);
    if (end != std::string_view::npos)
        return rest.substr(0, end + 1);
    if (rest.size() > mostHeaderBytes) // its end may be the beginning of the next header
        return rest.substr(0, rest.size() - lengthName.size());
    searched_ = rest.size();
    return std::nullopt;
}

void FrameReader::readHeader(std::string_view line) {
    hasLines_ = true;
    if (const auto length = lengthOn(line))
        length_ = length;
}

std::optional<ReceivedFrame> FrameReader::endHeader() {
    const bool hadLines = std::exchange(hasLines_, false);
    if (!length_) {
        return hadLines ? std::optional(ReceivedFrame{"the header of a message has no Content-Length that is a number; "
                                                      "write Content-Length: and the bytes of the message",
                                                      true})
                        : std::nullopt;
    }
    if (*length_ <= mostMessageBytes) {
        isContent_ = true;
        return std::nullopt;
    }
    skipped_ = *length_;
    length_.reset();
    return ReceivedFrame{"a message of " + std::to_string(skipped_) + " bytes is larger than " +
                             sizeText(mostMessageBytes) + "; send a smaller one",
                         true};
}

std::optional<ReceivedFrame> FrameReader::next() {
    while (true) {
        const std::size_t available = buffer_.size() - at_;
        if (skipped_ > 0) {
            const auto passed = static_cast<std::size_t>(std::min<std::uint64_t>(skipped_, available));
            skipped_ -= passed;
            drop(passed);
            if (skipped_ > 0)
                return std::nullopt;
        } else if (isContent_) {
            const auto length = static_cast<std::size_t>(*length_);
            if (available < length)
                return std::nullopt;
            ReceivedFrame frame{buffer_.substr(at_, length)};
            drop(length);
            length_.reset();
            isContent_ = false;
            return frame;
        } else {
            const auto next = line();
            if (!next)
                return std::nullopt;
            const bool isEmpty = *next == "\n" || *next == "\r\n";
            const std::size_t read = next->size();
            std::optional<ReceivedFrame> fault;
            if (isEmpty)
                fault = endHeader();
            else
                readHeader(*next);
            drop(read);
            if (fault)
                return fault;
        }
    }
}

std::string framed(std::string_view content) {
    return "Content-Length: " + std::to_string(content.size()) + "\r\n\r\n" + std::string(content);
}

} // namespace vtsym
