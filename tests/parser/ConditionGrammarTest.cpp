// What the condition grammar reads as what, where it stops, and its bounds.
#include "base/VTSymbolicExpr.hpp"
#include "base/core/Limits.hpp"
#include "base/variants/Features.hpp"
#include "parser/SyntaxConverter.hpp"
#include "tests/support/Cases.hpp"
#include "tests/support/FlagSetting.hpp"
#include "tests/support/Locales.hpp"
#include "tests/support/Parsing.hpp"
#include "tests/support/Times.hpp"
#include "tests/support/TreeText.hpp"

#include <gtest/gtest.h>

#include <array>
#include <set>
#include <tuple>

namespace VT::Testing {
namespace {

/// A row is a text, and its tree or where reading stops.
void expectReadings(const std::string& section, bool cOperators = true, bool variantKeywords = true) {
    for (const CaseRow& row : casesOf("conditions.txt", section, 2)) {
        SCOPED_TRACE(row[0]);
        SymbolicExprTable table;
        const ParseAnswer answer = parse(table, row[0], cOperators, variantKeywords);
        const std::size_t stop = answer.stop(row[0]);
        EXPECT_EQ(answer.error ? "stops at " + std::to_string(stop) : treeText(table, answer.id), row[1]);
        if (!answer.error)
            continue;
        EXPECT_EQ(answer.error->messageId(), "Vantor:Variants:ExpressionParseError");
        const std::vector<DiagnosticArgument> arguments{row[0], std::string(stop + 1, ' ') + "^"};
        EXPECT_EQ(answer.error->arguments(), arguments) << "the text, and a pointer below it";
        EXPECT_EQ(answer.error->additionalText(), "");
        EXPECT_EQ(table.size(), 0U) << "an error interns nothing";
    }
}

// Trees of operators, calls and lists, and where reading stops, are compared with another parser in Agreement.cpp; here
// is what that one does not tell.
TEST(Grammar, ReadingsInEveryLocale) {
    inEveryLocale([] {
        expectReadings("C operators");
        expectReadings("host operators", false);
    });
}

TEST(Grammar, VariantKeywords) {
    for (const std::int32_t value : {1, 0, -1}) {
        const FlagSetting setting(*VTFEAT_VariantKeywordsSimCodegen, value);
        for (const bool cOperators : {true, false}) {
            expectReadings(value == 1 ? "keywords" : "no keywords", cOperators);
            expectReadings("no keywords", cOperators, false);
        }
    }
}

TEST(Grammar, RightOperandsAreInternedFirst) {
    for (const CaseRow& row : casesOf("conditions.txt", "order", 2)) {
        SymbolicExprTable table;
        const SymbolicExprId id = parse(table, row[0]).id;
        EXPECT_EQ(id, table.size() - 1) << row[0];
        std::string all;
        for (SymbolicExprId each = 0; each < table.size(); ++each)
            all += (each > 0 ? " " : "") + treeText(table, each);
        EXPECT_EQ(all, row[1]) << row[0];
    }
    // A call takes the class that was interned first.
    SymbolicExprTable table;
    const SymbolicExprId call =
        SymbolicFcnCall1UExpr(table, SymbolicString(table, "f"), SymbolicString(table, "x")).getId(table);
    EXPECT_EQ(parse(table, "f(x)").id, call);
}

TEST(Grammar, SyntaxValuesThatNoTextYields) {
    SymbolicExprTable table;
    Parser::SyntaxArena arena;
    const Parser::expression_ast a = std::string_view("a"), b = std::string_view("b"), nested = &a;
    const auto convert = [&](const Parser::expression_ast& value) {
        return treeText(table, convertSyntax(table, value, true));
    };
    EXPECT_EQ(convert(arena.binary(SymbolicOp::FcnCall2U, a, b)), "FcnCall1U(a,b)");
    EXPECT_EQ(treeText(table, 0), "a") << "the callee comes first";
    EXPECT_EQ(convert({}), "invalid");
    EXPECT_EQ(convert(&nested), "a");
    EXPECT_EQ(convert(arena.append(arena.append(nullptr, b), 1)), "DimsND(b,1)");
    EXPECT_EQ(convert(arena.binary(SymbolicOp::MemberValue, a, 5)), "invalid");
    const std::set<int> prefixes{5, 17, 21, 27};
    for (int code = 0; code < operatorCount; ++code) {
        const auto op = static_cast<SymbolicOp>(code);
        const bool infix = (code >= 3 && code <= 23 && !prefixes.contains(code)) || code == 29 || code == 31;
        EXPECT_EQ(convert(arena.binary(op, a, b)) == "invalid", !infix) << code;
        EXPECT_EQ(convert(arena.unary(op, a)) == "invalid", !prefixes.contains(code)) << code;
    }
}

constexpr std::size_t bound = limits::nesting;

/// Where reading stops; the size of the text where all of it is read.
std::size_t stopOf(const std::string& text, bool cOperators = true) {
    SymbolicExprTable table;
    return parse(table, text, cOperators).stop(text);
}

TEST(GrammarLimits, NestingAtTheBoundAndOneBeyond) {
    const std::vector<std::tuple<std::string, std::string, std::size_t>> nests = {
        {"(", ")", 1},   {"[", "]", 1},     {"f(", ")", 1},    {"f(a,", ")", 1}, {"a || (", ")", 1}, {"!(", ")", 1},
        {"-f(", ")", 1}, {"1*(b+", ")", 1}, {"[1,(", ")]", 2}, {"f([", "])", 2}, {"( ( ", "))", 2}};
    for (const auto& [open, close, brackets] : nests) {
        const std::size_t deep = bound / brackets;
        const std::string good = times(deep, open) + "x" + times(deep, close);
        EXPECT_EQ(stopOf(good), good.size()) << open;
        const std::string beyond = times(deep, open) + "f(x)" + times(deep, close);
        EXPECT_EQ(stopOf(beyond), deep * open.size() + 1) << open;
    }
    const std::string keyword = times(bound, "(") + "(sim)" + times(bound, ")");
    EXPECT_EQ(stopOf(keyword), keyword.size());
    // Siblings do not add up.
    const std::string wide = times(5000, "(f([1])) + ") + "1";
    EXPECT_EQ(stopOf(wide), wide.size());
}

TEST(GrammarLimits, RunsOfPrefixesAtTheBoundAndOneBeyond) {
    for (const std::string prefix : {"-", "+", "!", "~", "- ", "-!", "~ +"}) {
        const std::size_t operators = prefix == "-!" || prefix == "~ +" ? 2 : 1;
        const std::string run = times(bound / operators, prefix);
        for (const bool cOperators : {true, false}) {
            EXPECT_EQ(stopOf(run + "x", cOperators), run.size() + 1) << prefix;
            EXPECT_EQ(stopOf(run + "!x", cOperators), run.size()) << prefix;
            EXPECT_EQ(stopOf("a - " + run + "!x", cOperators), run.size() + 4) << prefix;
        }
    }
    // The sign of a literal is no prefix operator, and a bracket ends a run.
    const std::string run = times(bound, "!");
    EXPECT_EQ(stopOf(run + "-1"), run.size() + 2);
    const std::string both = times(bound, run + "(") + "x" + times(bound, ")");
    EXPECT_EQ(stopOf(both), both.size());
}

TEST(GrammarLimits, LongAndHostileTexts) {
    constexpr std::size_t many = 200000;
    constexpr std::size_t megabytes = 3000000;
    const std::string blanks = times(megabytes, " ");
    const std::string digits(megabytes, '7');
    for (const std::string open : {"(", "[", "f(", "a+(", "!(", "[(", "a.b(", "-"})
        for (const std::string tail : {"", "x", "x)", "$"})
            EXPECT_LT(stopOf(times(many, open) + tail), 2000U) << open;
    // Unclosed brackets around long operands: an operand that were read again at each level would not end.
    EXPECT_GT(stopOf(times(bound, "f(a || b && c == d + e * (")), 0U);
    for (const auto& [text, stop] :
         std::initializer_list<std::pair<std::string, std::size_t>>{{times(many, ")"), 0},
                                                                    {times(many, "a(b "), 1},
                                                                    {times(many, "a||"), many * 3 - 2},
                                                                    {times(many, "a.") + "1", many * 2 - 1},
                                                                    {blanks, 0},
                                                                    {blanks + "a" + blanks, megabytes * 2 + 1},
                                                                    {digits, 0},
                                                                    {digits + ".", 0},
                                                                    {"1.e" + digits, 1},
                                                                    {times(bound / 2, "a*(b+") + "$", 1}})
        EXPECT_EQ(stopOf(text), stop) << text.substr(0, 20);
    // Depth on the left spine costs no stack: neither reading, nor conversion, nor the end of the syntax value.
    for (const auto& [open, link, close] : std::initializer_list<std::array<const char*, 3>>{{"", "A + ", "B"},
                                                                                             {"", "A && ", "B"},
                                                                                             {"", "A - ", "B"},
                                                                                             {"", "A.", "B"},
                                                                                             {"[", "1,", "1]"},
                                                                                             {"f(", "1,", "1)"}}) {
        const std::string text = open + times(many, link) + close;
        EXPECT_EQ(stopOf(text), text.size()) << link;
    }

    SymbolicExprTable table;
    const auto tree = [&](const std::string& text) { return treeText(table, parse(table, text).id); };
    const std::string name(megabytes, 'n');
    EXPECT_EQ(tree(name), name);
    EXPECT_EQ(tree("0." + digits), "0.77777777777777779r");
    const std::string zeros(megabytes, '0');
    EXPECT_EQ(tree(zeros + "12"), "12");
    EXPECT_EQ(tree("." + zeros + "1e3000001"), "1r");
}

} // namespace
} // namespace VT::Testing
