// The symbols that expressions mention.
#include "base/transform/Symbols.hpp"
#include "tests/support/AnyNode.hpp"
#include "tests/support/Parsing.hpp"
#include "tests/support/RandomExpression.hpp"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>

namespace VT::Testing {
namespace {

using Names = std::vector<std::string>;
using testing::ElementsAre;

TEST(Symbols, InOrderOfFirstOccurrence) {
    const std::vector<std::pair<std::string, Names>> cases{
        {"N*N+M", {"N", "M"}},
        {"1+2.5", {}},
        {"true", {"true"}},
        {"f(x)", {"f", "x"}},
        {"x+f(x, g(y), f)", {"x", "f", "g", "y"}},
        {"A==1 && true", {"A", "true"}},
        {"p.q.r < q", {"p", "q"}},
        {"(c || b) && (b || a) && c", {"c", "b", "a"}},
    };
    SymbolicExprTable table;
    const SymbolicExprSymbols symbols(table);
    for (const auto& [text, expected] : cases) {
        const SymbolicExprId id = parse(table, text).id;
        for (int call = 0; call < 2; ++call) { // each for itself
            Names names{"before"};
            symbols(id, names);
            ASSERT_EQ(names.front(), "before");
            names.erase(names.begin());
            EXPECT_EQ(names, expected) << text;
        }
        std::vector<SymbolicExprId> ids;
        symbols(id, ids);
        Names names;
        for (const SymbolicExprId symbol : ids)
            names.push_back(dynamic_cast<const SymbolicString&>(*table.get(symbol)).getName());
        EXPECT_EQ(names, expected) << text;
    }
}

TEST(Symbols, ACollectorRemembersWhatItVisited) {
    SymbolicExprTable table;
    SymbolsOfSymbolicExpr collector(table);
    Names names;
    for (const char* text : {"a+b", "b+c", "a+b", "f(a)"})
        collector.getSymbols(parse(table, text).id, names);
    EXPECT_THAT(names, ElementsAre("a", "b", "c", "f"));
    collector.getSymbols(invalidId, names);
    collector.getSymbols(table.size(), names);
    EXPECT_EQ(names.size(), 4U);
}

/// Every occurrence of an identifier, from left to right.
void occurrences(const SymbolicExprTable& table, SymbolicExprId id, Names& names) { // NOLINT(misc-no-recursion)
    const SymbolicExpr& node = *table.get(id);
    if (node.op() == SymbolicOp::String)
        names.push_back(static_cast<const SymbolicString&>(node).getName());
    for (std::size_t i = 0; i < node.getNumInputs(); ++i)
        occurrences(table, node.getInput(i), names);
}

TEST(Symbols, AreTheFirstOfAllOccurrences) {
    std::mt19937_64 random(21);
    std::size_t total = 0;
    for (int round = 0; round < 100; ++round) {
        SymbolicExprTable table;
        for (const SymbolicExprId root : randomGraph(random, table, 30)) {
            Names all, expected, names;
            occurrences(table, root, all);
            for (const std::string& name : all)
                if (std::ranges::find(expected, name) == expected.end())
                    expected.push_back(name);
            SymbolicExprSymbols{table}(root, names);
            ASSERT_EQ(names, expected);
            table.getSymbolsFromExpression(root, names);
            ASSERT_EQ(names, expected);
            total += names.size();
        }
    }
    EXPECT_GT(total, 2000U);
}

TEST(Symbols, SharedAndDeepExpressions) {
    SymbolicExprTable table;
    const Trees tree{table};
    const SymbolicExprId doubled = tree.doubled(SymbolicOp::Plus, read(table, "a+b"));
    Names names;
    SymbolicExprSymbols{table}(tree.zigzag(SymbolicOp::Plus, SymbolicOp::Minus, doubled, 0, 1'000'000), names);
    EXPECT_THAT(names, testing::UnorderedElementsAre("a", "b"));
}

} // namespace
} // namespace VT::Testing
