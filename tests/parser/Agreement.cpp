// The grammar against an independent hand-written parser.
#include "base/VTSymbolicExpr.hpp"
#include "tests/support/Corpus.hpp"
#include "tests/support/OracleParser.hpp"
#include "tests/support/Parsing.hpp"
#include "tests/support/TreeText.hpp"

#include <gtest/gtest.h>
#include <rapidcheck.h>
#include <rapidcheck/gtest.h>

#include <random>

namespace VT::Testing {
namespace {

const std::vector<std::string> infixes = {
    "||", "&&", "|", "^", "&", "==", "!=", "~=", "<", "<=", ">", ">=", "<<", ">>", "+", "-", "*", "/", "%"};

/// What is wrong where the two parsers differ on a text; empty where they agree.
std::string difference(SymbolicExprTable& table, const std::string& text, bool cOperators, bool keywords) {
    const ParseAnswer answer = parse(table, text, cOperators, keywords);
    const OracleResult expected = oracleParse(table, text, {cOperators, keywords});
    if (answer.id == expected.id && answer.stop(text) == expected.stop)
        return {};
    return "`" + text + "`: " + treeText(table, answer.id) + " at " + std::to_string(answer.stop(text)) +
           " instead of " + treeText(table, expected.id) + " at " + std::to_string(expected.stop);
}

std::string difference(const std::string& text) {
    SymbolicExprTable table;
    std::string all;
    for (const bool cOperators : {false, true})
        for (const bool keywords : {false, true})
            all += difference(table, text, cOperators, keywords);
    return all;
}

/// Texts of tokens, most of them no conditions.
rc::Gen<std::string> tokenTexts() {
    const auto token = rc::gen::element<std::string>(
        "a", "b1", "f", "f(", "f()", "g(a", "1", "23", "-4", "5.", ".5", "1.5e3", "2147483648", "(", "(", ")", ")", "[",
        "]", ",", ".", "(sim)", "(codegen)", "||", "&&", "|", "&", "^", "==", "!=", "~=", "<", "<=", ">", ">=", "<<",
        ">>", "+", "-", "*", "/", "%", "!", "~", "=", " ", " ", "\t", "\n", "$");
    return rc::gen::map(rc::gen::container<std::vector<std::string>>(token),
                        [](const std::vector<std::string>& tokens) {
                            std::string text;
                            for (const std::string& each : tokens)
                                text += each;
                            return text;
                        });
}

// NOLINTBEGIN(misc-no-recursion): six levels

/// A text of every construct that is a condition in C.
std::string condition(std::mt19937_64& random, unsigned depth) {
    const auto below = [&](std::size_t bound) { return static_cast<std::size_t>(random() % bound); };
    const auto inner = [&] { return condition(random, depth - 1); };
    const auto list = [&] { return inner() + (below(2) == 0 ? ", " + inner() : ""); };
    switch (below(depth == 0 ? 4 : 11)) {
    case 0:
        return std::to_string(static_cast<std::int32_t>(random()));
    case 1:
        return std::to_string(below(256)) + ".5";
    case 2:
        return "m.field . field2";
    case 3:
        return std::string(1, static_cast<char>('a' + below(6)));
    case 4:
        return std::string(1, "-!~+"[below(4)]) + inner();
    case 5:
        return "(" + inner() + ")";
    case 6:
        return "f(" + (below(3) == 0 ? " " : list()) + ")";
    case 7:
        return "[" + list() + "]";
    default:
        return inner() + " " + infixes[below(infixes.size())] + inner();
    }
}

// NOLINTEND(misc-no-recursion)

TEST(Agreement, OnConditions) {
    std::mt19937_64 random(8);
    std::size_t whole = 0;
    for (unsigned round = 0; round < 4000; ++round) {
        const std::string text = condition(random, round % 7);
        ASSERT_EQ(difference(text), "");
        SymbolicExprTable table;
        whole += parse(table, text, false, false).error ? 0U : 1U;
    }
    EXPECT_GT(whole, 3500U);
}

RC_GTEST_PROP(Agreement, OnTokens, ()) {
    for (const std::string& text : *rc::gen::container<std::vector<std::string>>(tokenTexts()))
        RC_ASSERT(difference(text) == "");
}

RC_GTEST_PROP(Agreement, OnBytes, (const std::vector<std::string>& texts)) {
    for (const std::string& text : texts)
        RC_ASSERT(difference(text) == "");
}

TEST(Agreement, OnEveryPairOfOperators) {
    for (const std::string& first : infixes) {
        for (const std::string& second : infixes)
            EXPECT_EQ(difference("a " + first + " b " + second + "c"), "");
        for (const std::string prefix : {"", "-", "- ", "--", "+-", "!-", "-~", "! ~ "})
            for (const std::string operand : {"x", "3", ".5", "(x)", "f(x)", "x.y"})
                EXPECT_EQ(difference("2" + first + prefix + operand + first + prefix + operand), "");
    }
}

TEST(Agreement, OnEveryByte) {
    for (int value = 0; value < 256; ++value) {
        const std::string byte(1, static_cast<char>(value));
        for (const std::string& text : {"a" + byte, byte + "a", "a == " + byte + " 1", byte + "1" + byte + ".5"})
            EXPECT_EQ(difference(text), "") << value;
    }
}

/// Real conditions and, from each of them, one that has lost, doubled or exchanged a few bytes.
TEST(Agreement, OnRealConditions) {
    std::minstd_rand random(1);
    const auto pick = [&](std::size_t count) { return static_cast<std::size_t>(random()) % count; };
    for (const CorpusFile& file : corpusFiles) {
        SymbolicExprTable table;
        std::size_t readable = 0;
        for (std::string line : corpusLines(file.name)) {
            EXPECT_EQ(difference(table, line, true, true), "");
            readable += parse(table, line).error ? 0U : 1U;
            for (std::size_t edits = 1 + pick(3); edits > 0 && !line.empty(); --edits) {
                const std::size_t at = pick(line.size());
                switch (pick(3)) {
                case 0:
                    line.erase(at, 1 + pick(3));
                    break;
                case 1:
                    line.insert(at, line.substr(pick(line.size()), 1 + pick(4)));
                    break;
                default:
                    line[at] = "()!-~&|=<.,1a "[pick(14)];
                }
            }
            EXPECT_EQ(difference(table, line, true, true) + difference(table, line, false, false), "");
        }
        EXPECT_EQ(readable, file.readable) << file.name;
    }
}

} // namespace
} // namespace VT::Testing
