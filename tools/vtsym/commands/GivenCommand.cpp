// vtsym given
#include "tools/vtsym/commands/Commands.hpp"
#include "tools/vtsym/commands/Pairs.hpp"
#include "tools/vtsym/io/Json.hpp"

namespace vtsym {

namespace {

constexpr const char* examples =
    R"(The answer equals the condition wherever the known one holds, which is proven; elsewhere it may differ.

Examples:
  vtsym given 'VERSION >= 3' 'VERSION >= 4 && VERSION >= 2'
  vtsym given --to quill '!A' 'A || B != 1'
  vtsym given --json < pairs.txt)";

} // namespace

Command addGiven(CLI::App& program) {
    CLI::App* const command = program.add_subcommand("given", "Shorten conditions where another one is known to hold");
    const auto options = std::make_shared<PairOptions>();
    addPairOptions(*command, *options, "KNOWN", "CONDITION");
    addLanguageOption(*command, *options);
    command->footer(examples);
    return {command, [options](Console& console) {
                Conditions conditions(options->bits32);
                std::vector<std::string> warnings;
                const auto answer = [&](const std::string& text, std::string& out) {
                    conditions.makeRoomFor(text);
                    const ConditionPair pair = readPair(conditions, *options, text);
                    const VT::SymbolicExprId result = conditions.shortestGiven(*options, pair.second, pair.first);
                    const std::string printed = conditions.print(*options, result);
                    warnings = conditions.warnings(*options, result);
                    if (!options->json) {
                        out.append(printed);
                        return;
                    }
                    appendMember(out, "known", jsonString(pair.firstText));
                    appendMember(out, "condition", jsonString(pair.secondText));
                    appendMember(out, "result", jsonString(printed));
                };
                return answerTexts(*options, console, {answer, false, &warnings, true});
            }};
}

} // namespace vtsym
