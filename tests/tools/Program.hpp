// Runs the program.
#pragma once

#include "tests/support/TemporaryFolder.hpp"

#include <map>
#include <string>
#include <vector>

namespace VT::Testing {

struct ProgramResult {
    std::string out;
    std::string err;
    int status = -1; ///< exit status; above 128 where a signal ended the program
};

using Strings = std::vector<std::string>;

/// A shell's script in which `vtsym` is the program, in an environment of little else than what is given.
ProgramResult runScript(const TemporaryFolder& place, const std::string& script, const std::string& input = {},
                        const Strings& environment = {});

ProgramResult runProgram(const Strings& arguments, const std::string& input = {}, const Strings& environment = {});

/// What a terminal shows when the program, or the command of a shell in a folder, runs on it and the input is typed.
ProgramResult runOnTerminal(const Strings& arguments, const std::string& input, const Strings& environment);
ProgramResult runOnTerminal(const TemporaryFolder& place, const std::string& program, const std::string& input,
                            const Strings& environment);

/// Runs the commands of a file of tests/data/cases, each in a folder with the given files, and expects what is written.
/// The first character of a line says what it is; any other line, or the rest of one after a \, is a line of output:
///     $ a script of a shell in which vtsym is the program      < a line of its standard input
///     ! a line of standard error; … matches anything           = its status unless it is 0        # a comment
void expectTranscript(const std::string& file, const std::map<std::string, std::string>& files = {});

std::vector<std::string> linesOf(const std::string& text);

} // namespace VT::Testing
