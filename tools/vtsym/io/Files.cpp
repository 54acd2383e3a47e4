// Reads the first bytes of a file before anything else: a NUL there shows that it is not a text, so that an endless or
// huge binary file costs one read.  Then reads one byte more than the file claims to have, which shows that it ended,
// and grows the text by doubling where the size is not known.  System calls that a signal interrupted are repeated.
#include "tools/vtsym/io/Files.hpp"

#include "tools/vtsym/io/CommandLine.hpp"

#include <algorithm>
#include <array>
#include <cerrno>
#include <charconv>
#include <cstdio>
#include <cstdlib>
#include <fcntl.h>
#include <limits>
#include <memory>
#include <new>
#include <sys/stat.h>
#include <system_error>
#include <unistd.h>
#include <utility>

namespace vtsym {

namespace {

/// Bytes at the beginning of a file that are searched for a NUL.
constexpr std::size_t firstBytes = 8192;

struct Unit {
    unsigned shift;
    char letter;
    const char* name;
};

constexpr std::array<Unit, 4> units{{{30, 'G', " GiB"}, {20, 'M', " MiB"}, {10, 'K', " KiB"}, {0, '\0', " bytes"}}};

class Descriptor {
public:
    Descriptor(const std::string& path, int flags) : value_(open(path.c_str(), flags | O_CLOEXEC | O_NOCTTY, 0666)) {}

    Descriptor(const Descriptor&) = delete;
    Descriptor& operator=(const Descriptor&) = delete;

    ~Descriptor() {
        if (value_ >= 0)
            ::close(value_);
    }

    [[nodiscard]] int get() const noexcept { return value_; }

