#include "tests/tools/Program.hpp"

#include <array>
#include <gtest/gtest.h>
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

std::string commandOf(const std::string& program, const Strings& arguments) {
    std::string command = program;
    for (const std::string& argument : arguments)
        command += " " + quoted(argument);
    return command;
}

std::string inEnvironment(Strings settings, const std::string& command) {
    for (const std::string name : {"PATH", "ASAN_OPTIONS", "UBSAN_OPTIONS"})
        if (const char* const value = std::getenv(name.c_str()))
            settings.push_back(name + "=" + value);
    return commandOf("env -i", settings) + " " + command;
}

} // namespace

ProgramResult runScript(const Workplace& place, const std::string& script, const std::string& input,
                        const Strings& environment) {
    place.write("in", input);
    place.write("script", "vtsym() { '" VTSYM_PROGRAM "' \"$@\"; }\n" + script);
    const int status = place.run(inEnvironment(environment, "sh ./script <in >out 2>words"));
    return {place.read("out"), place.read("words"), status};
}

ProgramResult runProgram(const Strings& arguments, const std::string& input, const Strings& environment) {
    return runScript(Workplace(), commandOf("vtsym", arguments), input, environment);
}

ProgramResult runOnTerminal(const Strings& arguments, const std::string& input, const Strings& environment) {
    const std::string command = "exec " + inEnvironment(environment, commandOf(VTSYM_PROGRAM, arguments));
    int terminal = -1;
    const pid_t child = forkpty(&terminal, nullptr, nullptr, nullptr);
    if (child == 0) {
        execl("/bin/sh", "sh", "-c", command.c_str(), nullptr);
        _exit(127);
    }
    if (write(terminal, input.data(), input.size()) != static_cast<ssize_t>(input.size()))
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

void expectRows(const std::vector<Row>& rows, const std::map<std::string, std::string>& files) {
    for (const Row& row : rows) {
        SCOPED_TRACE(row.script);
        const Workplace place;
        for (const auto& [name, content] : files)
            place.write(name, content);
        const std::size_t line = std::min(row.script.find('\n'), row.script.size());
        const ProgramResult result =
            runScript(place, row.script.substr(0, line), row.script.substr(std::min(line + 1, row.script.size())));
        EXPECT_EQ(result.output, row.output);
        EXPECT_EQ(result.status, row.status);
        EXPECT_EQ(result.words.empty(), row.words.empty()) << result.words;
        std::size_t at = 0;
        for (std::size_t from = 0, end = 0; end < row.words.size(); from = end + 3) {
            end = std::min(row.words.find("...", from), row.words.size());
            end += row.words.substr(end).starts_with("....") ? 1 : 0; // behind a full stop
            at = result.words.find(row.words.substr(from, end - from), at);
            EXPECT_NE(at, std::string::npos) << result.words;
        }
    }
}

std::vector<std::string> linesOf(const std::string& text) {
    std::vector<std::string> lines;
    std::istringstream stream(text);
    for (std::string line; std::getline(stream, line);)
        lines.push_back(line);
    return lines;
}

} // namespace VT::Testing
