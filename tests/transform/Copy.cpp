// Copies of expressions with the values of their symbols, and expressions in the place of others.
#include "base/transform/Copy.hpp"
#include "base/transform/Replacement.hpp"
#include "tests/support/AnyNode.hpp"
#include "tests/support/Parsing.hpp"
#include "tests/support/RandomExpression.hpp"
#include "tests/support/StructureNumbers.hpp"
#include "tests/support/TreeText.hpp"

#include <algorithm>
#include <cmath>
#include <gtest/gtest.h>
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

class Replacement : public testing::Test {
protected:
    SymbolicExprId read(const std::string& text) { return Testing::read(table, text); }

    struct Answer {
        std::string tree;
        bool replaced;
        bool operator==(const Answer&) const = default;
    };

    Answer replace(SymbolicExprId id, const std::vector<std::pair<std::string, std::string>>& texts) {
        SymbolicExprReplacements replacements;
        for (const auto& [from, to] : texts)
            replacements[read(from)] = read(to);
        SymbolicExprReplacement driver(table, replacements);
        const SymbolicExprId result = driver(id);
        EXPECT_TRUE(driver.replaced() || result == id);
        return {treeText(table, result), driver.replaced()};
    }

    SymbolicExprTable table;
};

TEST_F(Replacement, ReplacesOperandsOnce) {
    struct Case {
        std::string from;
        std::vector<std::pair<std::string, std::string>> replacements;
        Answer expected;
    };

    const std::vector<Case> cases{
        {"x + 1", {{"z", "y"}}, {"Plus(x,1)", false}},
        {"x + 1", {{"x", "x"}}, {"Plus(x,1)", true}},
        {"x == y && !y", {{"x", "y"}, {"y", "x"}}, {"And(Equal(y,x),Not(x))", true}},
        {"x * x", {{"x", "x + 1"}}, {"Multiply(Plus(x,1),Plus(x,1))", true}},
        {"x + 1", {{"x + 1", "y"}}, {"Plus(x,1)", false}},
        {"-(x + 1)", {{"x + 1", "y"}}, {"UnaryMinus(y)", true}},
        {"-(x + 1)", {{"x", "y"}, {"y + 1", "z"}}, {"UnaryMinus(z)", true}}, // looked up as it was rebuilt
        {"-(x + 1)", {{"x", "y"}, {"x + 1", "z"}}, {"UnaryMinus(Plus(y,1))", true}},
        {"f(x, f(f))", {{"x", "y"}, {"f", "g"}}, {"FcnCall(f,y,FcnCall(f,g))", true}},
        {"f(x)", {{"f", "g"}}, {"FcnCall(f,x)", false}},
        {"1 + a.b", {{"a", "c"}, {"b", "c"}}, {"Plus(1,MemberValue(a,b))", false}},
        {"1 + a.b", {{"a.b", "c"}}, {"Plus(1,c)", true}},
    };
    for (const auto& [from, replacements, expected] : cases)
        EXPECT_EQ(replace(read(from), replacements), expected)
            << from << "  " << replace(read(from), replacements).tree;
}

TEST_F(Replacement, AgreesWithAModelOverEveryClass) {
    const std::set<SymbolicOp> untouched{SymbolicOp::Dims2D,      SymbolicOp::Dims3D,       SymbolicOp::DimsND,
                                         SymbolicOp::FcnCall0U,   SymbolicOp::CellArray,    SymbolicOp::Matrix,
                                         SymbolicOp::MemberValue, SymbolicOp::AnonymousFunc};
    const std::set<SymbolicOp> calls{SymbolicOp::FcnCall1U, SymbolicOp::FcnCall2U, SymbolicOp::FcnCall};
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
        // NaN makes, are no operands of one key, so such a round tells nothing.
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
                if (found == byNumber.end() || untouched.contains(node.op()) || (i == 0 && calls.contains(node.op())))
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

TEST_F(Replacement, IntoAnotherTableKeysAreOfTheTarget) {
    const SymbolicExprId sum = read("x + 1");
    SymbolicExprTable target;
    const SymbolicExprId y = SymbolicString(target, "y").getId(target), x = SymbolicString(target, "x").getId(target);
    const SymbolicExprReplacements replacements{{x, y}};
    SymbolicExprReplacementVisitor visitor(target, replacements);
    table.get(sum)->accept(table, visitor);
    EXPECT_EQ(treeText(target, visitor.get()), "Plus(y,1)");
}

TEST_F(Replacement, IdentifiersThatAreNotOfTheTable) {
    const SymbolicExprId sum = read("x + 1");
    for (const SymbolicExprId odd : {invalidId, SymbolicExprId{1000}}) {
        const SymbolicExprReplacements replacements{{read("x"), odd}, {odd, read("y")}};
        SymbolicExprReplacement driver(table, replacements);
        EXPECT_EQ(driver(odd), invalidId);
        EXPECT_EQ(driver(sum), sum);
        EXPECT_FALSE(driver.replaced());
    }
}

} // namespace
} // namespace VT::Testing
