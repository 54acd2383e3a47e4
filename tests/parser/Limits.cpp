// Texts at the grammar's bounds and texts meant to harm it.
#include "base/core/Limits.hpp"
#include "base/VTSymbolicExpr.hpp"
#include "tests/support/Parsing.hpp"
#include "tests/support/Times.hpp"
#include "tests/support/TreeText.hpp"

#include <gtest/gtest.h>

#include <map>

namespace VT::Testing {
namespace {

constexpr std::size_t bound = limits::nesting;

/// Where reading stops; the size of the text where all of it is read.
std::size_t stopOf(const std::string& text, bool cOperators = true) {
    SymbolicExprTable table;
    return parse(table, text, cOperators).stop(text);
}

TEST(GrammarLimits, NestingAtTheBoundAndOneBeyond) {
    struct Nest {
        std::string open;
        std::string close;
        std::size_t brackets = 1;
    };

    const std::vector<Nest> nests = {{"(", ")"},        {"[", "]"},       {"f(", ")"},      {"f(a,", ")"},
                                     {"a || (", ")"},   {"!(", ")"},      {"-f(", ")"},     {"1*(b+", ")"},
                                     {"[1,(", ")]", 2}, {"f([", "])", 2}, {"( ( ", "))", 2}};
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

TEST(GrammarLimits, LongChains) {
    // Depth on the left spine costs no stack: neither reading, nor conversion, nor the end of the syntax value.
    constexpr std::size_t count = 200000;
    const std::map<std::string, std::size_t> chains = {
        {"A + ", 2 + count - 1}, {"A && ", 2 + count - 1}, {"A - ", 2 + count - 1}, {"A.", 1 + count}};
    for (const auto& [link, nodes] : chains) {
        SymbolicExprTable table;
        const std::string text = times(count, link) + (link == "A." ? "A" : "B");
        EXPECT_FALSE(parse(table, text).error.has_value()) << link;
        EXPECT_GE(table.size(), nodes - 1) << link;
    }
    SymbolicExprTable table;
    const std::string list = "[" + times(count, "1,") + "1]";
    EXPECT_EQ(table.get(parse(table, list).id)->getNumInputs(), count + 1);
    const std::string call = "f(" + times(count, "1,") + "1)";
    EXPECT_EQ(table.get(parse(table, call).id)->getNumInputs(), count + 2);
}

TEST(GrammarLimits, HostileTexts) {
    constexpr std::size_t many = 200000;
    constexpr std::size_t megabytes = 3000000;
    const std::string blanks = times(megabytes, " ");
    const std::string zeros = times(megabytes, "0");
    for (const std::string open : {"(", "[", "f(", "a+(", "!(", "[(", "a.b(", "-"})
        for (const std::string tail : {"", "x", "x)", "$"})
            EXPECT_LT(stopOf(times(many, open) + tail), 2000U) << open;
    EXPECT_EQ(stopOf(times(many, ")")), 0U);
    EXPECT_EQ(stopOf(times(many, "()")), 0U);
    EXPECT_EQ(stopOf(times(many, "a(b ")), 1U);
    EXPECT_EQ(stopOf(times(many, "1 ")), 2U);
    EXPECT_EQ(stopOf(times(many, "a,")), 1U);
    EXPECT_EQ(stopOf(times(many, "a||")), many * 3 - 2);
    EXPECT_EQ(stopOf(times(many, "a.") + "1"), many * 2 - 1);
    EXPECT_EQ(stopOf(blanks), 0U);
    EXPECT_EQ(stopOf(blanks + "a" + blanks), megabytes * 2 + 1);

    // Unclosed brackets around long operands; an operand that were read again at each level would not end.
    const std::string nest = times(bound, "f(a || b && c == d + e * (");
    EXPECT_GT(stopOf(nest), 0U);
    EXPECT_EQ(stopOf(times(bound / 2, "a*(b+") + "$"), 1U);

    SymbolicExprTable table;
    const std::string name(megabytes, 'n');
    EXPECT_EQ(static_cast<const SymbolicString&>(*table.get(parse(table, name).id)).getName(), name);
    const std::string digits(megabytes, '7');
    EXPECT_EQ(stopOf(digits), 0U);
    EXPECT_EQ(stopOf(digits + "."), 0U);
    EXPECT_EQ(treeText(table, parse(table, "0." + digits).id), "0.77777777777777779r");
    EXPECT_EQ(treeText(table, parse(table, "1." + digits).id), "1.7777777777777777r");
    EXPECT_EQ(treeText(table, parse(table, zeros + "12").id), "12");
    EXPECT_EQ(treeText(table, parse(table, "." + zeros + "1").id), "0r");
    EXPECT_EQ(treeText(table, parse(table, "." + zeros + "1e3000001").id), "1r");
    EXPECT_EQ(treeText(table, parse(table, "1.e-" + digits).id), "0r");
    EXPECT_EQ(stopOf("1.e" + digits), 1U);
}

} // namespace
} // namespace VT::Testing