    /// Whether everything written has arrived, as far as the system knows.
    bool close() { return ::close(std::exchange(value_, -1)) == 0; }

private:
    int value_;
};

[[noreturn]] void fail(const char* what) {
    throw FileError(what + std::generic_category().message(errno));
}

[[noreturn]] void failToRead() {
    fail("cannot be read: ");
}

[[noreturn]] void failToWrite() {
    fail("cannot be written: ");
}

/// Appends bytes until the text has `size` of them.  Returns false at the end of the file.
bool readUpTo(const Descriptor& file, std::size_t size, std::string& text) {
    std::size_t at = text.size();
    text.resize(size);
    while (at < size) {
        const ssize_t got = read(file.get(), text.data() + at, size - at);
        if (got < 0 && errno != EINTR)
            failToRead();
        if (got == 0) {
            text.resize(at);
            return false;
        }
        at += static_cast<std::size_t>(std::max<ssize_t>(got, 0));
    }
    return true;
}

std::string readAll(const Descriptor& file, std::size_t bound, bool isText) {
    struct stat state {};

    if (file.get() < 0 || fstat(file.get(), &state) != 0)
        failToRead();
    if (S_ISDIR(state.st_mode))
        throw FileError("is a folder: name a file in it");
    const bool isRegular = S_ISREG(state.st_mode);
    const auto refuseSize = [bound] {
        throw FileError("is larger than " + sizeText(bound) + ": --max-size allows more");
    };
    std::string text;
    bool goesOn = readUpTo(file, std::min(firstBytes, bound + 1), text);
    if (isText && text.find('\0') != std::string::npos)
        throw FileError("is not a text: there is a NUL in it");
    const std::size_t size = isRegular ? static_cast<std::size_t>(state.st_size) : 0;
    if (size > bound || text.size() > bound)
        refuseSize();
    while (goesOn) { // asking for one more byte shows the end
        goesOn = readUpTo(file, std::min(size >= text.size() ? size + 1 : 2 * text.size(), bound + 1), text);
        if (text.size() > bound)
            refuseSize();
    }
    return text;
}

void writeText(const Descriptor& file, std::string_view text) {
    while (!text.empty()) {
        const ssize_t written = write(file.get(), text.data(), text.size());
        if (written < 0 && errno != EINTR)
            failToWrite();
        text.remove_prefix(static_cast<std::size_t>(std::max<ssize_t>(written, 0)));
    }
}

/// Where writing fails, the file is left empty, so that nobody takes a part of the text for all of it.
void writeInPlace(const std::string& path, std::string_view text) {
    Descriptor file(path, O_WRONLY | O_CREAT | O_TRUNC);
    if (file.get() < 0)
        failToWrite();
    try {
        writeText(file, text);
    } catch (const FileError&) {
        static_cast<void>(ftruncate(file.get(), 0) == 0);
        throw;
    }
    if (!file.close())
        failToWrite();
}

/// Writes a file beside the one that it then replaces, with the mode and the owner of that one.  Returns false, and
/// changes nothing, where the folder refuses further files or the owner cannot be kept.
bool replaceFile(const std::string& path, std::string_view text, const struct stat* old) {
    // Links stay, the file that they lead to is replaced.
    const std::unique_ptr<char, decltype(&std::free)> real(old != nullptr ? realpath(path.c_str(), nullptr) : nullptr,
                                                           &std::free);
    const std::string target = real != nullptr ? real.get() : path;
    const std::string beside = target + "." + std::to_string(getpid()) + ".part";
    Descriptor file(beside, O_WRONLY | O_CREAT | O_EXCL);
    if (file.get() < 0) {
        if (errno == EACCES || errno == EPERM || errno == EROFS || errno == ENAMETOOLONG || errno == EEXIST)
            return false;
        failToWrite();
    }
    const auto giveUp = [&] {
        const int reason = errno;
        static_cast<void>(unlink(beside.c_str()));
        errno = reason;
    };

    struct stat made {};

    if (old != nullptr && (fstat(file.get(), &made) != 0 ||
                           ((made.st_uid != old->st_uid || made.st_gid != old->st_gid) &&
                            fchown(file.get(), old->st_uid, old->st_gid) != 0) ||
                           fchmod(file.get(), old->st_mode & 07777U) != 0)) {
        giveUp();
        return false;
    }
    try {
        writeText(file, text);
    } catch (const FileError&) {
        giveUp();
        throw;
    }
    if (!file.close() || rename(beside.c_str(), target.c_str()) != 0) {
        giveUp();
        failToWrite();
    }
    return true;
}

/// Reads a number of bytes, with a unit or without.  Returns 0 for anything else.
std::size_t bytesOf(std::string_view text) {
    std::size_t number = 0;
    const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
    const std::string_view rest(end, static_cast<std::size_t>(text.data() + text.size() - end));
    if (error != std::errc() || rest.size() > 1)
        return 0;
    const char letter = rest.empty() ? '\0' : rest.front();
    const auto* const unit = std::ranges::find(units, letter, &Unit::letter);
    const bool fits = unit != units.end() && number <= (std::numeric_limits<std::size_t>::max() >> 1U >> unit->shift);
    return fits ? number << unit->shift : 0;
}

} // namespace

namespace {

std::string readWhole(const std::string& path, std::size_t bound, bool isText) {
    try {
        return readAll(Descriptor(path, O_RDONLY), bound, isText);
    } catch (const std::bad_alloc&) {
        throw FileError("cannot be read: there is not enough memory for it");
    } catch (const std::length_error&) {
        throw FileError("cannot be read: there is not enough memory for it");
    }
}

} // namespace

std::string readFile(const std::string& path, std::size_t bound) {
    return readWhole(path, bound, true);
}

std::string readBytes(const std::string& path, std::size_t bound) {
    return readWhole(path, bound, false);
}

void writeFile(const std::string& path, std::string_view text) {
    // Opened first without a change, so that a file that must not be written stays.
    const Descriptor old(path, O_WRONLY);
    if (old.get() < 0 && errno != ENOENT)
        failToWrite();

    struct stat state {};

    const bool isThere = old.get() >= 0;
    if (isThere && fstat(old.get(), &state) != 0)
        failToWrite();
    // Further names of a file, links to what is not there yet, devices and pipes would not survive a renaming.
    const bool canReplace = isThere ? S_ISREG(state.st_mode) && state.st_nlink == 1 : lstat(path.c_str(), &state) != 0;
    if (!canReplace || !replaceFile(path, text, isThere ? &state : nullptr))
        writeInPlace(path, text);
}

bool isSameFile(const std::string& a, const std::string& b) {
    struct stat first {};

    struct stat second {};

    return stat(a.c_str(), &first) == 0 && stat(b.c_str(), &second) == 0 && S_ISREG(first.st_mode) &&
           first.st_dev == second.st_dev && first.st_ino == second.st_ino;
}

std::string sizeText(std::size_t bytes) {
    const auto* const unit = std::ranges::find_if(units, [bytes](const Unit& each) {
        return bytes >> each.shift != 0 && bytes >> each.shift << each.shift == bytes;
    });
    return unit == units.end() ? "0 bytes" : std::to_string(bytes >> unit->shift) + unit->name;
}

void addSizeOption(Command& command, std::size_t& bound) {
    const auto take = [&bound](const std::string& size) {
        bound = bytesOf(size);
        if (bound == 0) {
            throw UsageError("--max-size",
                             quotedArgument(size) +
                                 " is not a size; write a number of bytes, with K, M or G after it for larger units");
        }
    };
    command.addArgument(
        {"--max-size", "Reject files that are larger (" + sizeText(mostBytes) + " unless given)", "SIZE"}, take);
}

void holdStandardStreams() {
    // open() takes the lowest free number.  The direction is wrong on purpose: using the stream fails.
    for (int stream = STDIN_FILENO; stream <= STDERR_FILENO; ++stream)
        if (fcntl(stream, F_GETFD) == -1)
            static_cast<void>(open("/dev/null", stream == STDIN_FILENO ? O_WRONLY : O_RDONLY));
}

} // namespace vtsym
