// Files that the program reads and writes.
#pragma once

#include <CLI/CLI.hpp>

#include <cstddef>
#include <stdexcept>
#include <string>
#include <string_view>

namespace vtsym {

/// Bytes of a file, unless --max-size says otherwise, and of a line of standard input.  Sources and models that people
/// write stay far below; what is larger is data, of which nothing more is read.
inline constexpr std::size_t mostBytes = std::size_t{64} << 20U;

/// A file cannot be read or written.  what() goes on after its name: "cannot be read: Permission denied".
class FileError : public std::runtime_error {
public:
    using std::runtime_error::runtime_error;
};

/// The text in a file, a device or a pipe.  Throws FileError where there is none: for a folder, for more bytes than
/// `bound`, and for a NUL among the first bytes.  Reads no more than it takes to know, and waits for the other end of a
/// pipe.
std::string readFile(const std::string& path, std::size_t bound);

/// Makes a text what is in a file.  Throws FileError; the file may hold a part of the text then.
void writeFile(const std::string& path, std::string_view text);

/// Whether two paths lead to one regular file, through links too.
bool isSameFile(const std::string& a, const std::string& b);

/// Bytes in words: "64 MiB".
std::string sizeText(std::size_t bytes);

/// Gives a command --max-size.
void addSizeOption(CLI::App& command, std::size_t& bound);

/// Opens standard streams that the caller of the program closed, so that no file gets the number of one.  They refuse
/// reading and writing as before.
void holdStandardStreams();

} // namespace vtsym
