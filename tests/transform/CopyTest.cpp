// Copies of expressions with the values of their symbols, and expressions in the place of others.
#include "base/transform/Copy.hpp"
#include "base/transform/Replacement.hpp"
#include "tests/support/Parsing.hpp"
#include "tests/support/StructureNumbers.hpp"
#include "tests/support/TreeText.hpp"
#include "tests/support/generators/RandomExpression.hpp"

#include <algorithm>
#include <cmath>
#include <gtest/gtest.h>
#include <map>
#include <set>

namespace VT::Testing {
namespace {

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
        std::multiset<SymbolicOp> classes, copiedClasses; // no class stands for its twin
        for (SymbolicExprId id = 0; id < target.size(); ++id) {
            copiedClasses.insert(target.get(id)->op());
            const bool isSymbol = target.get(id)->op() == SymbolicOp::String; // the values of others remains
            ASSERT_TRUE(isSymbol || target.isUnsetValue(target.getValueId(id)));
        }
        for (const SymbolicExprId id : copied) {
            classes.insert(source.get(id)->op());
            if (source.get(id)->op() != SymbolicOp::String)
                continue;
            const auto twin = static_cast<SymbolicExprId>(std::ranges::find(to, from[id]) - to.begin());
            const SymbolicExprId value = source.getValueId(id), copiedValue = target.getValueId(twin);
            ASSERT_EQ(source.isUnsetValue(value), target.isUnsetValue(copiedValue));
            ASSERT_TRUE(source.isUnsetValue(value) || to.at(copiedValue) == from[value]);
        }
        ASSERT_EQ(copiedClasses, classes);
        kinds.insert(classes.begin(), classes.end());

        const std::size_t before = source.size();
        ASSERT_EQ(SymbolicExprCopy(source, source)(root), root);
        ASSERT_EQ(source.size(), before);

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

    source.registerValueId("a", 1000);
    source.registerValue("b", 2);
    for (const char* const name : {"a", "b", "c"})
        target.registerValue(name, 1);
    EXPECT_EQ(treeText(target, SymbolicExprCopy(source, target)(sum)), "Plus(a,b)");
    EXPECT_EQ(target.getValue("a"), 1);
    EXPECT_EQ(target.getValue("b"), 2);
    EXPECT_EQ(target.getValue("c"), 1);
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

TEST(Replacement, AgreesWithAModelOverEveryClass) {
    using Op = SymbolicOp;
    const std::set<Op> untouched{Op::Dims2D,    Op::Dims3D, Op::DimsND,      Op::FcnCall0U,
                                 Op::CellArray, Op::Matrix, Op::MemberValue, Op::AnonymousFunc};
    std::mt19937_64 random(9);
    int replacedRounds = 0;
    for (int round = 0; round < 500; ++round) {
        SymbolicExprTable graph;
        const std::vector<SymbolicExprId> ids = randomGraph(random, graph, 40);
        SymbolicExprReplacements replacements;
        for (std::size_t count = random() % 8; count > 0; --count)
            replacements[ids[random() % ids.size()]] = ids[random() % ids.size()];
        const std::size_t before = graph.size();

        // What every node becomes, as the number of its structure.  Equal structures of different identifiers, which
        // NaN makes, are no operands of one key, so such a round shows nothing.
        StructureNumbers structures;
        const std::vector<std::size_t> numbers = structures.of(graph);
        if (std::set(numbers.begin(), numbers.end()).size() != numbers.size())
            continue;
        std::map<std::size_t, std::size_t> byNumber;
        for (const auto& [from, to] : replacements)
            byNumber[numbers[from]] = numbers[to];
        std::vector<std::size_t> expected;
        std::vector<bool> expectReplaced;
        for (SymbolicExprId id = 0; id < before; ++id) {
            const SymbolicExpr& node = *graph.get(id);
            std::vector<std::size_t> operands;
            bool replaced = false;
            for (std::size_t i = 0; i < node.getNumInputs(); ++i) {
                operands.push_back(expected[node.getInput(i)]);
                replaced = replaced || expectReplaced[node.getInput(i)];
                const auto found = byNumber.find(operands.back());
                if (found == byNumber.end() || untouched.contains(node.op()) || (i == 0 && callOps.contains(node.op())))
                    continue;
                operands.back() = found->second;
                replaced = true;
            }
            expected.push_back(structures.number(node, operands));
            expectReplaced.push_back(replaced);
        }

        const SymbolicExprId root = ids[ids.size() - 1 - random() % 10];
        SymbolicExprReplacement driver(graph, replacements);
        const SymbolicExprId result = driver(root);
        ASSERT_LT(result, graph.size());
        ASSERT_EQ(structures.of(graph)[result], expected[root]) << treeText(graph, root);
        ASSERT_EQ(driver.replaced(), expectReplaced[root]);
        replacedRounds += driver.replaced() ? 1 : 0;

        // The visitor of a host, which meets every occurrence and cannot know one NaN from another.
        if (std::ranges::any_of(ids, [&](SymbolicExprId id) { return std::isnan(graph.get(id)->getNumValue()); }))
            continue;
        SymbolicExprReplacementVisitor visitor(graph, replacements);
        graph.get(root)->accept(graph, visitor);
        ASSERT_EQ(structures.of(graph).at(visitor.get()), expected[root]);
        ASSERT_EQ(visitor.replaced(), expectReplaced[root]);
    }
    EXPECT_GT(replacedRounds, 100);
}

TEST(Replacement, KeysAreOfTheTargetAndLookedUpAsRebuilt) {
    SymbolicExprTable table, target;
    const SymbolicExprId minus = read(table, "-(x + 1)");
    for (SymbolicExprTable* const into : {&target, &table}) {
        const SymbolicExprReplacements replacements{{read(*into, "x"), read(*into, "y")},
                                                    {read(*into, "x + 1"), read(*into, "w")},
                                                    {read(*into, "y + 1"), read(*into, "z")}};
        SymbolicExprReplacementVisitor visitor(*into, replacements);
        table.get(minus)->accept(table, visitor);
        EXPECT_EQ(treeText(*into, visitor.get()), "UnaryMinus(z)");
    }
}

TEST(Replacement, IdentifiersThatAreNotOfTheTable) {
    SymbolicExprTable table;
    const SymbolicExprId sum = read(table, "x + 1");
    for (const SymbolicExprId odd : {invalidId, SymbolicExprId{1000}}) {
        const SymbolicExprReplacements replacements{{read(table, "x"), odd}, {odd, read(table, "y")}};
        SymbolicExprReplacement driver(table, replacements);
        EXPECT_EQ(driver(odd), invalidId);
        EXPECT_EQ(driver(sum), sum);
        EXPECT_FALSE(driver.replaced());
    }
}

} // namespace
} // namespace VT::Testing
