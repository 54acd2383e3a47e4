// The commands of the program.
#pragma once

#include "tools/vtsym/Console.hpp"

#include <CLI/CLI.hpp>

#include <cstdint>
#include <functional>
#include <memory>

namespace vtsym {

/// What a search through files comes to.
enum class SearchResult : std::uint8_t { NothingFound, Found, Failed };

/// The exit status of a command: 0 or 1 for one that answers texts, 0, 1 or 2 for a search.
class ExitStatus {
public:
    // NOLINTBEGIN(google-explicit-constructor): what a command returns is its status
    ExitStatus(bool success) : value_(success ? 0 : 1) {}

    ExitStatus(SearchResult result) : value_(static_cast<int>(result)) {}

    // NOLINTEND(google-explicit-constructor)

    [[nodiscard]] int value() const noexcept { return value_; }

private:
    int value_;
};

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
