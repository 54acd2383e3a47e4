// Texts of conditions for generated code.
#include "base/print/CTextObstacles.hpp"
#include "base/print/Predicates.hpp"
#include "base/print/StringifyImpliedCondition.hpp"
#include "tests/support/AnyNode.hpp"
#include "tests/support/Parsing.hpp"
#include "tests/support/RandomCondition.hpp"
#include "tests/support/Truth.hpp"

#include <array>
#include <cmath>
#include <gtest/gtest.h>

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
    struct Row {
        SymbolicExprId id;
        std::string clarified;
        std::string bare;  ///< empty: as clarified
        std::string quill; ///< of the clarified text; empty: as in C
    };

    const SymbolicExprId a = tree.name("a"), b = tree.name("b"), c = tree.name("c");
    const SymbolicExprId both = tree(Op::SingleAnd, a, b), either = tree(Op::SingleOr, a, b);
    const std::vector<Row> rows{{read("true && Mode == 1"), "1 && Mode == 1", "", "true && Mode == 1"},
                                {read("false"), "0", "", "false"},
                                {read("A.B.C+1"), "A_B_C + 1", "", "A.B.C + 1"},
                                {read("A || B && C"), "A || (B && C)", "A || B && C", ""},
                                {read("A || (B || C)"), "A || (B || C)", "", ""},
                                {read("a == b == c"), "(a == b) == c", "", ""},
                                {read("a == (b == c)"), "a == (b == c)", "", ""},
                                {read("!(a - -3 * -b)"), "!(a - -3 * -b)", "", "~(a - -3 * -b)"},
                                {read("defined(A.B) || f(a, b + 1) != 0"), "defined(A_B) || f(a,b + 1) != 0", "",
                                 "defined(A.B) || f(a,b + 1) ~= 0"},
                                {tree(Op::And, both, either), "(a & b) && (a | b)", "a & b && a | b", ""},
                                {tree(Op::Or, both, either), "(a & b) || (a | b)", "a & b || a | b", ""},
                                {tree(Op::SingleOr, both, c), "(a & b) | c", "a & b | c", ""},
                                {tree(Op::SingleOr, c, both), "c | (a & b)", "c | a & b", ""},
                                {tree(Op::SingleAnd, either, c), "(a | b) & c", "", ""}};
    for (const Row& row : rows) {
        EXPECT_EQ(PreprocessorVCExpr(table, false, true).print(row.id), row.clarified);
        EXPECT_EQ(PreprocessorVCExpr(table, false).print(row.id), row.bare.empty() ? row.clarified : row.bare);
        PreprocessorVCExpr visitor(table, true, true);
        visitor.execute(table, row.id);
        EXPECT_EQ(visitor.get(), row.quill.empty() ? row.clarified : row.quill);
        StringifyImpliedCondition nothingKnown(table, false, true, invalidId);
        EXPECT_EQ(nothingKnown.print(row.id), row.clarified);
    }
    table.insertAliasInfo("Mode", "true");
    PreprocessorVCExpr aliased(table, false, true, SymbolicExprAliasPrinterPredicate(table));
    EXPECT_EQ(aliased.print(read("Mode == 1")), "1 == 1");
}

