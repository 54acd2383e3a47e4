// Where expressions have no value, lists, shared and deep graphs, and slots.
#include "base/eval/Eval.hpp"
#include "base/eval/EvalVisitor.hpp"
#include "base/transform/DimensionLists.hpp"
#include "host/Messages.hpp"
#include "parser/QuillConverterBlockVariants.hpp"
#include "parser/SymbolicExprParser.hpp"
#include "tests/support/Cases.hpp"
#include "tests/support/TreeReader.hpp"
#include "tests/support/generators/AnyNode.hpp"

#include <gmock/gmock.h>
#include <iterator>
#include <sstream>

namespace VT::Testing {
namespace {

using ::testing::HasSubstr;

class Evaluation : public ::testing::Test {
protected:
    SymbolicExprId read(const std::string& text) { return SymbolicExprParser(table, true, true)(text); }

    void bind(const std::string& symbol, const std::string& value) { table.registerValueId(read(symbol), read(value)); }

    void expectValue(SymbolicExprId id, const SymbolicValue& wanted) {
        EXPECT_EQ(SymbolicExprEval(table).eval(id), wanted);
        EXPECT_EQ(SymbolicExprEval(table).prepare(id).run(), wanted);
    }

    void expectNone(SymbolicExprId id) {
        EXPECT_THROW(static_cast<void>(SymbolicExprEval(table).eval(id)), HostDiagnostic);
        EXPECT_THROW(static_cast<void>(SymbolicExprEval(table).prepare(id).run()), HostDiagnostic);
    }

