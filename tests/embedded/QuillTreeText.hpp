// Parse trees as text.
#pragma once

#include "host/QuillParser.hpp"

#include <memory>
#include <string>
#include <vector>

namespace VT::Testing {

using QuillNode = _Q_parse_tree_T<char>;

inline bool isOperand(int token) {
    return token == 40 || token == 41 || (token >= 200 && token <= 202);
}

/// The tree below the root: operands as they are written, a rule as its code and children in parentheses.  Operators
/// and brackets, which the code says already, are left out.
inline std::string treeText(const QuillNode& node) { // NOLINT(misc-no-recursion): as deep as the text of a case
    if (node.kind == QuillNode::terminal)
        return isOperand(node.code) ? std::string(node.text, node.length) : "";
    std::string inputs;
    for (std::int32_t i = 0; i < node.childCount; ++i)
        if (const std::string input = treeText(node.children[i]); !input.empty())
            inputs += " " + input;
    return node.code == 21 ? inputs.substr(1) : "(" + std::to_string(node.code) + inputs + ")";
}

inline std::string tokenError(const QuillNode& token, std::string_view text, std::size_t after) {
    if (token.start < after || token.start + token.length > text.size() || token.length == 0)
        return "token out of order";
    if (token.text != text.data() + token.start)
        return "token that does not point to its place";
    const std::string_view written(token.text, token.length);
    if (!isOperand(token.code) && written != "!=" && written != "!" && written != vtuQParserTerminalName(token.code))
        return "token of another spelling";
    return "";
}

/// What is wrong with a tree: kinds, tokens, their order and places in the text, the number of nodes; empty where
/// nothing is.
inline std::string shapeError(const QuillNode& root, std::string_view text) {
    if (root.kind != 1 || root.code != 21 || root.childCount != 1)
        return "no root";
    std::size_t after = 0; // end of the last token
    std::size_t count = 0;
    std::vector<const QuillNode*> pending{&root};
    while (!pending.empty()) {
        const QuillNode& node = *pending.back();
        pending.pop_back();
        if (++count > 3 * text.size() + 4)
            return "too many nodes";
        if (node.kind == 0) {
            const std::string error = tokenError(node, text, after);
            if (!error.empty())
                return error + " at " + std::to_string(node.start);
            after = node.start + node.length;
            continue;
        }
        if (node.kind != 1 || node.start < after || node.start > text.size() ||
            (node.childCount > 0 && node.start > node.children[0].start))
            return "rule " + std::to_string(node.code) + " at the wrong place";
        for (std::int32_t i = node.childCount; i-- > 0;)
            pending.push_back(node.children + i);
    }
    return "";
}

/// A parser and its last tree.
class QuillReading {
public:
    explicit QuillReading(std::size_t nesting = 256, const std::vector<std::string>& keywords = {})
        : parser_(PARSER_T<char>::create(nesting, keywords)) {}

    QuillReading(const QuillReading&) = delete;
    QuillReading& operator=(const QuillReading&) = delete;

    ~QuillReading() { parser_->delete_parse_tree(tree_); }

    /// The root, or nullptr; valid until the next reading.
    const QuillNode* read(std::string_view text) {
        parser_->delete_parse_tree(tree_);
        tree_ = nullptr;
        tree_ = parser_->generate_parse_tree(text.data(), text.size());
        return tree_;
    }

    QuillFailure failure() const { return parser_->failure(); }

    /// The tree as treeText shows it, or "POSITION: REASON".
    std::string answer(std::string_view text) {
        const QuillNode* const tree = read(text);
        return tree != nullptr ? treeText(*tree)
                               : std::to_string(failure().position) + ": " + std::string(failure().reason);
    }

private:
    std::unique_ptr<PARSER_T<char>> parser_;
    const QuillNode* tree_ = nullptr;
};

} // namespace VT::Testing
