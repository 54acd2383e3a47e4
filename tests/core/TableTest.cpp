// The table: identifiers, lookups and what it keeps beside its nodes.
#include "base/core/Nodes.hpp"
#include "tests/support/Cases.hpp"
#include "tests/support/HostTables.hpp"
#include "tests/support/TreeText.hpp"
#include "tests/support/generators/AnyNode.hpp"

#include <gmock/gmock.h>

#include <map>
#include <memory>
#include <random>
#include <set>

namespace VT::Testing {
namespace {

using testing::IsEmpty;

constexpr int noValue = 2147483647;

TEST(Table, TruthConstantsComeFirst) {
    SymbolicExprTable table;
    EXPECT_EQ(table.getIdTRUE(), 0xffffffffffffffff);
    EXPECT_EQ(table.getIdFALSE(), 0xffffffffffffffff);
    table.addBoolSymbols();
    table.addBoolSymbols();
    EXPECT_EQ(table.getIdFALSE(), 0U);
    EXPECT_EQ(table.getIdTRUE(), 1U);
    EXPECT_EQ(table.size(), 2U);

    const std::unique_ptr<SymbolicExprTable> fresh(table.CreateSymbolicExprTable());
    EXPECT_EQ(fresh->size(), 0U);
    EXPECT_EQ(fresh->getIdTRUE(), invalidId);
}

TEST(Table, OperandsAreIdentifiersOrNodesInEveryCombination) {
    SymbolicExprTable table;
    const SymbolicString a(table, "a");
    const SymbolicIntValue b(table, 1);
    const SymbolicExprId idA = a.getId(table), idB = b.getId(table);
    const auto text = [&](const SymbolicExpr& node) { return treeText(table, node.getId(table)); };
    for (const SymbolicExpr& sum :
         {SymbolicPlusExpr(table, idA, idB), SymbolicPlusExpr(table, a, idB), SymbolicPlusExpr(table, idA, b),
          SymbolicPlusExpr(table, a, b), SymbolicPlusExpr(table, SymbolicString(table, "a"), idB)})
        EXPECT_EQ(text(sum), "Plus(a,1)");
    EXPECT_EQ(text(SymbolicPlusExpr(table, b, a)), "Plus(1,a)");
    EXPECT_EQ(text(SymbolicQColon3Expr(table, a, idB, a)), "QColon3(a,1,a)");
    EXPECT_EQ(text(SymbolicMemberValue(table, a, "m")), "MemberValue(a,m)");

    // A name that is given as text is interned.
    EXPECT_EQ(text(SymbolicFcnCallExpr(table, std::string("f"), {idA, idB, idA})), "FcnCall(f,a,1,a)");
    EXPECT_EQ(text(SymbolicFcnCallExpr(table, SymbolicString(table, "f"), {idA, idA, idA})), "FcnCall(f,a,a,a)");
    EXPECT_EQ(text(SymbolicFcnCallExpr(table, "f", {idB, idB, idA})), "FcnCall(f,1,1,a)");
    EXPECT_EQ(text(SymbolicFcnCall0UExpr(table, "g")), "FcnCall0U(g)");
    EXPECT_EQ(text(SymbolicFcnCall1UExpr(table, "g", a)), "FcnCall1U(g,a)");
    EXPECT_EQ(text(SymbolicFcnCall2UExpr(table, std::string("g"), a, b)), "FcnCall2U(g,a,1)");
    EXPECT_EQ(text(SymbolicFcnCall2UExpr(table, 0, a, 1)), "FcnCall2U(a,a,1)");
    EXPECT_EQ(text(SymbolicCellArrayExpr(table, idB, {idA, idA})), "CellArray(1,a,a)");
}

TEST(Table, LookupsOfWhatIsNotThere) {
    SymbolicExprTable table, other;
    const SymbolicString node(other, "a");
    EXPECT_EQ(node.getId(table), invalidId);
    EXPECT_FALSE(table.contains(&node));
    EXPECT_TRUE(table.isUnsetValue(node.getId(table)));
    EXPECT_FALSE(table.isUnsetValue(0));
    for (const SymbolicExprId id : {SymbolicExprId{0}, SymbolicExprId{1} << 32U, invalidId}) {
        EXPECT_EQ(table.get(id), nullptr);
        EXPECT_FALSE(table.has(id));
        std::vector<std::string> symbols{"left over"};
        table.getSymbolsFromExpression(id, symbols);
        EXPECT_THAT(symbols, IsEmpty());
    }
}

TEST(Table, AnAnswerIsNotRememberedForAnotherNodeAtTheSamePlace) {
    // Temporaries take turns in one place of the stack, between two tables and classes.
    SymbolicExprTable table, other;
    alignas(SymbolicPlusExpr) std::byte place[sizeof(SymbolicPlusExpr)];
    using Ids = std::pair<SymbolicExprId, SymbolicExprId>; // in the one and in the other
    const auto ids = [&]<class Node>(std::type_identity<Node>, SymbolicExprTable& into, SymbolicExprId a,
                                     SymbolicExprId b) {
        const Node* const node = new (place) Node(into, a, b);
        const Ids answers{node->getId(table), node->getId(other)};
        const SymbolicExpr& base = *node;
        EXPECT_EQ(answers, Ids(base.getId(table), base.getId(other)));
        EXPECT_EQ(table.contains(node), answers.first != invalidId);
        node->~Node();
        return answers;
    };
    constexpr std::type_identity<SymbolicPlusExpr> plus;
    constexpr std::type_identity<SymbolicMinusExpr> minus;
    EXPECT_EQ(ids(plus, table, 7, 8), Ids(0, invalidId));
    EXPECT_EQ(ids(plus, other, 8, 7), Ids(invalidId, 0));
    EXPECT_EQ(ids(minus, other, 7, 8), Ids(invalidId, 1)) << "a miss is not remembered either";
    EXPECT_EQ(ids(plus, other, 7, 8), Ids(0, 2));
    EXPECT_EQ(ids(minus, table, 7, 8), Ids(1, 1));
}

TEST(Table, NodesAreOneExactlyWhereTheirPartsAre) {
    // Operands around the largest that fit the table's keys, and far beyond: a table does not ask whether they are
    // there.
    const std::vector<SymbolicExprId> operands{
        0, 1, 2, (1U << 29U) - 1, 1U << 29U, (1U << 29U) + 1, ~0U, SymbolicExprId{1} << 58U, invalidId - 1, invalidId};
    SymbolicExprTable table;
    std::map<std::pair<SymbolicOp, std::vector<SymbolicExprId>>, SymbolicExprId> known;
    std::mt19937_64 random(5);
    for (int round = 0; round < 30000; ++round) {
        const auto op = static_cast<SymbolicOp>(random() % operatorCount);
        const std::optional<std::size_t> count = operandCount(op);
        if (count == 0 || op == SymbolicOp::MemberValue || dimensionOps.contains(op) || callOps.contains(op))
            continue; // leaves, and classes some of whose nodes are equal to those of others
        std::vector<SymbolicExprId> inputs(count.value_or(random() % 4));
        for (SymbolicExprId& input : inputs)
            input = operands[random() % operands.size()];
        const std::size_t before = table.size();
        const SymbolicExprId id = makeNode(table, op, inputs);
        const auto [entry, isNew] = known.emplace(std::pair(op, inputs), id);
        ASSERT_EQ(entry->second, id);
        ASSERT_EQ(table.size(), before + (isNew ? 1 : 0));
        ASSERT_EQ(table.lookup(table.get(id)), id);
    }
    std::set<std::string> names;
    for (int i = 0; i < 1000; ++i) {
        const std::string name = std::string(random() % 20, "ab"[random() % 2]) + std::string(random() % 2, '\0');
        const SymbolicExprId id = table.internName(name);
        EXPECT_EQ(table.size() - known.size(), (names.insert(name), names.size())) << name;
        EXPECT_EQ(SymbolicString(table, name).getId(table), id);
    }
}

TEST(Table, AddKeepsWhatItIsGivenAndFindsTheFirst) {
    SymbolicExprTable table, source;
    table.add(new SymbolicIntValue(source, 5));
    table.add(new SymbolicIntValue(source, 5));
    EXPECT_EQ(table.size(), 2U);
    EXPECT_EQ(SymbolicIntValue(table, 5).getId(table), 0U);
    EXPECT_EQ(table.get(1)->getId(table), 0U);
    EXPECT_EQ(SymbolicNotExpr(table, 1).getId(table), 2U) << "identifiers go on";
    // Foreign nodes between the table's own, through several enlargements.
    for (int i = 0; i < 1000; ++i)
        if (i % 3 == 0)
            table.add(new SymbolicIntValue(source, 100 + i));
        else
            SymbolicIntValue(table, 100 + i);
    for (int i = 0; i < 1000; ++i)
        EXPECT_EQ(SymbolicIntValue(table, 100 + i).getId(table), static_cast<SymbolicExprId>(3 + i));
}

TEST(Table, NodesAreKeptWhereADerivedTableKeepsThem) {
    for (const auto& numbered : tablesOfEachKind()) {
        SymbolicExprTable& table = numbered->table();
        table.addBoolSymbols();
        EXPECT_EQ(table.getIdFALSE(), numbered->idAt(0));
        EXPECT_EQ(table.getIdTRUE(), numbered->idAt(1));
        table.registerValue("N", 3);
        EXPECT_EQ(table.getValue("N"), 3);
        const SymbolicExprId sum = SymbolicPlusExpr(table, table.getIdTRUE(), SymbolicString(table, "N")).getId(table);
        EXPECT_EQ(treeText(table, sum), "Plus(true,N)");
        EXPECT_TRUE(table.has(sum));
        EXPECT_FALSE(table.has(invalidId));
        EXPECT_EQ(numbered->count(), 5U);
        if (numbered->idAt(1) == 1) {
            std::vector<SymbolicExprId> names;
            table.lookup(SymbolicOp::String, names);
            EXPECT_THAT(names, testing::ElementsAre(0, 1, 3));
        }
    }
}

TEST(Table, ValuesOfNames) {
    SymbolicExprTable table;
    for (const CaseRow& row : casesOf("operators.txt", "values of reals", 2)) {
        SymbolicDoubleValue(table, std::stod(row[0]));
        table.registerValueId("R", table.size() - 1);
        EXPECT_EQ(table.getValue("R"), std::stoi(row[1])) << row[0];
    }
    table.registerValue("N", 3);
    EXPECT_EQ(table.getValue("N"), 3);
    table.registerValue("N", -4);
    EXPECT_EQ(table.getValue("N"), -4) << "the later binding";
    table.registerValueId("N", SymbolicString(table, "M").getId(table));
    EXPECT_EQ(table.getValue("N"), noValue) << "no number";
    table.registerValueId("N", invalidId - 1);
    EXPECT_EQ(table.getValue("N"), noValue) << "no node";

    const std::size_t before = table.size();
    EXPECT_EQ(table.getValue("Unbound"), noValue);
    EXPECT_EQ(table.size(), before + 1) << "interns the name";

    const SymbolicExprId sum = SymbolicPlusExpr(table, 0, 0).getId(table);
    EXPECT_TRUE(table.isUnsetValue(table.getValueId(sum)));
    table.registerValueId(sum, 17);
    EXPECT_EQ(table.getValueId(sum), 17U);
    EXPECT_TRUE(table.isUnsetValue(table.getValueId(invalidId)));
}

TEST(Table, GrowsAcrossManyChunksWithoutMovingANode) {
    SymbolicExprTable table;
    SymbolicExprId last = SymbolicString(table, std::string(100, 's')).getId(table);
    const SymbolicExpr* const first = table.get(last);
    std::vector<const SymbolicExpr*> nodes;
    for (int i = 0; i < 200000; ++i) {
        last = SymbolicMinusExpr(table, last, 0U).getId(table);
        nodes.push_back(table.get(last));
    }
    EXPECT_EQ(table.get(0), first);
    for (std::size_t i = 0; i < nodes.size(); ++i) {
        ASSERT_EQ(table.get(i + 1), nodes[i]);
        ASSERT_EQ(table.lookup(nodes[i]), i + 1);
    }
}

} // namespace
} // namespace VT::Testing
