// Expressions in the place of others.
#include "base/transform/Replacement.hpp"
#include "tests/support/AnyNode.hpp"
#include "tests/support/Parsing.hpp"
#include "tests/support/RandomExpression.hpp"
#include "tests/support/StructureNumbers.hpp"
#include "tests/support/TreeText.hpp"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <map>
#include <set>

namespace VT::Testing {
namespace {

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