TEST_F(GeneratedCode, ConditionsUnderAKnownOne) {
    // What is known, a condition, what is left of it.
    const std::vector<std::array<std::string, 3>> rows{{"A == 1 && B", "C && (D || B) && A == 1", "C"},
                                                       {"A == 1", "1 == A && !(A != 1) && B", "B"},
                                                       {"A < B", "B > A && A >= B", "0"},
                                                       {"!(A || B)", "A || C && !B", "C"},
                                                       {"!(A && B)", "A && C", "A && C"},
                                                       {"A", "!(A && B) || C", "!B || C"},
                                                       {"A", "(A && B) + 1 == 2 && (A && B)", "(A && B) + 1 == 2 && B"},
                                                       {"A", "(B && (A && C)) == 1", "(B && C) == 1"},
                                                       {"A == 1 && A == 2", "A == 1", "1"}};
    for (const auto& [given, text, left] : rows) {
        const SymbolicExprId known = read(given);
        const SymbolicExprId condition = read(text);
        StringifyImpliedCondition printer(table, false, true, known);
        EXPECT_EQ(printer.print(condition), left) << text << " given " << given;
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
    struct Row {
        std::vector<CTextObstacle> inPrograms;
        std::vector<CTextObstacle> inDirectives;
        std::vector<SymbolicExprId> ids;
    };

    using enum CTextObstacle;
    const SymbolicExprId a = tree.name("a"), b = tree.name("b"), truth = read("a > 1");
    const SymbolicExprId call = tree(Op::FcnCall1U, a, b);
    const std::vector<Row> rows{
        {{},
         {},
         {read("defined(A) && f(A, B) + ~(A % 2 << B / 3 ^ C) == -S.x.y"), read("A.B.C || A_B"), invalidId,
          tree(Op::SingleAnd, truth, tree(Op::Not, a)), read("defined.B && A.defined && defined(A.B)")}},
        {{BitwiseLogic},
         {BitwiseLogic},
         {tree(Op::SingleOr, truth, a), tree(Op::BitXOr, tree(Op::SingleOr, truth, truth), a)}},
        {{NoSuchOperator}, {NoSuchOperator}, {tree(Op::Equal, tree(Op::Power, a, b), tree(Op::Power, b, a))}},
        {{}, {RealConstant}, {read("a > .5")}},
        {{RealConstant}, {RealConstant}, {tree(Op::LessThan, a, tree.real(HUGE_VAL))}},
        {{}, {SharedMacroName}, {read("A.B_C && A.B == A_B.C"), read("A.B || A_B")}},
        {{}, {MemberOfNoName}, {tree(Op::MemberValue, call)}},
        {{MemberOfNoName}, {MemberOfNoName}, {read("true.B"), tree(Op::MemberValue, tree(Op::Plus, a, b))}},
        {{}, {CalledNoName}, {tree(Op::FcnCall1U, read("S.f"), b)}},
        {{CalledNoName}, {CalledNoName}, {read("true(x) || false()"), tree(Op::FcnCall1U, tree.integer(1), b)}},
        {{VariantKeyword}, {VariantKeyword}, {read("(sim) && A"), read("(codegen)"), tree.name("(default)")}},
        {{VariantKeyword}, {VariantKeyword, MemberOfNoName}, {tree(Op::MemberValue, tree.name("(sim)"))}},
        {{NoSuchName}, {NoSuchName}, {tree(Op::And, tree.name("@default"), a), tree.name("")}},
        {{NoSuchName}, {NoSuchName, CalledNoName}, {tree(Op::FcnCall1U, tree.name("a b"), a)}},
        {{NoSuchName}, {}, {read("int == S.while"), read("S.int"), read("sizeof(A) == 4"), read("A.false.true")}},
        {{}, {NoSuchName}, {read("defined == 1 && defined(A)"), read("f(defined)")}},
        {{},
         {DefinedNoName},
         {read("defined(true)"), read("defined(A + 1)"), read("defined(f(A))"), read("defined(A, B)"),
          read("defined()"), read("defined(defined)")}}};
    const auto obstacles = [&](SymbolicExprId id, CTextUse use) {
        std::vector<CTextObstacle> found;
        for (const CTextFinding& finding : findCTextObstacles(table, id, use))
            if (found.empty() || found.back() != finding.obstacle)
                found.push_back(finding.obstacle);
        return found;
    };
    for (const Row& row : rows)
        for (const SymbolicExprId id : row.ids) {
            SCOPED_TRACE(table.has(id) ? SymbolicExprPrinter(table, false)(id) : "");
            EXPECT_EQ(obstacles(id, CTextUse::Program), row.inPrograms);
            EXPECT_EQ(obstacles(id, CTextUse::Directive), row.inDirectives);
        }
    table.insertAliasInfo("int", "rows");
    table.insertAliasInfo("a b", "(p+q)");
    table.insertAliasInfo("Name", "true");
    const SymbolicExprAliasPrinterPredicate aliases(table);
    EXPECT_TRUE(findCTextObstacles(table, read("int == 1"), CTextUse::Program, aliases).empty());
    EXPECT_TRUE(findCTextObstacles(table, tree.name("a b"), CTextUse::Directive, aliases).empty());
    for (const SymbolicExprId id : {tree(Op::MemberValue, tree.name("a b")), read("Name.B")})
        EXPECT_EQ(findCTextObstacles(table, id, CTextUse::Directive, aliases).front().obstacle, MemberOfNoName);
    for (const OperatorInfo& op : operatorTable()) {
        const bool onlyInQuill = op.op != Op::UnaryMinus && op.c.find_first_of(".\\':") != std::string_view::npos;
        if (onlyInQuill && op.op != Op::MemberValue) {
            const std::vector<SymbolicExprId> inputs(*operandCount(op.op), a);
            EXPECT_EQ(obstacles(makeNode(table, op.op, inputs), CTextUse::Program), std::vector{NoSuchOperator})
                << op.name;
        }
    }
}

TEST_F(GeneratedCode, SharedAndDeepConditions) {
    const SymbolicExprId known = read("A == 1");
    SymbolicExprId doubled = tree(Op::Or, known, read("B"));
    SymbolicExprId open = read("C");
    for (int i = 0; i < 64; ++i) {
        doubled = tree(i % 2 == 0 ? Op::And : Op::Or, doubled, doubled);
        open = tree(Op::And, open, open);
    }
    EXPECT_EQ(StringifyImpliedCondition(table, false, true, known).print(doubled), "1");
    EXPECT_EQ(StringifyImpliedCondition(table, false, true, open).print(open), "1");
    StringifyImpliedCondition printer(table, false, true, known);
    EXPECT_THROW(static_cast<void>(printer.print(open)), std::length_error);
    EXPECT_THROW(static_cast<void>(printer.print(invalidId)), std::out_of_range);
    EXPECT_THROW(static_cast<void>(printer.get()), std::out_of_range);
    EXPECT_TRUE(findCTextObstacles(table, open, CTextUse::Directive).empty());

    SymbolicExprId spine = read("C");
    SymbolicExprId member = read("S");
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
