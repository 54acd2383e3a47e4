// A place for other programs to work in.
#pragma once

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <sstream>
#include <stdexcept>
#include <string>
#include <sys/wait.h>

namespace VT::Testing {

/// A directory that lives as long as this.
class TemporaryFolder {
public:
    TemporaryFolder() {
        std::string pattern = (std::filesystem::temp_directory_path() / "vtsym-XXXXXX").string();
        if (mkdtemp(pattern.data()) == nullptr)
            throw std::runtime_error("no directory for files");
        path_ = pattern;
    }

    TemporaryFolder(const TemporaryFolder&) = delete;
    TemporaryFolder& operator=(const TemporaryFolder&) = delete;

    ~TemporaryFolder() { std::filesystem::remove_all(path_); }

    /// A name in the directory.
    [[nodiscard]] std::string path(const std::string& name) const { return (path_ / name).string(); }

    /// Writes a file and makes the folders that it is in; its path.
    std::string write(const std::string& name, const std::string& content) const {
        std::filesystem::create_directories((path_ / name).parent_path());
        std::ofstream(path_ / name, std::ios::binary) << content;
        return path(name);
    }

    [[nodiscard]] std::string read(const std::string& name) const {
        std::ostringstream content;
        content << std::ifstream(path_ / name).rdbuf();
        return content.str();
    }

    /// The exit status of a shell's command there; -1 where a signal ended it.
    int run(const std::string& command) const {
        const int status = std::system(("cd '" + path_.string() + "' && " + command).c_str());
        return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
    }

private:
    std::filesystem::path path_;
};

} // namespace VT::Testing
