// vtsym pp
#include "base/decide/shorten/StringifyImpliedCondition.hpp"
#include "base/transform/QuillConversion.hpp"
#include "tools/vtsym/answers/Conditions.hpp"
#include "tools/vtsym/commands/Commands.hpp"
#include "tools/vtsym/io/Arguments.hpp"
#include "tools/vtsym/io/ErrorText.hpp"
#include "tools/vtsym/io/Json.hpp"
#include "tools/vtsym/io/Texts.hpp"

namespace vtsym {

namespace {

constexpr const char* examples =
    R"(Members become macro names: s.x is s_x.  The condition that always holds is written as 1.

Examples:
  vtsym pp 'Mode == 1 || s.gear > 2 && true'
  vtsym pp --given 'Mode == 1 && A != 2' 'Mode == 1 && B || A == 2'
  vtsym pp --from quill '~(A == 1) && rem(B,2) ~= 0')";

struct PreprocessOptions : TextOptions {
    std::string given;
};

class Preprocessor {
public:
    explicit Preprocessor(const PreprocessOptions& options) : options_(options) {}

    /// Whether the given condition can be read; says why not.
    bool readsGiven(Console& console);
    void answer(const std::string& text, std::string& out);

    std::vector<std::string> warnings;

private:
    const PreprocessOptions& options_;
    Conditions conditions_;
};

bool Preprocessor::readsGiven(Console& console) {
    try {
        static_cast<void>(conditions_.parse(options_, options_.given));
        return true;
    } catch (...) {
        const TextError error = currentTextError();
        std::string words = "vtsym: --given: " + error.message + "\n";
        if (error.offset)
            words += withCaret(options_.given, *error.offset, console.wordStyle());
        console.words(words);
        return false;
    }
}

void Preprocessor::answer(const std::string& text, std::string& out) {
    conditions_.makeRoomFor(text);
    VT::SymbolicExprTable& table = conditions_.service().table();
    const VT::SymbolicExprQ2C toC(table);
    const VT::SymbolicExprId given = options_.given.empty() // nothing is known then
                                         ? VT::invalidId
                                         : toC(conditions_.parse(options_, options_.given));
    const VT::SymbolicExprId condition = toC(conditions_.parse(options_, text));
    const std::string result = VT::StringifyImpliedCondition(table, false, true, given).print(condition);
    warnings = conditions_.warnings(options_, condition);
    if (options_.json)
        appendMember(out, "result", jsonString(result));
    else
        out.append(result);
}

} // namespace

Command addPreprocess(CLI::App& program) {
    CLI::App* const command = program.add_subcommand("pp", "Write conditions for preprocessor directives");
    const auto options = std::make_shared<PreprocessOptions>();
    options->to = "pp";
    addTextOptions(*command, *options);
    addArgument(*command, "--given", options->given, "A condition that is known to hold; what it decides is left out")
        ->type_name("CONDITION");
    command->footer(examples);
    return {command, [options](Console& console) {
                Preprocessor preprocessor(*options);
                if (!preprocessor.readsGiven(console))
                    return false;
                const auto answer = [&](const std::string& text, std::string& out) { preprocessor.answer(text, out); };
                return answerTexts(*options, console, {answer, false, &preprocessor.warnings});
            }};
}

} // namespace vtsym
