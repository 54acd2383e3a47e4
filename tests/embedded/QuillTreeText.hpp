// Parse trees as text.
#pragma once

#include "host/QuillParser.hpp"

#include <memory>
#include <string>
#include <vector>

namespace VT::Testing {

using QuillNode = _Q_parse_tree_T<char>;

/// A parser and its last tree.
class QuillReading {
public:
    explicit QuillReading(std::size_t nesting = 256, const std::vector<std::string>& keywords = {})
        : parser_(PARSER_T<char>::create(nesting, keywords)) {}

    QuillReading(const QuillReading&) = delete;
    QuillReading& operator=(const QuillReading&) = delete;

    ~QuillReading() { parser_->delete_parse_tree(tree_); }

    /// The root, or nullptr; valid until the next reading.
    const QuillNode* read(std::string_view text);

    QuillFailure failure() const { return parser_->failure(); }

    /// The tree as treeText shows it, or "POSITION: REASON".
    std::string answer(std::string_view text);

private:
    std::unique_ptr<PARSER_T<char>> parser_;
    const QuillNode* tree_ = nullptr;
};

/// The tree below the root: operands as they are written, a rule as its code and children in parentheses.  Operators
/// and brackets, which the code tells already, are left out.
std::string treeText(const QuillNode& root);

/// What is wrong with a tree: kinds, tokens, their order and places in the text, the number of nodes; empty where
/// nothing is.
std::string shapeError(const QuillNode& root, std::string_view text);

} // namespace VT::Testing
