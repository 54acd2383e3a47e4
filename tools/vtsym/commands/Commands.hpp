// The commands of the program.  Each is one source of its name, which adds it to the command line.
// A new command is declared here and added in main.cpp.
#pragma once

#include "tools/vtsym/io/CommandLine.hpp"
#include "tools/vtsym/io/Console.hpp"

#include <memory>

namespace vtsym {

void addSimplify(CommandLine& program);
void addCompare(CommandLine& program);
void addGiven(CommandLine& program);
void addCheck(CommandLine& program);
void addConvert(CommandLine& program);
void addTree(CommandLine& program);
void addSymbols(CommandLine& program);
void addReplace(CommandLine& program);
void addRepl(CommandLine& program);
void addLsp(CommandLine& program);
void addPreprocess(CommandLine& program);
void addEval(CommandLine& program);
void addDims(CommandLine& program);
void addOperators(CommandLine& program);
void addScan(CommandLine& program);
void addManual(CommandLine& program);
void addCompletion(CommandLine& program);

} // namespace vtsym
