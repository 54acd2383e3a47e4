// Texts of conditions for generated code.
#include "base/decide/shorten/StringifyImpliedCondition.hpp"
#include "base/print/CTextObstacles.hpp"
#include "base/print/Predicates.hpp"
#include "tests/support/Cases.hpp"
#include "tests/support/Parsing.hpp"
#include "tests/support/TreeReader.hpp"
#include "tests/support/generators/RandomCondition.hpp"
#include "tests/support/oracles/Truth.hpp"

#include <gtest/gtest.h>
#include <map>

namespace VT::Testing {
namespace {

using Op = SymbolicOp;

class GeneratedCode : public testing::Test {
protected:
    SymbolicExprId read(const std::string& text) { return Testing::read(table, text); }

    SymbolicExprTable table;
    Trees tree{table};
};

TEST_F(GeneratedCode, ConditionsOfDirectives) {
    for (const bool trees : {false, true})
        for (const CaseRow& row : casesOf("print.txt", trees ? "directives of trees" : "directives", 4)) {
            SCOPED_TRACE(row[0]);
            const SymbolicExprId id = trees ? readTree(table, row[0]) : read(row[0]);
            EXPECT_EQ(PreprocessorVCExpr(table, false, true).print(id), row[1]);
            EXPECT_EQ(PreprocessorVCExpr(table, false).print(id), row[2]);
            PreprocessorVCExpr visitor(table, true, true);
            visitor.execute(table, id);
            EXPECT_EQ(visitor.get(), row[3]);
            StringifyImpliedCondition nothingKnown(table, false, true, invalidId);
            EXPECT_EQ(nothingKnown.print(id), row[1]);
        }
    table.insertAliasInfo("Mode", "true");
    PreprocessorVCExpr aliased(table, false, true, SymbolicExprAliasPrinterPredicate(table));
    EXPECT_EQ(aliased.print(read("Mode == 1")), "1 == 1");
}

TEST_F(GeneratedCode, ConditionsUnderAKnownOne) {
    for (const CaseRow& row : casesOf("print.txt", "implied", 3)) {
        const std::string &given = row[0], &text = row[1], &left = row[2];
        SCOPED_TRACE(given + "; " + text);
        const SymbolicExprId known = read(given), condition = read(text);
        StringifyImpliedCondition printer(table, false, true, known);
        EXPECT_EQ(printer.print(condition), left);
        printer.forget();
        EXPECT_EQ(printer.print(condition), left);
        StringifyImpliedCondition visitor(table, false, true, known);
        StringifySymbolicExpr& base = visitor;
        table.get(condition)->accept(table, base);
        EXPECT_EQ(base.get(), left);
        EXPECT_EQ(base.print(condition), left);
        EXPECT_EQ(base.print(*table.get(condition)), left);
    }
    EXPECT_EQ(StringifyImpliedCondition(table, true, true, read("A")).print(read("A || B")), "true");
}

TEST_F(GeneratedCode, WhatIsLeftIsTrueExactlyWhereTheConditionIs) {
    const ConditionShape shape{
        .symbols = {"A", "B", "C"}, .lowest = 0, .highest = 1, .symbolPairs = true, .truthValues = true};
    std::mt19937_64 random(9);
    std::size_t shorter = 0;
    for (int i = 0; i < 1500; ++i) {
        const std::string given = randomCondition(random, 1 + random() % 4, shape);
        const std::string other = randomCondition(random, 1 + random() % 6, shape);
        const SymbolicExprId known = read(given);
        const SymbolicExprId condition = read(i % 2 == 0 ? other : "(" + other + ") && (" + given + ")");
        StringifyImpliedCondition printer(table, false, true, known);
        const std::string text = printer.print(condition);
        const SymbolicExprId left = read(text);
        shorter += text.size() < PreprocessorVCExpr(table, false, true).print(condition).size() ? 1U : 0U;
        bool canHold = false;
        forEachAssignment(shape.symbols, -1, 2, [&](const Assignment& values) {
            if (holds(table, known, values)) {
                canHold = true;
                ASSERT_EQ(holds(table, left, values), holds(table, condition, values)) << text;
            }
        });
        EXPECT_TRUE(!canHold || printer.print(known) == "1") << given;
    }
    EXPECT_GT(shorter, 700U);
}

TEST_F(GeneratedCode, ObstaclesOfCText) {
    static const std::map<CTextObstacle, std::string> names{
        {CTextObstacle::NoSuchOperator, "NoSuchOperator"}, {CTextObstacle::BitwiseLogic, "BitwiseLogic"},
        {CTextObstacle::RealConstant, "RealConstant"},     {CTextObstacle::MemberOfNoName, "MemberOfNoName"},
        {CTextObstacle::CalledNoName, "CalledNoName"},     {CTextObstacle::SharedMacroName, "SharedMacroName"},
        {CTextObstacle::VariantKeyword, "VariantKeyword"}, {CTextObstacle::NoSuchName, "NoSuchName"},
        {CTextObstacle::DefinedNoName, "DefinedNoName"}};
    const auto obstacles = [&](SymbolicExprId id, CTextUse use) {
        std::string found;
        for (const CTextFinding& finding : findCTextObstacles(table, id, use))
            if (const std::string& name = names.at(finding.obstacle); !found.ends_with(name))
                found += (found.empty() ? "" : " ") + name;
        return found;
    };
    for (const bool trees : {false, true})
        for (const CaseRow& row : casesOf("print.txt", trees ? "obstacles of trees" : "obstacles", 3)) {
            SCOPED_TRACE(row[0]);
            const SymbolicExprId id = trees ? readTree(table, row[0]) : read(row[0]);
            EXPECT_EQ(obstacles(id, CTextUse::Program), row[1]);
            EXPECT_EQ(obstacles(id, CTextUse::Directive), row[2]);
        }
    table.insertAliasInfo("int", "rows");
    table.insertAliasInfo("a b", "(p+q)");
    table.insertAliasInfo("Name", "true");
    const SymbolicExprAliasPrinterPredicate aliases(table);
    EXPECT_TRUE(findCTextObstacles(table, read("int == 1"), CTextUse::Program, aliases).empty());
    EXPECT_TRUE(findCTextObstacles(table, tree.name("a b"), CTextUse::Directive, aliases).empty());
    for (const SymbolicExprId id : {readTree(table, "MemberValue(a b,field)"), read("Name.B")})
        EXPECT_EQ(findCTextObstacles(table, id, CTextUse::Directive, aliases).front().obstacle,
                  CTextObstacle::MemberOfNoName);
    for (const OperatorInfo& row : operatorTable())
        if (row.c.find_first_of(".\\':") != std::string_view::npos && row.op != Op::MemberValue) { // Quill alone has it
            const std::vector<SymbolicExprId> inputs(*operandCount(row.op), tree.name("a"));
            EXPECT_EQ(obstacles(tree(row.op, inputs), CTextUse::Program), "NoSuchOperator") << row.name;
        }
}

TEST_F(GeneratedCode, SharedAndDeepConditions) {
    const SymbolicExprId known = read("A == 1");
    SymbolicExprId doubled = tree(Op::Or, known, read("B"));
    for (int i = 0; i < 64; ++i)
        doubled = tree(i % 2 == 0 ? Op::And : Op::Or, doubled, doubled);
    const SymbolicExprId open = tree.doubled(Op::And, read("C"));
    EXPECT_EQ(StringifyImpliedCondition(table, false, true, known).print(doubled), "1");
    EXPECT_EQ(StringifyImpliedCondition(table, false, true, open).print(open), "1");
    StringifyImpliedCondition printer(table, false, true, known);
    EXPECT_THROW(static_cast<void>(printer.print(open)), std::length_error);
    EXPECT_THROW(static_cast<void>(printer.print(invalidId)), std::out_of_range);
    EXPECT_THROW(static_cast<void>(printer.get()), std::out_of_range);
    EXPECT_TRUE(findCTextObstacles(table, open, CTextUse::Directive).empty());

    SymbolicExprId spine = read("C"), member = read("S");
    for (int i = 0; i < 200'000; ++i) {
        spine = tree(i % 3 == 0 ? Op::Or : Op::And, spine, i % 3 == 1 ? known : tree.name("x" + std::to_string(i)));
        member = tree(Op::MemberValue, member);
    }
    const std::string left = StringifyImpliedCondition(table, false, true, known).print(spine);
    EXPECT_EQ(left.find("A == 1"), std::string::npos);
    EXPECT_EQ(StringifyImpliedCondition(table, false, true, spine).print(spine), "1");
    EXPECT_TRUE(findCTextObstacles(table, tree(Op::And, spine, member), CTextUse::Directive).empty());
}

} // namespace
} // namespace VT::Testing
