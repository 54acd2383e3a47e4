// Reading and writing whole files, within a bound, and with errors that say what to do.
// A path may name a device or a pipe; nothing is read beyond the bound.
#pragma once

#include <cstddef>
#include <stdexcept>
#include <string>
#include <string_view>

namespace vtsym {

class Command;

/// Bytes of a file, unless --max-size says otherwise, and of a line of standard input.  Sources and models that people
/// write stay far below it; a larger file is rejected, a longer line is an error of that line.
inline constexpr std::size_t mostBytes = std::size_t{64} << 20U;

/// A file cannot be read or written.  what() continues after its name: "cannot be read: Permission denied".
class FileError : public std::runtime_error {
public:
    using std::runtime_error::runtime_error;
};

/// Reads a file, a device or a pipe.  Throws FileError for a folder, for more bytes than `bound`, for a NUL among the
/// first bytes, and where the system refuses.  Waits for the other end of a pipe.
std::string readFile(const std::string& path, std::size_t bound);

/// Reads any file of that many bytes at most.  Throws FileError as above.
std::string readBytes(const std::string& path, std::size_t bound);

/// Replaces the content of a file.  The text is written beside the file, which is then replaced by renaming; in place
/// where that cannot be: for a device, a pipe, a file with several names, a folder that takes no further file.  Throws
/// FileError, after which the file is as it was, or empty where it was written in place.
void writeFile(const std::string& path, std::string_view text);

/// Whether two paths lead to the same regular file, directly or through links.
bool isSameFile(const std::string& a, const std::string& b);

/// Bytes in words: "64 MiB".
std::string sizeText(std::size_t bytes);

/// Adds --max-size to a command.
void addSizeOption(Command& command, std::size_t& bound);

/// Opens the standard streams that the caller of the program closed, so that no other file receives their numbers.
/// Reading from them and writing to them fails as before.
void holdStandardStreams();

} // namespace vtsym
