// The order of expressions by their texts.
#include "base/core/Limits.hpp"
#include "base/print/ExpressionPrinter.hpp"
#include "tests/support/AnyNode.hpp"
#include "tests/support/RandomExpression.hpp"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>

namespace VT::Testing {
namespace {

using Op = SymbolicOp;

const std::vector<Op> operators{Op::Plus, Op::Minus,  Op::Divide,    Op::Power, Op::And,     Op::Equal,
                                Op::Not,  Op::Modulo, Op::Transpose, Op::Or,    Op::FcnCall, Op::DimsND};

int sign(int order) {
    return (order > 0) - (order < 0);
}

TEST(PrintOrder, AgreesWithTheTextsAndIsAnOrder) {
    std::mt19937_64 random(3);
    SymbolicExprTable table;
    const Trees tree{table};
    std::vector<SymbolicExprId> ids;
    for (int i = 0; i < 150; ++i) {
        ids.push_back(randomTree(table, random, operators, 1 + i % 6));
        ids.push_back(tree(Op::And, tree.name("a_name_of_more_than_a_head"),
                           ids[random() % ids.size()])); // long texts that begin alike
    }
    ids.push_back(tree.name("a+b")); // texts of several expressions
    ids.push_back(tree(Op::Plus, tree.name("a"), tree.name("b")));
    ids.push_back(tree(Op::UnaryMinus, tree.integer(3)));
    ids.push_back(tree.integer(-3));
    ids.push_back(tree.name(std::string("a\0", 2)));
    ids.push_back(tree.name("\xc3\xa4"));
    std::ranges::sort(ids);
    ids.erase(std::unique(ids.begin(), ids.end()), ids.end());

    const SymbolicExprPrinter printer(table, true);
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

TEST(PrintOrder, DoesNotDependOnWhatWasInternedWhen) {
    const auto sorted = [](unsigned history) {
        SymbolicExprTable table;
        const Trees tree{table};
        std::mt19937_64 past(history);
        for (unsigned i = 0; i < 50 * history; ++i)
            randomTree(table, past, operators, 4);
        const SymbolicExprId f = tree.name("f"), x = tree.name("x");
        if (history % 2 == 0) { // either class may stand for both
            tree(Op::FcnCall1U, f, x);
            tree(Op::Dims2D, f, x);
        }
        std::mt19937_64 random(11);
        std::vector<SymbolicExprId> ids{tree(Op::FcnCall, f, x),
                                        tree.name("f(x)"),
                                        tree(Op::DimsND, f, x),
                                        tree.name("[f,x]"),
                                        tree(Op::FcnCall, tree.name("f"), tree.name("x"), x),
                                        tree.name("f(x,x)")};
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

TEST(PrintOrder, StructureDecidesBeyondTheBound) {
    for (const std::size_t length : {limits::orderedTextBytes - 1, limits::orderedTextBytes}) {
        SymbolicExprTable table;
        const Trees tree{table};
        const SymbolicExprId name = tree.name(std::string(length, 'n'));
        const SymbolicExprId product =
            tree(Op::Multiply, name, name); // '*' is before '+', addition before multiplication
        const SymbolicExprId sum = tree(Op::Plus, name, name);
        EXPECT_EQ(SymbolicExprPrinter(table, true).compareUsingCache(product, sum) < 0,
                  length < limits::orderedTextBytes);
    }
}

TEST(PrintOrder, GiantTexts) {
    SymbolicExprTable table;
    const Trees tree{table};
    const auto doubled = [&](SymbolicExprId id) { return tree.doubled(Op::Plus, id); };
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
    const SymbolicExprPrinter printer(table, true);
    const auto expectLess = [&](SymbolicExprId a, SymbolicExprId b) {
        EXPECT_LT(printer.compareUsingCache(a, b), 0);
        EXPECT_GT(printer.compareUsingCache(b, a), 0);
    };
    expectLess(doubled(tree.name("x")), doubled(tree.name("y")));
    expectLess(doubled(tree(Op::Minus, tree.name("x"), tree.name("y"))),
               doubled(tree(Op::Minus, tree.name("x"), tree.name("z"))));
    expectLess(sum(0), sum(100));
    expectLess(sum(0), sum(60'000));
    expectLess(sum(60'000), sum(100));
    expectLess(bottom(tree.name("x")), bottom(tree.name("y")));

    const auto fresh = [&] { // every NaN is a node of its own
        static_cast<void>(SymbolicDoubleValue(table, std::nan("")));
        return doubled(table.size() - 1);
    };
    const SymbolicExprId one = fresh();
    EXPECT_EQ(printer.compareUsingCache(one, fresh()), 0);
}

} // namespace
} // namespace VT::Testing
