// Writes a parse tree for people: one line for each node, depth first on an explicit stack.
//
// Linear in the tree: blanks that show the depth are bounded.
#include "parser/ParseTreeDump.hpp"

#include "base/core/Limits.hpp"

#include <algorithm>
#include <ostream>
#include <string>
#include <vector>

namespace VT {

namespace {

using ParseTree = _Q_parse_tree_T<char>;

void writeNode(std::ostream& out, const ParseTree& node, std::size_t depth) {
    const bool isTerminal = node.kind == ParseTree::terminal;
    out << std::string(2 * std::min(depth, limits::dumpIndent), ' ') << '(' << depth << ": "
        << (isTerminal ? vtuQParserTerminalName(node.code) : vtuQParserNonTerminalName(node.code))
        << ") Code = " << node.code;
    if (isTerminal)
        out << ", Val = " << std::string_view(node.text, node.length);
    else
        out << ", Child_count = " << node.childCount;
    out << '\n';
}

} // namespace

void dumpParseTree(std::ostream& out, std::string_view text, const ParseTree* root) {
    if (root == nullptr) {
        out << "======Q-Parse tree not found for expression '" << text << "'\n";
        return;
    }
    out << "========Q-Parse tree for expression '" << text << "'\n";

    struct Open {
        const ParseTree* node;
        std::size_t depth;
    };

    std::vector<Open> open{{root, 0}};
    while (!open.empty()) {
        const auto [node, depth] = open.back();
        open.pop_back();
        writeNode(out, *node, depth);
        if (node->kind != ParseTree::terminal)
            for (std::int32_t i = node->childCount; i > 0; --i)
                open.push_back({node->children + (i - 1), depth + 1});
    }
    out << "======================================================\n";
}

} // namespace VT
