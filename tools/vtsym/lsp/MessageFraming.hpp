// The frames of messages on a stream: a header with the length, an empty line, and that many bytes.
#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace vtsym {

/// What came out of a stream: the content of a message, or what is wrong with the stream.
struct ReceivedFrame {
    std::string text;
    bool isFault = false;
};

/// Takes a stream apart.  After a header that cannot be read, it goes on with the next one that can; a message that is
/// larger than mostMessageBytes is passed over.
class FrameReader {
public:
    void feed(std::string_view bytes);

    /// Returns the next message or fault that is complete.  Linear in what was fed, over all calls.
    std::optional<ReceivedFrame> next();

private:
    std::optional<std::string_view> line();
    void readHeader(std::string_view line);
    std::optional<ReceivedFrame> endHeader();
    void drop(std::size_t bytes);

    std::string buffer_;
    std::size_t at_ = 0;                  ///< what is before was read
    std::size_t searched_ = 0;            ///< there is no line end between
    std::uint64_t skipped_ = 0;           ///< bytes to pass over
    std::optional<std::uint64_t> length_; ///< of the header that is being read
    bool isContent_ = false;              ///< the header has ended
    bool hasLines_ = false;               ///< there was something in it
};

/// A message in its frame.
std::string framed(std::string_view content);

} // namespace vtsym
