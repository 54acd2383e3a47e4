// vtsym convert: prints conditions in another language, without simplifying them.
// Warns where C or a preprocessor would read the result differently.
#include "tools/vtsym/answers/Conditions.hpp"
#include "tools/vtsym/commands/Commands.hpp"
#include "tools/vtsym/io/Json.hpp"
#include "tools/vtsym/io/Texts.hpp"

namespace vtsym {

namespace {

constexpr const char* convertNotes = R"(An operator that a language lacks becomes a call: a % b is rem(a,b) in Quill.

Examples:
  vtsym convert --to quill '(F & 4) != 0 && a % b == 1'
  vtsym convert 'Mode==1&&!(Gear>2)'
  vtsym convert --to pp 'Mode==1 || s.gear>2 && true'
  vtsym convert --to quill < conditions.txt)";

struct Converter {
    explicit Converter(const TextOptions& given) : options(given) {}

    void answer(const std::string& text, std::string& out) {
        conditions.makeRoomFor(text);
        const VT::SymbolicExprId condition = conditions.parse(options, text);
        const std::string result = conditions.print(options, condition);
        warnings = conditions.warnings(options, condition);
        if (options.json)
            appendMember(out, "result", jsonString(result));
        else
            out.append(result);
    }

    const TextOptions& options;
    Conditions conditions;
    std::vector<std::string> warnings;
};

} // namespace

void addConvert(CommandLine& program) {
    Command& command =
        program.add("convert", "Translate conditions between C, Quill and preprocessor directives", convertNotes);
    const auto options = std::make_shared<TextOptions>();
    addTextOptions(command, *options);
    addLanguageOption(command, *options);
    command.run = [options](Console& console) {
        return answerTexts(*options, console, [&] { return answeringBy(std::make_shared<Converter>(*options)); });
    };
}

} // namespace vtsym
