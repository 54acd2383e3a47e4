// vtsym replace
#include "tools/vtsym/answers/Conditions.hpp"
#include "tools/vtsym/commands/Commands.hpp"
#include "tools/vtsym/io/Arguments.hpp"
#include "tools/vtsym/io/Json.hpp"
#include "tools/vtsym/io/Texts.hpp"

#include <unordered_map>

namespace vtsym {

namespace {

constexpr const char* examples =
    R"(All names are replaced at once, so two can be exchanged.  The names of functions and members stay.

Examples:
  vtsym replace Mode=Gear 'Mode == 1 && Speed > 2'
  vtsym replace A=B B=A -- 'A && !B' '-A < B'
  vtsym replace Mode=Gear < conditions.txt)";

using Names = std::unordered_map<std::string, std::string>;

/// Takes the replacements from the beginning of the arguments: no condition looks like NAME=NAME.
Names takeNames(std::vector<std::string>& arguments) {
    Names names;
    auto next = arguments.begin();
    for (; next != arguments.end(); ++next) {
        const std::size_t equals = next->find('=');
        if (equals == std::string::npos || !isName(std::string_view(*next).substr(0, equals)) ||
            !isName(std::string_view(*next).substr(equals + 1)))
            break;
        const std::string name = next->substr(0, equals);
        if (!names.emplace(name, next->substr(equals + 1)).second)
            throw CLI::ValidationError("replace", quotedArgument(name) + " is replaced twice");
    }
    if (names.empty())
        throw CLI::ValidationError("replace", "a replacement NAME=NAME is missing before the texts");
    arguments.erase(arguments.begin(), next);
    return names;
}

} // namespace

Command addReplace(CLI::App& program) {
    CLI::App* const command = program.add_subcommand("replace", "Replace names in conditions");
    const auto options = std::make_shared<TextOptions>();
    const auto names = std::make_shared<Names>();
    addTextOptions(*command, *options);
    command->get_option("TEXT")->description(
        "NAME=NAME... and then texts to work on; without any, or with -, every line of standard input");
    addLanguageOption(*command, *options);
    command->footer(examples);
    command->final_callback([options, names] { *names = takeNames(options->texts); });
    return {command, [options, names](Console& console) {
                Conditions conditions;
                const auto answer = [&](const std::string& text, std::string& out) {
                    conditions.makeRoomFor(text);
                    const VT::VCSymbolicExprId replaced =
                        conditions.service().replaceSymbolsInExpression(conditions.parse(*options, text), *names);
                    const std::string result = conditions.print(*options, replaced.id());
                    if (options->json)
                        appendMember(out, "result", jsonString(result));
                    else
                        out.append(result);
                };
                return answerTexts(*options, console, {answer});
            }};
}

} // namespace vtsym
