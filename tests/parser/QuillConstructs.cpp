// What every construct of Quill text becomes, in dimensions and in conditions.
#include "base/variants/Features.hpp"
#include "tests/parser/QuillReading.hpp"
#include "tests/support/FlagSetting.hpp"
#include "tests/support/Sides.hpp"

#include <gtest/gtest.h>

namespace VT::Testing {
namespace {

using QuillConstructs = QuillTest;

void expectTrees(bool isDimension, std::initializer_list<const char*> cases) { // a text => its tree
    for (const std::string each : cases) {
        const auto& [text, tree] = sides(each);
        const QuillAnswer answer = isDimension ? readDimension(text) : readCondition(text);
        EXPECT_EQ(answer.tree, tree) << text;
        EXPECT_EQ(answer.reports.size(), tree == "invalid" ? 1U : 0U) << text;
    }
}

TEST_F(QuillConstructs, Dimensions) {
    expectTrees(true,
                {// Leaves
                 "true => true", "1.5E-3 => 0.0015r", "0x1F => 31r", "0X1p => invalid",
                 "0xffffffffffffffff => 1.8446744073709552e+19r", "123456789012345678 => 1.2345678901234568e+17r",
                 "00012 => 12r",
                 // Operators and fields
                 "-a => UnaryMinus(a)", "-1 => UnaryMinus(1r)", "-2147483648+N => Plus(-2147483648r,N)", "~a => Not(a)",
                 "!a => Not(a)", "a == b < c => Equal(a,LessThan(b,c))", "a.b.c => MemberValue(MemberValue(a,b),c)",
                 "(a).b => MemberValue(a,b)", "a!=b => NotEqual(a,b)",
                 // Lists
                 "[N] => DimsND(N)", "[N, M, 3] => Dims3D(N,M,3r)", "[a b c d] => DimsND(a,b,c,d)", "[] => DimsND()",
                 "[N -1] => Dims2D(N,UnaryMinus(1r))", "[N 3]*2 => Multiply(Dims2D(N,3r),2r)",
                 // The seven functions become operators.
                 "bitcmp(a) => BitCompl(a)",
                 "1+rem(bitand(a,b),idivide(c,d)) => Plus(1r,Modulo(BitAnd(a,b),Divide(c,d)))"});
}

// Operators, lists, calls and functions of each other are printed and read back in tests/print.
TEST_F(QuillConstructs, Conditions) {
    expectTrees(
        false,
        {// Integral literals of 32 bits are integers.
         "A == 1 => Equal(A,1)", "2147483648 => 2147483648r", "1e3 => 1000", "2.5 => 2.5r", "0x10 => 16", "1e-400 => 0",
         // A minus before 2147483648 makes one with it.
         "-2147483648 => -2147483648", "- 0x80000000 => -2147483648", "--2147483648. => UnaryMinus(-2147483648)",
         "2^-2147483648 => Power(2,-2147483648)", "-(2147483648) => UnaryMinus(2147483648r)",
         "-2147483648^2 => UnaryMinus(Power(2147483648r,2))", "-2147483648' => UnaryMinus(Transpose(2147483648r))",
         "a-2147483648 => Minus(a,2147483648r)", "-2147483649 => UnaryMinus(2147483649r)",
         "-02147483647 => UnaryMinus(2147483647)", "bitshift(a,-2147483648) => ShiftRight(a,2147483647)",
         // Lists and functions
         "[a b; 1:3 d] => Matrix(Row(a,b),Row(QColon(1,3),d))", "{} => CellArray(Row())",
         "@(p) @(q) p => AnonymousFunc(@(p),AnonymousFunc(@(q),p))",
         // Calls
         "f() => FcnCall(f)", "f(g(x), @( p , q ) h(p)) => FcnCall(f,FcnCall(g,x),AnonymousFunc(@(p,q),FcnCall(h,p)))",
         "a.b(2) => FcnCall(MemberValue(a,b),2)", "(5)(1) => FcnCall(5,1)",
         "((s.t)(1).u)(2) => FcnCall(MemberValue(FcnCall(MemberValue(s,t),1),u),2)",
         "[f](1) => FcnCall(Matrix(Row(f)),1)", "(@(p) p)(2) => FcnCall(AnonymousFunc(@(p),p),2)",
         // The seven functions, with their number of arguments and with another one
         "bitshift(a, 2) => ShiftLeft(a,2)", "bitshift(a, -3) => ShiftRight(a,3)", "rem(a,b,c) => FcnCall(rem,a,b,c)",
         "bitand(a) => FcnCall(bitand,a)"});
}

/// Each text has a ` before what is not known, and " => " before the name of that.
void expectUnhandled(const std::string& each, bool inDimensions, bool inConditions) {
    auto [text, name] = sides(each);
    const std::string place = std::to_string(text.find('`'));
    text.erase(text.find('`'), 1);
    const std::string report = "UnhandledExpression(" + name + ", " + text + ", " + place + ")@" + place;
    EXPECT_EQ(inDimensions ? reportsText(readDimension(text)) : report, report);
    EXPECT_EQ(inConditions ? reportsText(readCondition(text)) : report, report);
}

TEST_F(QuillConstructs, OperatorsOfBoth) {
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
}

TEST_F(QuillConstructs, ConditionsOnly) {
    for (const std::string each :
         {"1+`a^2 => power", "`a.^b => element-wise power", "`a' => transpose", "`a.' => plain transpose",
          "1 - `a.*b => element-wise multiply", "`a./b => element-wise divide", "`a\\b => left divide",
          "`a.\\b => element-wise left divide", "`a|b => element-wise or", "`a&b => element-wise and", "`a:b => range",
          "`a:s:b => stepped range", "[`1:3] => range", "2*`{a} => cell array",
          // Functions
          "`@(p) p => anonymous function"})
        expectUnhandled(each, true, false);
    expectTrees(false, {"1+a^2 => Plus(1,Power(a,2))", "a.^b => DotPower(a,b)", "a' => Transpose(a)",
                        "a.' => DotTranspose(a)", "a.*b => DotMul(a,b)", "a./b => DotDiv(a,b)", "a\\b => LDiv(a,b)",
                        // Those of C are others.
                        "a.\\b => DotLDiv(a,b)", "a|b => SingleOr(a,b)", "a&b => SingleAnd(a,b)", "a:b => QColon(a,b)",
                        "a:s:b => QColon3(a,s,b)"});
}

TEST_F(QuillConstructs, NeitherInDimensionsNorInConditions) {
    for (const std::string each :
         {"1 + `'it''s' => 'it''s'", "`\"text\" => \"text\"", "`2i => 2i", "`@sin => function handle",
          // Without a name to be called or indexed
          "`(a)(1) => call", "`((a))(1) => call", "`(+a)(1) => call"})
        expectUnhandled(each, true, true);
    for (const std::string each : {"x`{1} => {", "a + b.c`{1, 2} + 'd' => {", "`((sim))(1) => call", "v(`end) => end"})
        expectUnhandled(each, false, true);
}

TEST_F(QuillConstructs, VariantKeywords) {
    for (const int value : {1, 0, 1}) {
        const FlagSetting setting(*VTFEAT_VariantKeywordsSimCodegen, value);
        EXPECT_EQ(treeText(table, conditions("(sim) || x && (codegen)")),
                  value == 1 ? "Or((sim),And(x,(codegen)))" : "Or(sim,And(x,codegen))");
        EXPECT_EQ(treeText(table, dimensions("(sim)")), "sim");
    }
}

} // namespace
} // namespace VT::Testing
