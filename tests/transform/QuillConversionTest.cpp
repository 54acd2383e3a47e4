// The two shapes of one operation: C operators and calls of Quill functions.
#include "base/transform/QuillConversion.hpp"
#include "tests/support/Cases.hpp"
#include "tests/support/Parsing.hpp"
#include "tests/support/TreeText.hpp"
#include "tests/support/generators/AnyNode.hpp"

#include <gtest/gtest.h>

namespace VT::Testing {
namespace {

class QuillConversion : public testing::Test {
protected:
    SymbolicExprId read(const std::string& text) { return Testing::read(table, text); }

    template <class Driver>
    void expectConverted(const std::string& section) {
        for (const CaseRow& row : casesOf("transform.txt", section, 2)) {
            const SymbolicExprId before = read(row[0]), after = Driver(table)(before);
            EXPECT_TRUE(row[1].empty() ? after == before : treeText(table, after) == row[1])
                << row[0] << " becomes " << treeText(table, after);
        }
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
    expectConverted<SymbolicExprQ2C>("calls to operators");
}

TEST_F(QuillConversion, OperatorsBecomeCalls) {
    expectConverted<SymbolicExprC2Q>("operators to calls");
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
