#include "tools/vtsym/SourceFiles.hpp"

#include <algorithm>
#include <array>
#include <cerrno>
#include <cstdio>
#include <filesystem>
#include <memory>
#include <new>
#include <system_error>

namespace vtsym {

namespace fs = std::filesystem;

namespace {

constexpr auto cppExtensions =
    std::to_array<std::string_view>({".C",   ".H",  ".c++", ".cc",  ".cp",  ".cpp", ".cppm", ".cu",  ".cuh", ".cxx",
                                     ".h++", ".hh", ".hpp", ".hxx", ".inl", ".ipp", ".ixx",  ".tcc", ".tpp", ".txx"});
constexpr auto otherExtensions = std::to_array<std::string_view>({".c", ".h"});

/// Bytes at the beginning of a file in which a text has no NUL.
constexpr std::size_t firstBytes = 8192;

bool isSource(const fs::path& path) {
    const std::string extension = path.extension().string();
    return isCppPath(path.native()) || std::ranges::find(otherExtensions, extension) != otherExtensions.end();
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
            if (fs::is_directory(status))
                open.push_back(entries->path());
            else if (fs::is_regular_file(status) && isSource(entries->path()))
                files.push_back(entries->path().lexically_normal().string());
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

std::vector<std::string> sourceFiles(const std::vector<std::string>& paths, const FileProblem& problem) {
    std::vector<std::string> files;
    for (const std::string& path : paths) {
        std::error_code error;
        if (fs::is_directory(path, error))
            addBelow(path, files, problem);
        else
            files.push_back(fs::path(path).lexically_normal().string());
    }
    std::ranges::sort(files);
    const auto repeated = std::ranges::unique(files);
    files.erase(repeated.begin(), repeated.end());
    return files;
}

std::optional<std::string> readSource(const std::string& path, const FileProblem& problem) {
    const auto fail = [&](const std::string& sentence) -> std::optional<std::string> {
        problem(path, sentence);
        return std::nullopt;
    };
    const auto reason = [] { return "cannot be read: " + std::generic_category().message(errno); };
    try {
        const auto close = [](std::FILE* file) { std::fclose(file); };
        const std::unique_ptr<std::FILE, decltype(close)> file(std::fopen(path.c_str(), "rb"), close);
        if (file == nullptr)
            return fail(reason());
        std::string text;
        for (std::size_t size = std::size_t{1} << 16U;; size = text.size()) { // doubles
            const std::size_t before = text.size();
            text.resize(before + size);
            const std::size_t read = std::fread(text.data() + before, 1, size, file.get());
            text.resize(before + read);
            if (read < size)
                break;
        }
        if (std::ferror(file.get()) != 0)
            return fail(reason());
        if (std::string_view(text).substr(0, firstBytes).find('\0') != std::string_view::npos)
            return fail("is no text");
        return text;
    } catch (const std::bad_alloc&) {
        return fail("cannot be read: it is too large for the memory");
    } catch (const std::length_error&) {
        return fail("cannot be read: it is too large for the memory");
    }
}

} // namespace vtsym
