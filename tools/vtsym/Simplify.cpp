// vtsym simplify
#include "base/simplify/Simplify.hpp"
#include "base/core/Table.hpp"
#include "host/Text.hpp"
#include "tools/vtsym/Commands.hpp"
#include "tools/vtsym/Conditions.hpp"
#include "tools/vtsym/Json.hpp"
#include "tools/vtsym/Texts.hpp"

#include <algorithm>

namespace vtsym {

namespace {

constexpr const char* examples =
    R"(Conditions are over integers: every name stands for an integer, and what is not zero is true.

Examples:
  vtsym simplify 'Mode == 1 && Mode == 2'
  vtsym simplify --explain '!(A < 3) || A == 2'
  vtsym simplify --to quill 'a / b == 1 && x != 2'
  vtsym simplify --json < conditions.txt)";

// Of the conditions in an explanation: the beginning of a long one is shown, and of a very long one its length alone.
constexpr std::size_t shownBytes = 200;
constexpr std::size_t printedBytes = 20'000;

struct SimplifyOptions : TextOptions {
    bool explain = false;
};

/// Keeps the rules that fire.
class Firings : public VT::RuleListener {
public:
    void fired(const VT::RuleFiring& firing) override { firings.push_back(firing); }

    std::vector<VT::RuleFiring> firings;
};

class Simplifier {
public:
    Simplifier(const SimplifyOptions& options, const Style& style) : options_(options), style_(style) {}

    void answer(const std::string& text, std::string& out);

    [[nodiscard]] const std::vector<std::string>& warnings() const noexcept { return warnings_; }

private:
    std::string print(VT::SymbolicExprId condition);
    void answerInDetail(const std::string& text, std::string& out);
    [[nodiscard]] std::string step(VT::SymbolicExprId condition) const;
    void explain(std::string& out) const;
    void explainJson(std::string& out) const;

    const SimplifyOptions& options_;
    const Style& style_;
    Conditions conditions_;
    Firings firings_;
    std::vector<std::string> warnings_;
};

void Simplifier::answer(const std::string& text, std::string& out) {
    conditions_.makeRoomFor(text);
    if (options_.json || options_.explain)
        answerInDetail(text, out);
    else
        out.append(print(conditions_.simplify(options_, text)));
}

/// A result, with what there is to say of it.
std::string Simplifier::print(VT::SymbolicExprId condition) {
    warnings_ = conditions_.warnings(options_, condition);
    return conditions_.print(options_, condition);
}

/// Past the service's caches, which know results only.
void Simplifier::answerInDetail(const std::string& text, std::string& out) {
    firings_.firings.clear();
    VT::SymbolicExprSimplify& simplifier = conditions_.service().simplifier();
    simplifier.setListener(options_.explain ? &firings_ : nullptr);
    std::uint64_t passes = 0;
    const VT::SymbolicExprId condition = conditions_.parse(options_, text);
    const VT::SymbolicExprId simplified = simplifier.simplify(condition, passes);
    const std::string result = print(simplified);
    if (options_.json) {
        appendMember(out, "result", jsonString(result));
        appendMember(out, "passes", std::to_string(passes));
        if (options_.explain)
            explainJson(out);
    } else {
        out.append(style_.strong(step(condition))).append("\n");
        explain(out);
        if (simplified == condition && !firings_.firings.empty())
            out.append("  what this leads to is longer or beyond a limit, so the condition stays\n");
        out.append("= ").append(style_.good(result));
    }
}

/// A condition of an explanation; the beginning of a long one.
std::string Simplifier::step(VT::SymbolicExprId condition) const {
    const VT::SymbolicExprPrinter& printer = conditions_.service().simplifier().printer();
    if (const std::uint64_t bytes = printer.textLength(condition); bytes > printedBytes)
        return "(" + std::to_string(bytes) + " bytes of text)";
    return VT::shownText(conditions_.printAsItStands(condition, options_.toQuill()), shownBytes);
}

void Simplifier::explain(std::string& out) const {
    std::size_t width = 0;
    for (const VT::RuleFiring& firing : firings_.firings)
        width = std::max(width, firing.rule->name.size());
    std::uint64_t pass = 0;
    for (const VT::RuleFiring& firing : firings_.firings) {
        if (firing.pass != pass) {
            pass = firing.pass;
            out.append(style_.faint("pass " + std::to_string(pass))).append("\n");
        }
        out.append("  ").append(style_.name(firing.rule->name));
        out.append(width - firing.rule->name.size() + 2, ' ');
        out.append(step(firing.before)).append(style_.faint("  =>  ")).append(step(firing.after)).append("\n");
    }
    if (firings_.firings.empty())
        out.append("  no rule applies\n");
}

void Simplifier::explainJson(std::string& out) const {
    std::string steps;
    for (const VT::RuleFiring& firing : firings_.firings) {
        steps.append(steps.empty() ? "{\"pass\":" : ",{\"pass\":").append(std::to_string(firing.pass));
        appendMember(steps, "rule", jsonString(firing.rule->name));
        appendMember(steps, "before", jsonString(step(firing.before)));
        appendMember(steps, "after", jsonString(step(firing.after)));
        steps.append("}");
    }
    appendMember(out, "steps", "[" + steps + "]");
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
                Simplifier simplifier(*options, console.dataStyle());
                const Answering answering{
                    [&](const std::string& text, std::string& out) { simplifier.answer(text, out); },
                    options->explain && !options->json, &simplifier.warnings()};
                return answerTexts(*options, console, answering);
            }};
}

} // namespace vtsym
