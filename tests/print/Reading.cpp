// NOLINTBEGIN(misc-no-recursion, performance-inefficient-string-concatenation): small texts and trees only
#include "tests/print/Reading.hpp"

#include "base/transform/QuillConversion.hpp"

#include <algorithm>
#include <charconv>
#include <cmath>
#include <set>
#include <stdexcept>

namespace VT::Testing {

namespace {

using Level = std::vector<std::string_view>;

/// The binary operators of a language from the loosest on, longer spellings first.
const std::vector<Level>& levels(Language language) {
    static const std::vector<Level> c{
        {"||"},       {"&&"},     {"|"},          {"^"}, {"&"}, {"==", "!="}, {"<=", ">=", "<", ">"},
        {"<<", ">>"}, {"+", "-"}, {"*", "/", "%"}};
    static const std::vector<Level> quill{{"||"}, {"&&"},       {"|"},
                                          {"&"},  {"==", "~="}, {"<=", ">=", "<", ">"},
                                          {":"},  {"+", "-"},   {".*", "./", ".\\", "*", "/", "\\"}};
    return language == Language::C ? c : quill;
}

constexpr std::string_view nameBytes = "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz_0123456789";
constexpr std::string_view digits = "0123456789";

bool isNumber(std::string_view text) {
    return !text.empty() && digits.find(text.front()) != std::string_view::npos;
}

class Reader {
public:
    Reader(std::string_view text, Language language) : text_(text), language_(language), levels_(levels(language)) {}

    std::string whole() {
        std::string result = binary(0);
        if (!text_.empty())
            throw std::runtime_error("left over: " + std::string(text_));
        return result;
    }

private:
    std::string_view spelling() const {
        static constexpr std::string_view all[] = {
            "||", "&&", "==", "!=", "~=", "<=", ">=", "<<", ">>", ".*", "./", ".\\", ".^", ".'"};
        const auto found = std::ranges::find_if(all, [&](std::string_view op) { return text_.starts_with(op); });
        return found != std::end(all) ? *found : text_.substr(0, 1);
    }

    void skipBlank() {
        if (text_.starts_with(' '))
            text_.remove_prefix(1);
    }

    bool take(std::string_view token) {
        if (spelling() != token || token.empty())
            return false;
        text_.remove_prefix(token.size());
        return true;
    }

    std::string takeAll(std::string_view set) {
        const std::size_t end = std::min(text_.find_first_not_of(set), text_.size());
        std::string taken(text_.substr(0, end));
        text_.remove_prefix(end);
        return taken;
    }

    std::string binary(std::size_t level) {
        if (level == levels_.size())
            return prefixed();
        std::string left = binary(level + 1);
        while (true) {
            const std::string_view before = text_;
            skipBlank();
            const auto op = std::ranges::find(levels_[level], spelling());
            if (op == levels_[level].end() || text_.empty()) {
                text_ = before;
                return left;
            }
            text_.remove_prefix(op->size());
            skipBlank();
            left = "(" + left + std::string(*op) + binary(level + 1) + ")";
        }
    }

    std::string prefixed() {
        const std::string op(spelling());
        if (op != "-" && op != "~" && op != "!")
            return power();
        take(op);
        const std::string operand = prefixed();
        return op == "-" && isNumber(operand) ? "-" + operand : "(" + op + operand + ")";
    }

    std::string power() {
        std::string left = chain();
        while (language_ == Language::Quill) {
            if (take("'"))
                left = "(" + left + "')";
            else if (take(".'"))
                left = "(" + left + ".')";
            else if (take("^"))
                left = "(" + left + "^" + exponent() + ")";
            else if (take(".^"))
                left = "(" + left + ".^" + exponent() + ")";
            else
                break;
        }
        return left;
    }

    std::string exponent() {
        if (take("-"))
            return "-" + exponent();
        return chain();
    }

    std::string chain() {
        std::string left = primary();
        while (true) {
            if (take("("))
                left += "(" + list(')', ",") + ")";
            else if (text_.size() > 1 && text_[0] == '.' &&
                     nameBytes.find(text_[1]) < nameBytes.size() - digits.size()) {
                text_.remove_prefix(1);
                left = "(" + left + "." + takeAll(nameBytes) + ")";
            } else
                return left;
        }
    }

    std::string primary() {
        if (take("(")) {
            std::string inner = binary(0);
            if (!take(")"))
                throw std::runtime_error("no ) at " + std::string(text_));
            return inner;
        }
        if (take("["))
            return "[" + list(']', ",;") + "]";
        if (take("{"))
            return "{" + list('}', ";") + "}";
        std::string run = takeAll(nameBytes);
        if (run.empty())
            throw std::runtime_error("no operand at " + std::string(text_));
        if (isNumber(run)) {
            if (text_.size() > 1 && text_[0] == '.' && isNumber(text_.substr(1))) {
                text_.remove_prefix(1);
                run += "." + takeAll(nameBytes);
            }
            if (run.back() == 'e') {
                run += text_.front();
                text_.remove_prefix(1);
                run += takeAll(digits);
            }
        }
        return run;
    }

    std::string list(char close, std::string_view separators) {
        std::string items;
        while (!text_.starts_with(close)) {
            items += binary(0);
            if (!text_.empty() && separators.find(text_.front()) != std::string_view::npos) {
                items += text_.front();
                text_.remove_prefix(1);
            } else if (!text_.starts_with(close))
                throw std::runtime_error("no end of list at " + std::string(text_));
        }
        text_.remove_prefix(1);
        return items;
    }

