// vtsym eval: values of expressions, with definitions for their names.
// The definitions are bound again whenever the service is renewed.
#include "base/eval/Eval.hpp"
#include "base/transform/DimensionLists.hpp"
#include "tools/vtsym/answers/Conditions.hpp"
#include "tools/vtsym/answers/ValueText.hpp"
#include "tools/vtsym/commands/Commands.hpp"
#include "tools/vtsym/commands/Definitions.hpp"
#include "tools/vtsym/io/Json.hpp"
#include "tools/vtsym/io/Texts.hpp"

#include <memory>

namespace vtsym {

namespace {

constexpr const char* evalNotes =
    R"(Integers have 32 bits: + - * wrap, / truncates and saturates.  The last definition of a name counts, and a value may use
other definitions.

Examples:
  vtsym eval -D N=3 'N*2 + 1'
  vtsym eval -D 'N=M + 1' -D M=4 '[N, N*M]'
  vtsym eval -D s.gear=2 's.gear > 1 && !false'
  vtsym eval --json -D Rate=0.5 < expressions.txt)";

struct EvalOptions : TextOptions {
    Definitions definitions;
};

class Evaluator {
public:
    explicit Evaluator(const EvalOptions& options) : options_(options) {}

    void define();
    void begin(std::uint64_t steps);
    void answer(const std::string& text, std::string& out);

    Conditions conditions;

private:
    [[nodiscard]] VT::SymbolicExprTable& table() const { return conditions.service().table(); }

    /// A list in Quill is written as a matrix.
    [[nodiscard]] VT::SymbolicExprId read(const std::string& text) const {
        return VT::SymbolicExprDimensionLists(table())(conditions.parse(options_, text));
    }

    const EvalOptions& options_;
};

void Evaluator::begin(std::uint64_t steps) {
    if (conditions.begin(steps))
        define();
}

void Evaluator::define() {
    bindDefinitions(table(), options_.definitions, [this](const std::string& text) { return read(text); });
}

void Evaluator::answer(const std::string& text, std::string& out) {
    if (conditions.makeRoomFor(text))
        define();
    const VT::SymbolicValue value = VT::SymbolicExprEval(table()).eval(read(text));
    if (options_.json) {
        appendMember(out, "type", jsonString(typeText(value)));
        appendMember(out, "value", valueText(value, true));
    } else {
        out.append(valueText(value, false));
    }
}

} // namespace

void addEval(CommandLine& program) {
    Command& command = program.add("eval", "Evaluate expressions", evalNotes);
    const auto options = std::make_shared<EvalOptions>();
    addTextOptions(command, *options);
    addDefinitions(command, options->definitions);
    // After all options: --from is the language of the definitions too.
    command.afterOptions = [options] { Evaluator(*options).define(); };
    command.run = [options](Console& console) {
        return answerTexts(*options, console, [&] {
            const auto evaluator = std::make_shared<Evaluator>(*options);
            evaluator->define();
            Answering answering = answeringBy(evaluator);
            answering.begin = [evaluator](std::uint64_t steps) { evaluator->begin(steps); };
            return answering;
        });
    };
}

} // namespace vtsym
