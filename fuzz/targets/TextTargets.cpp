// Texts of both languages.
#include "base/print/ExpressionPrinter.hpp"
#include "base/transform/QuillConversion.hpp"
#include "fuzz/Choices.hpp"
#include "fuzz/Targets.hpp"
#include "fuzz/targets/All.hpp"
#include "parser/QuillConverterBlockVariants.hpp"
#include "tests/support/Parsing.hpp"

#include <string>
#include <utility>

namespace VT::Fuzz {

namespace {

/// Reading and printing `text` again gives `text`, or a shorter one: a table has one node for the zeros of both signs,
/// so that each reading takes a minus from `-(-0.0)` where 0.0 came first.
template <class ReadAndPrint>
void demandSettled(std::string text, ReadAndPrint readAndPrint) {
    constexpr int rounds = 4; // enough for what is not that zero; a text of many minuses would be read many times
    for (int round = 0; round < rounds; ++round) {
        std::string next = readAndPrint(text);
        if (next == text)
            return;
        demand(next.size() < text.size() && text.find("-0.0") != std::string::npos, "a printed text settles",
               text + "\n" + next);
        text = std::move(next);
    }
}

/// What a converter makes of a Quill text prints as a text that no longer changes.
template <class Converter, class Checker>
void convertQuill(const std::string& text) {
    SymbolicExprTable table;
    Checker checker;
    Converter convert(table, checker);
    convert.enableDiagnostics();
    SymbolicExprId id = invalidId;
    try {
        id = convert(text);
    } catch (const HostDiagnostic& diagnostic) {
        demand(!diagnostic.messageId().empty(), "a report has an identifier");
        return;
    }
    if (id == invalidId)
        return;
    demand(table.has(id), "the result of a conversion is a node");
    const SymbolicExprPrinter printer(table, true, false);
    const auto print = [&](SymbolicExprId shape) { return printer(SymbolicExprC2Q(table)(shape)); };
    const std::string first = print(id);
    SymbolicExprId again = invalidId;
    try {
        again = convert(first);
    } catch (const HostDiagnostic& diagnostic) {
        demand(false, "what is printed is read", first + ": " + diagnostic.messageId());
    }
    demand(table.has(again), "what is printed is read", first);
    demandSettled(print(again), [&](const std::string& printed) { return print(convert(printed)); });
}

} // namespace

void fuzzCGrammar(Input input) {
    Choices choices(input);
    const std::uint8_t flags = choices.byte();
    const bool cOperators = (flags & 1U) != 0;
    const bool keywords = (flags & 2U) != 0;
    std::string text;
    while (!choices.areUsedUp())
        text += static_cast<char>(choices.byte());
    SymbolicExprTable table;
    const Testing::ParseAnswer answer = Testing::parse(table, text, cOperators, keywords);
    if (answer.error) {
        demand(answer.error->offset().value() <= text.size(), "a parse error is within the text");
        demand(table.size() == 0, "nothing is interned for a text that is refused");
        return;
    }
    demand(table.has(answer.id), "the result of a parse is a node");
    const std::size_t size = table.size();
    demand(Testing::parse(table, text, cOperators, keywords).id == answer.id && table.size() == size,
           "one text is one node");
    const std::string printed = SymbolicExprPrinter(table, false, false)(answer.id);
    const Testing::ParseAnswer again = Testing::parse(table, printed, true, keywords);
    demand(!again.error, "what is printed is read", printed);
    // Minus before a literal belongs to it from the first reading on.
    const SymbolicExprPrinter print(table, false, false);
    demandSettled(print(again.id),
                  [&](const std::string& one) { return print(Testing::parse(table, one, true, keywords).id); });
}

void fuzzQuillDimensions(Input input) {
    convertQuill<SymbolicExprFromQParseTree, VTSymbolicExprErrorChecker>(Choices(input).text());
}

void fuzzQuillConditions(Input input) {
    convertQuill<SymbolicExprFromQParseTreeBlockVariants, VTSymbolicExprErrorCheckerBlockVariants>(
        Choices(input).text());
}

} // namespace VT::Fuzz
