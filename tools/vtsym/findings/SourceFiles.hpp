// The C and C++ files that a search is to read.
#pragma once

#include <functional>
#include <string>
#include <string_view>
#include <vector>

namespace vtsym {

/// Whether a path has the extension of a C++ file; headers of either language have not.
bool isCppPath(std::string_view path);

/// Tells that something could not be read, and why.
using FileProblem = std::function<void(const std::string& path, const std::string& sentence)>;

/// The files that paths stand for, each once, in the order of their names: a path to a file is that file, a path to a
/// directory all C and C++ files below that are regular files.  Symbolic links are followed where they are given, not
/// below a directory.
std::vector<std::string> sourceFiles(const std::vector<std::string>& paths, const FileProblem& problem);

} // namespace vtsym
