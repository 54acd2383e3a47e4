// The two shapes of one operation: C operators and calls of Quill functions.
#include "base/transform/QuillConversion.hpp"
#include "tests/support/AnyNode.hpp"
#include "tests/support/Parsing.hpp"
#include "tests/support/Sides.hpp"
#include "tests/support/TreeText.hpp"

#include <gtest/gtest.h>

namespace VT::Testing {
namespace {

class QuillConversion : public testing::Test {
protected:
    SymbolicExprId read(const std::string& text) { return Testing::read(table, text); }

    template <class Driver>
    void expectConverted(const std::vector<std::string>& conversions) { // of C text to a tree
        for (const std::string& each : conversions) {
            const auto& [from, to] = sides(each);
            EXPECT_EQ(treeText(table, Driver(table)(read(from))), to) << from;
        }
    }

    template <class Driver>
    void expectUnchanged(const std::vector<std::string>& texts) {
        for (const std::string& text : texts)
            EXPECT_EQ(Driver(table)(read(text)), read(text)) << text;
    }

    SymbolicExprTable table;
};

TEST_F(QuillConversion, NamesAreInternedInOrder) {
    SymbolicExprQ2CVisitor visitor(table);
    std::string names;
    for (SymbolicExprId id = 0; id < table.size(); ++id)
        names += treeText(table, id) + " ";
    EXPECT_EQ(names, "idivide rem bitand bitor bitxor bitcmp bitshift ");
    EXPECT_EQ(visitor.get(), invalidId);
}

TEST_F(QuillConversion, CallsBecomeOperators) {
    expectConverted<SymbolicExprQ2C>({"idivide(a, rem(b, c)) => Divide(a,Modulo(b,c))",
                                      "g(bitxor(a, bitcmp(b))) => FcnCall(g,BitXOr(a,BitCompl(b)))",
                                      "bitshift(a, 0) => ShiftLeft(a,0)", "bitshift(a, -2) => ShiftRight(a,2)",
                                      "bitshift(a, - 0) => ShiftLeft(a,0)", "bitshift(a, -(-2)) => ShiftLeft(a,2)",
                                      "bitshift(a, -n) => ShiftRight(a,n)",
                                      "bitshift(a, -2147483648) => ShiftRight(a,2147483647)",
                                      "bitshift(a, -(-2147483648)) => ShiftLeft(a,2147483647)",
                                      "bitshift(a, -2147483647) => ShiftRight(a,2147483647)"});
    expectUnchanged<SymbolicExprQ2C>(
        {"rem(a)", "rem(a, b, c)", "bitcmp(a, b)", "bitcmp()", "idivide + bitand", "a / b % c", "f(a, b)"});
}

TEST_F(QuillConversion, OperatorsBecomeCalls) {
    expectConverted<SymbolicExprC2Q>(
        {"a / b % c => FcnCall2U(rem,FcnCall2U(idivide,a,b),c)",
         "(a & b | ~c) ^ a => FcnCall2U(bitxor,FcnCall2U(bitor,FcnCall2U(bitand,a,b),FcnCall1U(bitcmp,c)),a)",
         "a << - 2 => FcnCall2U(bitshift,a,-2)", "a << -(-2147483648) => FcnCall2U(bitshift,a,UnaryMinus(-2147483648))",
         "a >> 2 => FcnCall2U(bitshift,a,-2)", "a >> n => FcnCall2U(bitshift,a,UnaryMinus(n))",
         "a >> -n => FcnCall2U(bitshift,a,n)", "a >> -(b / c) => FcnCall2U(bitshift,a,FcnCall2U(idivide,b,c))",
         "a >> -2147483648 => FcnCall2U(bitshift,a,UnaryMinus(-2147483648))"});
    expectUnchanged<SymbolicExprC2Q>({"rem(a, b)", "a + b * c == !d || x.y < -3"});
}

TEST_F(QuillConversion, TheCallClassDoesNotMatter) {
    const SymbolicExprId a = read("a"), b = read("b");
    for (const bool genericFirst : {false, true}) {
        SymbolicExprTable fresh;
        const SymbolicExprId x = SymbolicString(fresh, "x").getId(fresh);
        const std::string name = "rem";
        if (genericFirst)
            SymbolicFcnCallExpr(fresh, name, std::vector{x, x});
        const SymbolicExprId call = SymbolicFcnCall2UExpr(fresh, name, x, x).getId(fresh);
        EXPECT_EQ(treeText(fresh, SymbolicExprQ2C(fresh)(call)), "Modulo(x,x)");
    }
    EXPECT_EQ(
        treeText(table, SymbolicExprQ2C(table)(SymbolicFcnCallExpr(table, std::vector<SymbolicExprId>{}).getId(table))),
        "FcnCall()");
    const SymbolicExprId computed = SymbolicFcnCall2UExpr(table, read("rem + 1"), a, b).getId(table);
    EXPECT_EQ(SymbolicExprQ2C(table)(computed), computed);
}

TEST_F(QuillConversion, IdentifiersThatAreNotOfTheTable) {
    read("a");
    for (const SymbolicExprId id :
         {invalidId, SymbolicExprId{1}, SymbolicExprId{3}}) { // those of the names that will be interned
        SymbolicExprTable small;
        const SymbolicString a(small, "a");
        EXPECT_EQ(SymbolicExprQ2C(small)(id), invalidId);
        SymbolicExprTable other;
        const SymbolicString alike(other, "a");
        EXPECT_EQ(SymbolicExprC2Q(other)(id), invalidId);
    }
}

} // namespace
} // namespace VT::Testing
