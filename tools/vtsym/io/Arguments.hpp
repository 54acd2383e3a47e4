// Arguments of the command line, taken as they are written.
#pragma once

#include <CLI/CLI.hpp>

#include <functional>
#include <span>
#include <string>
#include <vector>

namespace vtsym {

/// Marks what is no option among the arguments of a command: texts, paths, the values of options, and all that is after
/// `--`, which goes.  The parser of the command line sees no list, command or end of a command in a marked argument;
/// options that the functions below add take the mark off.
std::vector<std::string> markedArguments(std::span<const std::string> arguments);

/// An argument as it is written.
std::string unmarked(const std::string& argument);

/// An argument in quotes, fit for a message.
std::string quotedArgument(const std::string& argument);

/// Gives a command an option, or a positional where the name has no dash, that takes one argument.
CLI::Option* addArgument(CLI::App& command, const std::string& name, std::function<void(const std::string&)> take,
                         const std::string& description);
CLI::Option* addArgument(CLI::App& command, const std::string& name, std::string& value,
                         const std::string& description);

/// The same for any number of arguments; an option takes one each time that it is written.
CLI::Option* addArguments(CLI::App& command, const std::string& name,
                          std::function<void(std::vector<std::string>)> take, const std::string& description);

/// Throws CLI::ValidationError about an option unless its value is one of the words.
void requireOneOf(const std::string& option, const std::string& value, const std::vector<std::string>& words);

/// Accepts the words of a list.
CLI::Validator oneOf(std::vector<std::string> words);

} // namespace vtsym