    std::string_view text_;
    Language language_;
    const std::vector<Level>& levels_;
};

std::string joined(SymbolicExprTable& table, const SymbolicExpr& node, std::size_t first, char separator,
                   Language language) {
    std::string text;
    for (std::size_t i = first; i < node.getNumInputs(); ++i)
        text += (i > first ? std::string(1, separator) : "") + meaningOf(table, node.getInput(i), language);
    return text;
}

std::string realText(double value, Language language) {
    char digitsOf[40];
    std::string text(digitsOf, std::to_chars(std::begin(digitsOf), std::end(digitsOf), value).ptr);
    const bool needsPoint = language == Language::C || (value == 0 && std::signbit(value));
    if (needsPoint && text.find('.') == std::string::npos)
        text.insert(std::min(text.find('e'), text.size()), ".0");
    return text;
}

} // namespace

std::string readingOf(std::string_view text, Language language) {
    return Reader(text, language).whole();
}

bool isWritten(SymbolicOp op, Language language) {
    using enum SymbolicOp;
    static const std::set<SymbolicOp> never{Row, Matrix, AnonymousFunc, QColon3}; // a:b:c is a range of a range
    static const std::set<SymbolicOp> inQuill{Power,     DotPower,     DotMul,    DotDiv,   LDiv,  DotLDiv,
                                              Transpose, DotTranspose, SingleAnd, SingleOr, QColon};
    return !never.contains(op) && (language == Language::Quill || !inQuill.contains(op));
}

std::string meaningOf(SymbolicExprTable& table, SymbolicExprId id, Language language) {
    const SymbolicExpr& node = *table.get(id);
    if (callOps.contains(node.op()))
        return meaningOf(table, node.getInput(0), language) + "(" + joined(table, node, 1, ',', language) + ")";
    if (dimensionOps.contains(node.op()))
        return "[" + joined(table, node, 0, ',', language) + "]";
    switch (node.op()) {
    case SymbolicOp::String:
        return static_cast<const SymbolicString&>(node).getName();
    case SymbolicOp::IntValue:
        return std::to_string(static_cast<const SymbolicIntValue&>(node).getValue());
    case SymbolicOp::DoubleValue:
        return realText(node.getNumValue(), language);
    case SymbolicOp::CellArray:
        return "{" + joined(table, node, 0, ';', language) + "}";
    case SymbolicOp::MemberValue:
        return "(" + meaningOf(table, node.getInput(0), language) + ".field)";
    default:
        break;
    }
    const OperatorInfo& row = operatorInfo(node.op());
    if (language == Language::Quill && row.quill.empty())
        return meaningOf(table, SymbolicExprC2Q(table)(id), language);
    const std::string op(language == Language::Quill ? row.quill : row.c);
    const std::string first = meaningOf(table, node.getInput(0), language);
    if (node.getNumInputs() == 2)
        return "(" + first + op + meaningOf(table, node.getInput(1), language) + ")";
    if (row.form == OperatorForm::Postfix)
        return "(" + first + op + ")";
    if (node.op() == SymbolicOp::UnaryMinus && (first == "0" || isNumber(first)))
        return first == "0" && table.get(node.getInput(0))->op() != SymbolicOp::DoubleValue ? "0" : "-" + first;
    return "(" + op + first + ")";
}

SymbolicExprId randomTree(SymbolicExprTable& table, Language language, std::mt19937& random, int depth) {
    const Trees tree{table};
    const auto below = [&](unsigned bound) { return static_cast<unsigned>(random()) % bound; };
    if (depth == 0 || below(6) == 0) {
        switch (below(6)) {
        case 0:
            return tree.integer(static_cast<int>(below(7)) - 3);
        case 1:
            return tree.real((static_cast<int>(below(9)) - 4) * 0.5);
        default:
            return tree.name(std::string(1, static_cast<char>('a' + below(4))));
        }
    }
    while (true) {
        const auto op = static_cast<SymbolicOp>(3 + below(operatorCount - 3));
        if (!isWritten(op, language))
            continue;
        if (op == SymbolicOp::QColon) // its operands are never wrapped
            return tree(op, randomTree(table, language, random, 0), randomTree(table, language, random, 0));
        if (callOps.contains(op) || dimensionOps.contains(op) || op == SymbolicOp::CellArray) {
            std::vector<SymbolicExprId> inputs;
            for (unsigned left = 1 + below(4); left > 0; --left)
                inputs.push_back(randomTree(table, language, random, depth - 1));
            if (callOps.contains(op))
                inputs.front() = tree.name("f");
            return tree(dimensionOps.contains(op) ? SymbolicOp::DimsND
                        : callOps.contains(op)    ? SymbolicOp::FcnCall
                                                  : op,
                        inputs);
        }
        const SymbolicExprId first = randomTree(table, language, random, depth - 1);
        return operatorInfo(op).form == OperatorForm::Infix
                   ? tree(op, first, randomTree(table, language, random, depth - 1))
                   : tree(op, first);
    }
}

} // namespace VT::Testing

// NOLINTEND(misc-no-recursion, performance-inefficient-string-concatenation)
