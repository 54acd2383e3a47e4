// The options that commands on texts share.
#include "tools/vtsym/io/Texts.hpp"

#include "tools/vtsym/io/CommandLine.hpp"
#include "tools/vtsym/io/InOrder.hpp"

#include <charconv>
#include <string_view>

namespace vtsym {

bool isName(std::string_view text) {
    const auto isLetter = [](char c) { return c == '_' || (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z'); };
    if (text.empty() || !isLetter(text.front()))
        return false;
    return text.find_first_not_of("abcdefghijklmnopqrstuvwxyzABCDEFGHIJKLMNOPQRSTUVWXYZ0123456789_") ==
           std::string_view::npos;
}

void addTexts(Command& command, TextOptions& options, const std::string& texts) {
    command.addArguments({"TEXT", texts + "; without any, or with -, every line of standard input"},
                         [&options](std::vector<std::string> given) { options.texts = std::move(given); });
    command.addFlag("--json", "Answer with one JSON object per text", options.json);
    addJobsOption(command, options.jobs);
}

void addTextOptions(Command& command, TextOptions& options, const std::string& texts) {
    addTexts(command, options, texts);
    addSourceOption(command, options);
}

void addSourceOption(Command& command, TextOptions& options) {
    command.addChoice({"--from", "Language of the texts: c or quill (c unless given)", "LANGUAGE"}, {"c", "quill"},
                      [&options](const std::string& language) { options.from = language; });
}

void addLanguageOption(Command& command, TextOptions& options) {
    command.addChoice(
        {"--to", "Language of the answers: c, quill or pp for directives (as --from unless given)", "LANGUAGE"},
        {"c", "quill", "pp"}, [&options](const std::string& language) { options.to = language; });
}

void addAssumeOption(Command& command, std::vector<std::string>& assumptions) {
    command.addArguments(
        {"--assume", "Answer for the values for which a condition holds; may be repeated", "CONDITION"},
        [&assumptions](std::vector<std::string> all) { assumptions = std::move(all); });
}

void addBitsOption(Command& command, bool& bits32) {
    command.addChoice({"--bits", "Take names for signed integers of 32 bits (without bounds unless given)", "BITS"},
                      {"32"}, [&bits32](const std::string&) { bits32 = true; });
}

void addJobsOption(Command& command, std::size_t& jobs) {
    command.addArgument({"--jobs", "Use so many processors (all unless given); answers are the same", "N"},
                        [&jobs](const std::string& text) {
                            const char* const end = text.data() + text.size();
                            const auto [at, error] = std::from_chars(text.data(), end, jobs);
                            if (error != std::errc() || at != end || jobs == 0 || jobs > mostJobs)
                                throw UsageError("--jobs", quotedArgument(text) + " is not a number from 1 to " +
                                                               std::to_string(mostJobs));
                        });
}

} // namespace vtsym
