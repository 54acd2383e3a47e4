// Writes a Graphviz digraph: one vertex for each distinct node, so that the size is linear in the nodes of the graph,
// not in the paths through it.
#include "base/core/Walk.hpp"
#include "tools/vtsym/answers/NodeText.hpp"
#include "tools/vtsym/answers/TreeWriters.hpp"

namespace vtsym {

namespace {

std::string quoted(const std::string& text) {
    std::string result = "\"";
    for (const char c : text) {
        if (c == '"' || c == '\\')
            result += '\\';
        result += c;
    }
    return result + "\"";
}

} // namespace

void appendDotGraph(const VT::SymbolicExprTable& table, VT::SymbolicExprId root, std::string& out) {
    out.append("digraph expression {\n  node [shape=box, fontname=monospace];\n");
    VT::walkDistinct(
        table, root,
        [&](VT::SymbolicExprId id, const VT::SymbolicExpr& node) {
            const std::string name = "n" + std::to_string(id);
            out.append("  ").append(name).append(" [label=").append(quoted(labelOf(node)));
            out.append(isOperator(node) ? "];\n" : ", style=rounded];\n");
            for (std::size_t i = 0; i < node.getNumInputs(); ++i)
                out.append("  ").append(name).append(" -> n").append(std::to_string(node.getInput(i))).append(";\n");
        },
        [](VT::SymbolicExprId) {});
    out.append("}");
}

} // namespace vtsym
