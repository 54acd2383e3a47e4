// Standard output and standard error of the program: answers, messages, colours and the progress line.
// Everything that the program prints passes through here.
#pragma once

#include <chrono>
#include <condition_variable>
#include <cstdint>
#include <mutex>
#include <stdexcept>
#include <string>
#include <string_view>
#include <thread>

namespace vtsym {

/// Standard output refused to take more.
class OutputError : public std::runtime_error {
public:
    explicit OutputError(int error);

    /// Whether the reader of a pipe has left, which is not worth a message.
    [[nodiscard]] bool readerIsGone() const noexcept { return readerIsGone_; }

private:
    bool readerIsGone_;
};

/// Colours for one stream: escape sequences, or nothing where it is not a terminal or NO_COLOR is set.
class Style {
public:
    explicit Style(bool coloured) : coloured_(coloured) {}

    [[nodiscard]] std::string strong(std::string_view text) const { return in("1", text); }

    [[nodiscard]] std::string bad(std::string_view text) const { return in("1;31", text); }

    [[nodiscard]] std::string good(std::string_view text) const { return in("32", text); }

    [[nodiscard]] std::string name(std::string_view text) const { return in("36", text); }

    [[nodiscard]] std::string faint(std::string_view text) const { return in("2", text); }

private:
    [[nodiscard]] std::string in(std::string_view code, std::string_view text) const;

    bool coloured_;
};

/// Writes answers to standard output, buffered, and messages to standard error, at once.  On a terminal a progress line
/// appears after a second of work without output.
class Console {
public:
    Console();
    Console(const Console&) = delete;
    Console& operator=(const Console&) = delete;
    ~Console();

    /// Writes to standard output.  Throws OutputError.
    void out(std::string_view text);
    /// Hands over what standard output has not yet received.  Throws OutputError.
    void flush();
    /// Writes whole lines to standard error, after flushing standard output.
    void err(std::string_view lines);

    /// Whether standard error refused a message; a closed one is not expected to take any.
    [[nodiscard]] bool errFailed() const noexcept { return errFailed_; }

    /// Starts the progress line for a line of input.
    void working(std::uint64_t line);
    /// Stops it while the program waits for input.
    void waiting();

    [[nodiscard]] const Style& outStyle() const noexcept { return outStyle_; }

    [[nodiscard]] const Style& errStyle() const noexcept { return errStyle_; }

private:
    void showProgress();
    void eraseProgress();

    Style outStyle_;
    Style errStyle_;
    bool outIsTerminal_;
    bool errIsTerminal_;
    bool errFailed_ = false;
    std::string buffer_;

    std::mutex mutex_; ///< guards standard error and all members below
    std::condition_variable stop_;
    bool stopping_ = false;
    bool shown_ = false;
    std::uint64_t line_ = 0;                        ///< being worked on; 0 while waiting
    std::chrono::steady_clock::time_point since_;   ///< when the work on it began
    std::chrono::steady_clock::duration worked_{0}; ///< time spent on the lines before
    std::thread progress_;
};

} // namespace vtsym
