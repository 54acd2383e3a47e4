// vtsym tree: the nodes of an expression as a drawing, as JSON or for Graphviz.
// Reads with the converters themselves, so that the tree shows what the reader made, before any rewriting.
#include "base/service/TruthTexts.hpp"
#include "parser/QuillConverterBlockVariants.hpp"
#include "parser/SymbolicExprParser.hpp"
#include "tools/vtsym/answers/TreeWriters.hpp"
#include "tools/vtsym/commands/Commands.hpp"
#include "tools/vtsym/io/Json.hpp"
#include "tools/vtsym/io/Texts.hpp"

namespace vtsym {

namespace {

constexpr const char* treeNotes =
    R"(Identifiers count the nodes of a text in the order in which they were made; false is 0 and true is 1.

Examples:
  vtsym tree 'Mode == 1 && Gear > 2'
  vtsym tree --json 'N+1'
  vtsym tree --dot 'N*2 + M' | dot -Tsvg > tree.svg)";

struct TreeOptions : TextOptions {
    bool dot = false;
};

VT::SymbolicExprId read(VT::SymbolicExprTable& table, const TreeOptions& options, const std::string& text) {
    if (const auto truth = VT::truthOfText(table, text))
        return *truth;
    if (!options.fromQuill())
        return VT::SymbolicExprParser(table, true, true)(text);
    VT::VTSymbolicExprErrorCheckerBlockVariants checker;
    return VT::SymbolicExprFromQParseTreeBlockVariants(table, checker)(text);
}

void answerTree(const TreeOptions& options, const Style& style, const std::string& text, std::string& out) {
    VT::SymbolicExprTable table;
    table.addBoolSymbols();
    const VT::SymbolicExprId root = read(table, options, text);
    if (options.json) {
        appendMember(out, "tree", "");
        appendJsonTree(table, root, out);
    } else if (options.dot) {
        appendDotGraph(table, root, out);
    } else {
        appendDrawing(table, root, style, out);
    }
}

} // namespace

void addTree(CommandLine& program) {
    Command& command = program.add("tree", "Show expressions as trees", treeNotes);
    const auto options = std::make_shared<TreeOptions>();
    addTextOptions(command, *options);
    command.addFlag("--dot", "Answer with graphs for Graphviz", options->dot);
    command.exclude("--dot", "--json");
    command.run = [options](Console& console) {
        const auto answerText = [&](const std::string& text, std::string& out) {
            answerTree(*options, console.outStyle(), text, out);
        };
        return answerTexts(*options, console, [&] { return Answering{answerText, !options->json}; });
    };
}

} // namespace vtsym
