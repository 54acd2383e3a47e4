// What every construct of Quill text becomes, in dimensions and in conditions.
#include "base/variants/Features.hpp"
#include "tests/parser/QuillReading.hpp"
#include "tests/support/FlagSetting.hpp"
#include "tests/support/Sides.hpp"

#include <gtest/gtest.h>

namespace VT::Testing {
namespace {

TEST(QuillConstructs, Dimensions) {
    const std::string cases[] = {
        // Leaves
        "true => true", "1.5E-3 => 0.0015r", "0x1F => 31r", "0X1p => invalid",
        "0xffffffffffffffff => 1.8446744073709552e+19r", "123456789012345678 => 1.2345678901234568e+17r",
        "00012 => 12r",
        // Operators
        "-a => UnaryMinus(a)", "-1 => UnaryMinus(1r)", "-2147483648+N => Plus(-2147483648r,N)", "~a => Not(a)",
        "!a => Not(a)", "a == b < c => Equal(a,LessThan(b,c))", "a - ... and so on\n  b % the rest => Minus(a,b)",
        // Fields
        "a.b.c => MemberValue(MemberValue(a,b),c)", "(a).b => MemberValue(a,b)",
        // Lists
        "[N] => DimsND(N)", "[N, M, 3] => Dims3D(N,M,3r)", "[a b c d] => DimsND(a,b,c,d)", "[] => DimsND()",
        "[N -1] => Dims2D(N,UnaryMinus(1r))", "[N - 1] => DimsND(Minus(N,1r))", "[N 3]*2 => Multiply(Dims2D(N,3r),2r)",
        // The seven functions become operators.
        "bitcmp(a) => BitCompl(a)", "1+rem(bitand(a,b),idivide(c,d)) => Plus(1r,Modulo(BitAnd(a,b),Divide(c,d)))"};

    for (const std::string& each : cases) {
        const auto& [text, tree] = sides(each);
        const QuillAnswer answer = readDimension(text);
        EXPECT_EQ(answer.tree, tree) << text;
        EXPECT_EQ(answer.reports.size(), tree == "invalid" ? 1U : 0U) << text;
    }
}

TEST(QuillConstructs, Conditions) {
    const std::string cases[] = {
        // Integral literals of 32 bits are integers.
        "A == 1 => Equal(A,1)", "2147483648 => 2147483648r", "1e3 => 1000", "2.5 => 2.5r", "0x10 => 16", "1e-400 => 0",
        // A minus before 2147483648 makes one with it.
        "-2147483648 => -2147483648", "- 0x80000000 => -2147483648", "--2147483648. => UnaryMinus(-2147483648)",
        "2^-2147483648 => Power(2,-2147483648)", "-(2147483648) => UnaryMinus(2147483648r)",
        "-2147483648^2 => UnaryMinus(Power(2147483648r,2))", "-2147483648' => UnaryMinus(Transpose(2147483648r))",
        "a-2147483648 => Minus(a,2147483648r)", "-2147483649 => UnaryMinus(2147483649r)",
        "-02147483647 => UnaryMinus(2147483647)", "bitshift(a,-2147483648) => ShiftRight(a,2147483647)",
        // Every operator
        "2^-1 => Power(2,UnaryMinus(1))", "-a^2 => UnaryMinus(Power(a,2))", "a'' => Transpose(Transpose(a))",
        // Ranges
        "x == 1:2+n => Equal(x,QColon(1,Plus(2,n)))",
        // Lists
        "[a b; c d] => Matrix(Row(a,b),Row(c,d))", "{a, b; c} => CellArray(Row(a,b),Row(c))", "{} => CellArray(Row())",
        "{{}, 1} => CellArray(Row(CellArray(Row()),1))",
        // Functions
        "@( p , q ) p => AnonymousFunc(@(p,q),p)", "@(p) @(q) p => AnonymousFunc(@(p),AnonymousFunc(@(q),p))",
        // Calls
        "f() => FcnCall(f)", "sqrt(x:y) => FcnCall(sqrt,QColon(x,y))",
        "f(g(x), @(p) h(p)) => FcnCall(f,FcnCall(g,x),AnonymousFunc(@(p),FcnCall(h,p)))",
        "a.b(2) => FcnCall(MemberValue(a,b),2)", "f(1)(2) => FcnCall(FcnCall(f,1),2)",
        "a(1).b(2).c => MemberValue(FcnCall(MemberValue(FcnCall(a,1),b),2),c)",
        "((s.t)(1).u)(2) => FcnCall(MemberValue(FcnCall(MemberValue(s,t),1),u),2)", "(5)(1) => FcnCall(5,1)",
        "[f](1) => FcnCall(Matrix(Row(f)),1)", "(@(p) p)(2) => FcnCall(AnonymousFunc(@(p),p),2)",
        // The seven functions, with their number of arguments and with another one
        "bitshift(a, 2) => ShiftLeft(a,2)", "bitshift(a, -3) => ShiftRight(a,3)", "rem(a,b,c) => FcnCall(rem,a,b,c)",
        "bitand(a) => FcnCall(bitand,a)"};

    for (const std::string& each : cases) {
        const auto& [text, tree] = sides(each);
        const QuillAnswer answer = readCondition(text);
        EXPECT_EQ(answer.tree, tree) << text;
        EXPECT_EQ(reportsText(answer), "") << text;
    }
}

/// The report on what a converter does not know, and where.
std::string unhandledIn(const std::string& text, const std::string& name, std::size_t position) {
    const std::string place = std::to_string(position);
    return "UnhandledExpression(" + name + ", " + text + ", " + place + ")@" + place;
}

TEST(QuillConstructs, OperatorsOfBoth) {
    for (const OperatorInfo& row : operatorTable()) {
        const std::string call(row.quillCall), infix(row.quill), name(row.name);
        if (row.op >= SymbolicOp::Power || row.shape != "Binary" || row.form != OperatorForm::Infix)
            continue;
        std::vector<std::string> texts;
        if (!infix.empty())
            texts.push_back("a" + infix + "b");
        if (!call.empty() && row.op != SymbolicOp::ShiftRight)
            texts.push_back(call + "(a,b)");
        for (const std::string& text : texts) {
            EXPECT_EQ(readDimension(text).tree, name + "(a,b)") << text;
            EXPECT_EQ(readCondition(text).tree, name + "(a,b)") << text;
        }
    }
    EXPECT_EQ(readDimension("a!=b").tree, "NotEqual(a,b)");
}

TEST(QuillConstructs, ConditionsOnly) {
    const struct {
        std::string text;
        std::string tree; ///< in a condition
        std::string name; ///< of what is refused in a dimension
        std::size_t position = 0;
    } cases[] = {
        {"1+a^2", "Plus(1,Power(a,2))", "power", 2},
        {"a.^b", "DotPower(a,b)", "element-wise power"},
        {"a'", "Transpose(a)", "transpose"},
        {"a.'", "DotTranspose(a)", "plain transpose"},
        {"1 - a.*b", "Minus(1,DotMul(a,b))", "element-wise multiply", 4},
        {"a./b", "DotDiv(a,b)", "element-wise divide"},
        {"a\\b", "LDiv(a,b)", "left divide"},
        {"a.\\b", "DotLDiv(a,b)", "element-wise left divide"},
        {"a|b", "SingleOr(a,b)", "element-wise or"},
        {"a&b", "SingleAnd(a,b)", "element-wise and"},
        {"a:b", "QColon(a,b)", "range"},
        {"a:s:b", "QColon3(a,s,b)", "stepped range"},
        {"[1:3]", "Matrix(Row(QColon(1,3)))", "range", 1},
        {"2*{a}", "Multiply(2,CellArray(Row(a)))", "cell array", 2},
        {"@(p) p", "AnonymousFunc(@(p),p)", "anonymous function"},
    };

    for (const auto& [text, tree, name, position] : cases) {
        const QuillAnswer answer = readDimension(text);
        EXPECT_EQ(answer.tree, "invalid") << text;
        EXPECT_EQ(reportsText(answer), unhandledIn(text, name, position));
        EXPECT_EQ(readCondition(text).tree, tree) << text;
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
        EXPECT_EQ(reportsText(readCondition(text)), unhandledIn(text, name, position));
        if (name != "{") {
            EXPECT_EQ(reportsText(readDimension(text)), unhandledIn(text, name, position));
        }
    }
    for (const std::string text : {"(a)(1)", "((a))(1)", "(+a)(1)", "((sim))(1)"})
        EXPECT_EQ(reportsText(readCondition(text)), unhandledIn(text, "call", 0));
    EXPECT_EQ(reportsText(readCondition("v(end)")), unhandledIn("v(end)", "end", 2));
}

TEST(QuillConstructs, VariantKeywords) {
    SymbolicExprTable table;
    VTSymbolicExprErrorChecker checker;
    SymbolicExprFromQParseTreeBlockVariants converter(table, checker);
    SymbolicExprFromQParseTree dimensions(table, checker);
    for (const int value : {1, 0, 1}) {
        const FlagSetting setting(*VTFEAT_VariantKeywordsSimCodegen, value);
        EXPECT_EQ(treeText(table, converter("(sim) || x && (codegen)")),
                  value == 1 ? "Or((sim),And(x,(codegen)))" : "Or(sim,And(x,codegen))");
        EXPECT_EQ(treeText(table, dimensions("(sim)")), "sim");
    }
}

} // namespace
} // namespace VT::Testing
