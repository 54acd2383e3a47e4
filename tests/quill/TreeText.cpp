#include "tests/quill/TreeText.hpp"

#include <algorithm>
#include <cctype>
#include <map>
#include <sstream>

namespace VT::Testing {

namespace {

/// What the children of a rule are: e an expression, i an identifier, a an argument list, p a parameter list, r a row,
/// a number the code of a token; * any number of what stands before it.
const std::map<int, std::string> shapes = {
    {21, "e"},           {27, "r*"},       {43, "240 e 241"}, {44, "221 e"},    {46, "232 e"},    {49, "e 220 e"},
    {50, "e 221 e"},     {76, "e 228 e"},  {77, "e 229 e"},   {78, "e 230"},    {79, "e 231"},    {83, "e i"},
    {85, "e 240 a 241"}, {90, "e 222 e"},  {91, "e 225 e"},   {92, "e 223 e"},  {93, "e 226 e"},  {94, "e 224 e"},
    {95, "e 227 e"},     {99, "e 216 e"},  {100, "e 217 e"},  {101, "e 218 e"}, {102, "e 219 e"}, {103, "e 214 e"},
    {104, "e 215 e"},    {130, "e 210 e"}, {132, "e 212 e"},  {134, "e 213 e"}, {136, "e 211 e"}, {300, "e 242 a 243"},
    {301, "r*"},         {302, "e*"},      {303, "e*"},       {304, "e e"},     {305, "e e e"},   {306, "p e"},
    {307, "i*"},         {308, "i"},
};

const std::map<int, std::vector<std::string>> spellings = {
    {210, {"||"}}, {211, {"&&"}},     {212, {"|"}},  {213, {"&"}},   {214, {"=="}}, {215, {"~=", "!="}}, {216, {"<"}},
    {217, {"<="}}, {218, {">"}},      {219, {">="}}, {220, {"+"}},   {221, {"-"}},  {222, {"*"}},        {223, {"/"}},
    {224, {"\\"}}, {225, {".*"}},     {226, {"./"}}, {227, {".\\"}}, {228, {"^"}},  {229, {".^"}},       {230, {"'"}},
    {231, {".'"}}, {232, {"~", "!"}}, {240, {"("}},  {241, {")"}},   {242, {"{"}},  {243, {"}"}},        {202, {"end"}},
};

bool isOperand(int token) {
    return token == 40 || token == 41 || (token >= 200 && token <= 202);
}

/// A child that a rule may have: a letter of `shapes`, or the code of a token.
struct Item {
    char letter = 0;
    int token = 0;
};

struct Shape {
    std::vector<Item> items;
    bool repeated = false;
};

Shape shapeOf(const std::string& pattern) {
    Shape shape;
    std::istringstream words(pattern);
    for (std::string word; words >> word;) {
        if (std::isdigit(static_cast<unsigned char>(word[0])) != 0)
            shape.items.push_back({.token = std::stoi(word)});
        else
            shape.items.push_back({.letter = word[0]});
        shape.repeated = word.back() == '*';
    }
    return shape;
}

bool fits(const QuillNode& node, Item item) {
    if (node.kind == 0)
        return item.letter == 0 ? item.token == node.code
                                : isOperand(node.code) && (item.letter == 'e' || node.code == 40);
    switch (node.code) {
    case 21:
        return false;
    case 302:
        return item.letter == 'r';
    case 303:
        return item.letter == 'a';
    case 307:
        return item.letter == 'p';
    default:
        return item.letter == 'e';
    }
}

bool childrenFit(const QuillNode& node) {
    static const std::map<int, Shape> known = [] {
        std::map<int, Shape> all;
        for (const auto& [code, pattern] : shapes)
            all[code] = shapeOf(pattern);
        return all;
    }();
    const auto shape = known.find(node.code);
    if (shape == known.end() || node.childCount < 0)
        return false;
    const auto& [items, repeated] = shape->second;
    const auto count = static_cast<std::size_t>(node.childCount);
    if (!repeated && items.size() != count)
        return false;
    for (std::size_t i = 0; i < count; ++i)
        if (!fits(node.children[i], items[repeated ? 0 : i]))
            return false;
    return true;
}

std::string tokenError(const QuillNode& token, std::string_view text, std::size_t behind) {
    if (token.start < behind || token.start + token.length > text.size() || token.length == 0)
        return "token out of order";
    if (token.text != text.data() + token.start)
        return "token that does not point to its place";
    const std::string_view written(token.text, token.length);
    const auto known = spellings.find(token.code);
    if (known != spellings.end() && std::ranges::find(known->second, written) == known->second.end())
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

std::string treeText(const QuillNode& root) {
    std::string result;
    std::vector<const QuillNode*> pending{root.children}; // nullptr closes a rule
    while (!pending.empty()) {
        const QuillNode* const node = pending.back();
        pending.pop_back();
        if (node == nullptr) {
            result += ')';
            continue;
        }
        if (node->kind == 0 && !isOperand(node->code))
            continue;
        if (!result.empty() && result.back() != '(')
            result += ' ';
        if (node->kind == 0) {
            result.append(node->text, node->length);
            continue;
        }
        result += "(" + std::to_string(node->code);
        pending.push_back(nullptr);
        for (std::int32_t i = node->childCount; i-- > 0;)
            pending.push_back(node->children + i);
    }
    return result;
}

std::string shapeError(const QuillNode& root, std::string_view text) {
    if (root.kind != 1 || root.code != 21)
        return "no root";
    std::size_t behind = 0; // end of the last token
    std::vector<const QuillNode*> pending{&root};
    while (!pending.empty()) {
        const QuillNode& node = *pending.back();
        pending.pop_back();
        if (node.kind == 0) {
            const std::string error = tokenError(node, text, behind);
            if (!error.empty())
                return error + " at " + std::to_string(node.start);
            behind = node.start + node.length;
            continue;
        }
        if (node.kind != 1 || !childrenFit(node))
            return "rule " + std::to_string(node.code) + " with other children";
        if (node.start < behind || node.start > text.size() ||
            (node.childCount > 0 && node.start > node.children[0].start))
            return "rule " + std::to_string(node.code) + " at the wrong place";
        for (std::int32_t i = node.childCount; i-- > 0;)
            pending.push_back(node.children + i);
    }
    return "";
}

std::size_t countNodes(const QuillNode& root) {
    std::size_t count = 0;
    std::vector<const QuillNode*> pending{&root};
    while (!pending.empty()) {
        const QuillNode& node = *pending.back();
        pending.pop_back();
        ++count;
        for (std::int32_t i = 0; node.kind == 1 && i < node.childCount; ++i)
            pending.push_back(node.children + i);
    }
    return count;
}

} // namespace VT::Testing
