// The commands of the program.
#pragma once

#include "tools/vtsym/io/Console.hpp"
#include "tools/vtsym/io/ExitStatus.hpp"

#include <CLI/CLI.hpp>

#include <functional>
#include <memory>

namespace vtsym {

/// What a command does once the command line has been read.
using Run = std::function<ExitStatus(Console&)>;

/// A command of the program's command line.
struct Command {
    CLI::App* app;
    Run run;
    ExitStatus onError = false; ///< what it ends with when run() throws
};

Command addSimplify(CLI::App& program);
Command addCompare(CLI::App& program);
Command addGiven(CLI::App& program);
Command addCheck(CLI::App& program);
Command addConvert(CLI::App& program);
Command addTree(CLI::App& program);
Command addSymbols(CLI::App& program);
Command addReplace(CLI::App& program);
Command addRepl(CLI::App& program);
Command addPreprocess(CLI::App& program);
Command addEval(CLI::App& program);
Command addDims(CLI::App& program);
Command addOperators(CLI::App& program);
Command addScan(CLI::App& program);

} // namespace vtsym
