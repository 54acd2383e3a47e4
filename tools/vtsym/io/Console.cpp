// Buffers standard output and writes standard error through it, so that on a terminal answers and messages appear in
// the order in which they were made.  One thread, started only for a terminal, redraws the progress line five times a
// second.
#include "tools/vtsym/io/Console.hpp"

#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <unistd.h>

namespace vtsym {

namespace {

constexpr std::size_t bufferBytes = std::size_t{1} << 16U;
constexpr std::chrono::seconds quietTime{1};          ///< before the progress line appears
constexpr std::chrono::milliseconds refreshTime{200}; ///< between two updates of it

bool isColoured(int descriptor) {
    const char* const refused = std::getenv("NO_COLOR");
    const char* const terminal = std::getenv("TERM");
    return isatty(descriptor) == 1 && (refused == nullptr || *refused == '\0') &&
           (terminal == nullptr || std::strcmp(terminal, "dumb") != 0);
}

/// Writes all of a text.  Returns 0, or the error that stopped it.
int writeAll(int descriptor, std::string_view text) {
    while (!text.empty()) {
        const ssize_t written = write(descriptor, text.data(), text.size());
        if (written >= 0)
            text.remove_prefix(static_cast<std::size_t>(written));
        else if (errno != EINTR)
            return errno;
    }
    return 0;
}

std::string reason(int error) {
    return std::string("standard output cannot be written: ") + std::strerror(error);
}

} // namespace

OutputError::OutputError(int error) : std::runtime_error(reason(error)), readerIsGone_(error == EPIPE) {}

std::string Style::in(std::string_view code, std::string_view text) const {
    if (!coloured_ || text.empty())
        return std::string(text);
    return std::string("\033[").append(code).append("m").append(text).append("\033[0m");
}

Console::Console()
    : outStyle_(isColoured(STDOUT_FILENO)),
      errStyle_(isColoured(STDERR_FILENO)),
      outIsTerminal_(isatty(STDOUT_FILENO) == 1),
      errIsTerminal_(isatty(STDERR_FILENO) == 1),
      since_(std::chrono::steady_clock::now()) {
    if (errIsTerminal_)
        progress_ = std::thread([this] { showProgress(); });
}

Console::~Console() {
    if (!progress_.joinable())
        return;
    {
        const std::lock_guard lock(mutex_);
        stopping_ = true;
        eraseProgress();
    }
    stop_.notify_all();
    progress_.join();
}

void Console::out(std::string_view text) {
    buffer_.append(text);
    if (buffer_.size() >= bufferBytes)
        flush();
}

void Console::flush() {
    if (buffer_.empty())
        return;
    const std::lock_guard lock(mutex_);
    if (outIsTerminal_)
        eraseProgress();
    const int error = writeAll(STDOUT_FILENO, buffer_);
    buffer_.clear();
    if (error != 0)
        throw OutputError(error);
}

void Console::err(std::string_view lines) {
    flush();
    const std::lock_guard lock(mutex_);
    eraseProgress();
    const int error = writeAll(STDERR_FILENO, lines); // only the exit status can still report this
    errFailed_ = errFailed_ || (error != 0 && error != EBADF);
}

void Console::working(std::uint64_t line) {
    if (!errIsTerminal_)
        return;
    const std::lock_guard lock(mutex_);
    if (line_ == 0)
        since_ = std::chrono::steady_clock::now();
    line_ = line;
}

void Console::waiting() {
    if (!errIsTerminal_)
        return;
    const std::lock_guard lock(mutex_);
    if (line_ != 0)
        worked_ += std::chrono::steady_clock::now() - since_;
    line_ = 0;
}

/// The thread of the progress line.
void Console::showProgress() {
    std::unique_lock lock(mutex_);
    while (!stop_.wait_for(lock, refreshTime, [this] { return stopping_; })) {
        if (line_ == 0) {
            eraseProgress();
            continue;
        }
        const auto elapsed = worked_ + (std::chrono::steady_clock::now() - since_);
        if (elapsed < quietTime)
            continue;
        const auto seconds = std::chrono::duration_cast<std::chrono::seconds>(elapsed).count();
        shown_ = true;
        writeAll(STDERR_FILENO, "\r\033[Kvtsym: line " + std::to_string(line_) + ", " + std::to_string(seconds) + " s");
    }
}

void Console::eraseProgress() {
    if (shown_)
        writeAll(STDERR_FILENO, "\r\033[K");
    shown_ = false;
}

} // namespace vtsym
