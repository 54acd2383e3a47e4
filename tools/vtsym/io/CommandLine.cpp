// Reads the command line with CLI11, whose own syntax is kept away from arguments: everything that is not an option is
// marked before the library sees it, and unmarked when an option takes it, so that texts such as `[1,2]`, `{}`, `%%`
// and the names of commands arrive as they are written.  No other source includes the library.
#include "tools/vtsym/io/CommandLine.hpp"

#include "host/Text.hpp"

#include <CLI/CLI.hpp>

#include <algorithm>
#include <numeric>
#include <span>
#include <sstream>
#include <string_view>
#include <utility>

namespace vtsym {

namespace {

// No argument of a command line contains a NUL.
constexpr std::string_view plainMark("\0", 1);
constexpr std::string_view endMark("\0\0", 2); ///< of an argument after `--`

constexpr std::size_t shownArgumentBytes = 80;
constexpr std::size_t helpColumn = 34; ///< where descriptions begin

/// Marks the arguments that are not options: texts, paths, the values of options, and all that follow `--`, which is
/// left out.
std::vector<std::string> marked(std::span<const std::string> arguments) {
    std::vector<std::string> result;
    bool ended = false;
    for (const std::string& argument : arguments) {
        if (!ended && argument == "--")
            ended = true;
        else if (ended)
            result.push_back(std::string(endMark) + argument);
        else if (argument == "-imacros") // as compilers write it
            result.push_back("-" + argument);
        else if (!argument.starts_with('-') || argument == "-")
            result.push_back(std::string(plainMark) + argument);
        else
            result.push_back(argument);
    }
    return result;
}

std::string unmarked(const std::string& argument) {
    return argument.substr(std::min(argument.find_first_not_of('\0'), argument.size()));
}

/// The values of an option, which `--` ends as it ends all options.
std::vector<std::string> valuesOf(const CLI::Option& option, const CLI::results_t& results) {
    std::vector<std::string> values;
    for (const std::string& result : results) {
        if (!option.get_positional() && result.starts_with(endMark))
            throw CLI::ArgumentMismatch::TypedAtLeast(option.get_name(), 1, option.get_type_name());
        values.push_back(unmarked(result));
    }
    return values;
}

/// The edit distance of two words: letters inserted, removed or replaced (Wagner and Fischer, 1974).
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

/// The problem with arguments that no option took.
std::string unexpected(const std::vector<std::string>& arguments) {
    const std::string first = arguments.empty() ? std::string() : arguments.front();
    if (first.starts_with('-') && first != "-")
        return "there is no option " + quotedArgument(first) + "; write a text that begins with - after --";
    return quotedArgument(unmarked(first)) + " is one argument too many; leave it out";
}

/// An option that was added.  The look-up of the library that parses ends the process where memory runs out.
CLI::Option& optionOf(CLI::App& app, const std::string& name) {
    for (CLI::Option* const option : app.get_options())
        if (option->check_name(name))
            return *option;
    throw std::logic_error("there is no option " + name);
}

} // namespace

std::string quotedArgument(const std::string& argument) {
    return "'" + VT::shownText(argument, shownArgumentBytes) + "'";
}

void requireOneOf(const std::string& option, const std::string& value, const std::vector<std::string>& words) {
    if (std::ranges::find(words, value) != words.end())
        return;
    std::string offered = words.front();
    for (std::size_t i = 1; i < words.size(); ++i)
        offered += (i + 1 < words.size() ? ", " : " or ") + words[i];
    throw UsageError(option, quotedArgument(value) + " is not offered; write " + offered);
}

const std::string& Command::name() const {
    return app_.get_name();
}

void Command::hide() {
    app_.group("");
}

bool Command::isHidden() const {
    return app_.get_group().empty();
}

CommandEntry Command::entry() const {
    CommandEntry result{app_.get_name(), app_.get_description(), app_.get_footer(), {}};
    for (const CLI::Option* const option : std::as_const(app_).get_options()) {
        OptionEntry each;
        for (const std::string& name : option->get_snames())
            each.names.push_back("-" + name);
        for (const std::string& name : option->get_lnames())
            each.names.push_back("--" + name);
        if (option->get_positional())
            each.names.assign(1, option->get_name());
        each.description = option->get_description();
        if (option->get_items_expected_max() > 0)
            each.value = option->get_positional() ? option->get_name() : option->get_type_name();
        if (const auto words = words_.find(each.names.back()); words != words_.end())
            each.words = words->second;
        each.repeats = option->get_multi_option_policy() == CLI::MultiOptionPolicy::TakeAll;
        each.isRequired = option->get_required();
        result.options.push_back(std::move(each));
    }
    return result;
}

/// Adds an option past the library's own conversions, which read some texts as signs.
CLI::Option* Command::add(const OptionHelp& help, std::function<void(std::vector<std::string>)> take) {
    const auto self = std::make_shared<const CLI::Option*>(nullptr);
    CLI::Option* const option = app_.add_option(
        help.name,
        [self, take = std::move(take)](const CLI::results_t& results) {
            take(valuesOf(**self, results));
            return true;
        },
        help.description);
    *self = option;
    return option->type_name(help.value);
}

void Command::addArgument(const OptionHelp& help, std::function<void(const std::string&)> take) {
    add(help, [take = std::move(take)](const std::vector<std::string>& values) { take(values.front()); });
}

void Command::addArgument(const OptionHelp& help, std::string& value) {
    addArgument(help, [&value](const std::string& argument) { value = argument; });
}

void Command::addArguments(const OptionHelp& help, std::function<void(std::vector<std::string>)> take) {
    CLI::Option* const option = add(help, std::move(take));
    option->expected(CLI::detail::expected_max_vector_size);
    option->allow_extra_args(option->get_positional())->multi_option_policy(CLI::MultiOptionPolicy::TakeAll);
}

void Command::addChoice(const OptionHelp& help, std::vector<std::string> words,
                        std::function<void(const std::string&)> take) {
    words_.emplace(help.name, words);
    addArgument(help, [name = help.name, words = std::move(words), take = std::move(take)](const std::string& value) {
        requireOneOf(name, value, words);
        take(value);
    });
}

void Command::addFlag(const std::string& name, const std::string& description, bool& value) {
    app_.add_flag(name, value, description);
}

void Command::addFlag(const std::string& name, const std::string& description, std::function<void()> take) {
    app_.add_flag_callback(name, std::move(take), description);
}

void Command::require(const std::string& name) {
    optionOf(app_, name).required();
}

void Command::exclude(const std::string& name, const std::string& other) {
    optionOf(app_, name).excludes(&optionOf(app_, other));
}

CommandLine::CommandLine(const std::string& description, const std::string& version, const std::string& notes)
    : app_(std::make_unique<CLI::App>(description, "vtsym")),
      version_(version),
      program_(*app_) {
    app_->set_version_flag("--version", "vtsym " + version, "Print the version and exit");
    app_->require_subcommand(1);
    app_->footer(notes);
    app_->get_formatter()->column_width(helpColumn);
}

CommandLine::~CommandLine() = default;

Command& CommandLine::add(const std::string& name, const std::string& description, const std::string& notes) {
    CLI::App* const app = app_->add_subcommand(name, description);
    app->footer(notes);
    return commands_.emplace_back(*app);
}

void CommandLine::addToAll(const OptionHelp& help, const std::function<void(std::vector<std::string>)>& take) {
    program_.addArguments(help, take);
    for (Command& command : commands_)
        command.addArguments(help, take);
}

Command* CommandLine::find(const std::string& name) {
    const auto found = std::ranges::find(commands_, name, &Command::name);
    return found == commands_.end() ? nullptr : &*found;
}

/// Throws where the first word is neither a command nor an option.
void CommandLine::refuseUnknownCommand(const std::string& word) const {
    const auto nearest = std::ranges::min_element(
        commands_, {}, [&word](const Command& command) { return distance(word, command.name()); });
    const std::size_t changes = distance(word, nearest->name());
    if ((word.starts_with('-') && word != "--") || changes == 0)
        return;
    const bool isNear = changes <= 2 && changes < word.size();
    throw UsageError("there is no command " + quotedArgument(word) +
                     (isNear ? "; did you mean " + nearest->name() + "?" : ""));
}

/// Marks the arguments after the command.
void CommandLine::mark(std::vector<std::string>& arguments) {
    const auto word = std::ranges::find_if(arguments, [this](const auto& each) { return find(each) != nullptr; });
    if (word == arguments.end())
        return;
    const auto first = static_cast<std::size_t>(word - arguments.begin()) + 1;
    const std::vector<std::string> rest = marked(std::span(arguments).subspan(first));
    arguments.resize(first);
    arguments.insert(arguments.end(), rest.begin(), rest.end());
}

Request CommandLine::read(std::vector<std::string> arguments) {
    if (!arguments.empty() && arguments.front() == "help") {
        arguments.erase(arguments.begin());
        arguments.emplace_back("--help");
    }
    if (!arguments.empty())
        refuseUnknownCommand(arguments.front());
    mark(arguments);
    try {
        std::ranges::reverse(arguments); // the order that the library takes
        app_->parse(std::move(arguments));
    } catch (const CLI::Success& request) { // --help or --version
        std::ostringstream out;
        out.exceptions(std::ios::badbit); // or a part would be taken for all where memory runs out
        app_->exit(request, out, out);
        return {nullptr, out.str()};
    } catch (const CLI::ExtrasError&) {
        throw UsageError(unexpected(app_->remaining(true)));
    } catch (const CLI::RequiredError& missing) {
        const std::vector<std::string> rest = app_->remaining(true);
        throw UsageError(rest.empty() ? missing.what() : unexpected(rest));
    } catch (const CLI::ParseError& error) {
        throw UsageError(error.what());
    }
    Command* const command = find(app_->get_subcommands().front()->get_name());
    if (command->afterOptions)
        command->afterOptions();
    return {command};
}

std::string CommandLine::help() const {
    return app_->help();
}

ProgramEntry CommandLine::entries() const {
    ProgramEntry result{program_.entry(), version_, {}};
    for (const Command& command : commands_)
        if (!command.isHidden())
            result.commands.push_back(command.entry());
    return result;
}

std::string CommandLine::commandRead() const {
    std::string text = app_->get_name();
    for (const CLI::App* const command : app_->get_subcommands())
        text += " " + command->get_name();
    return text;
}

} // namespace vtsym
