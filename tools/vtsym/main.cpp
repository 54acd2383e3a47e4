// vtsym: symbolic expressions and variant conditions on the command line.
//
// Adds every command to the command line, reads it, runs the command and maps what can go wrong to an exit status.
#include "host/Feature.hpp"
#include "host/Text.hpp"
#include "tools/vtsym/commands/Commands.hpp"
#include "tools/vtsym/io/Files.hpp"

#include <algorithm>
#include <csignal>
#include <cstdlib>
#include <exception>
#include <new>
#include <optional>
#include <string>
#include <string_view>
#include <unistd.h>
#include <vector>

namespace vtsym {

namespace {

constexpr int success = 0;
constexpr int wrongUsage = 2;

constexpr const char* description =
    "Simplifies, compares and converts conditions, and finds the dead ones in models and in C and C++ sources.";

constexpr const char* programNotes =
    R"(Commands on texts answer every line of standard input by one line; a text without an answer leaves an empty line, and
standard error says why.

Exit status: 0 every text was answered, 1 some were not, 2 the command line is wrong; of scan and check: 0 no findings,
1 findings, 2 something could not be read.

Environment: NO_COLOR, when not empty, turns colours off; VTSYM_FEATURES sets feature flags, as --feature does, with commas
between them; VTSYM_LOG is the least level of messages of the library: debug, info, warning, error or off.

Examples:
  vtsym simplify 'x > 2 && x != 3 && x < 5'
  vtsym compare 'x % 2 == 1' 'x % 2 != 0'
  vtsym check model.json
  vtsym scan src include)";

/// Adds the command that a command line begins with; all commands for any other word, and for those that describe all.
void addCommands(CommandLine& commandLine, const std::string& first) {
    struct Row {
        const char* name; ///< empty for a command that describes all
        void (*add)(CommandLine&);
    };

    static constexpr Row rows[] = {{"simplify", addSimplify}, {"compare", addCompare}, {"given", addGiven},
                                   {"check", addCheck},       {"scan", addScan},       {"convert", addConvert},
                                   {"pp", addPreprocess},     {"tree", addTree},       {"eval", addEval},
                                   {"dims", addDims},         {"symbols", addSymbols}, {"replace", addReplace},
                                   {"repl", addRepl},         {"lsp", addLsp},         {"operators", addOperators},
                                   {"", addManual},           {"", addCompletion}};
    for (const Row& row : rows)
        if (first == row.name && !first.empty())
            return row.add(commandLine);
    for (const Row& row : rows)
        row.add(commandLine);
}

void addFeatureOption(CommandLine& commandLine) {
    std::string flags;
    for (const VtFeature* feature : VtFeature::all())
        flags += (flags.empty() ? "" : ", ") + feature->name();
    commandLine.addToAll({"--feature", "Set a feature flag: " + flags, "NAME=VALUE"},
                         [](const std::vector<std::string>& assignments) {
                             for (const std::string& assignment : assignments)
                                 if (const std::string error = VtFeature::assign(assignment); !error.empty())
                                     throw UsageError("--feature", error);
                         });
}

void complain(Console& console, const std::string& problem) {
    console.err("vtsym: " + VT::shownText(problem) + "\n");
}

/// Says so without taking memory.
void complainOfMemory() {
    static constexpr std::string_view message = "vtsym: there is not enough memory\n";
    static_cast<void>(write(STDERR_FILENO, message.data(), message.size()) > 0);
}

/// Ends the process where memory ran out in a place that may not throw: destructors of the library for JSON take some,
/// and the one that reads the command line copies words there.
[[noreturn]] void endWhereNothingMayThrow() noexcept {
    if (const std::exception_ptr thrown = std::current_exception()) {
        try {
            std::rethrow_exception(thrown);
        } catch (const std::bad_alloc&) {
            complainOfMemory();
            _exit(wrongUsage);
        } catch (...) {
        }
    }
    std::abort();
}

/// Reads the command line and runs its command.  `onError` becomes the status for a command that throws.
int readAndRun(Console& console, std::vector<std::string> arguments, std::optional<ExitStatus>& onError) {
    CommandLine commandLine(description, VTSYM_VERSION, programNotes);
    addCommands(commandLine, arguments.empty() ? "" : arguments.front());
    addFeatureOption(commandLine);
    if (arguments.empty()) {
        console.err("vtsym: a command is missing; choose one of those below\n\n" + commandLine.help());
        return wrongUsage;
    }
    Request request;
    try {
        request = commandLine.read(std::move(arguments));
    } catch (const UsageError& error) {
        complain(console, error.what());
        console.err("Try '" + commandLine.commandRead() + " --help'.\n");
        return wrongUsage;
    }
    if (request.command == nullptr) {
        console.out(request.text);
        console.flush();
        return success;
    }
    onError = request.command->onError;
    const int status = request.command->run(console).value();
    return console.errFailed() ? std::max(status, onError->value()) : status;
}

int runProgram(Console& console, std::vector<std::string> arguments) {
    std::optional<ExitStatus> onError; // when the command is known
    bool isOutOfMemory = false;
    try {
        try {
            return readAndRun(console, std::move(arguments), onError);
        } catch (const std::bad_alloc&) {
            throw;
        } catch (const OutputError& error) {
            if (!error.readerIsGone())
                complain(console, error.what());
        } catch (const std::exception& error) {
            complain(console, error.what());
        }
    } catch (const std::bad_alloc&) {
        isOutOfMemory = true;
        complainOfMemory();
    } catch (const OutputError&) { // the message could not be written either
    }
    return onError.value_or(isOutOfMemory ? ExitStatus(SearchResult::Failed) : ExitStatus(false)).value();
}

} // namespace

} // namespace vtsym

int main(int argc, char** argv) {
    vtsym::holdStandardStreams();
    std::set_terminate(vtsym::endWhereNothingMayThrow);
    std::signal(SIGPIPE, SIG_IGN); // a reader that left is an error of writing, not the end of the process
    try {
        vtsym::Console console;
        return vtsym::runProgram(console, std::vector<std::string>(argv + (argc > 0 ? 1 : 0), argv + argc));
    } catch (const std::exception&) { // before there was anything that could say more
        vtsym::complainOfMemory();
        return vtsym::wrongUsage;
    }
}
