// vtsym dims: dimension expressions in the forms that the host works with: integers, simplified, divisions pulled out.
// Each text has a table of its own, in which the definitions are bound again.
#include "base/core/Nodes.hpp"
#include "base/core/Walk.hpp"
#include "base/decide/DimensionProofs.hpp"
#include "base/decide/external/SolverPlugin.hpp"
#include "base/decide/reasons/ReasonSearch.hpp"
#include "base/eval/Eval.hpp"
#include "base/service/VCSymbols.hpp"
#include "base/simplify/Simplify.hpp"
#include "base/transform/Cast2Int.hpp"
#include "base/transform/FactorDivision.hpp"
#include "host/Diagnostics.hpp"
#include "parser/QuillConverter.hpp"
#include "parser/SymbolicExprParser.hpp"
#include "tools/vtsym/answers/ValueText.hpp"
#include "tools/vtsym/commands/Commands.hpp"
#include "tools/vtsym/commands/Definitions.hpp"
#include "tools/vtsym/findings/UndecidedText.hpp"
#include "tools/vtsym/io/CommandLine.hpp"
#include "tools/vtsym/io/Json.hpp"
#include "tools/vtsym/io/Texts.hpp"

#include <cmath>
#include <optional>
#include <string_view>

namespace vtsym {

namespace {

constexpr const char* dimsNotes =
    R"(Each answer has a line for every form: the text with integers for its numbers, the simplified form, and that form with
its divisions pulled outwards; then the symbols and, if all of them are defined, the value.  Divisions are taken to be
exact.

Examples:
  vtsym dims 'N*2 + N/3'
  vtsym dims -D N=6 -D 'M=N - 1' '[N/2 + M/3, 4]'
  vtsym dims --assume 'N >= 1 && N <= 64 && N % 4 == 0' --prove 'N*2 >= 8'
  vtsym dims --json < dimensions.txt)";

struct DimsOptions : TextOptions {
    Definitions definitions;
    std::vector<std::string> assumptions;
    std::vector<std::string> claims;
};

/// A dimension expression, as written.  Throws the first diagnostic of the reader.
VT::SymbolicExprId readUncast(VT::SymbolicExprTable& table, const std::string& text) {
    VT::VTSymbolicExprErrorChecker checker;
    const VT::SymbolicExprId id = VT::SymbolicExprFromQParseTree(table, checker)(text);
    if (!checker.diagnostics().empty())
        throw VT::HostDiagnostic(checker.diagnostics().front());
    return id;
}

/// The same with integers for its numbers.
VT::SymbolicExprId readDimension(VT::SymbolicExprTable& table, const std::string& text) {
    return VT::SymbolicExprCast2Int(table).cast2Int(readUncast(table, text));
}

/// A sentence for each number that its integer is far from, since dimensions have 32 bits.
std::vector<std::string> tooLarge(const VT::SymbolicExprTable& table, VT::SymbolicExprId uncast) {
    constexpr double beyond = 2147483648.0;
    const VT::SymbolicExprPrinter printer(table, true);
    std::vector<std::string> sentences;
    VT::walkDistinct(
        table, uncast,
        [&](VT::SymbolicExprId id, const VT::SymbolicExpr& node) {
            if (node.op() != VT::SymbolicOp::DoubleValue)
                return;
            const double rounded = std::round(static_cast<const VT::SymbolicDoubleValue&>(node).getValue());
            if (!(rounded >= -beyond && rounded < beyond))
                sentences.push_back(printer(id) +
                                    " is not an integer of 32 bits, as dimensions are: it becomes -2147483648");
        },
        [](VT::SymbolicExprId) {});
    return sentences;
}

void define(VT::SymbolicExprTable& table, const DimsOptions& options) {
    table.addBoolSymbols();
    bindDefinitions(table, options.definitions,
                    [&table](const std::string& text) { return readDimension(table, text); });
}

std::vector<std::string> symbolsOf(const VT::SymbolicExprTable& table, VT::SymbolicExprId id) {
    using enum VT::VCSymbolType;
    std::vector<std::string> symbols;
    VT::VCSymbolsOfSymbolicExpr(table, {Identifier, BoundMember, UnboundMember}).getSymbols(id, symbols);
    std::erase_if(symbols, [](const std::string& name) { return name == "true" || name == "false"; });
    return symbols;
}

/// The value, or nullopt where a symbol has no value.
std::optional<VT::SymbolicValue> valueOf(const VT::SymbolicExprTable& table, VT::SymbolicExprId id) {
    std::vector<VT::SymbolicExprId> unbound;
    VT::VCSymbolsOfSymbolicExpr(table, {VT::VCSymbolType::UnboundMember}).getSymbolIds(id, unbound);
    if (!unbound.empty())
        return std::nullopt;
    try {
        return VT::SymbolicExprEval(table).eval(id);
    } catch (const VT::HostDiagnostic& diagnostic) {
        if (diagnostic.messageId() != "Vantor:SymbolicDims:UnboundSymbol")
            throw;
        return std::nullopt;
    }
}

/// Appends the lines, or the JSON members, of one answer.
class Report {
public:
    Report(std::string& out, bool json, const Style& style) : out_(out), json_(json), style_(style) {}

