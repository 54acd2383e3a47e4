// The symbols of conditions, by kind.
#include "base/service/VCSymbols.hpp"
#include "tests/support/AnyNode.hpp"
#include "tests/support/Parsing.hpp"
#include "tests/support/RandomExpression.hpp"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <set>
#include <stdexcept>

namespace VT::Testing {
namespace {

using Names = std::vector<std::string>;

TEST(VCSymbols, ByKind) {
    struct Case {
        std::string text;
        unsigned kinds;
        Names expected;
    };

    const std::vector<Case> cases{
        {"A == 1 && B > A", 1, {"A", "B"}},
        {"A == 1 && B > A", 14, {}},
        {"A && true", 1, {"A", "true"}},
        {"bound.m + free.m + x", 1, {"x"}},
        {"bound.m + free.m + x", 2, {"bound.m"}},
        {"bound.m + free.m + x", 4, {"free.m"}},
        {"free.m + x + bound.m + free.m", 7, {"free.m", "x", "bound.m"}},
        {"a.m.n < x", 15, {"a.m.n", "x"}}, // no look into the owner
        {"f(x) + y", 1, {"x", "y"}},
        {"f(x) + y", 8, {"f"}},
        {"f + f(f) + f(f(g))", 8, {"f", "f", "f"}}, // once for each call
        {"f + f(f) + f(f(g))", 1, {"f", "g"}},
        {"f(x) + f(x) + g()", 9, {"f", "x", "g"}},
        {"f(g(x), y)", 9, {"f", "g", "x", "y"}}, // the name comes first
        {"x + f(bound.m)", 0, {}},
    };
    for (const auto& [text, kinds, expected] : cases) {
        SymbolicExprTable table;
        table.registerValueId(read(table, "bound.m"), read(table, "4"));
        Names names{"before"};
        VCSymbolsOfSymbolicExpr(table, kinds).getSymbols(read(table, text), names);
        ASSERT_EQ(names.front(), "before");
        names.erase(names.begin());
        EXPECT_EQ(names, expected) << text << " kinds " << kinds;
    }
}

TEST(VCSymbols, KindsAreFourBits) {
    using enum VCSymbolType;
    EXPECT_EQ((VCSymbolTypes{Identifier, BoundMember}).bits(), 3U);
    EXPECT_EQ((VCSymbolTypes{UnboundMember, FunctionName}).bits(), 12U);
    for (const int outside : {4, 5, -1}) {
        try {
            const VCSymbolTypes kinds{static_cast<VCSymbolType>(outside)};
            ADD_FAILURE() << outside;
        } catch (const std::out_of_range& error) {
            EXPECT_THAT(error.what(), testing::StartsWith("bitset::set"));
        }
    }
    SymbolicExprTable table;
    Names names;
    VCSymbolsOfSymbolicExpr(table, {Identifier, FunctionName}).getSymbols(read(table, "f(x) + a.b"), names);
    EXPECT_THAT(names, testing::ElementsAre("f", "x"));
}

/// Every occurrence of a symbol, with the node that it was found at.
struct Occurrences {
    const SymbolicExprTable& table;
    unsigned kinds;
    std::vector<std::pair<SymbolicExprId, SymbolicExprId>> found;

    void look(SymbolicExprId id) { // NOLINT(misc-no-recursion): small graphs only
        const SymbolicExpr& node = *table.get(id);
        const auto add = [&](unsigned kind, SymbolicExprId symbol) {
            if ((kinds & kind) != 0)
                found.emplace_back(id, symbol);
        };
        switch (node.op()) {
        case SymbolicOp::String:
            return add(1, id);
        case SymbolicOp::MemberValue:
            return add(table.isUnsetValue(table.getValueId(id)) ? 4 : 2, id);
        case SymbolicOp::FcnCall0U:
        case SymbolicOp::FcnCall1U:
        case SymbolicOp::FcnCall2U:
        case SymbolicOp::FcnCall:
            if (node.getNumInputs() > 0)
                add(8, node.getInput(0));
            for (std::size_t i = 1; i < node.getNumInputs(); ++i)
                look(node.getInput(i));
            return;
        default:
            for (std::size_t i = 0; i < node.getNumInputs(); ++i)
                look(node.getInput(i));
        }
    }
};

TEST(VCSymbols, AreTheFirstOccurrencesAtEachNode) {
    std::mt19937_64 random(33);
    std::size_t total = 0;
    for (int round = 0; round < 100; ++round) {
        SymbolicExprTable table;
        const std::vector<SymbolicExprId> graph = randomGraph(random, table, 30);
        for (const SymbolicExprId id : graph)
            if (random() % 2 == 0)
                table.registerValueId(id, 0);
        for (const SymbolicExprId root : graph) {
            const auto kinds = static_cast<unsigned>(random() % 16);
            Occurrences all{table, kinds, {}};
            all.look(root);
            std::vector<SymbolicExprId> expected, ids;
            std::set<SymbolicExprId> met;
            for (const auto& [at, symbol] : all.found)
                if (met.insert(at).second)
                    expected.push_back(symbol);
            VCSymbolsOfSymbolicExpr(table, kinds).getSymbolIds(root, ids);
            ASSERT_EQ(ids, expected);
            total += ids.size();
        }
    }
    EXPECT_GT(total, 2000U);
}

TEST(VCSymbols, OddSharedAndDeepExpressions) {
    SymbolicExprTable table;
    const auto symbols = [&](SymbolicExprId id) {
        Names names;
        VCSymbolsOfSymbolicExpr(table, 15).getSymbols(id, names);
        return names;
    };
    EXPECT_THAT(symbols(invalidId), testing::IsEmpty());
    EXPECT_THAT(symbols(table.size()), testing::IsEmpty());
    EXPECT_THAT(symbols(SymbolicFcnCall1UExpr(table, invalidId, invalidId).getId(table)), testing::IsEmpty());

    const Trees tree{table};
    const SymbolicExprId doubled = tree.doubled(SymbolicOp::Plus, read(table, "a + b"));
    EXPECT_THAT(symbols(tree.zigzag(SymbolicOp::Plus, SymbolicOp::Minus, doubled, read(table, "c"), 1'000'000)),
                testing::ElementsAre("c", "a", "b"));
}

} // namespace
} // namespace VT::Testing
