// Blocks that register dimension expressions.
#include "base/service/SymbolRegistry.hpp"
#include "parser/SymbolicExprParser.hpp"
#include "tests/support/Cases.hpp"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <array>
#include <map>

class VTBlock {};

namespace VT::Testing {
namespace {

class Registry : public testing::Test {
protected:
    SymbolicExprId read(const std::string& text) { return SymbolicExprParser(table, true, false)(text); }

    std::string registered(const std::string& text, std::size_t block = 0) {
        return registry.registerExpression(&blocks.at(block), read(text));
    }

    std::array<VTBlock, 2> blocks;
    SymbolicExprTable table;
    SymbolRegistry registry{table};
};

TEST_F(Registry, NamesExpressions) {
    for (const CaseRow& row : casesOf("service.txt", "names", 2)) {
        EXPECT_EQ(registered(row[0]), row[1]) << row[0];
        EXPECT_EQ(registry.expressionOf(row[1]), read(row[0])) << row[0];
    }
    EXPECT_EQ(registry.expressionOf("M"), invalidId);
    EXPECT_EQ(registry.registerExpression(&blocks[0], invalidId), "");
}

TEST_F(Registry, OneNameForOneSimplifiedText) {
    EXPECT_EQ(registered("a == 1 && a == 1"), registered("a == 1"));
    EXPECT_EQ(registry.expressionOf("dim_a_3d_3d1"), read("a == 1"));
    SymbolicExprTable other;
    SymbolicExprParser parse(other, true, false);
    parse("b + c");
    EXPECT_EQ(SymbolRegistry(other).registerExpression(&blocks[1], parse("a == 1")), "dim_a_3d_3d1")
        << "whatever was interned before";
}

TEST_F(Registry, LongTextsAndThoseThatLookAlikeNeverShareAName) {
    std::map<std::string, SymbolicExprId> expressionOfName;
    const std::string letters(60, 'x');
    std::string longName = letters + "abcdefgh";
    std::vector<std::string> texts{"a+b", "a_2bb", "dim_a_2bb", "_a", "__a", "dimx_a", longName};
    for (int i = 0; i < 200; ++i)
        texts.push_back(letters + "*" + std::to_string(i + 2));
    for (const std::string& text : texts) {
        const SymbolicExprId id = read(text);
        const std::string name = registered(text);
        EXPECT_LE(name.size(), 63U);
        EXPECT_THAT(name, testing::MatchesRegex("[a-zA-Z][a-zA-Z0-9_]*"));
        EXPECT_TRUE(expressionOfName.emplace(name, id).second) << text;
        EXPECT_EQ(registered(text), name) << "again";
    }
    for (const auto& [name, id] : expressionOfName)
        EXPECT_EQ(registry.expressionOf(name), id) << name;
}

TEST_F(Registry, ListsWhatABlockRegistered) {
    using Names = std::vector<std::string>;
    registered("N*2", 0);
    registered("M", 0);
    registered("N*2", 1);
    registered("N*2", 0);
    EXPECT_EQ(registry.registeredBy(&blocks[0]), (Names{"dim_N_2a2", "M"}));
    EXPECT_EQ(registry.registeredBy(&blocks[1]), (Names{"dim_N_2a2"}));
    registry.forgetBlock(&blocks[0]);
    EXPECT_EQ(registry.registeredBy(&blocks[0]), Names{});
    EXPECT_EQ(registry.registeredBy(&blocks[1]), (Names{"dim_N_2a2"}));
    EXPECT_EQ(registry.expressionOf("M"), read("M"));
}

TEST_F(Registry, KeepsAliasesInTheTable) {
    registered("N+1");
    registered("7");
    registered("N");
    EXPECT_EQ(table.getAliasForSymbolicIdentifier("dim_N_2b1"), "(N+1)");
    EXPECT_EQ(registry.aliasOf("dim_7"), "7");
    EXPECT_EQ(registry.aliasOf("N"), "");
    registry.insertAlias("N", "rows");
    registry.insertAlias("N", "columns");
    EXPECT_EQ(registry.aliasOf("N"), "rows");
    registry.registerExpression(&blocks[0], SymbolicIntValue(table, -7).getId(table));
    EXPECT_EQ(registry.aliasOf("dim__2d7"), "(-7)");
    int i = 0;
    for (const CaseRow& row : casesOf("service.txt", "aliases", 2)) {
        const std::string name = "n" + std::to_string(i++);
        registry.insertAlias(name, row[0]);
        EXPECT_EQ(registry.aliasOf(name), row[1]);
        table.insertAliasInfo("t" + name, row[0]);
        EXPECT_EQ(registry.aliasOf("t" + name), row[0]);
    }
}

} // namespace
} // namespace VT::Testing
