// Runs the git program.
#pragma once

#include <cstddef>
#include <cstdio>
#include <string>
#include <string_view>
#include <sys/types.h>
#include <vector>

namespace vtsym {

/// A running git program, whose input and output are pipes.  Its messages go to standard error.
class GitProcess {
public:
    /// Starts `git ARGUMENTS...`.  Throws GitError where it does not start.
    explicit GitProcess(const std::vector<std::string>& arguments);
    GitProcess(const GitProcess&) = delete;
    GitProcess& operator=(const GitProcess&) = delete;
    ~GitProcess();

    /// Writes a line to its input.  Throws GitError.
    void ask(std::string_view line);
    /// Reads up to a line end, which is left out.  Throws GitError at the end of its output.
    std::string readLine();
    /// Reads so many bytes.  Throws GitError where there are fewer.
    std::string read(std::size_t size);
    /// Closes its input and reads what it writes until its end; throws GitError unless it succeeded.
    std::string readAll();

private:
    int wait();

    pid_t process_ = -1;
    std::FILE* input_ = nullptr;
    std::FILE* output_ = nullptr;
};

} // namespace vtsym
