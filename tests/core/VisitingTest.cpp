// The order of visits, shared nodes, depth, and nodes that name what is not there.
#include "base/core/Nodes.hpp"
#include "tests/support/HostTables.hpp"

#include <gmock/gmock.h>

#include <optional>
#include <set>

namespace VT::Testing {
namespace {

using testing::ElementsAreArray;
using testing::IsEmpty;

using Nodes = std::vector<const SymbolicExpr*>;

/// Writes down which nodes it visits.
class Recorder final : public RoutedVisitor<Recorder> {
public:
    explicit Recorder(bool bottomUp) : bottomUp_(bottomUp) {}

    [[nodiscard]] bool isBottomUpVistor() const override { return bottomUp_; }

    template <class Node>
    void on(const Node& node) {
        EXPECT_EQ(node.op(), Node::code) << "each class is visited as itself";
        visited.push_back(&node);
    }

    Nodes visited;

private:
    bool bottomUp_;
};

Nodes accepted(const SymbolicExprTable& table, const SymbolicExpr& node, bool bottomUp = true) {
    Recorder recorder(bottomUp);
    node.accept(table, recorder);
    return recorder.visited;
}

Nodes executed(const SymbolicExprTable& table, SymbolicExprId id, bool bottomUp = true) {
    Recorder recorder(bottomUp);
    recorder.execute(table, id);
    return recorder.visited;
}

/// The nodes below one, by recursion; nothing where there are very many.
std::optional<Nodes> expected(NumberedTable& table, SymbolicExprId root, bool bottomUp) {
    Nodes nodes;
    Recursion recursion(
        table, bottomUp, [&](const SymbolicExpr& node) { nodes.push_back(&node); }, [] {});
    return recursion(root) ? std::optional(nodes) : std::nullopt;
}

TEST(Visiting, AgreesWithRecursionOverTablesOfEachKind) {
    std::size_t compared = 0;
    forBrokenGraphs(5, 120, 25, [&](NumberedTable& numbered, const std::vector<SymbolicExprId>& ids) {
        const SymbolicExprTable& table = numbered.table();
        for (const SymbolicExprId root : ids) {
            const auto after = expected(numbered, root, true);
            const auto before = expected(numbered, root, false);
            if (!after || !before)
                continue;
            const SymbolicExpr& node = *table.get(root);
            ASSERT_THAT(executed(table, root), ElementsAreArray(*after));
            ASSERT_THAT(executed(table, root, false), ElementsAreArray(*after)) << "execute() does not ask";
            ASSERT_THAT(accepted(table, node), ElementsAreArray(*after));
            ASSERT_THAT(accepted(table, node, false), ElementsAreArray(*before));
            compared += after->size();

            std::vector<std::string> symbols;
            table.getSymbolsFromExpression(root, symbols);
            std::set<std::string> names;
            for (const SymbolicExpr* each : *after)
                if (each->op() == SymbolicOp::String)
                    names.insert(static_cast<const SymbolicString&>(*each).getName());
            ASSERT_THAT(symbols, testing::UnorderedElementsAreArray(names));
        }
    });
    EXPECT_GT(compared, 50'000U);
}

TEST(Visiting, WhatIsNotThereIsNotVisited) {
    SymbolicExprTable table;
    const SymbolicExprId x = SymbolicString(table, "x").getId(table);
    EXPECT_THAT(executed(table, 1), IsEmpty());
    EXPECT_THAT(executed(table, invalidId), IsEmpty());

    // A temporary that is in another table may name any node; one that is interned, here or there, may not.
    SymbolicExprTable other;
    const SymbolicPlusExpr stranger(other, x, 2U);
    const SymbolicNotExpr forward(table, 2U);
    SymbolicMinusExpr(table, x, x);
    EXPECT_THAT(accepted(table, stranger),
                ElementsAreArray(Nodes{table.get(x), table.get(x), table.get(x), table.get(2), &stranger}));
    EXPECT_THAT(accepted(table, forward), ElementsAreArray(Nodes{&forward}));
    EXPECT_THAT(accepted(table, SymbolicNotExpr(other, 2U)), testing::SizeIs(1));
    EXPECT_EQ(executed(table, 1), Nodes{table.get(1)});
}

} // namespace
} // namespace VT::Testing
