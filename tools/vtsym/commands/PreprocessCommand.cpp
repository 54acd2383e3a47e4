// vtsym pp: conditions as the host generates them for preprocessor directives, shortened under a known condition.
// Parts are taken away from the text as written; the shortest form is written only where it is shorter still.
#include "base/decide/shorten/StringifyImpliedCondition.hpp"
#include "base/transform/QuillConversion.hpp"
#include "tools/vtsym/answers/Conditions.hpp"
#include "tools/vtsym/commands/Commands.hpp"
#include "tools/vtsym/io/CommandLine.hpp"
#include "tools/vtsym/io/ErrorText.hpp"
#include "tools/vtsym/io/Json.hpp"
#include "tools/vtsym/io/Texts.hpp"

namespace vtsym {

namespace {

constexpr const char* preprocessNotes =
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

    /// Returns whether the known condition can be read, and reports why it cannot.
    bool readsGiven(Console& console);
    void answer(const std::string& text, std::string& out);

    std::vector<std::string> warnings;
    Conditions conditions;

private:
    const PreprocessOptions& options_;
};

bool Preprocessor::readsGiven(Console& console) {
    try {
        static_cast<void>(conditions.parse(options_, options_.given));
        return true;
    } catch (...) {
        const TextError error = currentTextError();
        std::string message = "vtsym: --given: " + error.message + "\n";
        if (error.offset)
            message += withCaret(options_.given, *error.offset, console.errStyle());
        console.err(message);
        return false;
    }
}

void Preprocessor::answer(const std::string& text, std::string& out) {
    conditions.makeRoomFor(text);
    VT::SymbolicExprTable& table = conditions.service().table();
    const VT::SymbolicExprQ2C toC(table);
    const VT::SymbolicExprId given = options_.given.empty() // nothing is known then
                                         ? VT::invalidId
                                         : toC(conditions.parse(options_, options_.given));
    const VT::SymbolicExprId condition = toC(conditions.parse(options_, text));
    std::string result = VT::StringifyImpliedCondition(table, false, true, given).print(condition);
    if (given != VT::invalidId) {
        std::string shortest = conditions.print(options_, conditions.shortestGiven(options_, condition, given));
        if (shortest.size() < result.size())
            result = std::move(shortest);
    }
    warnings = conditions.warnings(options_, condition);
    if (options_.json)
        appendMember(out, "result", jsonString(result));
    else
        out.append(result);
}

} // namespace

void addPreprocess(CommandLine& program) {
    Command& command = program.add("pp", "Write conditions for preprocessor directives", preprocessNotes);
    const auto options = std::make_shared<PreprocessOptions>();
    options->to = "pp";
    addTextOptions(command, *options);
    command.addArgument(
        {"--given", "A condition that is known to hold; the parts that it decides are left out", "CONDITION"},
        options->given);
    command.run = [options](Console& console) {
        if (!Preprocessor(*options).readsGiven(console))
            return false;
        return answerTexts(*options, console, [&] { return answeringBy(std::make_shared<Preprocessor>(*options)); });
    };
}

} // namespace vtsym
