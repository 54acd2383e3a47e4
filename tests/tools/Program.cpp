#include "tests/tools/Program.hpp"

#include <array>
#include <boost/algorithm/string.hpp>
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
    for (const std::string name : {"PATH", "ASAN_OPTIONS", "UBSAN_OPTIONS", "TSAN_OPTIONS"})
        if (const char* const value = std::getenv(name.c_str()))
            settings.push_back(name + "=" + value);
    return commandOf("env -i", settings) + " " + command;
}

/// Whether a text matches the pattern, in which … matches anything.
bool isLike(const std::string& text, const std::string& pattern) {
    std::vector<std::string> parts;
    boost::algorithm::iter_split(parts, pattern, boost::algorithm::first_finder("\u2026"));
    std::size_t end = 0;
    for (const std::string& part : parts) {
        const std::size_t found = text.find(part, end);
        if (found == std::string::npos)
            return false;
        end = found + part.size();
    }
    return text.starts_with(parts.front()) && text.ends_with(parts.back()) && (parts.size() > 1 || text == pattern);
}

} // namespace

ProgramResult runScript(const TemporaryFolder& place, const std::string& script, const std::string& input,
                        const Strings& environment) {
    place.write("in", input);
    place.write("script", "vtsym() { '" VTSYM_PROGRAM "' \"$@\"; }\n" + script);
    const int status = place.run(inEnvironment(environment, "sh ./script <in >out 2>words"));
    return {place.read("out"), place.read("words"), status};
}

ProgramResult runProgram(const Strings& arguments, const std::string& input, const Strings& environment) {
    return runScript(TemporaryFolder(), commandOf("vtsym", arguments), input, environment);
}

ProgramResult runOnTerminal(const Strings& arguments, const std::string& input, const Strings& environment) {
    return runOnTerminal(TemporaryFolder(), commandOf(VTSYM_PROGRAM, arguments), input, environment);
}

ProgramResult runOnTerminal(const TemporaryFolder& place, const std::string& program, const std::string& input,
                            const Strings& environment) {
    const std::string command = "cd '" + place.path("") + "' && exec " + inEnvironment(environment, program);
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
        result.out.append(part.data(), static_cast<std::size_t>(got));
    int status = 0;
    waitpid(child, &status, 0);
    result.status = WIFEXITED(status) ? WEXITSTATUS(status) : -1;
    close(terminal);
    return result;
}

void expectTranscript(const std::string& file, const std::map<std::string, std::string>& files) {
    struct Command {
        std::string script;
        std::string input = {};
        ProgramResult expected = {{}, {}, 0};
    };

    std::vector<Command> commands;
    std::ifstream stream(VTSYM_TEST_DATA "/cases/" + file);
    for (std::string line; std::getline(stream, line);) {
        if (line.empty() || line.starts_with('#'))
            continue;
        const std::string text = line.substr(std::min<std::size_t>(line.size(), 2));
        if (line.starts_with('$')) {
            commands.push_back({text});
            continue;
        }
        Command& command = commands.at(commands.size() - 1);
        if (line.starts_with('<'))
            command.input += text + "\n";
        else if (line.starts_with('!'))
            command.expected.err += text + "\n";
        else if (line.starts_with('='))
            command.expected.status = std::stoi(text);
        else
            command.expected.out += line.substr(line.starts_with('\\') ? 1 : 0) + "\n";
    }
    EXPECT_FALSE(commands.empty()) << file;
    for (const auto& [script, input, expected] : commands) {
        SCOPED_TRACE(file + ": " + script + "\n" + input);
        const TemporaryFolder place;
        for (const auto& [name, content] : files)
            place.write(name, content);
        const ProgramResult result = runScript(place, script, input);
        EXPECT_EQ(result.out, expected.out);
        EXPECT_EQ(result.status, expected.status);
        EXPECT_TRUE(isLike(result.err, expected.err)) << result.err << "is not\n" << expected.err;
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
