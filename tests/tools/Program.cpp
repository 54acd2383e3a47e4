#include "tests/tools/Program.hpp"

#include <array>
#include <cstdio>
#include <cstdlib>
#include <fcntl.h>
#include <memory>
#include <stdexcept>
#include <sys/wait.h>
#include <unistd.h>

namespace VT::Testing {

namespace {

struct CloseFile {
    void operator()(std::FILE* file) const { std::fclose(file); }
};

/// A file without a name.
using Scratch = std::unique_ptr<std::FILE, CloseFile>;

Scratch scratch(const std::string& content = {}) {
    Scratch file(std::tmpfile());
    if (file == nullptr || std::fwrite(content.data(), 1, content.size(), file.get()) != content.size())
        throw std::runtime_error("no scratch file");
    std::rewind(file.get());
    return file;
}

std::string readAll(int descriptor) {
    std::string content;
    std::array<char, 4096> part{};
    for (ssize_t got = 0; (got = read(descriptor, part.data(), part.size())) > 0;)
        content.append(part.data(), static_cast<std::size_t>(got));
    return content;
}

std::vector<char*> pointers(std::vector<std::string>& texts) {
    std::vector<char*> result;
    for (std::string& text : texts)
        result.push_back(text.data());
    result.push_back(nullptr);
    return result;
}

/// Starts the program on three descriptors.
pid_t start(const ProgramInput& input, int in, int out, int err) {
    std::vector<std::string> arguments{VTSYM_PROGRAM};
    arguments.insert(arguments.end(), input.arguments.begin(), input.arguments.end());
    std::vector<std::string> environment = input.environment;
    for (const char* name : {"PATH", "ASAN_OPTIONS", "UBSAN_OPTIONS"})
        if (const char* const value = std::getenv(name))
            environment.push_back(std::string(name) + "=" + value);
    std::vector<char*> argv = pointers(arguments);
    std::vector<char*> envp = pointers(environment);
    const pid_t child = fork();
    if (child != 0)
        return child;
    dup2(in, STDIN_FILENO);
    dup2(out, STDOUT_FILENO);
    dup2(err, STDERR_FILENO);
    execve(VTSYM_PROGRAM, argv.data(), envp.data());
    _exit(127);
}

int statusOf(pid_t child) {
    int status = 0;
    waitpid(child, &status, 0);
    return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
}

/// A descriptor that takes nothing.
int badOutput(OutputTo output) {
    if (output == OutputTo::FullDevice)
        return open("/dev/full", O_WRONLY | O_CLOEXEC);
    std::array<int, 2> ends{};
    if (pipe(ends.data()) != 0)
        throw std::runtime_error("no pipe");
    close(ends[0]);
    return ends[1];
}

} // namespace

ProgramResult runProgram(const ProgramInput& input) {
    const Scratch in = scratch(input.input);
    const Scratch out = scratch();
    const Scratch err = scratch();
    const int bad = input.output == OutputTo::Result ? -1 : badOutput(input.output);
    ProgramResult result;
    result.status = statusOf(start(input, fileno(in.get()), bad >= 0 ? bad : fileno(out.get()), fileno(err.get())));
    if (bad >= 0)
        close(bad);
    lseek(fileno(out.get()), 0, SEEK_SET);
    lseek(fileno(err.get()), 0, SEEK_SET);
    result.output = readAll(fileno(out.get()));
    result.words = readAll(fileno(err.get()));
    return result;
}

ProgramResult runOnTerminal(const ProgramInput& input) {
    const int terminal = posix_openpt(O_RDWR | O_NOCTTY | O_CLOEXEC);
    if (terminal < 0 || grantpt(terminal) != 0 || unlockpt(terminal) != 0)
        throw std::runtime_error("no pseudo terminal");
    const int screen = open(ptsname(terminal), O_RDWR | O_NOCTTY | O_CLOEXEC);
    const pid_t child = start(input, screen, screen, screen);
    const bool typed =
        write(terminal, input.input.data(), input.input.size()) == static_cast<ssize_t>(input.input.size());
    close(screen);
    ProgramResult result;
    result.output = readAll(terminal); // until the program closes it
    result.status = statusOf(child);
    close(terminal);
    if (!typed)
        throw std::runtime_error("the terminal takes no input");
    return result;
}

} // namespace VT::Testing
