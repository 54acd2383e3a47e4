#include "tests/tools/Program.hpp"

#include "tests/support/Workplace.hpp"

#include <array>
#include <pty.h>
#include <unistd.h>

namespace VT::Testing {

namespace {

std::string quoted(const std::string& text) {
    std::string result = "'";
    for (const char c : text)
        result += c == '\'' ? "'\\''" : std::string(1, c);
    return result + "'";
}

/// The program with its arguments in an environment of little else.
std::string commandOf(const ProgramInput& input) {
    std::string command = "env -i";
    for (const std::string name : {"PATH", "ASAN_OPTIONS", "UBSAN_OPTIONS"})
        if (const char* const value = std::getenv(name.c_str()))
            command += " " + quoted(name + "=" + value);
    for (const std::string& setting : input.environment)
        command += " " + quoted(setting);
    command += " " + quoted(VTSYM_PROGRAM);
    for (const std::string& argument : input.arguments)
        command += " " + quoted(argument);
    return command;
}

} // namespace

ProgramResult runProgram(const ProgramInput& input) {
    const Workplace place;
    place.write("in", input.input);
    const std::string command = commandOf(input) + " <in 2>words";
    ProgramResult result;
    if (input.output != OutputTo::ClosedPipe) {
        result.status = place.run(command + (input.output == OutputTo::Result ? " >out" : " >/dev/full"));
    } else { // the reader is gone before the program starts
        place.run("{ sleep 0.2; " + command + "; echo $? >status; } | :");
        result.status = std::stoi(place.read("status"));
    }
    result.output = place.read("out");
    result.words = place.read("words");
    return result;
}

ProgramResult runOnTerminal(const ProgramInput& input) {
    const std::string command = "exec " + commandOf(input);
    int terminal = -1;
    const pid_t child = forkpty(&terminal, nullptr, nullptr, nullptr);
    if (child == 0) {
        execl("/bin/sh", "sh", "-c", command.c_str(), nullptr);
        _exit(127);
    }
    if (write(terminal, input.input.data(), input.input.size()) != static_cast<ssize_t>(input.input.size()))
        throw std::runtime_error("the terminal takes no input");
    ProgramResult result;
    std::array<char, 4096> part{};
    for (ssize_t got = 0; (got = read(terminal, part.data(), part.size())) > 0;) // until the program closes it
        result.output.append(part.data(), static_cast<std::size_t>(got));
    int status = 0;
    waitpid(child, &status, 0);
    result.status = WIFEXITED(status) ? WEXITSTATUS(status) : -1;
    close(terminal);
    return result;
}

} // namespace VT::Testing
