// vtsym: symbolic expressions and variant conditions on the command line.
#include "host/Feature.hpp"
#include "host/Text.hpp"
#include "tools/vtsym/commands/Commands.hpp"
#include "tools/vtsym/io/Arguments.hpp"
#include "tools/vtsym/io/Files.hpp"

#include <algorithm>
#include <csignal>
#include <numeric>
#include <span>
#include <sstream>
#include <string>
#include <string_view>
#include <vector>

namespace vtsym {

namespace {

constexpr int success = 0;
constexpr int wrongUsage = 2;

constexpr const char* description =
    "Symbolic expressions and variant conditions: simplify, convert, evaluate, look inside.";

constexpr const char* footer =
    R"(Every line of standard input is answered by one line of standard output; a text without an answer leaves an empty
line, and standard error says why.  The condition that always holds is written as true.

Exit status: 0 all texts were answered, 1 some were not, 2 the command line is wrong.

Examples:
  vtsym simplify 'Mode == 1 && Mode == 2'
  vtsym convert --to quill 'a % b == 1'
  vtsym eval -D N=3 'N*2 + 1'
  vtsym tree 'N*2 + 1')";

/// Changes between two words: letters put in, left out or replaced.
std::size_t distance(std::string_view a, std::string_view b) {
    std::vector<std::size_t> row(b.size() + 1);
    std::iota(row.begin(), row.end(), std::size_t{0});
    for (const char letter : a) {
        std::size_t diagonal = row[0]++;
        for (std::size_t j = 0; j < b.size(); ++j) {
            const std::size_t replaced = diagonal + (letter == b[j] ? 0 : 1);
            diagonal = row[j + 1];
            row[j + 1] = std::min({replaced, row[j] + 1, diagonal + 1});
        }
    }
    return row.back();
}

/// What is wrong with arguments that nothing takes.
std::string unexpected(const std::vector<std::string>& arguments) {
    const std::string first = arguments.empty() ? std::string() : arguments.front();
    if (first.starts_with('-') && first != "-")
        return "there is no option " + quotedArgument(first) + "; write a text that begins with - after --";
    return quotedArgument(unmarked(first)) + " is one argument too many";
}

class Program {
public:
    Program();
    /// `onError` becomes what the command ends with when it throws.
    int run(Console& console, std::vector<std::string> arguments, ExitStatus& onError);

private:
    void addFeatures(CLI::App& app);
    int fail(Console& console, const std::string& problem);
    void markArguments(std::vector<std::string>& arguments) const;
    [[nodiscard]] std::string unknownCommand(const std::string& word) const;

    CLI::App app_{description, "vtsym"};
    std::vector<Command> commands_;
};

Program::Program() {
    app_.set_version_flag("--version", "vtsym " VTSYM_VERSION, "Print the version and exit");
    app_.require_subcommand(1);
    app_.footer(footer);
    app_.get_formatter()->column_width(34);
    addFeatures(app_);
    for (const auto add : {addSimplify, addCompare, addGiven, addCheck, addScan, addConvert, addPreprocess, addTree,
                           addEval, addDims, addSymbols, addReplace, addRepl, addOperators}) {
        commands_.push_back(add(app_));
        addFeatures(*commands_.back().app);
    }
}

void Program::addFeatures(CLI::App& app) {
    std::string flags;
    for (const VtFeature* feature : VtFeature::all())
        flags += (flags.empty() ? "" : ", ") + feature->name();
    const auto take = [](const std::vector<std::string>& assignments) {
        for (const std::string& assignment : assignments)
            if (const std::string error = VtFeature::assign(assignment); !error.empty())
                throw CLI::ValidationError("--feature", error);
    };
    addArguments(app, "--feature", take, "Set a feature flag: " + flags)->type_name("NAME=VALUE");
}

/// What is wrong with a first word that is not a command; empty where nothing is.
std::string Program::unknownCommand(const std::string& word) const {
    const auto nearer = [&word](const Command& a, const Command& b) {
        return distance(word, a.app->get_name()) < distance(word, b.app->get_name());
    };
    const std::string& nearest = std::ranges::min_element(commands_, nearer)->app->get_name();
    const std::size_t changes = distance(word, nearest);
    if ((word.starts_with('-') && word != "--") || changes == 0)
        return {};
    const bool isNear = changes <= 2 && changes < word.size();
    return "there is no command " + quotedArgument(word) + (isNear ? "; did you mean " + nearest + "?" : "");
}

int Program::fail(Console& console, const std::string& problem) {
    std::string command = "vtsym";
    for (const CLI::App* const chosen : app_.get_subcommands())
        command += " " + chosen->get_name();
    console.words("vtsym: " + VT::shownText(problem) + "\nTry '" + command + " --help'.\n");
    return wrongUsage;
}

/// Marks the arguments after the command.
void Program::markArguments(std::vector<std::string>& arguments) const {
    const auto isCommand = [this](const std::string& word) {
        return std::ranges::any_of(commands_, [&](const Command& each) { return each.app->get_name() == word; });
    };
    const auto word = std::ranges::find_if(arguments, isCommand);
    if (word == arguments.end())
        return;
    const auto first = static_cast<std::size_t>(word - arguments.begin()) + 1;
    const std::vector<std::string> marked = markedArguments(std::span(arguments).subspan(first));
    arguments.resize(first);
    arguments.insert(arguments.end(), marked.begin(), marked.end());
}

int Program::run(Console& console, std::vector<std::string> arguments, ExitStatus& onError) {
    if (arguments.empty()) {
        console.words("vtsym: a command is missing\n\n" + app_.help());
        return wrongUsage;
    }
    if (arguments.front() == "help") {
        arguments.erase(arguments.begin());
        arguments.emplace_back("--help");
    }
    if (const std::string problem = unknownCommand(arguments.front()); !problem.empty())
        return fail(console, problem);
    markArguments(arguments);
    try {
        std::ranges::reverse(arguments); // the order that CLI11 takes
        app_.parse(std::move(arguments));
    } catch (const CLI::Success& wish) { // --help or --version
        std::ostringstream out;
        app_.exit(wish, out, out);
        console.data(out.str());
        console.flush();
        return success;
    } catch (const CLI::ExtrasError&) {
        return fail(console, unexpected(app_.remaining(true)));
    } catch (const CLI::RequiredError& missing) {
        const std::vector<std::string> rest = app_.remaining(true);
        return fail(console, rest.empty() ? missing.what() : unexpected(rest));
    } catch (const CLI::ParseError& error) {
        return fail(console, error.what());
    }
    const auto chosen = std::ranges::find_if(commands_, [](const Command& command) { return command.app->parsed(); });
    onError = chosen->onError;
    const int status = chosen->run(console).value();
    return console.wordsLost() ? std::max(status, onError.value()) : status;
}

int runOn(Console& console, std::vector<std::string> arguments) {
    ExitStatus onError = false;
    try {
        return Program().run(console, std::move(arguments), onError);
    } catch (const OutputError& error) {
        if (!error.readerIsGone())
            console.words("vtsym: " + VT::shownText(error.what()) + "\n");
    } catch (const std::exception& error) {
        console.words("vtsym: " + VT::shownText(error.what()) + "\n");
    }
    return onError.value();
}

} // namespace

} // namespace vtsym

int main(int argc, char** argv) {
    vtsym::holdStandardStreams();
    std::signal(SIGPIPE, SIG_IGN); // a reader that left is an error of writing, not the end of the process
    vtsym::Console console;
    return vtsym::runOn(console, std::vector<std::string>(argv + (argc > 0 ? 1 : 0), argv + argc));
}
