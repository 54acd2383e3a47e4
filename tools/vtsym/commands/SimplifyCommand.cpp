// vtsym simplify: the shortest form of a condition that is proven equal, or its sum of products.
// Explanations and JSON count passes, so they bypass the caches of the service.
#include "tools/vtsym/answers/Conditions.hpp"
#include "tools/vtsym/answers/Explanation.hpp"
#include "tools/vtsym/answers/ReasonText.hpp"
#include "tools/vtsym/commands/Commands.hpp"
#include "tools/vtsym/io/Json.hpp"
#include "tools/vtsym/io/Texts.hpp"

namespace vtsym {

namespace {

constexpr const char* simplifyNotes =
    R"(Every name stands for an integer of any size, and every value but zero is true.  Quotients in conditions are truncated, as
in C; in dimensions, such as N/2*2, they are exact.

The answer is the shortest form found that is proven equal: fewest comparisons, then fewest bytes, and never longer than
the condition as printed.  With --normal-form it is the sum of products that the rules lead to.  A number, such as 2+3,
stays a number.

Examples:
  vtsym simplify 'Mode == 1 && Mode == 2'
  vtsym simplify 'A<B && B<C && A<C'
  vtsym simplify --explain '!(A < 3) || A == 2'
  vtsym simplify --normal-form '(A || B) && C'
  vtsym simplify --to quill 'a / b == 1 && x != 2'
  vtsym simplify --assume 'VERSION >= 3' 'VERSION >= 2 && TLS || VERSION < 1'
  vtsym simplify --why --assume 'VERSION >= 3' 'VERSION >= 2 && TLS'
  vtsym simplify --json < conditions.txt)";

struct SimplifyOptions : TextOptions {
    bool explain = false;
    bool normalForm = false;
    bool why = false;
    bool bits32 = false;
    std::vector<std::string> assumptions;
};

class Simplifier {
public:
    Simplifier(const SimplifyOptions& options, const Style& style)
        : conditions(options.bits32, options, options.assumptions),
          options_(options),
          style_(style) {}

    void answer(const std::string& text, std::string& out);

    Conditions conditions;
    std::vector<std::string> warnings;

private:
    VT::SymbolicExprId answerInDetail(const std::string& text, std::string& out) const;
    void explainShorter(VT::SymbolicExprId condition, VT::SymbolicExprId result, std::string& out) const;

    const SimplifyOptions& options_;
    const Style& style_;
};

void Simplifier::answer(const std::string& text, std::string& out) {
    conditions.makeRoomFor(text);
    VT::SymbolicExprId result = 0;
    if (options_.json || options_.explain) {
        result = answerInDetail(text, out);
    } else {
        const VT::SymbolicExprId condition =
            options_.normalForm ? conditions.simplify(options_, text) : conditions.parse(options_, text);
        result = options_.normalForm ? condition : conditions.shortest(options_, condition);
        out.append(options_.normalForm ? conditions.print(options_, result)
                                       : conditions.printShortest(options_, result, condition));
    }
    warnings = conditions.warnings(options_, result);
    if (options_.why)
        explainShorter(conditions.parse(options_, text), result, out);
}

/// Appends which operands went, and why; nothing where the condition stays as it is.
void Simplifier::explainShorter(VT::SymbolicExprId condition, VT::SymbolicExprId result, std::string& out) const {
    VT::VCService& service = conditions.service();
    const VT::ShorteningReasons reasons =
        condition == result ? VT::ShorteningReasons{}
                            : service.explainImpliedCondition(condition, result, service.table().getIdTRUE());
    if (!reasons.because.isProven)
        return;
    if (options_.json)
        appendReasonsJson(conditions, options_, reasons, out);
    else
        appendReasons(conditions, options_, reasons, out);
}

/// Bypasses the caches of the service, which keep only results.
VT::SymbolicExprId Simplifier::answerInDetail(const std::string& text, std::string& out) const {
    Explanation explanation(conditions, options_, conditions.parse(options_, text), options_.explain);
    if (!options_.normalForm)
        explanation.shorten();
    if (!options_.json) {
        explanation.appendText(style_, out);
        return explanation.result();
    }
    appendMember(out, "result", jsonString(explanation.resultText()));
    appendMember(out, "passes", std::to_string(explanation.passes()));
    if (options_.explain)
        appendMember(out, "steps", explanation.json());
    return explanation.result();
}

} // namespace

void addSimplify(CommandLine& program) {
    Command& command = program.add("simplify", "Find the shortest equal form of conditions", simplifyNotes);
    const auto options = std::make_shared<SimplifyOptions>();
    addTextOptions(command, *options);
    addLanguageOption(command, *options);
    command.addFlag("--explain", "Show the rules that fired, pass by pass, and how the shortest form was reached",
                    options->explain);
    command.addFlag("--normal-form", "Answer with the sum of products instead", options->normalForm);
    command.addFlag("--why", "Say which operands went, and which assumptions or other operands make them redundant",
                    options->why);
    addBitsOption(command, options->bits32);
    addAssumeOption(command, options->assumptions);
    command.exclude("--normal-form", "--assume");
    command.exclude("--why", "--normal-form");
    command.exclude("--why", "--explain");
    command.afterOptions = [options] {
        const Conditions checked(options->bits32, *options, options->assumptions); // before any text is answered
    };
    command.run = [options](Console& console) {
        return answerTexts(*options, console, [&] {
            Answering answering = answeringBy(std::make_shared<Simplifier>(*options, console.outStyle()));
            answering.inBlocks = options->explain && !options->json;
            return answering;
        });
    };
}

} // namespace vtsym
