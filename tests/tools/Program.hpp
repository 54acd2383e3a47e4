// Runs the program.
#pragma once

#include <string>
#include <vector>

namespace VT::Testing {

struct ProgramResult {
    std::string output;
    std::string words; ///< standard error
    int status = -1;   ///< exit status; -1 where a signal ended the program
};

/// What standard output is.
enum class OutputTo { Result, FullDevice, ClosedPipe };

struct ProgramInput {
    std::vector<std::string> arguments;
    std::string input;
    std::vector<std::string> environment; ///< NAME=VALUE beside PATH
    OutputTo output = OutputTo::Result;
};

ProgramResult runProgram(const ProgramInput& input);

/// What a terminal shows when the program runs on it and the input is typed.
ProgramResult runOnTerminal(const ProgramInput& input);

} // namespace VT::Testing
