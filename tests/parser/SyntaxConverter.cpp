// What the converter makes of syntax values, also of those that no text yields.
#include "parser/SyntaxConverter.hpp"

#include "base/VTSymbolicExpr.hpp"
#include "parser/SyntaxActions.hpp"
#include "tests/support/TreeText.hpp"

#include <gtest/gtest.h>
#include <set>

namespace VT::Parser {
namespace {

TEST(SyntaxConverter, ValuesOfActionsAndThoseThatNoTextYields) {
    SymbolicExprTable table;
    SyntaxArena arena;
    const expression_ast a = std::string_view("a");
    const expression_ast b = std::string_view("b");
    const expression_ast nested = &a;
    const auto convert = [&](const expression_ast& value) {
        return Testing::treeText(table, convertSyntax(table, value, true));
    };
    EXPECT_EQ(convert(arena.binary(SymbolicOp::FcnCall2U, a, b)), "FcnCall1U(a,b)");
    EXPECT_EQ(Testing::treeText(table, 0), "a") << "the callee comes first";
    const expression_list* const both = arena.append(arena.append(nullptr, a), b);
    EXPECT_EQ(convert(negate_expr()(arena, not_expr()(arena, cmp_expr()(arena, a)))), "UnaryMinus(Not(BitCompl(a)))");
    EXPECT_EQ(convert(modulo_expr()(arena, a, member_val()(arena, b, a))), "Modulo(a,MemberValue(b,a))");
    EXPECT_EQ(convert(fcn_call_expr()(arena, a, both)), "FcnCall(a,a,b)");
    EXPECT_EQ(convert(void_fcn_call_expr()(arena, b)), "FcnCall0U(b)");
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

} // namespace
} // namespace VT::Parser
