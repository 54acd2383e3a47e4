// Blocks that register dimension expressions.
#include "base/service/SymbolRegistry.hpp"
#include "parser/SymbolicExprParser.hpp"

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
    const std::map<std::string, std::string> names{
        {"N_1", "N_1"},
        {"_N", "dim___N"},
        {"N*2+1", "dim_N_2a2_2b1"},
        {"dim_N", "dim_dim__N"},
        {"[N, 3]", "dim__5bN_2c3_5d"},
        {"s.f", "dim_s_2ef"},
    };
    for (const auto& [text, name] : names) {
        EXPECT_EQ(registered(text), name) << text;
        EXPECT_EQ(registry.expressionOf(name), read(text)) << text;
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
    for (const char* text : {"-5", "-.5", " - 0x1p-3 ", "-1e+300", "-10U", "-Inf", "-NaN"}) {
        const std::string name = "n" + std::to_string(i++);
        registry.insertAlias(name, text);
        EXPECT_EQ(registry.aliasOf(name), "(" + std::string(text) + ")");
        table.insertAliasInfo("t" + name, text);
        EXPECT_EQ(registry.aliasOf("t" + name), text);
    }
    for (const char* text : {"5", "", "-", "-5-4", "(-5)", "-.", "N-5", "-5 4", "-+5"}) {
        const std::string name = "n" + std::to_string(i++);
        registry.insertAlias(name, text);
        EXPECT_EQ(registry.aliasOf(name), text);
    }
}

} // namespace
} // namespace VT::Testing
