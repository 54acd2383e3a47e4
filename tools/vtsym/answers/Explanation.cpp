// Listens to the simplifier while it runs and prints each firing.  Conditions on the way are cut to a line: a shared
// graph of a few nodes can have a text of gigabytes.
#include "tools/vtsym/answers/Explanation.hpp"

#include "base/core/Table.hpp"
#include "host/Text.hpp"
#include "tools/vtsym/answers/NodeText.hpp"
#include "tools/vtsym/io/Json.hpp"

#include <algorithm>

namespace vtsym {

namespace {

constexpr std::size_t shownConditionBytes = 200; ///< of a condition on the way

/// Records the rules that fire during its life.
class Listener : public VT::RuleListener {
public:
    Listener(VT::SymbolicExprSimplify& simplifier, std::vector<VT::RuleFiring>& firings)
        : simplifier_(simplifier),
          firings_(firings) {
        simplifier_.setListener(this);
    }

    Listener(const Listener&) = delete;
    Listener& operator=(const Listener&) = delete;

    ~Listener() override { simplifier_.setListener(nullptr); }

    void fired(const VT::RuleFiring& firing) override { firings_.push_back(firing); }

private:
    VT::SymbolicExprSimplify& simplifier_;
    std::vector<VT::RuleFiring>& firings_;
};

std::string counted(std::uint64_t count, const char* what) {
    return std::to_string(count) + " " + what + (count == 1 ? "" : "s");
}

} // namespace

Explanation::Explanation(const Conditions& conditions, const TextOptions& options, VT::SymbolicExprId condition,
                         bool withRules)
    : conditions_(conditions),
      options_(options),
      condition_(condition) {
    VT::SymbolicExprSimplify& simplifier = conditions.service().simplifier();
    std::optional<Listener> listener;
    if (withRules)
        listener.emplace(simplifier, firings_);
    result_ = simplifier.simplify(condition, passes_);
}

void Explanation::shorten() {
    shortest_ = conditions_.shortest(options_, condition_, &forms_);
}

std::string Explanation::resultText() const {
    return shortest_ ? conditions_.printShortest(options_, *shortest_, condition_)
                     : conditions_.print(options_, result_);
}

/// The text of a condition on the way, cut where it is long.
std::string Explanation::step(VT::SymbolicExprId condition) const {
    const VT::SymbolicExprPrinter& printer = conditions_.service().simplifier().printer();
    if (const std::uint64_t bytes = printer.textLength(condition); bytes > printedBytes)
        return lengthOfText(bytes);
    return VT::shownText(conditions_.printUnconverted(condition, options_.toQuill()), shownConditionBytes);
}

void Explanation::appendText(const Style& style, std::string& out) const {
    out.append(style.strong(step(condition_))).append("\n");
    appendSteps(style, out);
    if (firings_.empty())
        out.append("  no rule applies\n");
    else if (result_ == condition_)
        out.append("  the result is longer or a limit was reached, so the condition stays\n");
    if (shortest_)
        appendForms(style, out);
    out.append("= ").append(style.good(resultText()));
}

/// Appends the result of the rules and the forms that were considered instead, the shortest first.
void Explanation::appendForms(const Style& style, std::string& out) const {
    if (result_ != condition_)
        out.append(style.faint("normal form")).append("\n  ").append(step(result_)) += '\n';
    if (!forms_.empty())
        out.append(style.faint("shortest form")) += '\n';
    std::size_t width = 0;
    for (const VT::ShortForm& form : forms_)
        width = std::max(width, form.way.size());
    for (const VT::ShortForm& form : forms_) {
        out.append("  ").append(style.name(form.way)).append(width - form.way.size() + 2, ' ').append(step(form.form));
        out.append(style.faint("  " + counted(form.comparisons, "comparison") + ", " + counted(form.bytes, "byte") +
                               (form.chosen ? ", proven equal" : "")));
        out += '\n';
    }
    const bool isChosen = std::ranges::any_of(forms_, &VT::ShortForm::chosen);
    if (!isChosen && *shortest_ != result_)
        out.append("  no shorter form is proven equal, so the condition stays\n");
}

void Explanation::appendSteps(const Style& style, std::string& out) const {
    std::size_t width = 0;
    for (const VT::RuleFiring& firing : firings_)
        width = std::max(width, firing.rule->name.size());
    std::uint64_t pass = 0;
    for (const VT::RuleFiring& firing : firings_) {
        if (firing.pass != pass) {
            pass = firing.pass;
            out.append(style.faint("pass " + std::to_string(pass))).append("\n");
        }
        out.append("  ").append(style.name(firing.rule->name));
        out.append(width - firing.rule->name.size() + 2, ' ');
        out.append(step(firing.before)).append(style.faint("  =>  ")).append(step(firing.after)).append("\n");
    }
}

std::string Explanation::json() const {
    std::string steps;
    for (const VT::RuleFiring& firing : firings_) {
        steps.append(steps.empty() ? "{\"pass\":" : ",{\"pass\":").append(std::to_string(firing.pass));
        appendMember(steps, "rule", jsonString(firing.rule->name));
        appendMember(steps, "before", jsonString(step(firing.before)));
        appendMember(steps, "after", jsonString(step(firing.after)));
        steps.append("}");
    }
    for (const VT::ShortForm& form : forms_) {
        steps.append(steps.empty() ? "{" : ",{").append(R"("form":)").append(jsonString(step(form.form)));
        appendMember(steps, "way", jsonString(std::string(form.way)));
        appendMember(steps, "comparisons", std::to_string(form.comparisons));
        appendMember(steps, "bytes", std::to_string(form.bytes));
        appendMember(steps, "chosen", form.chosen ? "true" : "false");
        steps.append("}");
    }
    return "[" + steps + "]";
}

} // namespace vtsym
