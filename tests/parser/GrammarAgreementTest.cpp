// The grammar against an independent hand-written parser.
#include "base/VTSymbolicExpr.hpp"
#include "base/print/ExpressionPrinter.hpp"
#include "parser/ConditionGrammar.hpp"
#include "parser/SyntaxConverter.hpp"
#include "tests/support/Parsing.hpp"
#include "tests/support/TreeText.hpp"
#include "tests/support/generators/Corpus.hpp"
#include "tests/support/generators/RandomExpression.hpp"
#include "tests/support/oracles/PrecedenceReader.hpp"

#include <gtest/gtest.h>

#include <iterator>
#include <random>
#include <regex>
#include <sstream>

namespace VT::Testing {
namespace {

/// The words of a text.
std::vector<std::string> words(const std::string& text) {
    std::istringstream stream(text);
    return {std::istream_iterator<std::string>(stream), {}};
}

/// Writes trees as treeText does.
struct TextBuilder {
    using Node = std::string;
    static inline const std::string none;
    bool c, withKeywords;

    bool cOperators() const { return c; }

    bool keywords() const { return withKeywords; }

    static std::string intern(SymbolicOp op, const std::string& left, const std::string& right) {
        const std::string operands = left + (right.empty() ? "" : "," + right);
        if (op == SymbolicOp::Row)
            return operands;
        const bool bare = op == SymbolicOp::FcnCall && right.empty();
        return std::string(operatorInfo(bare ? SymbolicOp::FcnCall0U : op).name) + "(" + operands + ")";
    }

    static std::string name(std::string_view text) { return std::string(text); }

    static std::string integer(int value) { return std::to_string(value); }

