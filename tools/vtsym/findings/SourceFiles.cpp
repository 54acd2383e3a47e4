// Searches directories with a stack of its own, so that their nesting does not matter, and never follows links below a
// given path, so that a circle of links ends.  A directory that cannot be read is reported, and the search continues.
#include "tools/vtsym/findings/SourceFiles.hpp"

#include <algorithm>
#include <array>
#include <cerrno>
#include <dirent.h>
#include <filesystem>
#include <fnmatch.h>
#include <memory>
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

/// The extension of a path's last part, with its dot; empty for none.
std::string_view extensionOf(std::string_view path) {
    const std::string_view name = path.substr(path.rfind('/') + 1); // of the whole path where there is no slash
    const std::size_t dot = name.rfind('.');
    return dot == std::string_view::npos || dot == 0 || name == ".." ? std::string_view() : name.substr(dot);
}

/// A directory to be read: its path, and what the paths of its files begin with.
struct OpenDirectory {
    std::string path;
    std::string prefix;
};

/// What a path begins with below a directory.
std::string prefixBelow(const std::string& directory) {
    std::string prefix = tidied(directory);
    if (prefix == "." || prefix == "./")
        return "";
    if (!prefix.ends_with('/'))
        prefix.push_back('/');
    return prefix;
}

/// The kind of an entry, without following links.  The system mostly knows it from the directory.
fs::file_type entryKindOf(const dirent& entry, const std::string& path, std::error_code& error) {
    switch (entry.d_type) {
    case DT_REG:
        return fs::file_type::regular;
    case DT_DIR:
        return fs::file_type::directory;
    case DT_UNKNOWN:
        return fs::symlink_status(path, error).type();
    default:
        return fs::file_type::unknown;
    }
}

/// Adds the files below a directory.
void addBelow(const std::string& directory, std::vector<std::string>& files, const FileProblem& problem) {
    const auto refuse = [&](const std::string& path, int error) {
        problem(path, "cannot be read: " + std::generic_category().message(error));
    };
    std::vector<OpenDirectory> open{{directory, prefixBelow(directory)}};
    while (!open.empty()) {
        const OpenDirectory next = std::move(open.back());
        open.pop_back();
        const std::unique_ptr<DIR, int (*)(DIR*)> entries(opendir(next.path.c_str()), closedir);
        if (!entries) {
            refuse(next.path, errno);
            continue;
        }
        for (;;) {
            errno = 0;
            const dirent* const entry = readdir(entries.get()); // NOLINT(concurrency-mt-unsafe): of its own stream
            if (entry == nullptr)
                break;
            const std::string_view name = entry->d_name;
            if (name == "." || name == "..")
                continue;
            std::string path = next.path;
            path.append(path.ends_with('/') ? "" : "/").append(name);
            std::error_code error;
            const fs::file_type kind = entryKindOf(*entry, path, error);
            if (kind == fs::file_type::none)
                refuse(path, error.value());
            else if (kind == fs::file_type::directory)
                open.push_back({std::move(path), next.prefix + std::string(name) + "/"});
            else if (kind == fs::file_type::regular && isSourcePath(name))
                files.push_back(next.prefix + std::string(name));
        }
        if (errno != 0)
            refuse(next.path, errno);
    }
}

} // namespace

bool isCppPath(std::string_view path) {
    return std::ranges::find(cppExtensions, extensionOf(path)) != cppExtensions.end();
}

bool isSourcePath(std::string_view path) {
    return isCppPath(path) || std::ranges::find(otherExtensions, extensionOf(path)) != otherExtensions.end();
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
