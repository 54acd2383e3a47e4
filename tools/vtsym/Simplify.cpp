// vtsym simplify
#include "tools/vtsym/Commands.hpp"
#include "tools/vtsym/Conditions.hpp"
#include "tools/vtsym/Explanation.hpp"
#include "tools/vtsym/Json.hpp"
#include "tools/vtsym/Texts.hpp"

namespace vtsym {

namespace {

constexpr const char* examples =
    R"(Conditions are over integers: every name stands for an integer, and what is not zero is true.

Examples:
  vtsym simplify 'Mode == 1 && Mode == 2'
  vtsym simplify --explain '!(A < 3) || A == 2'
  vtsym simplify --to quill 'a / b == 1 && x != 2'
  vtsym simplify --json < conditions.txt)";

struct SimplifyOptions : TextOptions {
    bool explain = false;
};

/// Simplifies past the service's caches, which know results only.
void answerInDetail(const SimplifyOptions& options, const Style& style, const Conditions& conditions,
                    const std::string& text, std::string& out) {
    const Explanation explanation(conditions, options, conditions.parse(options, text), options.explain);
    if (!options.json) {
        explanation.appendText(style, out);
        return;
    }
    appendMember(out, "result", jsonString(conditions.print(options, explanation.result())));
    appendMember(out, "passes", std::to_string(explanation.passes()));
    if (options.explain)
        appendMember(out, "steps", explanation.json());
}

} // namespace

Command addSimplify(CLI::App& program) {
    CLI::App* const command = program.add_subcommand("simplify", "Simplify conditions");
    const auto options = std::make_shared<SimplifyOptions>();
    addTextOptions(*command, *options);
    addLanguageOption(*command, *options);
    command->add_flag("--explain", options->explain, "Show the rules that fired, pass by pass");
    command->footer(examples);
    return {command, [options](Console& console) {
                Conditions conditions;
                const auto answer = [&](const std::string& text, std::string& out) {
                    conditions.makeRoomFor(text);
                    if (options->json || options->explain)
                        answerInDetail(*options, console.dataStyle(), conditions, text, out);
                    else
                        out.append(conditions.print(*options, conditions.simplify(*options, text)));
                };
                return answerTexts(*options, console, {answer, options->explain && !options->json});
            }};
}

} // namespace vtsym
