// Where the program's data and words go.
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

/// Standard output took no more.
class OutputError : public std::runtime_error {
public:
    explicit OutputError(int error);

    /// Whether nobody reads any more, which is no error to tell.
    [[nodiscard]] bool readerIsGone() const noexcept { return readerIsGone_; }

private:
    bool readerIsGone_;
};

/// Colours of one stream: escape sequences, or nothing where it is no terminal or colours are not wanted.
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

/// Data on standard output, buffered; words on standard error, at once.  On a terminal a progress line shows after a
/// second of work between two outputs.
class Console {
public:
    Console();
    Console(const Console&) = delete;
    Console& operator=(const Console&) = delete;
    ~Console();

    /// Adds data to standard output.  Throws OutputError.
    void data(std::string_view text);
    /// Hands everything to standard output.  Throws OutputError.
    void flush();
    /// Writes whole lines to standard error, behind the data before them.
    void words(std::string_view lines);

    /// Whether standard error did not take all of them; one that is closed is not meant to.
    [[nodiscard]] bool wordsLost() const noexcept { return wordsLost_; }

    /// Tells the progress line that the work on a line of input begins, or that there is none while the program waits.
    void working(std::uint64_t line);
    void waiting();

    [[nodiscard]] const Style& dataStyle() const noexcept { return dataStyle_; }

    [[nodiscard]] const Style& wordStyle() const noexcept { return wordStyle_; }

private:
    void showProgress();
    void eraseProgress();

    Style dataStyle_;
    Style wordStyle_;
    bool dataToTerminal_;
    bool wordsToTerminal_;
    bool wordsLost_ = false;
    std::string buffer_;

    std::mutex mutex_; ///< of what follows, and of standard error
    std::condition_variable stop_;
    bool stopping_ = false;
    bool shown_ = false;
    std::uint64_t line_ = 0;                        ///< that is worked on; 0 for none
    std::chrono::steady_clock::time_point since_;   ///< when work began after the last wait
    std::chrono::steady_clock::duration worked_{0}; ///< before that
    std::thread progress_;
};

} // namespace vtsym
