// Starts git without a shell, so that no name of a file or a state is anything else than an argument.
#include "tools/vtsym/findings/source/GitProcess.hpp"

#include "tools/vtsym/findings/source/GitRepository.hpp"

#include <array>
#include <cerrno>
#include <fcntl.h>
#include <spawn.h>
#include <sys/wait.h>
#include <system_error>
#include <unistd.h>
#include <utility>

namespace vtsym {

namespace {

[[noreturn]] void fail(int error) {
    throw GitError("git cannot be run: " + std::generic_category().message(error));
}

/// Both ends of a pipe, which are closed unless they are taken.
class Pipe {
public:
    Pipe() {
        if (pipe2(ends_.data(), O_CLOEXEC) != 0)
            fail(errno);
    }

    Pipe(const Pipe&) = delete;
    Pipe& operator=(const Pipe&) = delete;

    ~Pipe() {
        for (const int end : ends_)
            if (end >= 0)
                close(end);
    }

    [[nodiscard]] int readEnd() const { return ends_[0]; }

    [[nodiscard]] int writeEnd() const { return ends_[1]; }

    std::FILE* take(std::size_t end, const char* mode) {
        std::FILE* const stream = fdopen(ends_.at(end), mode);
        if (stream == nullptr)
            fail(errno);
        ends_.at(end) = -1;
        return stream;
    }

private:
    std::array<int, 2> ends_{-1, -1};
};

} // namespace

GitProcess::GitProcess(const std::vector<std::string>& arguments) {
    Pipe in;
    Pipe out;
    std::vector<std::string> words{"git", "--no-optional-locks"};
    words.insert(words.end(), arguments.begin(), arguments.end());
    std::vector<char*> pointers;
    pointers.reserve(words.size() + 1);
    for (std::string& word : words)
        pointers.push_back(word.data());
    pointers.push_back(nullptr);
    posix_spawn_file_actions_t actions;
    if (const int error = posix_spawn_file_actions_init(&actions))
        fail(error);
    posix_spawn_file_actions_adddup2(&actions, in.readEnd(), STDIN_FILENO);
    posix_spawn_file_actions_adddup2(&actions, out.writeEnd(), STDOUT_FILENO);
    const int error = posix_spawnp(&process_, "git", &actions, nullptr, pointers.data(), environ);
    posix_spawn_file_actions_destroy(&actions);
    if (error != 0)
        fail(error);
    input_ = in.take(1, "w");
    output_ = out.take(0, "r");
}

GitProcess::~GitProcess() {
    wait();
}

/// Closes both pipes and waits for the end; the status.
int GitProcess::wait() {
    for (std::FILE** const stream : {&input_, &output_})
        if (std::FILE* const open = std::exchange(*stream, nullptr))
            static_cast<void>(std::fclose(open));
    int status = 0;
    if (const pid_t process = std::exchange(process_, -1); process > 0)
        while (waitpid(process, &status, 0) < 0 && errno == EINTR) {
        }
    return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
}

void GitProcess::ask(std::string_view line) {
    const bool isWritten = std::fwrite(line.data(), 1, line.size(), input_) == line.size() &&
                           std::fputc('\n', input_) != EOF && std::fflush(input_) == 0;
    if (!isWritten)
        throw GitError("git ended before its time");
}

std::string GitProcess::readLine() {
    std::string line;
    int c = 0;
    while ((c = std::fgetc(output_)) != EOF && c != '\n')
        line.push_back(static_cast<char>(c));
    if (c == EOF)
        throw GitError("git ended before its time");
    return line;
}

std::string GitProcess::read(std::size_t size) {
    std::string text(size, '\0');
    if (std::fread(text.data(), 1, size, output_) != size)
        throw GitError("git ended before its time");
    return text;
}

std::string GitProcess::readAll() {
    static_cast<void>(std::fclose(std::exchange(input_, nullptr)));
    std::string text;
    std::array<char, 65536> part{};
    while (const std::size_t got = std::fread(part.data(), 1, part.size(), output_))
        text.append(part.data(), got);
    if (wait() != 0)
        throw GitError("git failed");
    return text;
}

} // namespace vtsym
