// Runs the program.
#pragma once

#include "tests/support/Workplace.hpp"

#include <map>
#include <string>
#include <vector>

namespace VT::Testing {

struct ProgramResult {
    std::string output;
    std::string words; ///< standard error
    int status = -1;   ///< exit status; above 128 where a signal ended the program
};

using Strings = std::vector<std::string>;

/// A shell's script in which `vtsym` is the program, in an environment of little else than what is given.
ProgramResult runScript(const Workplace& place, const std::string& script, const std::string& input = {},
                        const Strings& environment = {});

ProgramResult runProgram(const Strings& arguments, const std::string& input = {}, const Strings& environment = {});

/// What a terminal shows when the program runs on it and the input is typed.
ProgramResult runOnTerminal(const Strings& arguments, const std::string& input, const Strings& environment);

struct Row {
    std::string script; ///< one line; what follows it is standard input
    std::string output;
    std::string words = {}; ///< parts of standard error, in order and with "..." between them; none for silence
    int status = 0;
};

/// Runs each row where the files are, and tells what is not as expected.
void expectRows(const std::vector<Row>& rows, const std::map<std::string, std::string>& files = {});

std::vector<std::string> linesOf(const std::string& text);

} // namespace VT::Testing
