// Copies of expressions with the values of their symbols.
#include "base/transform/Copy.hpp"
#include "tests/support/AnyNode.hpp"
#include "tests/support/Parsing.hpp"
#include "tests/support/RandomExpression.hpp"
#include "tests/support/StructureNumbers.hpp"
#include "tests/support/TreeText.hpp"

#include <gtest/gtest.h>

#include <algorithm>
#include <map>
#include <set>

namespace VT::Testing {
namespace {

using Values = std::map<std::string, std::string>;

void bind(SymbolicExprTable& table, const Values& values) {
    for (const auto& [name, value] : values)
        table.registerValueId(read(table, name), read(table, value));
}

/// Everything that has a value, and the values, as trees.
Values valuesOf(const SymbolicExprTable& table) {
    Values values;
    for (SymbolicExprId id = 0; id < table.size(); ++id)
        if (!table.isUnsetValue(table.getValueId(id)))
            values[treeText(table, id)] = treeText(table, table.getValueId(id));
    return values;
}

TEST(Copy, BringsTheValuesOfSymbols) {
    struct Case {
        std::string expression;
        Values source;
        Values target;
        Values expected;
    };

    const std::vector<Case> cases{
        {"N + 1", {{"N", "M * 2"}, {"M", "3"}}, {}, {{"N", "Multiply(M,2)"}, {"M", "3"}}},
        {"a", {{"a", "b + 1"}, {"b", "c || a"}, {"c", "c"}}, {}, {{"a", "Plus(b,1)"}, {"b", "Or(c,a)"}, {"c", "c"}}},
        {"p.q < r", {{"p", "5"}, {"p.q", "6"}, {"q", "7"}, {"a < b", "8"}}, {}, {{"p", "5"}}},
        {"N + M", {{"N", "1"}}, {{"N", "a"}, {"M", "2"}, {"K", "3"}}, {{"N", "1"}, {"M", "2"}, {"K", "3"}}},
    };
    for (const auto& [expression, sourceValues, targetValues, expected] : cases) {
        SymbolicExprTable source, target;
        const SymbolicExprId id = read(source, expression);
        bind(source, sourceValues);
        bind(target, targetValues);
        const SymbolicExprId copy = SymbolicExprCopy(source, target)(id);
        EXPECT_EQ(treeText(target, copy), treeText(source, id));
        EXPECT_EQ(valuesOf(target), expected) << expression;

        const std::size_t before = source.size();
        const Values own = valuesOf(source);
        EXPECT_EQ(SymbolicExprCopy(source, source)(id), id);
        EXPECT_EQ(source.size(), before);
        EXPECT_EQ(valuesOf(source), own);
    }
}

/// What has to be copied: the expression, its operands, and the values of symbols among them.
std::set<SymbolicExprId> reachable(const SymbolicExprTable& table, SymbolicExprId root) {
    std::set<SymbolicExprId> met{root};
    for (std::size_t before = 0; before < met.size();) {
        before = met.size();
        for (const SymbolicExprId id : std::vector(met.begin(), met.end())) {
            const SymbolicExpr& node = *table.get(id);
            for (std::size_t i = 0; i < node.getNumInputs(); ++i)
                met.insert(node.getInput(i));
            if (node.op() == SymbolicOp::String && !table.isUnsetValue(table.getValueId(id)))
                met.insert(table.getValueId(id));
        }
    }
    return met;
}

std::map<SymbolicOp, int> census(const SymbolicExprTable& table, const std::set<SymbolicExprId>& ids) {
    std::map<SymbolicOp, int> count;
    for (const SymbolicExprId id : ids)
        ++count[table.get(id)->op()];
    return count;
}

TEST(Copy, IsTheSameGraphOnceOverEveryClass) {
    std::mt19937_64 random(5);
    std::set<SymbolicOp> kinds;
    for (int round = 0; round < 300; ++round) {
        SymbolicExprTable source;
        const std::vector<SymbolicExprId> ids = randomGraph(random, source, 60);
        for (SymbolicExprId id = 0; id < source.size(); ++id)
            if (random() % 3 == 0)
                source.registerValueId(id, ids[random() % ids.size()]);
        const SymbolicExprId root = ids.back();
        SymbolicExprTable target;
        const SymbolicExprId copy = SymbolicExprCopy(source, target)(root);

        StructureNumbers structures;
        const std::vector<std::size_t> from = structures.of(source), to = structures.of(target);
        ASSERT_LT(copy, to.size());
        ASSERT_EQ(to[copy], from[root]);
        const std::set<SymbolicExprId> copied = reachable(source, root);
        ASSERT_EQ(target.size(), copied.size());
        std::set<SymbolicExprId> all;
        for (SymbolicExprId id = 0; id < target.size(); ++id)
            all.insert(id);
        ASSERT_EQ(census(target, all), census(source, copied)); // no class for its twin
        for (const SymbolicExprId id : copied) {
            kinds.insert(source.get(id)->op());
            if (source.get(id)->op() != SymbolicOp::String)
                continue;
            const auto twin = static_cast<SymbolicExprId>(std::ranges::find(to, from[id]) - to.begin());
            const SymbolicExprId value = source.getValueId(id), copiedValue = target.getValueId(twin);
            ASSERT_EQ(source.isUnsetValue(value), target.isUnsetValue(copiedValue));
            ASSERT_TRUE(source.isUnsetValue(value) || to.at(copiedValue) == from[value]);
        }

        // The visitor of a host, which meets every occurrence.
        SymbolicExprTable again;
        SymbolicExprCopyVisitor visitor(source, again);
        source.get(root)->accept(source, visitor);
        const SymbolicExprId accepted = visitor.get();
        ASSERT_EQ(structures.of(again).at(accepted), from[root]);
    }
    EXPECT_EQ(kinds.size(), std::size_t{operatorCount});
}

TEST(Copy, IdentifiersThatAreNotOfTheSource) {
    SymbolicExprTable source, target;
    const SymbolicExprId sum = read(source, "a + b");
    for (const SymbolicExprId id : {invalidId, source.size()})
        EXPECT_EQ(SymbolicExprCopy(source, target)(id), invalidId);
    EXPECT_EQ(target.size(), 0U);

    source.registerValueId(read(source, "a"), 1000);
    bind(target, {{"a", "1"}});
    EXPECT_EQ(treeText(target, SymbolicExprCopy(source, target)(sum)), "Plus(a,b)");
    EXPECT_EQ(valuesOf(target), (Values{{"a", "1"}}));
}

TEST(Copy, LongChainsOfValues) {
    constexpr std::size_t count = 100'000;
    SymbolicExprTable source, target;
    std::vector<SymbolicExprId> names(count);
    for (std::size_t i = 0; i < names.size(); ++i)
        names[i] = SymbolicString(source, "n" + std::to_string(i)).getId(source);
    SymbolicExprId sum = names.front(); // of all names
    for (const SymbolicExprId name : names)
        sum = SymbolicPlusExpr(source, sum, name).getId(source);

    for (std::size_t i = 0; i < names.size(); ++i) // a circle
        source.registerValueId(names[i], names[(i + 1) % names.size()]);
    SymbolicExprCopy(source, target)(names.front());
    EXPECT_EQ(target.size(), names.size());
    for (SymbolicExprId id = 0; id < target.size(); ++id)
        EXPECT_TRUE(target.has(target.getValueId(id)));

    for (const SymbolicExprId name : names) // one value of them all, which mentions them all
        source.registerValueId(name, sum);
    SymbolicExprTable other;
    SymbolicExprCopy(source, other)(sum);
    EXPECT_EQ(other.size(), source.size());
}

} // namespace
} // namespace VT::Testing
