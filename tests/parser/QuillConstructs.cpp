// What every construct of Quill text becomes, in dimensions and in conditions.
#include "base/variants/Features.hpp"
#include "tests/parser/QuillReading.hpp"
#include "tests/support/FlagSetting.hpp"

#include <gtest/gtest.h>

namespace VT::Testing {
namespace {

using QuillConstructs = QuillTest;

// Operators, lists, calls and functions of each other are printed and read back in tests/print.
TEST_F(QuillConstructs, Meanings) {
    expectMeanings<SymbolicExprFromQParseTree>("dimensions");
    expectMeanings<SymbolicExprFromQParseTreeBlockVariants>("conditions");
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
