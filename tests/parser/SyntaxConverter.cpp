// What the converter makes of syntax values, also of those that no text yields.
#include "parser/SyntaxConverter.hpp"

#include "base/VTSymbolicExpr.hpp"
#include "tests/support/TreeText.hpp"

#include <gtest/gtest.h>

namespace VT::Parser {
namespace {

class SyntaxConverterTest : public testing::Test {
protected:
    std::string convert(const expression_ast& value, bool cOperators = true) {
        return Testing::treeText(table, convertSyntax(table, value, cOperators));
    }

    SymbolicExprTable table;
    SyntaxArena arena;
    expression_ast a = std::string_view("a");
    expression_ast b = std::string_view("b");
};

TEST_F(SyntaxConverterTest, EveryAlternative) {
    EXPECT_EQ(convert({}), "invalid");
    EXPECT_EQ(convert(7), "7");
    EXPECT_EQ(convert(7.0), "7r");
    EXPECT_EQ(convert(a), "a");
    EXPECT_EQ(convert(&a), "a");
    const expression_ast nested = &a;
    EXPECT_EQ(convert(&nested), "a");
    EXPECT_EQ(convert(arena.append(arena.append(nullptr, b), 1)), "DimsND(b,1)");
    EXPECT_EQ(convert(arena.binary(SymbolicOp::Minus, a, b)), "Minus(a,b)");
    EXPECT_EQ(convert(arena.unary(SymbolicOp::BitCompl, a), true), "BitCompl(a)");
    EXPECT_EQ(convert(arena.unary(SymbolicOp::BitCompl, a), false), "Not(a)");
}

TEST_F(SyntaxConverterTest, CallsWithAnArgumentThatIsNoList) {
    EXPECT_EQ(convert(arena.binary(SymbolicOp::FcnCall2U, a, b)), "FcnCall1U(a,b)");
    EXPECT_EQ(table.size(), 3U);
    EXPECT_EQ(Testing::treeText(table, 0), "a") << "the callee comes first";
}

TEST_F(SyntaxConverterTest, OperatorsWithoutMeaningYieldTheInvalidId) {
    for (int code = 0; code < operatorCount; ++code) {
        const auto op = static_cast<SymbolicOp>(code);
        const bool infix =
            (code >= 3 && code <= 23 && code != 5 && code != 17 && code != 21) || code == 29 || code == 31;
        EXPECT_EQ(convert(arena.binary(op, a, b)) == "invalid", !infix) << code;
        const bool prefix = code == 5 || code == 17 || code == 21 || code == 27;
        EXPECT_EQ(convert(arena.unary(op, a)) == "invalid", !prefix) << code;
    }
    EXPECT_EQ(convert(arena.binary(SymbolicOp::MemberValue, a, 5)), "invalid");
}

TEST_F(SyntaxConverterTest, DepthCostsNoStack) {
    constexpr int depth = 300000;
    expression_ast left = a;
    expression_ast right = b;
    expression_ast prefixes = b;
    expression_ast lists = a;
    for (int i = 0; i < depth; ++i) {
        left = arena.binary(SymbolicOp::Plus, left, b);
        right = arena.binary(SymbolicOp::Plus, a, right);
        prefixes = arena.unary(SymbolicOp::Not, prefixes);
        lists = arena.append(nullptr, lists);
    }
    for (const expression_ast& value : {left, right, prefixes, lists}) {
        const SymbolicExprId id = convertSyntax(table, value, true);
        EXPECT_EQ(id, table.size() - 1);
    }
    EXPECT_EQ(table.size(), 2U + 4 * depth - 1) << "a + b is in both sums";
}

} // namespace
} // namespace VT::Parser
