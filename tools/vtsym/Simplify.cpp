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
Quotients of a condition are truncated, as in C; dimensions, such as N/2*2, divide exactly.

Examples:
  vtsym simplify 'Mode == 1 && Mode == 2'
  vtsym simplify --strong 'A<B && B<C && A<C'
  vtsym simplify --explain '!(A < 3) || A == 2'
  vtsym simplify --to quill 'a / b == 1 && x != 2'
  vtsym simplify --json < conditions.txt)";

struct SimplifyOptions : TextOptions {
    bool explain = false;
    bool strong = false;
    bool bits32 = false;
};

class Simplifier {
public:
    Simplifier(const SimplifyOptions& options, const Style& style)
        : options_(options),
          style_(style),
          conditions_(options.bits32) {}

    void answer(const std::string& text, std::string& out);

    [[nodiscard]] const std::vector<std::string>& warnings() const noexcept { return warnings_; }

private:
    [[nodiscard]] VT::SymbolicExprId strengthened(VT::SymbolicExprId result) const;
    VT::SymbolicExprId answerInDetail(const std::string& text, std::string& out) const;

    const SimplifyOptions& options_;
    const Style& style_;
    Conditions conditions_;
    std::vector<std::string> warnings_;
};

void Simplifier::answer(const std::string& text, std::string& out) {
    conditions_.makeRoomFor(text);
    VT::SymbolicExprId result = 0;
    if (options_.json || options_.explain) {
        result = answerInDetail(text, out);
    } else {
        result = strengthened(conditions_.simplify(options_, text));
        out.append(conditions_.print(options_, result));
    }
    warnings_ = conditions_.warnings(options_, result);
}

/// With --strong: true, false or a shorter form that is proven equal, where there is one.
VT::SymbolicExprId Simplifier::strengthened(VT::SymbolicExprId result) const {
    VT::VCService& service = conditions_.service();
    return options_.strong ? service.getImpliedCondition(result, service.table().getIdTRUE()).id() : result;
}

/// Past the service's caches, which know results only.
VT::SymbolicExprId Simplifier::answerInDetail(const std::string& text, std::string& out) const {
    Explanation explanation(conditions_, options_, conditions_.parse(options_, text), options_.explain);
    explanation.prove(strengthened(explanation.result()));
    if (!options_.json) {
        explanation.appendText(style_, out);
        return explanation.result();
    }
    appendMember(out, "result", jsonString(conditions_.print(options_, explanation.result())));
    appendMember(out, "passes", std::to_string(explanation.passes()));
    if (options_.explain)
        appendMember(out, "steps", explanation.json());
    return explanation.result();
}

} // namespace

Command addSimplify(CLI::App& program) {
    CLI::App* const command = program.add_subcommand("simplify", "Simplify conditions");
    const auto options = std::make_shared<SimplifyOptions>();
    addTextOptions(*command, *options);
    addLanguageOption(*command, *options);
    command->add_flag("--explain", options->explain, "Show the rules that fired, pass by pass");
    command->add_flag("--strong", options->strong,
                      "Then decide: answer true, false or a shorter condition where it is proven equal");
    addBitsOption(*command, options->bits32);
    command->footer(examples);
    return {
        command, [options](Console& console) {
            Simplifier simplifier(*options, console.dataStyle());
            const auto answer = [&](const std::string& text, std::string& out) { simplifier.answer(text, out); };
            return answerTexts(*options, console, {answer, options->explain && !options->json, &simplifier.warnings()});
        }};
}

} // namespace vtsym