    SymbolicExprTable table;
    Trees tree{table};
};

using Vector = SymbolicValue::Elements;

TEST_F(Evaluation, NamesWhatHasNoValue) {
    for (const CaseRow& row : casesOf("eval.txt", "bound", 2))
        bind(row[0], row[1]);
    for (const CaseRow& row : casesOf("eval.txt", "no value", 3)) {
        const std::string &key = row[0], &named = row[1], &text = row[2];
        SCOPED_TRACE(text);
        const SymbolicExprId id = read(text);
        const SymbolicExprEval evaluator(table);
        SymbolicExprEvalImpl visitor(table);
        for (const int way : {0, 1, 2})
            try {
                way == 0   ? static_cast<void>(evaluator.eval(id))
                : way == 1 ? static_cast<void>(evaluator.prepare(id).run())
                           : (table.get(id)->accept(table, visitor), static_cast<void>(visitor.get()));
                ADD_FAILURE() << "has a value";
            } catch (const HostDiagnostic& diagnostic) {
                EXPECT_EQ(diagnostic.messageId(), "Vantor:SymbolicDims:" + key);
                EXPECT_TRUE(fits(*findMessage(diagnostic.messageId()), diagnostic.arguments()));
                EXPECT_EQ(std::get<std::string>(diagnostic.arguments().at(0)), named);
                EXPECT_THAT(diagnostic.what(), HasSubstr("\"" + named + "\""));
            }
    }
}

TEST_F(Evaluation, AnswersIdentifiersThatAreNoNodes) {
    const SymbolicExprId one = tree.integer(1);
    const SymbolicExprId onNothing = SymbolicPlusExpr(table, one, 1000).getId(table);
    const SymbolicExprId onItself = SymbolicPlusExpr(table, one, table.size()).getId(table);
    table.registerValueId("N", 1000);
    for (const SymbolicExprId id : {SymbolicExprId{999}, invalidId, onNothing, onItself, tree.name("N")})
        expectNone(id);
    SymbolicExprEvalImpl visitor(table);
    EXPECT_THROW(static_cast<void>(visitor.get()), HostDiagnostic);
    table.get(onNothing)->invoke(visitor);
    EXPECT_THROW(static_cast<void>(visitor.get()), HostDiagnostic);
    EXPECT_THROW(static_cast<void>(visitor.evaluate(onNothing)), HostDiagnostic);
    visitor.execute(table, one);
    EXPECT_EQ(visitor.get(), SymbolicValue(1));                     // usable after errors
    EXPECT_THROW(static_cast<void>(visitor.get()), HostDiagnostic); // once
    SymbolicExprTable other;                                        // whose nodes are on the same numbers
    const SymbolicExprId two = SymbolicIntValue(other, 2).getId(other);
    other.get(two)->accept(table, visitor);
    EXPECT_EQ(visitor.get(), SymbolicValue(2));
    const SymbolicPlusExpr sum(other, two, two);
    sum.accept(table, visitor);
    EXPECT_EQ(visitor.get(), SymbolicValue(2)) << "1 + 1 in this table";
}

TEST_F(Evaluation, QuillWritesListsAsMatrices) {
    VTSymbolicExprErrorCheckerBlockVariants checker;
    SymbolicExprFromQParseTreeBlockVariants quill(table, checker);
    const SymbolicExprDimensionLists lists(table);
    bind("N", "3");
    for (const CaseRow& row : casesOf("eval.txt", "lists of Quill", 2)) {
        std::istringstream numbers(row[1]);
        const SymbolicValue wanted(Vector(std::istream_iterator<int>(numbers), {}));
        EXPECT_TRUE(numbers.eof()) << row[1];
        EXPECT_EQ(SymbolicExprEval(table).eval(lists(quill(row[0]))), wanted) << row[0];
    }
    EXPECT_EQ(lists(quill("[1 2]*3")), read("[1, 2]*3"));
    for (const CaseRow& row : casesOf("eval.txt", "no lists of Quill", 1)) {
        const SymbolicExprId id = quill(row[0]);
        SCOPED_TRACE(row[0]);
        EXPECT_EQ(lists(id), id);
        expectNone(id);
    }
    EXPECT_EQ(lists(invalidId), invalidId);
    for (const SymbolicExprId id : {quill("[[1 2] 3]"), tree(SymbolicOp::Matrix, SymbolicExprId{1000})})
        expectNone(lists(id));
}

TEST_F(Evaluation, SharedAndDeepExpressions) {
    constexpr int depth = 1'000'000;
    const SymbolicExprId one = tree.integer(1), x = tree.name("x");
    table.registerValueId(x, one);
    expectValue(tree.doubled(SymbolicOp::Plus, x), 0); // 2^64 wraps
    expectValue(tree.doubled(SymbolicOp::And, x), true);

    const SymbolicExprId sum = tree.zigzag(SymbolicOp::Plus, SymbolicOp::Plus, x, one, depth);
    SymbolicExprId prefix = x, bound = one;
    for (int i = 0; i < depth; ++i) {
        prefix = tree(SymbolicOp::BitCompl, prefix);
        const SymbolicExprId symbol = tree.name("s" + std::to_string(i));
        table.registerValueId(symbol, bound);
        bound = symbol;
    }
    expectValue(sum, depth + 1);
    expectValue(prefix, 1);
    expectValue(bound, 1);
    table.registerValueId("s0", bound); // a million symbols in a circle
    expectNone(bound);
    expectNone(tree(SymbolicOp::Power, sum, sum));
}

TEST(Prepared, HasASlotForEachSymbol) {
    SymbolicExprTable table;
    const SymbolicExprId id = readTree(table, "Plus(Plus(MemberValue(a,x),Plus(a,MemberValue(a,x))),true)");
    const SymbolicExprId member = readTree(table, "MemberValue(a,x)"), sum = table.get(id)->getInput(0);
    PreparedExpr prepared = SymbolicExprEval(table).prepare(id);
    ASSERT_EQ(prepared.slotCount(), 2U);
    EXPECT_EQ(prepared.symbol(0), member);
    EXPECT_EQ(prepared.slotOf("a"), 1U);
    EXPECT_EQ(prepared.slotOf(member), 0U);
    EXPECT_EQ(prepared.slotOf("true"), std::nullopt);
    EXPECT_EQ(prepared.slotOf(sum), std::nullopt);
    EXPECT_THROW(prepared.setInt(2, 1), std::out_of_range);
    EXPECT_THROW(prepared.set(2, SymbolicValue::Elements{1}), std::out_of_range);
    prepared.setBool(0, true);
    EXPECT_THROW(static_cast<void>(prepared.run()), HostDiagnostic); // `a` has no value
    prepared.setInt(1, 5);
    EXPECT_EQ(prepared.run(), SymbolicValue(8));
    prepared.setDouble(1, 0.5);
    EXPECT_EQ(prepared.run(), SymbolicValue(3.5));
    prepared.setInt(1, 2147483647);
    EXPECT_EQ(prepared.run(), SymbolicValue(-2147483646));
}

} // namespace
} // namespace VT::Testing
