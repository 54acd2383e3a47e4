// What the condition grammar reads as what, where it stops, and its bounds.
#include "base/VTSymbolicExpr.hpp"
#include "base/core/Limits.hpp"
#include "base/variants/Features.hpp"
#include "parser/SyntaxConverter.hpp"
#include "tests/support/FlagSetting.hpp"
#include "tests/support/Locales.hpp"
#include "tests/support/Parsing.hpp"
#include "tests/support/Sides.hpp"
#include "tests/support/Times.hpp"
#include "tests/support/TreeText.hpp"

#include <gtest/gtest.h>

#include <set>
#include <tuple>

namespace VT::Testing {
namespace {

/// "TEXT => TREE"
void expectTrees(const std::vector<std::string>& readings, bool cOperators = true, bool variantKeywords = true) {
    for (const std::string& reading : readings) {
        const auto& [text, tree] = sides(reading);
        SymbolicExprTable table;
        const ParseAnswer answer = parse(table, text, cOperators, variantKeywords);
        EXPECT_EQ(treeText(table, answer.id), tree) << text;
    }
}

/// Texts in which a ` stands where reading stops.
void expectStops(const std::vector<std::string>& texts, bool cOperators = true) {
    for (std::string text : texts) {
        const std::size_t offset = text.find('`');
        text.erase(offset, 1);
        SymbolicExprTable table;
        const ParseAnswer answer = parse(table, text, cOperators);
        ASSERT_TRUE(answer.error.has_value()) << text << " is " << treeText(table, answer.id);
        EXPECT_EQ(answer.error->offset(), offset) << text;
        EXPECT_EQ(answer.error->messageId(), "Vantor:Variants:ExpressionParseError");
        const std::vector<DiagnosticArgument> arguments{text, std::string(offset + 1, ' ') + "^"};
        EXPECT_EQ(answer.error->arguments(), arguments) << "the text, and a pointer below it";
        EXPECT_EQ(answer.error->additionalText(), "");
        EXPECT_EQ(table.size(), 0U) << text << ": an error interns nothing";
    }
}

// Trees of operators, calls and lists, and where reading stops, are compared with another parser in Agreement.cpp; here
// is what that one does not tell.
TEST(Grammar, Literals) {
    expectTrees({"007 => 7", "2---.5 => Minus(2,UnaryMinus(-0.5r))", "2147483647 => 2147483647",
                 "-2147483648 => -2147483648", "0000000000000000000000000000000000000012 => 12", "+5. => 5r",
                 "-0.0 => -0r", "1.0e+0005 => 100000r",
                 // Halfway and hard cases of correct rounding; an accumulated product of powers of ten misses them.
                 "9007199254740993.00000000000000000000000000001 => 9007199254740994r",
                 "6929495644600919.5 => 6929495644600920r", "8.41e21 => 8.4099999999999995e+21r",
                 "4.9e-324 => 4.9406564584124654e-324r", "1.7976931348623157e308 => 1.7976931348623157e+308r",
                 "-1.e-99999999999999999999 => -0r", "0.e99999999999 => 0r", "nan => nan", "inf => inf"});
}

TEST(Grammar, HostOperators) {
    expectTrees({"~x => BitCompl(x)", "!x => Not(x)"}, true);
    expectTrees({"!x => Not(x)", "~a~=~b => NotEqual(Not(a),Not(b))"}, false);
    expectStops({"x `~= 1"}, true);
    expectStops({"x `~ = 1", "`~= 1"}, false);
}

TEST(Grammar, VariantKeywords) {
    const std::vector<std::string> keywords = {"(sim) => (sim)", "(codegen) => (codegen)",
                                               " (sim) && !(codegen) => And((sim),Not((codegen)))", "((sim)) => (sim)",
                                               "f((sim)) => FcnCall(f,(sim))",
                                               // No keyword: a blank inside, a longer name, arguments, other words.
                                               "( sim ) => sim", "(simx) => simx", "f(sim) => FcnCall(f,sim)",
                                               "(SIM) => SIM", "(inherit) => inherit", "(default) => default"};
    const std::vector<std::string> names = {"(sim) => sim", "(codegen) => codegen", "((sim)) => sim"};
    {
        const FlagSetting on(*VTFEAT_VariantKeywordsSimCodegen, 1);
        expectTrees(keywords);
        expectTrees(keywords, false, true);
        expectTrees(names, true, false);
    }
    for (const std::int32_t off : {0, -1}) {
        const FlagSetting setting(*VTFEAT_VariantKeywordsSimCodegen, off);
        expectTrees(names);
        expectTrees(names, false, false);
    }
}

TEST(Grammar, ReadingStopsBehindTheLastCompleteOutermostOperand) {
    expectStops({"`", "`   ", "`(a", "`[1,", "`\"a\"", "a `&& (b == )", "(a) `b", "f`(x,)", "a.b`.1", "(sim)`x",
                 // Numbers out of range
                 "`2147483648", "-`2147483649", "- `2147483648", "a - +`99999999999999999999", "f(1, [`2147483648])",
                 "((`4294967296) + ", "a == `2147483648 == 2147483649", "`99999999999.e999", "a `b 2147483648",
                 "1`.e999999999", "a == 1`.7976931348623159e308", "-1`.e999999999999999999999999", "`.5e999",
                 "a `+ .5e999"});
}

TEST(Grammar, RightOperandsAreInternedFirst) {
    for (const std::string order :
         {"a + b => b a Plus(a,b)", "a - b * c => c b Multiply(b,c) a Minus(a,Multiply(b,c))",
          "f(x, y + z) => f x z y Plus(y,z) FcnCall(f,x,Plus(y,z))", "[a, b, a] => a b DimsND(a,b,a)",
          "a.b.c => a b MemberValue(a,b) c MemberValue(MemberValue(a,b),c)",
          // Prefix operators and calls of no argument
          "-!a => a Not(a) UnaryMinus(Not(a))", "f() + g => g f FcnCall0U(f) Plus(FcnCall0U(f),g)"}) {
        const auto& [text, nodes] = sides(order);
        SymbolicExprTable table;
        const SymbolicExprId id = parse(table, text).id;
        EXPECT_EQ(id, table.size() - 1) << text;
        std::string all;
        for (SymbolicExprId each = 0; each < table.size(); ++each)
            all += (each > 0 ? " " : "") + treeText(table, each);
        EXPECT_EQ(all, nodes) << text;
    }
    // A call takes the class that was interned first.
    SymbolicExprTable table;
    const SymbolicExprId call =
        SymbolicFcnCall1UExpr(table, SymbolicString(table, "f"), SymbolicString(table, "x")).getId(table);
    EXPECT_EQ(parse(table, "f(x)").id, call);
}

TEST(Grammar, LocalesChangeNothing) {
    inEveryLocale([] {
        expectTrees({"1.5 + I => Plus(1.5r,I)"});
        expectStops({"1`,5", "`\xe4", "a`\xa0"});
    });
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

TEST(GrammarLimits, LongChains) {
    // Depth on the left spine costs no stack: neither reading, nor conversion, nor the end of the syntax value.
    constexpr std::size_t count = 200000;
    for (const std::string link : {"A + ", "A && ", "A - ", "A."}) {
        SymbolicExprTable table;
        EXPECT_FALSE(parse(table, times(count, link) + "B").error.has_value()) << link;
        EXPECT_GE(table.size(), count) << link;
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
    const std::string digits(megabytes, '7');
    for (const std::string open : {"(", "[", "f(", "a+(", "!(", "[(", "a.b(", "-"})
        for (const std::string tail : {"", "x", "x)", "$"})
            EXPECT_LT(stopOf(times(many, open) + tail), 2000U) << open;
    EXPECT_EQ(stopOf(times(many, ")")), 0U);
    EXPECT_EQ(stopOf(times(many, "a(b ")), 1U);
    EXPECT_EQ(stopOf(times(many, "1 ")), 2U);
    EXPECT_EQ(stopOf(times(many, "a,")), 1U);
    EXPECT_EQ(stopOf(times(many, "a||")), many * 3 - 2);
    EXPECT_EQ(stopOf(times(many, "a.") + "1"), many * 2 - 1);
    EXPECT_EQ(stopOf(blanks), 0U);
    EXPECT_EQ(stopOf(blanks + "a" + blanks), megabytes * 2 + 1);
    EXPECT_EQ(stopOf(digits), 0U);
    EXPECT_EQ(stopOf(digits + "."), 0U);
    EXPECT_EQ(stopOf("1.e" + digits), 1U);
    // Unclosed brackets around long operands; an operand that were read again at each level would not end.
    EXPECT_EQ(stopOf(times(bound / 2, "a*(b+") + "$"), 1U);
    EXPECT_GT(stopOf(times(bound, "f(a || b && c == d + e * (")), 0U);

    SymbolicExprTable table;
    const auto tree = [&](const std::string& text) { return treeText(table, parse(table, text).id); };
    const std::string name(megabytes, 'n');
    EXPECT_EQ(tree(name), name);
    EXPECT_EQ(tree("0." + digits), "0.77777777777777779r");
    EXPECT_EQ(tree("1." + digits), "1.7777777777777777r");
    EXPECT_EQ(tree(zeros + "12"), "12");
    EXPECT_EQ(tree("." + zeros + "1"), "0r");
    EXPECT_EQ(tree("." + zeros + "1e3000001"), "1r");
    EXPECT_EQ(tree("1.e-" + digits), "0r");
}

} // namespace
} // namespace VT::Testing
