// Sizes and shapes that would ruin a printer that recurses, copies texts or visits paths.
#include "base/print/StringifySymbolicExpr.hpp"
#include "tests/support/AnyNode.hpp"

#include <gtest/gtest.h>

#include <stdexcept>

namespace VT::Testing {
namespace {

using Op = SymbolicOp;

constexpr int deep = 1'000'000;

TEST(PrintBounds, TextAtTheBoundAndOneByteBeyond) {
    SymbolicExprTable table;
    const Trees tree{table};
    const SymbolicExprId id = tree.doubled(Op::FcnCall1U, tree.name("x"), 10);
    SymbolicExprPrinter printer(table, true);
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

TEST(PrintBounds, DoublingGraphsAreMeasuredByTheirNodes) {
    SymbolicExprTable table;
    const Trees tree{table};
    const SymbolicExprId quotient = tree(Op::Divide, tree.name("x"), tree.name("y"));
    const SymbolicExprPrinter printer(table, true);
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

TEST(PrintBounds, DeepSpines) {
    for (const Op op : {Op::Plus, Op::Modulo}) {
        for (const bool right : {false, true}) {
            SymbolicExprTable table;
            const Trees tree{table};
            const SymbolicExprId x = tree.name("x");
            SymbolicExprId id = tree(Op::Not, x);
            for (int i = 0; i < deep; ++i)
                id = right ? tree(op, x, id) : tree(op, id, x);
            const bool call = op == Op::Modulo;
            const std::size_t perLevel = call ? std::size(std::string("rem(,x)")) : right ? 4 : 2;
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

TEST(PrintBounds, WideNodesAndLongNames) {
    SymbolicExprTable table;
    const Trees tree{table};
    const std::string name(3'000'000, 'n');
    const std::vector<SymbolicExprId> inputs(200'000, tree.name("x"));
    EXPECT_EQ(SymbolicExprPrinter(table, false)(tree.name(name)), name);
    EXPECT_EQ(SymbolicExprPrinter(table, false)(tree(Op::CellArray, inputs)).size(), 2 * inputs.size() + 1);
    SymbolicExprId nested = tree.name("x");
    for (int i = 0; i < 1000; ++i)
        nested = tree(Op::Row, nested);
    EXPECT_EQ(SymbolicExprPrinter(table, true)(nested), "x");
    EXPECT_EQ(SymbolicExprPrinter(table, true)(tree(Op::FcnCall, std::vector<SymbolicExprId>{})), "()");
}

TEST(PrintBounds, IdentifiersThatAreNotOfTheTable) {
    SymbolicExprTable table;
    const Trees tree{table};
    const SymbolicExprId x = tree.name("x");
    const SymbolicExprId half = tree(Op::Plus, x, SymbolicExprId{77}); // its operand comes later, if ever
    const SymbolicExprId whole = tree(Op::And, x, half);
    const SymbolicExprPrinter printer(table, true);
    for (const SymbolicExprId id : {invalidId, SymbolicExprId{table.size()}, half, whole}) {
        EXPECT_THROW(static_cast<void>(printer(id)), std::out_of_range);
        EXPECT_THROW(static_cast<void>(printer.printIdUsingCache(id)), std::out_of_range);
        EXPECT_THROW(static_cast<void>(printer.textLength(id)), std::out_of_range);
        EXPECT_THROW(static_cast<void>(printer.compareUsingCache(x, id)), std::out_of_range);
        EXPECT_THROW(
            {
                StringifySymbolicExpr visitor(table, true);
                visitor.execute(table, id);
                static_cast<void>(visitor.get());
            },
            std::out_of_range);
    }
    EXPECT_THROW(static_cast<void>(printer(SymbolicNotExpr(table, invalidId))), std::out_of_range);
    EXPECT_EQ(printer(tree(Op::Not, x)), "~x") << "usable after the errors";
}

} // namespace
} // namespace VT::Testing
