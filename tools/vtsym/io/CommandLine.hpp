// The commands of the program and the options that each of them takes.
//
// A thin layer over the library that parses command lines, which CommandLine.cpp alone includes: its header takes
// longer to compile than everything else in a source.  Arguments are taken as they are written: the library's own
// syntax for lists, subcommands and the end of a command does not apply to them.
#pragma once

#include "tools/vtsym/io/CommandEntries.hpp"
#include "tools/vtsym/io/ExitStatus.hpp"

#include <functional>
#include <list>
#include <map>
#include <memory>
#include <stdexcept>
#include <string>
#include <vector>

namespace CLI {
class App;
class Option;
} // namespace CLI

namespace vtsym {

class Console;

/// The command line is wrong; what() is a sentence without its full stop.
class UsageError : public std::runtime_error {
public:
    using std::runtime_error::runtime_error;

    /// `subject` is the option or the command that the problem is about.
    UsageError(const std::string& subject, const std::string& problem) : runtime_error(subject + ": " + problem) {}
};

/// An argument in quotes, shortened and escaped for a message.
std::string quotedArgument(const std::string& argument);

/// Throws UsageError about an option unless its value is one of the words.
void requireOneOf(const std::string& option, const std::string& value, const std::vector<std::string>& words);

/// How the help shows an option, or a positional argument where the name has no dash.
struct OptionHelp {
    std::string name; ///< "--to"
    std::string description;
    std::string value = {}; ///< what its argument is: "LANGUAGE"
};

/// Runs a command whose command line has been read.
using Run = std::function<ExitStatus(Console&)>;

/// A command, to which its options are added, and which is then run.
class Command {
public:
    explicit Command(CLI::App& app) : app_(app) {}

    Command(const Command&) = delete;
    Command& operator=(const Command&) = delete;

    [[nodiscard]] const std::string& name() const;
    [[nodiscard]] CommandEntry entry() const;

    /// Leaves the command out of the help, the manual page and completions.
    void hide();
    [[nodiscard]] bool isHidden() const;

    /// Adds an option that takes one argument.  `take` may throw UsageError.
    void addArgument(const OptionHelp& help, std::function<void(const std::string&)> take);
    void addArgument(const OptionHelp& help, std::string& value);
    /// Adds an option that takes one argument each time that it is written; a positional takes all.
    void addArguments(const OptionHelp& help, std::function<void(std::vector<std::string>)> take);
    /// Adds an option whose argument is one of the words.
    void addChoice(const OptionHelp& help, std::vector<std::string> words,
                   std::function<void(const std::string&)> take);
    /// Adds an option without an argument.
    void addFlag(const std::string& name, const std::string& description, bool& value);
    void addFlag(const std::string& name, const std::string& description, std::function<void()> take);

    /// Makes an option or a positional mandatory.
    void require(const std::string& name);
    /// Makes it wrong to write two options together.
    void exclude(const std::string& name, const std::string& other);

    /// Is called when all options have been taken; may throw UsageError.
    std::function<void()> afterOptions;
    Run run;
    ExitStatus onError = false; ///< how the program ends when run() throws

private:
    CLI::Option* add(const OptionHelp& help, std::function<void(std::vector<std::string>)> take);

    CLI::App& app_;
    std::map<std::string, std::vector<std::string>> words_; ///< the only values of an option
};

/// What a command line asks for: a command to run, or a text to print.
struct Request {
    Command* command = nullptr;
    std::string text = {}; ///< where there is no command: the help or the version
};

/// All commands.
class CommandLine {
public:
    CommandLine(const std::string& description, const std::string& version, const std::string& notes);
    CommandLine(const CommandLine&) = delete;
    CommandLine& operator=(const CommandLine&) = delete;
    ~CommandLine();

    /// Adds a command.  The help ends with the notes.
    Command& add(const std::string& name, const std::string& description, const std::string& notes);

    /// Adds to every command so far, and before it, an option that takes any number of arguments.
    void addToAll(const OptionHelp& help, const std::function<void(std::vector<std::string>)>& take);

    /// Reads a command line, once.  Throws UsageError.
    Request read(std::vector<std::string> arguments);

    [[nodiscard]] std::string help() const;

    /// The program and its commands, except for hidden ones.
    [[nodiscard]] ProgramEntry entries() const;

    /// The program and the command that was read: "vtsym simplify".
    [[nodiscard]] std::string commandRead() const;

private:
    [[nodiscard]] Command* find(const std::string& name);
    void refuseUnknownCommand(const std::string& word) const;
    void mark(std::vector<std::string>& arguments);

    std::unique_ptr<CLI::App> app_;
    std::string version_;
    Command program_;
    std::list<Command> commands_;
};

} // namespace vtsym