    void text(std::string_view name, const std::string& text) {
        json_ ? member(name, jsonString(text)) : line(name, text);
    }

    void list(std::string_view name, const std::vector<std::string>& texts) {
        std::string list;
        for (const std::string& text : texts)
            list.append(list.empty() ? "" : json_ ? "," : ", ").append(json_ ? jsonString(text) : text);
        if (json_)
            member(name, "[" + list + "]");
        else if (!texts.empty())
            line(name, list);
    }

    void value(const VT::SymbolicValue& value) {
        if (json_)
            member("type", jsonString(typeText(value)));
        json_ ? member("value", valueText(value, true)) : line("value", style_.good(valueText(value, false)));
    }

private:
    static constexpr std::size_t nameColumns = 12;

    void member(std::string_view name, std::string_view value) { appendMember(out_, name, value); }

    void line(std::string_view name, std::string_view text) {
        out_.append(begun_ ? "\n" : "").append(style_.name(name));
        out_.append(nameColumns - name.size(), ' ').append(text);
        begun_ = true;
    }

    std::string& out_;
    bool json_;
    const Style& style_;
    bool begun_ = false;
};

void answerDimension(const DimsOptions& options, const Style& style, const std::string& text, std::string& out,
                     std::vector<std::string>& warnings) {
    VT::SymbolicExprTable table;
    define(table, options);
    const VT::SymbolicExprId uncast = readUncast(table, text);
    warnings = tooLarge(table, uncast);
    const VT::SymbolicExprId cast = VT::SymbolicExprCast2Int(table).cast2Int(uncast);
    const std::optional<VT::SymbolicValue> value = valueOf(table, cast);
    std::uint64_t passes = 0;
    const VT::SymbolicExprId simplified = VT::SymbolicExprSimplify(table).simplify(cast, passes);
    const VT::SymbolicExprPrinter printer(table, true);
    Report report(out, options.json, style);
    report.text("cast", printer(cast));
    report.text("simplified", printer(simplified));
    report.text("factored", printer(VT::SymbolicExprFactorDivision(table).factorDivision(simplified)));
    report.list("symbols", symbolsOf(table, cast));
    if (value)
        report.value(*value);
}

/// Throws UsageError for an assumption that cannot be read.
void assume(VT::SymbolicExprTable& table, const DimsOptions& options, VT::Assumptions& assumptions) {
    for (const std::string& text : options.assumptions) {
        try {
            assumptions.add(VT::SymbolicExprParser(table, true, true)(text));
        } catch (const VT::HostDiagnostic& diagnostic) {
            throw UsageError("--assume", quotedArgument(text) + " cannot be read: " + diagnostic.what());
        }
    }
    VT::Decider decider(table);
    if (VT::ReasonSearch(table, decider).whyNever(assumptions.all()).isProven)
        throw UsageError("--assume", "the conditions contradict each other");
}

/// Answers whether claims hold wherever the assumptions do; returns whether all are decided.
bool prove(const DimsOptions& options, Console& console) {
    VT::SymbolicExprTable table;
    define(table, options);
    VT::Assumptions assumptions(table);
    assume(table, options, assumptions);
    VT::Budget budget(VT::limits::commandSteps);
    VT::Decider decider(table, {.solver = &VT::SolverPlugin::installed()});
    decider.share(&budget);
    VT::DimensionProofs proofs(table, decider, assumptions);
    bool isDecided = true;
    for (const std::string& text : options.claims) {
        VT::SymbolicExprId claim = VT::invalidId;
        try {
            claim = VT::SymbolicExprParser(table, true, true)(text);
        } catch (const VT::HostDiagnostic& diagnostic) {
            throw UsageError("--prove", quotedArgument(text) + " cannot be read: " + diagnostic.what());
        }
        const VT::Decision decision = proofs.holds(claim);
        isDecided = isDecided && !decision.isUndecided();
        const char* const answer = decision.isYes() ? "proven" : decision.isNo() ? "refuted" : "undecided";
        std::string witness;
        std::string json;
        for (const VT::UnknownValue& each : decision.witness.value_or(VT::Witness{})) {
            const std::string name = decider.nameOf(each.unknown);
            witness.append(witness.empty() ? ": " : ", ").append(name).append("=").append(std::to_string(each.value));
            json.append(json.empty() ? "" : ",")
                .append(jsonString(name))
                .append(":")
                .append(std::to_string(each.value));
        }
        const std::string reason =
            decision.isUndecided() ? "it " + undecidedText(decision.bound, budget.left() == 0) : "";
        if (!options.json) {
            std::string line = answer;
            line.append(reason.empty() ? "" : ": ").append(reason).append(witness).append("\n");
            console.out(line);
            continue;
        }
        std::string out = "{\"claim\":" + jsonString(text);
        appendMember(out, "answer", jsonString(answer));
        if (!reason.empty())
            appendMember(out, "reason", jsonString(reason));
        if (decision.witness)
            appendMember(out, "witness", "{" + json + "}");
        console.out(out + "}\n");
    }
    console.flush();
    return isDecided;
}

} // namespace

