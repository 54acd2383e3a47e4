// vtsym eval
#include "base/eval/Eval.hpp"
#include "base/core/Nodes.hpp"
#include "host/Numbers.hpp"
#include "tools/vtsym/Commands.hpp"
#include "tools/vtsym/Conditions.hpp"
#include "tools/vtsym/ErrorText.hpp"
#include "tools/vtsym/Json.hpp"
#include "tools/vtsym/Texts.hpp"

#include <utility>

namespace vtsym {

namespace {

constexpr const char* examples =
    R"(Integers have 32 bits: + - * wrap, / cuts and saturates.  A name that is defined twice has its last value, and a
value may name other definitions.

Examples:
  vtsym eval -D N=3 'N*2 + 1'
  vtsym eval -D 'N=M + 1' -D M=4 '[N, N*M]'
  vtsym eval -D s.gear=2 's.gear > 1 && !false'
  vtsym eval --json -D Rate=0.5 < expressions.txt)";

struct Definition {
    std::string name;
    std::string value;
};

struct EvalOptions : TextOptions {
    std::vector<Definition> definitions;
};

/// The two sides of NAME=VALUE, which stands with its first =.
Definition definitionOf(const std::string& assignment) {
    const std::size_t equals = assignment.find('=');
    if (equals == std::string::npos || equals == 0)
        throw CLI::ValidationError("-D", "'" + assignment + "' is not NAME=VALUE");
    return {assignment.substr(0, equals), assignment.substr(equals + 1)};
}

class Evaluator {
public:
    explicit Evaluator(const EvalOptions& options) : options_(options) {}

    void define();
    void answer(const std::string& text, std::string& out);

private:
    [[nodiscard]] VT::SymbolicExprTable& table() const { return conditions_.service().table(); }

    [[nodiscard]] VT::SymbolicExprId read(const std::string& text, const std::string& what) const;

    const EvalOptions& options_;
    Conditions conditions_;
};

/// Binds the definitions in the table.  Throws CLI::ValidationError for what is none.
void Evaluator::define() {
    for (const Definition& definition : options_.definitions) {
        const VT::SymbolicExprId name = read(definition.name, "the name '" + definition.name + "'");
        const VT::SymbolicExpr* const node = table().get(name);
        const bool isSymbol =
            node != nullptr && (node->op() == VT::SymbolicOp::String || node->op() == VT::SymbolicOp::MemberValue);
        if (!isSymbol || name == table().getIdTRUE() || name == table().getIdFALSE())
            throw CLI::ValidationError("-D", "'" + definition.name + "' is no name that can be given a value");
        if (definition.value.empty())
            throw CLI::ValidationError("-D", "'" + definition.name + "=' gives no value");
        table().registerValueId(name, read(definition.value, "the value of " + definition.name));
    }
}

VT::SymbolicExprId Evaluator::read(const std::string& text, const std::string& what) const {
    try {
        return conditions_.parse(options_, text);
    } catch (...) {
        throw CLI::ValidationError("-D", what + " cannot be read: " + currentTextError().message);
    }
}

/// A scalar as text; what JSON has no number for is named alike in both.
std::string scalarText(const VT::SymbolicScalar& scalar, bool json) {
    switch (scalar.type()) {
    case VT::ScalarType::Bool:
        return scalar.getBool() ? "true" : "false";
    case VT::ScalarType::Int:
        return std::to_string(scalar.getInt());
    default:
        break;
    }
    std::string text = jsonNumber(scalar.getDouble());
    if (!json && text.starts_with('"'))
        text = text.substr(1, text.size() - 2);
    return text;
}

std::string valueText(const VT::SymbolicValue& value, bool json) {
    if (!value.isVector())
        return scalarText(value.scalar(), json);
    std::string text = "[";
    for (const VT::SymbolicScalar& element : value.elements())
        text.append(text.size() > 1 ? "," : "").append(scalarText(element, json));
    return text + "]";
}

std::string_view typeText(const VT::SymbolicValue& value) {
    constexpr std::string_view names[] = {"bool", "int", "double"};
    return value.isVector() ? "vector" : names[value.scalar().index()];
}

void Evaluator::answer(const std::string& text, std::string& out) {
    if (conditions_.makeRoomFor(text))
        define();
    const VT::SymbolicValue value = VT::SymbolicExprEval(table()).eval(conditions_.parse(options_, text));
    if (options_.json) {
        appendMember(out, "type", jsonString(typeText(value)));
        appendMember(out, "value", valueText(value, true));
    } else {
        out.append(valueText(value, false));
    }
}

} // namespace

Command addEval(CLI::App& program) {
    CLI::App* const command = program.add_subcommand("eval", "Evaluate expressions");
    const auto options = std::make_shared<EvalOptions>();
    const auto evaluator = std::make_shared<std::optional<Evaluator>>();
    addTextOptions(*command, *options);
    command
        ->add_option_function<std::vector<std::string>>(
            "-D",
            [options](const std::vector<std::string>& assignments) {
                for (const std::string& assignment : assignments)
                    options->definitions.push_back(definitionOf(assignment));
            },
            "Give a symbol, or a member such as A.B, a value, which is an expression in the language of the texts")
        ->allow_extra_args(false)
        ->multi_option_policy(CLI::MultiOptionPolicy::TakeAll)
        ->type_name("NAME=VALUE");
    command->footer(examples);
    // Behind all options, because the language of the definitions is one.
    command->final_callback([options, evaluator] { evaluator->emplace(*options).define(); });
    return {command, [options, evaluator](Console& console) {
                const Answering answering{
                    [&](const std::string& text, std::string& out) { (*evaluator)->answer(text, out); }};
                return answerTexts(*options, console, answering);
            }};
}

} // namespace vtsym
