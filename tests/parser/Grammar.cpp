// What the condition grammar reads as what, and where it stops.
#include "base/VTSymbolicExpr.hpp"
#include "base/variants/Features.hpp"
#include "tests/support/Parsing.hpp"
#include "tests/support/TreeText.hpp"

#include <gtest/gtest.h>

#include <clocale>
#include <cmath>

namespace VT::Testing {
namespace {

struct Reading {
    std::string text;
    std::string tree;
};

void expectTrees(const std::vector<Reading>& readings, bool cOperators = true, bool variantKeywords = true) {
    for (const Reading& reading : readings) {
        SymbolicExprTable table;
        const ParseAnswer answer = parse(table, reading.text, cOperators, variantKeywords);
        EXPECT_EQ(treeText(table, answer.id), reading.tree) << reading.text;
    }
}

struct Stop {
    std::string text;
    std::size_t offset;
};

void expectStops(const std::vector<Stop>& stops, bool cOperators = true, bool variantKeywords = true) {
    for (const Stop& stop : stops) {
        SymbolicExprTable table;
        const ParseAnswer answer = parse(table, stop.text, cOperators, variantKeywords);
        ASSERT_TRUE(answer.error.has_value()) << stop.text << " is " << treeText(table, answer.id);
        EXPECT_EQ(answer.error->offset(), stop.offset) << stop.text;
        EXPECT_EQ(table.size(), 0U) << stop.text << ": an error interns nothing";
    }
}

class FlagSetting {
public:
    explicit FlagSetting(std::int32_t value) : before_(VTFEAT_VariantKeywordsSimCodegen->value()) {
        VTFEAT_VariantKeywordsSimCodegen->setValue(value);
    }

    FlagSetting(const FlagSetting&) = delete;
    FlagSetting& operator=(const FlagSetting&) = delete;

