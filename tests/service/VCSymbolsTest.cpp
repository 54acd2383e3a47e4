// The symbols of expressions, all of them and by kind.
#include "base/service/VCSymbols.hpp"
#include "base/transform/Symbols.hpp"
#include "tests/support/Cases.hpp"
#include "tests/support/Parsing.hpp"
#include "tests/support/generators/AnyNode.hpp"
#include "tests/support/generators/RandomExpression.hpp"

#include <gmock/gmock.h>

#include <boost/algorithm/string/join.hpp>
#include <set>
#include <stdexcept>

namespace VT::Testing {
namespace {

using Names = std::vector<std::string>;

TEST(VCSymbols, ByKind) {
    for (const CaseRow& row : casesOf("service.txt", "symbols by kind", 3)) {
        SymbolicExprTable table;
        table.registerValueId(read(table, "bound.m"), read(table, "4"));
        Names names{"before"};
        VCSymbolsOfSymbolicExpr(table, static_cast<unsigned>(std::stoi(row[1]))).getSymbols(read(table, row[0]), names);
        EXPECT_EQ(boost::algorithm::join(names, "; "), "before; " + row[2]) << row[0] << " kinds " << row[1];
    }
}

TEST(VCSymbols, KindsAreFourBits) {
    using enum VCSymbolType;
    EXPECT_EQ((VCSymbolTypes{Identifier, BoundMember}).bits(), 3U);
    EXPECT_EQ((VCSymbolTypes{UnboundMember, FunctionName}).bits(), 12U);
    for (const int outside : {4, -1})
        EXPECT_THROW(VCSymbolTypes{static_cast<VCSymbolType>(outside)}, std::out_of_range);
}

TEST(Symbols, ACollectorRemembersWhatItVisited) {
    SymbolicExprTable table;
    SymbolsOfSymbolicExpr collector(table);
    Names names;
    for (const char* text : {"a+b", "b+c", "a+b", "f(a)"})
        collector.getSymbols(read(table, text), names);
    collector.getSymbols(invalidId, names);
    collector.getSymbols(table.size(), names);
    EXPECT_THAT(names, testing::ElementsAre("a", "b", "c", "f"));
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
        const bool call = kinds != everything && callOps.contains(node.op()) && node.getNumInputs() > 0;
        if (node.op() == SymbolicOp::String)
            return add(1, id);
        if (kinds != everything && node.op() == SymbolicOp::MemberValue)
            return add(table.isUnsetValue(table.getValueId(id)) ? 4 : 2, id);
        if (call)
            add(8, node.getInput(0));
        for (std::size_t i = call ? 1 : 0; i < node.getNumInputs(); ++i)
            look(node.getInput(i));
    }

    /// The first one at each node.
    std::vector<SymbolicExprId> firsts(SymbolicExprId root) {
        std::vector<SymbolicExprId> symbols;
        std::set<SymbolicExprId> met;
        look(root);
        for (const auto& [at, symbol] : found)
            if (met.insert(at).second)
                symbols.push_back(symbol);
        return symbols;
    }

    static constexpr unsigned everything = 16 + 1; ///< identifiers wherever they stand
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
            std::vector<SymbolicExprId> ids, all;
            VCSymbolsOfSymbolicExpr(table, kinds).getSymbolIds(root, ids);
            ASSERT_EQ(ids, (Occurrences{table, kinds, {}}.firsts(root)));
            SymbolicExprSymbols{table}(root, all);
            ASSERT_EQ(all, (Occurrences{table, Occurrences::everything, {}}.firsts(root)));
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
    Names all;
    SymbolicExprSymbols{table}(table.size() - 1, all);
    EXPECT_THAT(all, testing::UnorderedElementsAre("a", "b", "c"));
}

} // namespace
} // namespace VT::Testing
