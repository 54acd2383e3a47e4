// The order of visits, shared nodes, depth, and nodes that name what is not there.
#include "base/core/Nodes.hpp"
#include "tests/support/AnyNode.hpp"
#include "tests/support/RandomExpression.hpp"

#include <gmock/gmock.h>

namespace VT::Testing {
namespace {

using testing::ElementsAre;
using testing::ElementsAreArray;
using testing::IsEmpty;

/// Writes the identifiers of the nodes that it visits down.
class Recorder final : public RoutedVisitor<Recorder> {
public:
    explicit Recorder(const SymbolicExprTable& table, bool bottomUp = true) : table_(table), bottomUp_(bottomUp) {}

    [[nodiscard]] bool isBottomUpVistor() const override { return bottomUp_; }

    template <class Node>
    void on(const Node& node) {
        EXPECT_EQ(node.op(), Node::code) << "each class is visited as itself";
        visited.push_back(node.getId(table_));
    }

    std::vector<SymbolicExprId> visited;

private:
    const SymbolicExprTable& table_;
    bool bottomUp_;
};

/// Counts visits, for graphs of many.
class Counter final : public RoutedVisitor<Counter> {
public:
    void on(const SymbolicExpr&) { ++count; }

    std::size_t count = 0;
};

std::vector<SymbolicExprId> visited(const SymbolicExprTable& table, SymbolicExprId id, bool accept, bool bottomUp) {
    Recorder recorder(table, bottomUp);
    accept ? table.get(id)->accept(table, recorder) : recorder.execute(table, id);
    return recorder.visited;
}

std::vector<SymbolicExprId> executed(const SymbolicExprTable& table, SymbolicExprId id, bool bottomUp = true) {
    return visited(table, id, false, bottomUp);
}

TEST(Visiting, AgreesWithRecursionOverRandomGraphs) {
    std::mt19937_64 random(5);
    for (int round = 0; round < 40; ++round) {
        SymbolicExprTable table;
        while (table.size() < 25)
            makeRandom(table, random);
        for (SymbolicExprId root = 0; root < table.size(); ++root) {
            std::vector<SymbolicExprId> after;
            std::vector<SymbolicExprId> before;
            const auto walk = [&](const auto& self, SymbolicExprId id) -> void {
                before.push_back(id);
                for (std::size_t i = 0; i < table.get(id)->getNumInputs(); ++i)
                    self(self, table.get(id)->getInput(i));
                after.push_back(id);
            };
            walk(walk, root);
            if (after.size() > 10000)
                continue;
            Recorder alone(table);
            table.get(root)->invoke(alone);
            ASSERT_THAT(alone.visited, ElementsAre(root));
            ASSERT_THAT(executed(table, root), ElementsAreArray(after));
            ASSERT_THAT(executed(table, root, false), ElementsAreArray(after)) << "execute() does not ask";
            ASSERT_THAT(visited(table, root, true, true), ElementsAreArray(after));
            ASSERT_THAT(visited(table, root, true, false), ElementsAreArray(before));
        }
    }
}

TEST(Visiting, WhatIsNotThereIsNotVisited) {
    SymbolicExprTable table;
    const SymbolicExprId x = SymbolicString(table, "x").getId(table);
    EXPECT_THAT(executed(table, 1), IsEmpty());
    EXPECT_THAT(executed(table, invalidId), IsEmpty());

    // Nodes built on identifiers that were not there yet: on itself, on the next one, on none.
    const SymbolicExprId self = SymbolicPlusExpr(table, x, 1U).getId(table);
    ASSERT_EQ(self, 1U);
    const SymbolicExprId forward = SymbolicNotExpr(table, 3U).getId(table);
    const SymbolicExprId back = SymbolicMinusExpr(table, forward, x).getId(table);
    const SymbolicExprId dangling = SymbolicRowExpr(table, {invalidId, x, 1000U}).getId(table);
    EXPECT_THAT(executed(table, self), ElementsAre(x, self));
    EXPECT_THAT(executed(table, back), ElementsAre(forward, x, back));
    EXPECT_THAT(executed(table, dangling), ElementsAre(x, dangling));
    std::vector<std::string> symbols;
    table.getSymbolsFromExpression(back, symbols);
    EXPECT_THAT(symbols, ElementsAre("x"));
    for (const SymbolicExprId id : {self, forward, back, dangling}) {
        Counter counter;
        table.get(id)->accept(table, counter);
        EXPECT_LE(counter.count, 5U);
    }
}

} // namespace
} // namespace VT::Testing
