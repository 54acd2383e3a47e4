// vtsym given: conditions shortened under a condition that is known to hold.
// The result is proven equal wherever the known condition holds.
#include "tools/vtsym/answers/ReasonText.hpp"
#include "tools/vtsym/commands/Commands.hpp"
#include "tools/vtsym/commands/Pairs.hpp"
#include "tools/vtsym/io/Json.hpp"

namespace vtsym {

namespace {

constexpr const char* givenNotes =
    R"(The answer is proven equal to the condition wherever the known one holds; elsewhere it may differ.

Examples:
  vtsym given 'VERSION >= 3' 'VERSION >= 4 && VERSION >= 2'
  vtsym given --to quill '!A' 'A || B != 1'
  vtsym given --why 'VERSION >= 3 && NET' 'VERSION >= 2 && TLS'
  vtsym given --json < pairs.txt)";

struct Shortener {
    explicit Shortener(const PairOptions& given) : options(given), conditions(given.bits32, given, given.assumptions) {}

    void answer(const std::string& text, std::string& out) {
        conditions.makeRoomFor(text);
        const ConditionPair pair = readPair(conditions, options, text);
        const VT::SymbolicExprId result = conditions.shortestGiven(options, pair.second, pair.first);
        const std::string printed = conditions.print(options, result);
        warnings = conditions.warnings(options, result);
        const VT::ShorteningReasons reasons =
            options.why ? conditions.service().explainImpliedCondition(pair.second, result, pair.first)
                        : VT::ShorteningReasons{};
        if (!options.json) {
            out.append(printed);
            if (reasons.because.isProven)
                appendReasons(conditions, options, reasons, out);
            return;
        }
        appendMember(out, "known", jsonString(pair.firstText));
        appendMember(out, "condition", jsonString(pair.secondText));
        appendMember(out, "result", jsonString(printed));
        if (reasons.because.isProven)
            appendReasonsJson(conditions, options, reasons, out);
    }

    const PairOptions& options;
    Conditions conditions;
    std::vector<std::string> warnings;
};

} // namespace

void addGiven(CommandLine& program) {
    Command& command = program.add("given", "Shorten conditions under a condition that is known to hold", givenNotes);
    const auto options = std::make_shared<PairOptions>();
    addPairOptions(command, *options, "KNOWN", "CONDITION");
    addLanguageOption(command, *options);
    command.run = [options](Console& console) {
        return answerTexts(*options, console, [&] {
            Answering answering = answeringBy(std::make_shared<Shortener>(*options));
            answering.writesInput = true;
            return answering;
        });
    };
}

} // namespace vtsym
