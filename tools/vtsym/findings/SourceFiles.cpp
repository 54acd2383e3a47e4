// Searches directories with a stack of its own, so that their nesting does not matter, and never follows links below a
// given path, so that a circle of links ends.  A directory that cannot be read is reported, and the search continues.
#include "tools/vtsym/findings/SourceFiles.hpp"

#include <algorithm>
#include <array>
#include <filesystem>
#include <fnmatch.h>
#include <system_error>

namespace vtsym {

namespace fs = std::filesystem;

namespace {

constexpr auto cppExtensions =
    std::to_array<std::string_view>({".C",   ".H",  ".c++", ".cc",  ".cp",  ".cpp", ".cppm", ".cu",  ".cuh", ".cxx",
                                     ".h++", ".hh", ".hpp", ".hxx", ".inl", ".ipp", ".ixx",  ".tcc", ".tpp", ".txx"});
constexpr auto otherExtensions = std::to_array<std::string_view>({".c", ".h"});

/// A path without redundant parts.  A path with `..` stays as it is, since the part before may be a link.
std::string tidied(const fs::path& path) {
    return std::ranges::find(path, fs::path("..")) == path.end() ? path.lexically_normal().string() : path.string();
}

/// Adds the files below a directory.
void addBelow(const fs::path& directory, std::vector<std::string>& files, const FileProblem& problem) {
    std::error_code error;
    std::vector<fs::path> open{directory};
    while (!open.empty()) {
        const fs::path next = std::move(open.back());
        open.pop_back();
        fs::directory_iterator entries(next, error);
        while (!error && entries != fs::directory_iterator()) {
            std::error_code unknown;
            const fs::file_status status = entries->symlink_status(unknown);
            if (status.type() == fs::file_type::none)
                problem(entries->path().string(), "cannot be read: " + unknown.message());
            else if (fs::is_directory(status))
                open.push_back(entries->path());
            else if (fs::is_regular_file(status) && isSourcePath(entries->path().native()))
                files.push_back(tidied(entries->path()));
            entries.increment(error);
        }
        if (error)
            problem(next.string(), "cannot be read: " + error.message());
        error.clear();
    }
}

} // namespace

bool isCppPath(std::string_view path) {
    const std::string extension = fs::path(path).extension().string();
    return std::ranges::find(cppExtensions, extension) != cppExtensions.end();
}

bool isSourcePath(std::string_view path) {
    const std::string extension = fs::path(path).extension().string();
    return isCppPath(path) || std::ranges::find(otherExtensions, extension) != otherExtensions.end();
}

bool isExcluded(const std::string& path, const std::vector<std::string>& patterns) {
    for (std::size_t end = path.size(); end != std::string::npos && end != 0; end = path.rfind('/', end - 1)) {
        const std::string part = path.substr(0, end);
        if (std::ranges::any_of(
                patterns, [&](const std::string& pattern) { return fnmatch(pattern.c_str(), part.c_str(), 0) == 0; }))
            return true;
    }
    return false;
}

std::vector<std::string> sourceFiles(const std::vector<std::string>& paths, const FileProblem& problem) {
    std::vector<std::string> files;
    for (const std::string& path : paths) {
        std::error_code error;
        if (fs::is_directory(path, error))
            addBelow(path, files, problem);
        else
            files.push_back(tidied(path));
    }
    std::ranges::sort(files);
    files.erase(std::unique(files.begin(), files.end()), files.end());
    return files;
}

} // namespace vtsym
