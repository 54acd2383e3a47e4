// The order of expressions by their texts, and sizes and shapes that would ruin a printer that recurses, copies texts
// or visits paths.
#include "base/core/Limits.hpp"
#include "base/print/ExpressionPrinter.hpp"
#include "base/print/StringifySymbolicExpr.hpp"
#include "base/print/StructuralOrder.hpp"
#include "tests/support/TreeReader.hpp"
#include "tests/support/generators/AnyNode.hpp"
#include "tests/support/generators/RandomExpression.hpp"

#include <algorithm>
#include <cmath>
#include <gtest/gtest.h>
#include <stdexcept>

namespace VT::Testing {
namespace {

using Op = SymbolicOp;

const std::vector<Op> operators{Op::Plus, Op::Minus,  Op::Divide,    Op::Power, Op::And,     Op::Equal,
                                Op::Not,  Op::Modulo, Op::Transpose, Op::Or,    Op::FcnCall, Op::DimsND};

class PrintBounds : public testing::Test {
protected:
    SymbolicExprTable table;
    Trees tree{table};
    SymbolicExprPrinter printer{table, true};
};

int sign(int order) {
    return (order > 0) - (order < 0);
}

TEST_F(PrintBounds, AgreesWithTheTextsAndIsAnOrder) {
    std::mt19937_64 random(3);
    std::vector<SymbolicExprId> ids;
    for (int i = 0; i < 150; ++i) {
        ids.push_back(randomTree(table, random, operators, 1 + i % 6));
        ids.push_back(tree(Op::And, tree.name("a_name_of_more_than_a_head"),
                           ids[random() % ids.size()])); // long texts that begin alike
    }
    for (const char* const text :
         {"\"a+b\"", "Plus(a,b)", "UnaryMinus(3)", "-3", "\xc3\xa4"}) // some texts are the same
        ids.push_back(readTree(table, text));
    ids.push_back(tree.name(std::string("a\0", 2)));
    std::ranges::sort(ids);
    ids.erase(std::unique(ids.begin(), ids.end()), ids.end());

    for (const SymbolicExprId a : ids) {
        for (const SymbolicExprId b : ids) {
            const int order = sign(printer.compareUsingCache(a, b));
            const int texts = sign(printer(a).compare(printer(b)));
            ASSERT_EQ(order, texts != 0 ? texts : sign(compareStructure(table, a, b)))
                << printer(a) << "  " << printer(b);
            ASSERT_EQ(order, -sign(printer.compareUsingCache(b, a)));
            ASSERT_EQ(order == 0, a == b);
        }
    }
    std::ranges::sort(ids, [&](SymbolicExprId a, SymbolicExprId b) { return printer.compareUsingCache(a, b) < 0; });
    for (std::size_t i = 0; i < ids.size(); ++i) // transitive
        for (std::size_t j = i + 1; j < ids.size(); ++j)
            ASSERT_LT(printer.compareUsingCache(ids[i], ids[j]), 0);
}

TEST(PrintOnce, WritesWhatThePoolDoes) {
    std::vector<Op> all;
    for (const OperatorInfo& row : operatorTable())
        if (row.form != OperatorForm::Leaf)
            all.push_back(row.op);
    const std::vector<Op> plain{Op::And,        Op::Or,    Op::Not,      Op::Minus,
                                Op::UnaryMinus, Op::Equal, Op::Multiply, Op::FcnCall};
    std::mt19937_64 random(12);
    for (int round = 0; round < 20000; ++round) {
        SymbolicExprTable table;
        const Trees tree{table};
        const SymbolicExprId id = randomTree(table, random, round % 4 == 0 ? all : plain, 1 + round % 6, [&] {
            const std::vector<SymbolicExprId> leaves{tree.name("a"),  tree.name("-b"),  tree.name(""),  tree.integer(0),
                                                     tree.integer(7), tree.integer(-7), tree.real(0.5), tree.name("c")};
            return leaves[random() % (round % 3 == 0 ? leaves.size() : 2)];
        });
        for (const bool quill : {false, true}) {
            const bool spaced = round % 2 == 0;
            ASSERT_EQ(SymbolicExprPrinter(table, quill, spaced)(id),
                      StringifySymbolicExpr(table, quill, spaced).print(id));
        }
    }
}

TEST(PrintHistory, DoesNotDependOnWhatWasInternedWhen) {
    const auto sorted = [](unsigned history) {
        SymbolicExprTable table;
        std::mt19937_64 past(history);
        for (unsigned i = 0; i < 50 * history; ++i)
            randomTree(table, past, operators, 4);
        if (history % 2 == 0) // either class may stand for both
            readTree(table, "Row(FcnCall1U(f,x),Dims2D(f,x))");
        std::mt19937_64 random(11);
        std::vector<SymbolicExprId> ids;
        for (const char* const text :
             {"FcnCall(f,x)", "\"f(x)\"", "DimsND(f,x)", "\"[f,x]\"", "FcnCall(f,x,x)", "\"f(x,x)\""})
            ids.push_back(readTree(table, text));
        for (int i = 0; i < 300; ++i)
            ids.push_back(randomTree(table, random, operators, 5));
        std::ranges::shuffle(ids, past);
        const SymbolicExprPrinter printer(table, true);
        std::ranges::sort(ids, [&](SymbolicExprId a, SymbolicExprId b) { return printer.compareUsingCache(a, b) < 0; });
        std::string texts;
        for (const SymbolicExprId id : ids)
            texts += printer(id) + "\n";
        return texts;
    };
    const std::string once = sorted(0);
    for (const unsigned history : {1U, 2U, 3U})
        EXPECT_EQ(sorted(history), once);
}

TEST_F(PrintBounds, StructureDecidesBeyondTheBound) {
    for (const std::size_t length : {limits::orderedTextBytes - 1, limits::orderedTextBytes}) {
        const SymbolicExprId name = tree.name(std::string(length, 'n'));
        // '*' is before '+', addition before multiplication
        EXPECT_EQ(printer.compareUsingCache(tree(Op::Multiply, name, name), tree(Op::Plus, name, name)) < 0,
                  length < limits::orderedTextBytes);
    }
}

TEST_F(PrintBounds, GiantTexts) {
    const auto doubled = [&](const char* text) { return tree.doubled(Op::Plus, readTree(table, text)); };
    const auto sum = [&](int changed) {
        SymbolicExprId id = tree.name("x");
        for (int i = 1; i < 100'000; ++i)
            id = tree(Op::Plus, id, tree.name(i == changed ? "y" : "x"));
        return id;
    };
    const auto bottom = [&](SymbolicExprId id) { // the right end of a text that begins alike
        for (int i = 0; i < 100'000; ++i)
            id = tree(Op::Power, tree.name("x"), id);
        return id;
    };
    const auto expectLess = [&](SymbolicExprId a, SymbolicExprId b) {
        EXPECT_LT(printer.compareUsingCache(a, b), 0);
        EXPECT_GT(printer.compareUsingCache(b, a), 0);
    };
    expectLess(doubled("x"), doubled("y"));
    expectLess(doubled("Minus(x,y)"), doubled("Minus(x,z)"));
    expectLess(sum(0), sum(60'000));
    expectLess(sum(60'000), sum(100));
    expectLess(bottom(tree.name("x")), bottom(tree.name("y")));

    const auto fresh = [&] { // every NaN is a node of its own
        static_cast<void>(SymbolicDoubleValue(table, std::nan("")));
        return tree.doubled(Op::Plus, table.size() - 1);
    };
    const SymbolicExprId one = fresh();
    EXPECT_EQ(printer.compareUsingCache(one, fresh()), 0);
}

constexpr int deep = 1'000'000;

TEST_F(PrintBounds, TextAtTheBoundAndOneByteBeyond) {
    const SymbolicExprId id = tree.doubled(Op::FcnCall1U, tree.name("x"), 10);
    const std::string text = printer(id);
    EXPECT_EQ(text.size(), printer.textLength(id));
    printer.setTextBound(text.size());
    EXPECT_EQ(printer(id), text);
    printer.setTextBound(text.size() - 1);
    for (int i = 0; i < 2; ++i) {
        EXPECT_THROW(static_cast<void>(printer(id)), std::length_error);
        EXPECT_THROW(static_cast<void>(printer.printIdUsingCache(id)), std::length_error);
    }
    EXPECT_EQ(printer(tree.name("x")), "x") << "usable after the error";
}

TEST_F(PrintBounds, DoublingGraphsAreMeasuredByTheirNodes) {
    const SymbolicExprId quotient = readTree(table, "Divide(x,y)");
    // x/y&&x/y is 8 bytes; each further level doubles and adds && and two parentheses.
    EXPECT_EQ(printer.textLength(tree.doubled(Op::And, quotient, 55)), (std::uint64_t{6} << 55U) - 4);
    for (const Op op : {Op::And, Op::BitAnd, Op::ShiftRight}) {
        const SymbolicExprId id = tree.doubled(op, quotient, 200);
        const std::size_t nodes = table.size();
        EXPECT_EQ(printer.textLength(id), std::uint64_t{1} << 62U);
        EXPECT_THROW(static_cast<void>(printer(id)), std::length_error);
        EXPECT_EQ(table.size(), nodes) << "nothing is interned";
    }
}

TEST(PrintDepth, DeepSpines) {
    for (const Op op : {Op::Plus, Op::Modulo}) {
        for (const bool right : {false, true}) {
            SymbolicExprTable table;
            const Trees tree{table};
            const SymbolicExprId x = tree.name("x");
            SymbolicExprId id = tree(Op::Not, x);
            for (int i = 0; i < deep; ++i)
                id = right ? tree(op, x, id) : tree(op, id, x);
            const bool call = op == Op::Modulo;
            const std::size_t perLevel = call ? 7 : right ? 4 : 2; // rem(,x), +(x), +x
            const std::string text = SymbolicExprPrinter(table, true)(id);
            EXPECT_EQ(text.size(), 2 + perLevel * deep - (right && !call ? 2 : 0));
            if (call)
                continue;
            StringifySymbolicExpr visitor(table, true);
            visitor.execute(table, id);
            EXPECT_EQ(visitor.get(), text);
        }
    }
    SymbolicExprTable table;
    const Trees tree{table};
    SymbolicExprId id = tree.name("x");
    for (int i = 0; i < deep; ++i)
        id = tree(i % 3 == 0 ? Op::UnaryMinus : i % 3 == 1 ? Op::Transpose : Op::BitCompl, id);
    EXPECT_GT(SymbolicExprPrinter(table, true)(id).size(), std::size_t{3} * deep);
}

TEST_F(PrintBounds, WideNodesAndLongNames) {
    const std::string name(3'000'000, 'n');
    const std::vector<SymbolicExprId> inputs(200'000, tree.name("x"));
    EXPECT_EQ(printer(tree.name(name)), name);
    EXPECT_EQ(printer(tree(Op::CellArray, inputs)).size(), 2 * inputs.size() + 1);
    SymbolicExprId nested = tree.name("x");
    for (int i = 0; i < 1000; ++i)
        nested = tree(Op::Row, nested);
    EXPECT_EQ(printer(nested), "x");
    EXPECT_EQ(printer(readTree(table, "FcnCall()")), "()");
}

TEST_F(PrintBounds, IdentifiersThatAreNotOfTheTable) {
    const SymbolicExprId x = tree.name("x");
    const SymbolicExprId half = tree(Op::Plus, x, SymbolicExprId{77}); // its operand comes later, if ever
    const SymbolicExprId whole = tree(Op::And, x, half);
    for (const SymbolicExprId id : {invalidId, SymbolicExprId{table.size()}, half, whole}) {
        EXPECT_THROW(static_cast<void>(printer(id)), std::out_of_range);
        EXPECT_THROW(static_cast<void>(printer.printIdUsingCache(id)), std::out_of_range);
        EXPECT_THROW(static_cast<void>(printer.textLength(id)), std::out_of_range);
        EXPECT_THROW(static_cast<void>(printer.compareUsingCache(x, id)), std::out_of_range);
        StringifySymbolicExpr visitor(table, true);
        EXPECT_THROW((visitor.execute(table, id), static_cast<void>(visitor.get())), std::out_of_range);
    }
    EXPECT_THROW(static_cast<void>(printer(SymbolicNotExpr(table, invalidId))), std::out_of_range);
    EXPECT_EQ(printer(tree(Op::Not, x)), "~x") << "usable after the errors";
}

} // namespace
} // namespace VT::Testing
