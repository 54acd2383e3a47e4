#include "tools/vtsym/io/Arguments.hpp"

#include "host/Text.hpp"

#include <algorithm>
#include <string_view>
#include <utility>

namespace vtsym {

namespace {

// What no argument of a command line holds.
constexpr std::string_view mark("\0", 1);
constexpr std::string_view endMark("\0\0", 2); ///< of an argument after `--`

constexpr std::size_t shownBytes = 80;

/// What is wrong with a value; empty where nothing is.
std::string refusal(const std::string& value, const std::vector<std::string>& words) {
    if (std::ranges::find(words, value) != words.end())
        return {};
    std::string choice = words.front();
    for (std::size_t i = 1; i < words.size(); ++i)
        choice += (i + 1 < words.size() ? ", " : " or ") + words[i];
    return quotedArgument(value) + " is not offered; " + choice + " is";
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

/// Past the library's own conversions, to which some texts are signs.
CLI::Option* addRaw(CLI::App& command, const std::string& name, std::function<void(std::vector<std::string>)> take,
                    const std::string& description) {
    const auto self = std::make_shared<const CLI::Option*>(nullptr);
    CLI::Option* const option = command.add_option(
        name,
        [self, take = std::move(take)](const CLI::results_t& results) {
            take(valuesOf(**self, results));
            return true;
        },
        description);
    *self = option;
    return option->type_name("");
}

} // namespace

std::vector<std::string> markedArguments(std::span<const std::string> arguments) {
    std::vector<std::string> result;
    bool ended = false;
    for (const std::string& argument : arguments) {
        if (!ended && argument == "--")
            ended = true;
        else if (ended)
            result.push_back(std::string(endMark) + argument);
        else if (!argument.starts_with('-') || argument == "-")
            result.push_back(std::string(mark) + argument);
        else
            result.push_back(argument);
    }
    return result;
}

std::string unmarked(const std::string& argument) {
    return argument.substr(std::min(argument.find_first_not_of('\0'), argument.size()));
}

std::string quotedArgument(const std::string& argument) {
    return "'" + VT::shownText(argument, shownBytes) + "'";
}

CLI::Option* addArgument(CLI::App& command, const std::string& name, std::function<void(const std::string&)> take,
                         const std::string& description) {
    return addRaw(
        command, name, [take = std::move(take)](const std::vector<std::string>& values) { take(values.front()); },
        description);
}

CLI::Option* addArgument(CLI::App& command, const std::string& name, std::string& value,
                         const std::string& description) {
    const auto assign = [&value](const std::string& argument) { value = argument; };
    return addArgument(command, name, assign, description);
}

CLI::Option* addArguments(CLI::App& command, const std::string& name,
                          std::function<void(std::vector<std::string>)> take, const std::string& description) {
    CLI::Option* const option = addRaw(command, name, std::move(take), description);
    option->expected(CLI::detail::expected_max_vector_size);
    return option->allow_extra_args(option->get_positional())->multi_option_policy(CLI::MultiOptionPolicy::TakeAll);
}

void requireOneOf(const std::string& option, const std::string& value, const std::vector<std::string>& words) {
    if (const std::string problem = refusal(value, words); !problem.empty())
        throw CLI::ValidationError(option, problem);
}

CLI::Validator oneOf(std::vector<std::string> words) {
    return {[words = std::move(words)](const std::string& value) { return refusal(unmarked(value), words); }, ""};
}

} // namespace vtsym