    ~FlagSetting() { VTFEAT_VariantKeywordsSimCodegen->setValue(before_); }

private:
    std::int32_t before_;
};

TEST(Grammar, Literals) {
    expectTrees({
        {"0", "0"},
        {"007", "7"},
        {"2147483647", "2147483647"},
        {"-2147483648", "-2147483648"},
        {"+5", "5"},
        {"-5", "-5"},
        {"0000000000000000000000000000000000000012", "12"},
        {"3.0", "3r"},
        {"5.", "5r"},
        {".5", "0.5r"},
        {"-.5", "-0.5r"},
        {"+5.", "5r"},
        {"-0.0", "-0r"},
        {"1.e5", "100000r"},
        {"1.5E-1", "0.14999999999999999r"},
        {"1.0e+0005", "100000r"},
        {"0.1", "0.10000000000000001r"},
        // Halfway and hard cases of correct rounding; an accumulated product of powers of ten misses them.
        {"9007199254740993.0", "9007199254740992r"},
        {"9007199254740993.00000000000000000000000000001", "9007199254740994r"},
        {"6929495644600919.5", "6929495644600920r"},
        {"8.41e21", "8.4099999999999995e+21r"},
        {"2.2250738585072011e-308", "2.2250738585072009e-308r"},
        {"4.9e-324", "4.9406564584124654e-324r"},
        {"1.e-999999999", "0r"},
        {"-1.e-99999999999999999999", "-0r"},
        {"1.7976931348623157e308", "1.7976931348623157e+308r"},
        {"0.e99999999999", "0r"},
        {"99999999999999999999.0", "1e+20r"},
        {"nan", "nan"},
        {"inf", "inf"},
        {"Infinity", "Infinity"},
    });
}

TEST(Grammar, SignsBelongToTheDigitsBehindThem) {
    expectTrees({
        {"- 5", "UnaryMinus(5)"},
        {"-(5)", "UnaryMinus(5)"},
        {"-x", "UnaryMinus(x)"},
        {"--5", "UnaryMinus(-5)"},
        {"--.5", "UnaryMinus(-0.5r)"},
        {"2--3", "Minus(2,-3)"},
        {"2---3", "Minus(2,UnaryMinus(-3))"},
        {"2-3", "Minus(2,3)"},
        {"2 -3", "Minus(2,3)"},
        {"2+-.5", "Plus(2,-0.5r)"},
        {"a-+-3", "Minus(a,-3)"},
        {"+x", "x"},
        {"+ + 5", "5"},
        {"+-+x", "UnaryMinus(x)"},
        {"!-5", "Not(-5)"},
    });
}

TEST(Grammar, PrecedenceAndAssociativity) {
    expectTrees({
        {"a || b && c", "Or(a,And(b,c))"},
        {"a && b || c", "Or(And(a,b),c)"},
        {"a && b | c", "And(a,BitOr(b,c))"},
        {"a | b ^ c", "BitOr(a,BitXOr(b,c))"},
        {"a ^ b & c", "BitXOr(a,BitAnd(b,c))"},
        {"a & b == c", "BitAnd(a,Equal(b,c))"},
        {"a == b < c", "Equal(a,LessThan(b,c))"},
        {"1 << 2 < 3", "LessThan(ShiftLeft(1,2),3)"},
        {"a >> b + c", "ShiftRight(a,Plus(b,c))"},
        {"a - b * c", "Minus(a,Multiply(b,c))"},
        {"a * -b", "Multiply(a,UnaryMinus(b))"},
        {"a - b - c", "Minus(Minus(a,b),c)"},
        {"a - b + c", "Plus(Minus(a,b),c)"},
        {"a / b % c * d", "Multiply(Modulo(Divide(a,b),c),d)"},
        {"a == b != c", "NotEqual(Equal(a,b),c)"},
        {"a < b <= c > d >= e", "GreaterThanEqual(GreaterThan(LessThanEqual(LessThan(a,b),c),d),e)"},
        {"a << b >> c", "ShiftRight(ShiftLeft(a,b),c)"},
        {"a || b || c", "Or(Or(a,b),c)"},
        // Down to the tightest operator and up again in one chain.
        {"a||b&&c|d^e&f==g<h<<i+j*k+l", "Or(a,And(b,BitOr(c,BitXOr(d,BitAnd(e,Equal(f,LessThan(g,ShiftLeft(h,"
                                        "Plus(Plus(i,Multiply(j,k)),l)))))))))"},
        {"a*b||c", "Or(Multiply(a,b),c)"},
        {"a*(b||c)", "Multiply(a,Or(b,c))"},
        {"!!a", "Not(Not(a))"},
        {"-~!a", "UnaryMinus(BitCompl(Not(a)))"},
        {"!a.b", "Not(MemberValue(a,b))"},
        {"!a == b", "Equal(Not(a),b)"},
    });
}

TEST(Grammar, OperandsBehindNames) {
    expectTrees({
        {"_a1", "_a1"},
        {"f()", "FcnCall0U(f)"},
        {"f ( )", "FcnCall0U(f)"},
        {"f(x)", "FcnCall(f,x)"},
        {"f(x, y)", "FcnCall(f,x,y)"},
        {"f(g(x), h())", "FcnCall(f,FcnCall(g,x),FcnCall0U(h))"},
        {"f([1, 2])", "FcnCall(f,DimsND(1,2))"},
        {"a.b", "MemberValue(a,b)"},
        {"a . b", "MemberValue(a,b)"},
        {"a.b.c.d", "MemberValue(MemberValue(MemberValue(a,b),c),d)"},
        {"a.b+c.d", "Plus(MemberValue(a,b),MemberValue(c,d))"},
        {"[1, 2]", "DimsND(1,2)"},
        {"[a]", "DimsND(a)"},
        {"[[1,2],[3]]", "DimsND(DimsND(1,2),DimsND(3))"},
        {"((a))", "a"},
        {"true && false", "And(true,false)"},
    });
}

TEST(Grammar, BlanksMayStandBetweenAllTokensAndAtBothEnds) {
    expectTrees({
        {" \t\n\v\f\ra\t==\n1\v&&\ff\r(\t)\n", "And(Equal(a,1),FcnCall0U(f))"},
        {"\n-\n5\n", "UnaryMinus(5)"},
    });
    expectStops(
        {{"a & & b", 2}, {"a = = b", 2}, {"a < = b", 2}, {"a ! = b", 2}, {"1 .5", 2}, {"1. 5", 3}, {"1.e 5", 2}});
}

TEST(Grammar, HostOperators) {
    expectTrees({{"~x", "BitCompl(x)"}, {"!x", "Not(x)"}, {"x != 1", "NotEqual(x,1)"}}, true);
    expectTrees({{"~x", "Not(x)"},
                 {"!x", "Not(x)"},
                 {"~~x", "Not(Not(x))"},
                 {"x ~= 1", "NotEqual(x,1)"},
                 {"x != 1", "NotEqual(x,1)"},
                 {"a ~= b == c", "Equal(NotEqual(a,b),c)"},
                 {"~a~=~b", "NotEqual(Not(a),Not(b))"}},
                false);
    expectStops({{"x ~= 1", 2}, {"x~=1", 1}}, true);
    expectStops({{"x ~ = 1", 2}, {"~= 1", 0}}, false);
}

TEST(Grammar, VariantKeywords) {
    const std::vector<Reading> keywords = {
        {"(sim)", "(sim)"},
        {"(codegen)", "(codegen)"},
        {" (sim) && !(codegen)", "And((sim),Not((codegen)))"},
        {"((sim))", "(sim)"},
        {"f((sim))", "FcnCall(f,(sim))"},
        // No keyword: a blank inside, a longer name, arguments, other words.
        {"( sim )", "sim"},
        {"(simx)", "simx"},
        {"f(sim)", "FcnCall(f,sim)"},
        {"(SIM)", "SIM"},
        {"(inherit)", "inherit"},
        {"(default)", "default"},
    };
    const std::vector<Reading> names = {{"(sim)", "sim"}, {"(codegen)", "codegen"}, {"((sim))", "sim"}};
    {
        const FlagSetting on(1);
        expectTrees(keywords);
        expectTrees(keywords, false, true);
        expectTrees(names, true, false);
    }
    for (const std::int32_t off : {0, -1}) {
        const FlagSetting setting(off);
        expectTrees(names);
        expectTrees(names, false, false);
    }
}

TEST(Grammar, ReadingStopsBehindTheLastCompleteOutermostOperand) {
    expectStops({
        {"", 0},
        {"   ", 0},
        {"==", 0},
        {"(a", 0},
        {"(a b)", 0},
        {"()", 0},
        {"[]", 0},
        {"[1,", 0},
        {"-", 0},
        {"- - !", 0},
        {"a b", 2},
        {"a   b", 4},
        {"a ==", 2},
        {"a == ", 2},
        {"a + (b", 2},
        {"a && (b == )", 2},
        {"a || || b", 2},
        {"a &&& b", 2},
        {"a ||| b", 2},
        {"a <<< b", 2},
        {"a === b", 2},
        {"a = b", 2},
        {"a + b * ", 6},
        {"(a) b", 4},
        {"a)", 1},
        {"a]", 1},
        {"a,b", 1},
        {"f(x", 1},
        {"f (x", 2},
        {"f(x,)", 1},
        {"f(,x)", 1},
        {"f(x)(y)", 4},
        {"f()()", 3},
        {"g + f(x", 5},
        {"!f(x", 2},
        {"f(x).y", 4},
        {"a.b(x)", 3},
        {"a.b.", 3},
        {"a.b.1", 3},
        {"a.", 1},
        {"a.1", 1},
        {"(a).b", 3},
        {"1e5", 1},
        {"1x", 1},
        {"0x10", 1},
        {"1u", 1},
        {"1.2.3", 3},
        {"1.x", 2},
        {"5.e", 2},
        {"5.e+", 2},
        {".", 0},
        {".e5", 0},
        {"a + .", 2},
        {"a ? b : c", 2},
        {"a # b", 2},
        {"a == 'x'", 2},
        {"\"a\"", 0},
        {"a; b", 1},
        {"a $ b", 2},
        {"a @ b", 2},
        {"a \\ b", 2},
        {"(sim)x", 5},
        {"(sim)(codegen)", 5},
    });
}

TEST(Grammar, NumbersOutOfRange) {
    expectStops({
        // An integer at its first digit, however deep in the text.
        {"2147483648", 0},
        {"a == 2147483648", 5},
        {"-2147483649", 1},
        {"- 2147483648", 2},
        {"a - +99999999999999999999", 5},
        {"f(1, [2147483648])", 6},
        {"((4294967296) + ", 2},
        {"a == 2147483648 == 2147483649", 5},
        {"99999999999.e999", 0},
        // No rule reaches the literal.
        {"a b 2147483648", 2},
        // A real beyond the double range is none: its leading digits are read as an integer.
        {"1.e999999999", 1},
        {"a == 1.7976931348623159e308", 6},
        {"-1.e999999999999999999999999", 2},
        {".5e999", 0},
        {"a + .5e999", 2},
    });
}

TEST(Grammar, ErrorsPointBelowTheText) {
    SymbolicExprTable table;
    for (const auto& [text, offset] :
         std::vector<Stop>{{"a b", 2}, {"", 0}, {"(", 0}, {"x ~= 1", 2}, {"\xc3\xa4", 0}}) {
        const ParseAnswer answer = parse(table, text);
        ASSERT_TRUE(answer.error.has_value()) << text;
        EXPECT_EQ(answer.error->messageId(), "Vantor:Variants:ExpressionParseError");
        EXPECT_EQ(answer.error->offset(), offset);
        ASSERT_EQ(answer.error->arguments().size(), 2U);
        EXPECT_EQ(std::get<std::string>(answer.error->arguments()[0]), text);
        EXPECT_EQ(std::get<std::string>(answer.error->arguments()[1]), std::string(offset + 1, ' ') + "^");
        EXPECT_EQ(answer.error->additionalText(), "");
    }
}

TEST(Grammar, RightOperandsAreInternedFirst) {
    const auto order = [](const std::string& text) {
        SymbolicExprTable table;
        const SymbolicExprId id = parse(table, text).id;
        EXPECT_EQ(id, table.size() - 1) << text;
        std::string all;
        for (SymbolicExprId each = 0; each < table.size(); ++each)
            all += (each > 0 ? " " : "") + treeText(table, each);
        return all;
    };
    EXPECT_EQ(order("a + b"), "b a Plus(a,b)");
    EXPECT_EQ(order("a - b * c"), "c b Multiply(b,c) a Minus(a,Multiply(b,c))");
    EXPECT_EQ(order("f(x, y + z)"), "f x z y Plus(y,z) FcnCall(f,x,Plus(y,z))");
    EXPECT_EQ(order("[a, b, a]"), "a b DimsND(a,b,a)");
    EXPECT_EQ(order("a.b.c"), "a b MemberValue(a,b) c MemberValue(MemberValue(a,b),c)");
    EXPECT_EQ(order("-!a"), "a Not(a) UnaryMinus(Not(a))");
    EXPECT_EQ(order("f() + g"), "g f FcnCall0U(f) Plus(FcnCall0U(f),g)");
}

TEST(Grammar, CallsTakeTheClassThatWasInternedFirst) {
    SymbolicExprTable table;
    const SymbolicString f(table, "f");
    const SymbolicString x(table, "x");
    const SymbolicExprId call = SymbolicFcnCall1UExpr(table, f, x).getId(table);
    EXPECT_EQ(parse(table, "f(x)").id, call);
}

TEST(Grammar, LocalesChangeNothing) {
    const std::string before = std::setlocale(LC_ALL, nullptr);
    for (const char* name : {"de_DE.UTF-8", "de_DE.ISO-8859-1", "tr_TR.UTF-8", "C.UTF-8"}) {
        if (std::setlocale(LC_ALL, name) == nullptr)
            continue;
        expectTrees({{"1.5 + I", "Plus(1.5r,I)"}});
        expectStops({{"1,5", 1}, {"\xe4", 0}, {"a\xa0", 1}});
    }
    std::setlocale(LC_ALL, before.c_str());
}

} // namespace
} // namespace VT::Testing
