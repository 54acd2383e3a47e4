// Finds the C and C++ files that a scan reads, in a stable order.
// Recognises them by their extensions.
#pragma once

#include <functional>
#include <string>
#include <string_view>
#include <vector>

namespace vtsym {

/// Whether a path has an extension that only C++ uses; .h and .c are read as C.
bool isCppPath(std::string_view path);

/// Whether a path has an extension of C or C++.
bool isSourcePath(std::string_view path);

/// Whether a pattern, as a shell has them, leaves a path out, or a folder above it.
bool isExcluded(const std::string& path, const std::vector<std::string>& patterns);

/// Receives a path that could not be read, and the reason.
using FileProblem = std::function<void(const std::string& path, const std::string& sentence)>;

/// The files to read, each once, ordered by name: every path to a file, and the regular C and C++ files below every
/// path to a directory.  A symbolic link is followed where it is given, but not below a directory.
std::vector<std::string> sourceFiles(const std::vector<std::string>& paths, const FileProblem& problem);

} // namespace vtsym