    static std::string real(double value) { return realText(value); }
};

/// What is wrong where the two parsers differ on a text; empty where they agree.  Reading stops after the longest part
/// of the text that is a condition, but for numbers out of range, of which it reads no part.
std::string difference(SymbolicExprTable& table, const std::string& text, bool cOperators, bool keywords) {
    static const std::regex beyond("[0-9]{10}|[eE][-+]?[0-9]{3}");
    const ParseAnswer answer = parse(table, text, cOperators, keywords);
    TextBuilder builder{cOperators, keywords};
    const std::string expected = PrecedenceReader(builder, text).run();
    const std::string tree = answer.error ? "" : treeText(table, answer.id);
    std::size_t stop = text.size();
    for (bool isRead = !expected.empty(); stop > 0 && !isRead; stop -= isRead ? 0 : 1)
        isRead = !PrecedenceReader(builder, std::string_view(text).substr(0, stop)).run().empty();
    if (tree == expected && (answer.stop(text) == stop || std::regex_search(text, beyond)))
        return {};
    return "`" + text + "`: " + tree + " at " + std::to_string(answer.stop(text)) + " instead of " + expected + " at " +
           std::to_string(stop);
}

/// What is wrong where the parser, most of whose texts the quick reader reads, and the grammar alone differ: in the
/// nodes, their order, or where reading stops.
std::string differenceOfReaders(const std::string& text, bool cOperators, bool keywords) {
    SymbolicExprTable table;
    const ParseAnswer answer = parse(table, text, cOperators, keywords);
    SymbolicExprTable other;
    Parser::SyntaxArena arena;
    const Parser::SyntaxResult read = Parser::readCondition(text, {cOperators, keywords}, arena);
    const SymbolicExprId id = read.value ? convertSyntax(other, *read.value, cOperators) : invalidId;
    bool isSame = id == answer.id && read.stop == answer.stop(text) && table.size() == other.size();
    for (SymbolicExprId each = 0; isSame && each < table.size(); ++each)
        isSame = treeText(table, each) == treeText(other, each);
    return isSame ? "" : "`" + text + "`: the grammar alone reads it in another way";
}

std::string difference(const std::string& text) {
    SymbolicExprTable table;
    std::string all;
    for (const bool cOperators : {false, true})
        for (const bool keywords : {false, true})
            all += difference(table, text, cOperators, keywords) + differenceOfReaders(text, cOperators, keywords);
    return all;
}

/// A text of tokens, mostly no condition.
std::string tokens(std::mt19937_64& random) {
    static std::vector<std::string> all = words(
        "a b1 f f( f() g(a 1 23 -4 5. .5 1.5e3 2147483648 ( ( ) ) [ ] , . (sim) (codegen) || && | & ^ == != ~= < <= "
        "> >= << >> + - * / % ! ~ = $ \xc3");
    if (all.back() != " ")
        all.insert(all.end(), {"\t", "\n", " ", " "});
    std::string text;
    for (std::size_t count = random() % 16; count > 0; --count)
        text += all[random() % all.size()];
    return text;
}

/// Compares a text and then one that has lost, doubled or exchanged a few of its bytes.
void expectAgreement(SymbolicExprTable& table, std::string text, std::mt19937_64& random) {
    const auto pick = [&](std::size_t count) { return static_cast<std::size_t>(random() % count); };
    EXPECT_EQ(difference(table, text, true, true) + differenceOfReaders(text, true, true), "");
    for (std::size_t edits = 1 + pick(3); edits > 0 && !text.empty(); --edits) {
        const std::size_t at = pick(text.size());
        switch (pick(3)) {
        case 0:
            text.erase(at, 1 + pick(3));
            break;
        case 1:
            text.insert(at, text.substr(pick(text.size()), 1 + pick(4)));
            break;
        default:
            text[at] = "()!-~&|=<.,1a+ "[pick(15)];
        }
    }
    EXPECT_EQ(difference(table, text, true, true) + difference(table, text, false, false), "");
}

TEST(Agreement, OnConditions) {
    std::mt19937_64 random(8);
    std::vector<SymbolicOp> operators{SymbolicOp::FcnCall, SymbolicOp::MemberValue, SymbolicOp::DimsND};
    for (const OperatorInfo& row : operatorTable())
        if (row.op < SymbolicOp::Power && (row.form == OperatorForm::Prefix || row.form == OperatorForm::Infix))
            operators.push_back(row.op);
    for (int round = 0; round < 4000; ++round) {
        SymbolicExprTable printed;
        SymbolicExprTable table;
        const SymbolicExprId id =
            randomTree(printed, random, operators, round % 7, [&] { // zeros of either sign are one
                const auto value = static_cast<int>(random());
                return value % 3 == 0   ? SymbolicIntValue(printed, value).getId(printed)
                       : value % 3 == 1 ? SymbolicDoubleValue(printed, value * 0.25 + 0.125).getId(printed)
                                        : SymbolicString(printed, value % 2 == 0 ? "a" : "b1").getId(printed);
            });
        const std::string text = SymbolicExprPrinter(printed, false, round % 2 == 0)(id);
        ASSERT_FALSE(parse(table, text).error) << text;
        expectAgreement(table, text, random);
    }
}

TEST(Agreement, OnTokens) {
    std::mt19937_64 random(9);
    for (int round = 0; round < 20000; ++round)
        ASSERT_EQ(difference(tokens(random)), "");
}

TEST(Agreement, OnEveryPairOfOperators) {
    const std::vector<std::string> infixes = words("|| && | ^ & == != ~= < <= > >= << >> + - * / %");
    for (const std::string& first : infixes) {
        for (const std::string& second : infixes)
            EXPECT_EQ(difference("a " + first + " b " + second + "c"), "");
        for (const std::string prefix : {"", "-", "- ", "--", "+-", "!-", "-~", "! ~ "})
            for (const std::string operand : {"x", "3", ".5", "(x)", "f(x)", "x.y"})
                EXPECT_EQ(difference("2" + first + prefix + operand + first + prefix + operand), "");
    }
}

TEST(Agreement, OnEveryShortTextOfTheCharactersOfNumbers) {
    const std::string characters = "1.e+-";
    for (std::vector<std::string> texts{""}; texts.front().size() < 6;) {
        std::vector<std::string> longer;
        for (const std::string& text : texts)
            for (const char character : characters)
                longer.push_back(text + character);
        texts.swap(longer);
        SymbolicExprTable table;
        for (const std::string& text : texts)
            ASSERT_EQ(difference(table, text, true, true), "");
    }
}

TEST(Agreement, OnEveryByte) {
    for (int value = 0; value < 256; ++value) {
        const std::string byte(1, static_cast<char>(value));
        for (const std::string& text : {"a" + byte, byte + "a", "a == " + byte + " 1", byte + "1" + byte + ".5"})
            EXPECT_EQ(difference(text), "") << value;
    }
}

TEST(Agreement, OnRealConditions) {
    std::mt19937_64 random(1);
    for (const CorpusFile& file : corpusFiles) {
        SymbolicExprTable table;
        std::size_t readable = 0;
        for (const std::string& line : corpusLines(file.name)) {
            expectAgreement(table, line, random);
            readable += parse(table, line).error ? 0U : 1U;
        }
        EXPECT_EQ(readable, file.readable) << file.name;
    }
}

} // namespace
} // namespace VT::Testing
