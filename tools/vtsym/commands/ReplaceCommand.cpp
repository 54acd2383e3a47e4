// vtsym replace: names replaced by other names, all at once.
// Leading arguments of the form NAME=NAME are replacements; no condition has that form.
#include "tools/vtsym/answers/Conditions.hpp"
#include "tools/vtsym/commands/Commands.hpp"
#include "tools/vtsym/io/CommandLine.hpp"
#include "tools/vtsym/io/Json.hpp"
#include "tools/vtsym/io/Texts.hpp"

#include <unordered_map>

namespace vtsym {

namespace {

constexpr const char* replaceNotes =
    R"(All names are replaced at once, so that two can be exchanged.  The names of functions and members stay.

Examples:
  vtsym replace Mode=Gear 'Mode == 1 && Speed > 2'
  vtsym replace A=B B=A -- 'A && !B' '-A < B'
  vtsym replace Mode=Gear < conditions.txt)";

using Names = std::unordered_map<std::string, std::string>;

/// Removes the replacements from the front of the arguments.
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
            throw UsageError("replace", quotedArgument(name) + " is replaced twice; leave one replacement out");
    }
    if (names.empty())
        throw UsageError("replace", "there is no replacement; write NAME=NAME before the texts");
    arguments.erase(arguments.begin(), next);
    return names;
}

struct Replacer {
    Replacer(const TextOptions& given, const Names& replaced) : options(given), names(replaced) {}

    void answer(const std::string& text, std::string& out) {
        conditions.makeRoomFor(text);
        const VT::VCSymbolicExprId replaced =
            conditions.service().replaceSymbolsInExpression(conditions.parse(options, text), names);
        const std::string result = conditions.print(options, replaced.id());
        if (options.json)
            appendMember(out, "result", jsonString(result));
        else
            out.append(result);
    }

    const TextOptions& options;
    const Names& names;
    Conditions conditions;
};

} // namespace

void addReplace(CommandLine& program) {
    Command& command = program.add("replace", "Replace names in conditions", replaceNotes);
    const auto options = std::make_shared<TextOptions>();
    const auto names = std::make_shared<Names>();
    addTextOptions(command, *options, "NAME=NAME... and then texts to work on");
    addLanguageOption(command, *options);
    command.afterOptions = [options, names] { *names = takeNames(options->texts); };
    command.run = [options, names](Console& console) {
        return answerTexts(*options, console,
                           [&] { return answeringBy(std::make_shared<Replacer>(*options, *names)); });
    };
}

} // namespace vtsym
