// What every construct of Quill text becomes, in dimensions and in conditions.
#include "base/variants/Features.hpp"
#include "parser/SymbolicExprParser.hpp"
#include "tests/parser/QuillReading.hpp"

#include <gtest/gtest.h>

namespace VT::Testing {
namespace {

struct Case {
    std::string text;
    std::string tree;
};

const std::string unhandled = "UnhandledExpression";

TEST(QuillConstructs, Dimensions) {
    const Case cases[] = {
        // Leaves
        {"N", "N"},
        {"_n1", "_n1"},
        {"true", "true"},
        {"3", "3r"},
        {"1.5E-3", "0.0015r"},
        {"5.", "5r"},
        {"0x1F", "31r"},
        {"0X1p", "invalid"},
        {"0xffffffffffffffff", "1.8446744073709552e+19r"},
        {"123456789012345678", "1.2345678901234568e+17r"},
        {"00012", "12r"},
        // Operators
        {"a+b", "Plus(a,b)"},
        {"a-b-c", "Minus(Minus(a,b),c)"},
        {"a*b", "Multiply(a,b)"},
        {"a/b", "Divide(a,b)"},
        {"-a", "UnaryMinus(a)"},
        {"-1", "UnaryMinus(1r)"},
        {"+a", "a"},
        {"~a", "Not(a)"},
        {"!a", "Not(a)"},
        {"a==b", "Equal(a,b)"},
        {"a~=b", "NotEqual(a,b)"},
        {"a!=b", "NotEqual(a,b)"},
        {"a<b", "LessThan(a,b)"},
        {"a<=b", "LessThanEqual(a,b)"},
        {"a>b", "GreaterThan(a,b)"},
        {"a>=b", "GreaterThanEqual(a,b)"},
        {"a||b", "Or(a,b)"},
        {"a&&b", "And(a,b)"},
        {"a == b < c", "Equal(a,LessThan(b,c))"},
        {"(a+b)*((c))", "Multiply(Plus(a,b),c)"},
        {"a - ... and so on\n  b % the rest", "Minus(a,b)"},
        // Fields
        {"a.b", "MemberValue(a,b)"},
        {"a.b.c", "MemberValue(MemberValue(a,b),c)"},
        {"(a).b", "MemberValue(a,b)"},
        // Lists
        {"[N]", "DimsND(N)"},
        {"[N 3]", "Dims2D(N,3r)"},
        {"[N, M, 3]", "Dims3D(N,M,3r)"},
        {"[a b c d]", "DimsND(a,b,c,d)"},
        {"[]", "DimsND()"},
        {"[N -1]", "Dims2D(N,UnaryMinus(1r))"},
        {"[N - 1]", "DimsND(Minus(N,1r))"},
        {"[N 3]*2", "Multiply(Dims2D(N,3r),2r)"},
        // The seven functions become operators.
        {"idivide(a,b)", "Divide(a,b)"},
        {"rem(a,b)", "Modulo(a,b)"},
        {"bitand(a,b)", "BitAnd(a,b)"},
        {"bitor(a,b)", "BitOr(a,b)"},
        {"bitxor(a,b)", "BitXOr(a,b)"},
        {"bitcmp(a)", "BitCompl(a)"},
        {"bitshift(a,n)", "ShiftLeft(a,n)"},
        {"1+rem(bitand(a,b),idivide(c,d))", "Plus(1r,Modulo(BitAnd(a,b),Divide(c,d)))"},
        {"[rem(a,b) 2]", "Dims2D(Modulo(a,b),2r)"},
    };

    for (const auto& [text, tree] : cases) {
        const QuillAnswer answer = readDimension(text);
        EXPECT_EQ(answer.tree, tree) << text;
        EXPECT_EQ(answer.reports.size(), tree == "invalid" ? 1U : 0U) << text;
    }
}

TEST(QuillConstructs, Conditions) {
    const Case cases[] = {
        // Integral literals of 32 bits are integers.
        {"A == 1", "Equal(A,1)"},
        {"2147483647", "2147483647"},
        {"2147483648", "2147483648r"},
        {"1e3", "1000"},
        {"2.0", "2"},
        {"2.5", "2.5r"},
        {"0x10", "16"},
        {"1e-400", "0"},
        // Every operator
        {"-1", "UnaryMinus(1)"},
        {"a^b", "Power(a,b)"},
        {"2^-1", "Power(2,UnaryMinus(1))"},
        {"-a^2", "UnaryMinus(Power(a,2))"},
        {"a.^b", "DotPower(a,b)"},
        {"a'", "Transpose(a)"},
        {"a.'", "DotTranspose(a)"},
        {"a''", "Transpose(Transpose(a))"},
        {"a.*b", "DotMul(a,b)"},
        {"a./b", "DotDiv(a,b)"},
        {"a\\b", "LDiv(a,b)"},
        {"a.\\b", "DotLDiv(a,b)"},
        {"a | b & c", "SingleOr(a,SingleAnd(b,c))"},
        // Ranges
        {"a:b", "QColon(a,b)"},
        {"a:s:b", "QColon3(a,s,b)"},
        {"x == 1:2+n", "Equal(x,QColon(1,Plus(2,n)))"},
        // Lists
        {"[a b; c d]", "Matrix(Row(a,b),Row(c,d))"},
        {"[[a b] c]", "Matrix(Row(Matrix(Row(a,b)),c))"},
        {"[a' b']", "Matrix(Row(Transpose(a),Transpose(b)))"},
        {"{a, b; c}", "CellArray(Row(a,b),Row(c))"},
        {"{}", "CellArray(Row())"},
        {"{{}, 1}", "CellArray(Row(CellArray(Row()),1))"},
        // Functions
        {"@(p) p+1", "AnonymousFunc(@(p),Plus(p,1))"},
        {"@( p , q ) p", "AnonymousFunc(@(p,q),p)"},
        {"@() 1", "AnonymousFunc(@(),1)"},
        {"@(p) @(q) p", "AnonymousFunc(@(p),AnonymousFunc(@(q),p))"},
        // Calls
        {"f()", "FcnCall(f)"},
        {"f(a)", "FcnCall(f,a)"},
        {"f(a, b, c, d)", "FcnCall(f,a,b,c,d)"},
        {"sqrt(x:y)", "FcnCall(sqrt,QColon(x,y))"},
        {"f(g(x), @(p) h(p))", "FcnCall(f,FcnCall(g,x),AnonymousFunc(@(p),FcnCall(h,p)))"},
        {"a.b(2)", "FcnCall(MemberValue(a,b),2)"},
        {"f(1)(2)", "FcnCall(FcnCall(f,1),2)"},
        {"a(1).b(2).c", "MemberValue(FcnCall(MemberValue(FcnCall(a,1),b),2),c)"},
        // The seven functions, with their number of arguments and with another one
        {"bitand(F, 4) ~= 0", "NotEqual(BitAnd(F,4),0)"},
        {"bitshift(a, 2)", "ShiftLeft(a,2)"},
        {"bitshift(a, -3)", "ShiftRight(a,3)"},
        {"rem(n, 2) == 1", "Equal(Modulo(n,2),1)"},
        {"rem(a,b,c)", "FcnCall(rem,a,b,c)"},
        {"bitand(a)", "FcnCall(bitand,a)"},
        {"f(rem(a,b))", "FcnCall(f,Modulo(a,b))"},
    };

    for (const auto& [text, tree] : cases) {
        const QuillAnswer answer = readCondition(text);
        EXPECT_EQ(answer.tree, tree) << text;
        EXPECT_EQ(reportsText(answer), "") << text;
    }
}

TEST(QuillConstructs, ConditionsOnly) {
    // The dimension converter names what it does not know, and where.
    const struct {
        std::string text;
        std::string name;
        std::size_t position;
    } cases[] = {
        {"1+a^2", "power", 2},
        {"a.^2", "element-wise power", 0},
        {"a'", "transpose", 0},
        {"a.'", "plain transpose", 0},
        {"1 - a.*b", "element-wise multiply", 4},
        {"a./b", "element-wise divide", 0},
        {"a\\b", "left divide", 0},
        {"a.\\b", "element-wise left divide", 0},
        {"a|b", "element-wise or", 0},
        {"a&b", "element-wise and", 0},
        {"a+1:b", "range", 0},
        {"a:s:b", "stepped range", 0},
        {"[1:3]", "range", 1},
        {"2*{a}", "cell array", 2},
        {"@(p) p", "anonymous function", 0},
    };

    for (const auto& [text, name, position] : cases) {
        const std::string expected =
            unhandled + "(" + name + ", " + text + ", " + std::to_string(position) + ")@" + std::to_string(position);
        const QuillAnswer answer = readDimension(text);
        EXPECT_EQ(answer.tree, "invalid") << text;
        EXPECT_EQ(reportsText(answer), expected);
        EXPECT_NE(readCondition(text).tree, "invalid") << text;
    }
}

TEST(QuillConstructs, NeitherInDimensionsNorInConditions) {
    const struct {
        std::string text;
        std::string name;
        std::size_t position;
    } cases[] = {
        {"x{1}", "{", 1}, {"a + b.c{1, 2} + 'd'", "{", 7}, {"1 + 'it''s'", "'it''s'", 4}, {"\"text\"", "\"text\"", 0},
        {"2i", "2i", 0},  {"@sin", "function handle", 0},
    };

    for (const auto& [text, name, position] : cases) {
        const std::string expected =
            unhandled + "(" + name + ", " + text + ", " + std::to_string(position) + ")@" + std::to_string(position);
        EXPECT_EQ(reportsText(readCondition(text)), expected);
        if (name != "{") {
            EXPECT_EQ(reportsText(readDimension(text)), expected);
        }
    }
    for (const std::string text : {"(a)(1)", "[f](1)", "(f.g)(1)"})
        EXPECT_EQ(reportsText(readCondition(text)), unhandled + "(call, " + text + ", 0)@0");
    EXPECT_EQ(reportsText(readCondition("v(end)")), unhandled + "(end, v(end), 2)@2");
}

TEST(QuillConstructs, BothLanguagesMeetInTheSameNodes) {
    const struct {
        std::string quill;
        std::string c;
    } cases[] = {
        {"Mode == 1 && Gear > 2", "Mode == 1 && Gear > 2"},
        {"~(A ~= 3) || B", "!(A != 3) || B"},
        {"bitand(F, 4) ~= 0", "(F & 4) != 0"},
        {"bitor(a, bitxor(b, bitcmp(c)))", "a | (b ^ ~c)"},
        {"bitshift(a, -3) + bitshift(b, 2)", "(a >> 3) + (b << 2)"},
        {"idivide(a, b) == rem(c, d)", "a / b == c % d"},
        {"cfg.mode == f(x, y, z)", "cfg.mode == f(x, y, z)"},
    };

    for (const auto& [quill, c] : cases) {
        SymbolicExprTable table;
        VTSymbolicExprErrorChecker checker;
        const SymbolicExprId fromC = SymbolicExprParser(table, true, true)(c);
        EXPECT_EQ(SymbolicExprFromQParseTreeBlockVariants(table, checker)(quill), fromC) << quill;
    }
}

TEST(QuillConstructs, ListsInUtf16Text) {
    EXPECT_EQ(readDimension(std::u16string(u"[N 3]")).tree, "Dims2D(N,3r)");
    EXPECT_EQ(readCondition(std::u16string(u"[N 3]")).tree, "Matrix(Row(N,3))");
    EXPECT_EQ(readCondition(std::u16string(u"A == 1 % \u00e9\U0001F600")).tree, "Equal(A,1)");
}

TEST(QuillConstructs, VariantKeywords) {
    VtFeature& flag = *VTFEAT_VariantKeywordsSimCodegen;
    const std::int32_t before = flag.value();
    SymbolicExprTable table;
    VTSymbolicExprErrorChecker checker;
    SymbolicExprFromQParseTreeBlockVariants converter(table, checker);
    SymbolicExprFromQParseTree dimensions(table, checker);
    for (const int value : {1, 0, 1}) {
        flag.setValue(value);
        EXPECT_EQ(treeText(table, converter("(sim) || x && (codegen)")),
                  value == 1 ? "Or((sim),And(x,(codegen)))" : "Or(sim,And(x,codegen))");
        EXPECT_EQ(treeText(table, dimensions("(sim)")), "sim");
    }
    flag.setValue(before);
}

} // namespace
} // namespace VT::Testing
