#include "tests/embedded/QuillTreeText.hpp"

namespace VT::Testing {

namespace {

bool isOperand(int token) {
    return token == 40 || token == 41 || (token >= 200 && token <= 202);
}

std::string tokenError(const QuillNode& token, std::string_view text, std::size_t behind) {
    if (token.start < behind || token.start + token.length > text.size() || token.length == 0)
        return "token out of order";
    if (token.text != text.data() + token.start)
        return "token that does not point to its place";
    const std::string_view written(token.text, token.length);
    if (!isOperand(token.code) && written != "!=" && written != "!" && written != vtuQParserTerminalName(token.code))
        return "token of another spelling";
    return "";
}

} // namespace

const QuillNode* QuillReading::read(std::string_view text) {
    parser_->delete_parse_tree(tree_);
    tree_ = nullptr;
    tree_ = parser_->generate_parse_tree(text.data(), text.size());
    return tree_;
}

std::string QuillReading::answer(std::string_view text) {
    const QuillNode* const tree = read(text);
    if (tree != nullptr)
        return treeText(*tree);
    return std::to_string(failure().position) + ": " + std::string(failure().reason);
}

std::string treeText(const QuillNode& node) { // NOLINT(misc-no-recursion): as deep as the text of a case
    if (node.kind == QuillNode::terminal)
        return isOperand(node.code) ? std::string(node.text, node.length) : "";
    std::string inputs;
    for (std::int32_t i = 0; i < node.childCount; ++i)
        if (const std::string input = treeText(node.children[i]); !input.empty())
            inputs += " " + input;
    return node.code == 21 ? inputs.substr(1) : "(" + std::to_string(node.code) + inputs + ")";
}

std::string shapeError(const QuillNode& root, std::string_view text) {
    if (root.kind != 1 || root.code != 21 || root.childCount != 1)
        return "no root";
    std::size_t behind = 0; // end of the last token
    std::size_t count = 0;
    std::vector<const QuillNode*> pending{&root};
    while (!pending.empty()) {
        const QuillNode& node = *pending.back();
        pending.pop_back();
        if (++count > 3 * text.size() + 4)
            return "too many nodes";
        if (node.kind == 0) {
            const std::string error = tokenError(node, text, behind);
            if (!error.empty())
                return error + " at " + std::to_string(node.start);
            behind = node.start + node.length;
            continue;
        }
        if (node.kind != 1 || node.start < behind || node.start > text.size() ||
            (node.childCount > 0 && node.start > node.children[0].start))
            return "rule " + std::to_string(node.code) + " at the wrong place";
        for (std::int32_t i = node.childCount; i-- > 0;)
            pending.push_back(node.children + i);
    }
    return "";
}

} // namespace VT::Testing