void addDims(CommandLine& program) {
    Command& command = program.add("dims", "Rearrange and evaluate dimension expressions in Quill", dimsNotes);
    const auto options = std::make_shared<DimsOptions>();
    addTexts(command, *options);
    addDefinitions(command, options->definitions);
    addAssumeOption(command, options->assumptions);
    command.addArguments({"--prove", "Prove or refute a comparison of dimensions, in C; may be repeated", "CLAIM"},
                         [options](std::vector<std::string> claims) { options->claims = std::move(claims); });
    command.afterOptions = [options] {
        VT::SymbolicExprTable table; // reports wrong definitions before any text is answered
        define(table, *options);
        VT::Assumptions assumptions(table);
        assume(table, *options, assumptions);
        if (options->claims.empty() && !options->assumptions.empty())
            throw UsageError("--assume", "nothing is proven; add --prove");
    };
    command.run = [options](Console& console) -> ExitStatus {
        if (!options->claims.empty())
            return prove(*options, console);
        return answerTexts(*options, console, [&] {
            const auto warnings = std::make_shared<std::vector<std::string>>();
            const auto answerText = [&, warnings](const std::string& text, std::string& out) {
                answerDimension(*options, console.outStyle(), text, out, *warnings);
            };
            return Answering{answerText, !options->json, warnings.get()};
        });
    };
}

} // namespace vtsym
