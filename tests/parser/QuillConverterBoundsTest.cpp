// Trees that a host may hand over, deep and broad texts, and the debug dump.
#include "base/core/Limits.hpp"
#include "parser/ParseTreeDump.hpp"
#include "tests/parser/QuillReading.hpp"
#include "tests/support/Cases.hpp"
#include "tests/support/Slots.hpp"
#include "tests/support/Times.hpp"

#include <gtest/gtest.h>

#include <array>
#include <cstddef>
#include <iterator>
#include <new>

namespace VT::Testing {
namespace {

using QuillBounds = QuillTest;

using Tree = _Q_parse_tree_T<char>;

Tree token(std::int32_t code, const char* text, std::uint32_t start = 0) {
    Tree node{Tree::terminal, code, start, {}, {}};
    node.length = static_cast<std::uint32_t>(std::string_view(text).size());
    node.text = text;
    return node;
}

template <std::size_t Size>
Tree rule(std::int32_t code, const std::array<Tree, Size>& children) {
    Tree node{Tree::nonTerminal, code, 0, {}, {}};
    node.childCount = static_cast<std::int32_t>(Size);
    node.children = children.data();
    return node;
}

TEST_F(QuillBounds, DeepAndBroadTrees) {
    constexpr std::size_t count = 200'000;

    const std::pair<std::string, std::size_t> cases[] = {
        // a text and the number of nodes that the table holds then
        {times(count, "A+") + "1", count + 2},  {times(count, "A && ") + "B", count + 2},
        {"A" + times(count, ".b"), count + 2},  {"A" + times(count, ".b(1)"), 2 * count + 3},
        {"f" + times(count, "(1)"), count + 2}, {"A" + times(count, "'"), count + 1},
        {"f(" + times(count, "A,") + "B)", 4},  {"[" + times(count, "A ") + "]", 3},
        {"{" + times(count, "A;") + "}", 4}};

    for (const auto& [text, nodes] : cases) {
        SymbolicExprTable fresh;
        EXPECT_TRUE(fresh.has(SymbolicExprFromQParseTreeBlockVariants(fresh, checker)(text))) << text.substr(0, 20);
        EXPECT_EQ(fresh.size(), nodes) << text.substr(0, 20);
    }
    EXPECT_FALSE(readCondition(times(limits::nesting, "(") + "A" + times(limits::nesting, ")")).thrown);
    EXPECT_TRUE(readCondition(times(limits::nesting + 1, "(") + "A" + times(limits::nesting + 1, ")")).thrown);
}

TEST_F(QuillBounds, TreesOfOtherHosts) {
    const Tree a = token(40, "a");
    const Tree sign = token(1, "?");
    const std::array<Tree, 1> alone{a};
    const std::array<Tree, 2> prefixed{sign, a};
    const std::array<Tree, 3> enclosed{sign, a, sign};
    const auto dimension = [&](const Tree& tree) { return treeText(table, dimensions.visitNode(tree, "text")); };
    const auto condition = [&](const Tree& tree) { return treeText(table, conditions.visitNode(tree, "text")); };

    // Roots in roots
    const std::array<Tree, 1> root{rule(21, alone)};
    const std::array<Tree, 1> roots{rule(21, root)};
    EXPECT_EQ(dimension(rule(21, roots)), "a");
    EXPECT_EQ(condition(rule(43, std::array<Tree, 3>{sign, rule(21, roots), sign})), "a");
    EXPECT_EQ(condition(rule(44, std::array<Tree, 2>{sign, token(41, "2147483648")})), "-2147483648");
    EXPECT_EQ(condition(rule(25, std::array<Tree, 2>{sign, token(41, "2147483648")})), "-2147483648");

    // The second forms of rules
    EXPECT_EQ(dimension(rule(67, enclosed)), "a");
    EXPECT_EQ(condition(rule(67, enclosed)), "a");
    EXPECT_EQ(condition(rule(25, prefixed)), "UnaryMinus(a)");
    EXPECT_EQ(condition(rule(26, prefixed)), "Not(a)");
    EXPECT_TRUE(checker.diagnostics().empty());
    EXPECT_EQ(dimension(rule(25, prefixed)), "invalid");
    EXPECT_EQ(dimension(rule(26, prefixed)), "invalid");

    // Numbers that the embedded host does not write
    EXPECT_EQ(dimension(token(41, "1_000", 4)), "invalid");
    EXPECT_EQ(reportText(checker.diagnostics().back()), "InvalidLiteralValue(1_000, text, 4)@4");
    EXPECT_EQ(condition(token(41, "")), "invalid");

    // Codes that nothing is known of, and rules without the children that they need
    const auto expectOneReport = [&](const auto& answerOf, const Tree& tree, const std::string& report) {
        checker.clear();
        EXPECT_EQ(answerOf(tree), "invalid") << tree.code;
        ASSERT_EQ(checker.diagnostics().size(), 1U) << tree.code;
        EXPECT_EQ(reportText(checker.diagnostics().front()), report);
    };
    for (const std::int32_t code :
         {-2147483647 - 1, -1, 0, 22, 39, 43, 44, 49, 76, 83, 85, 90, 136, 299, 300, 304, 305, 306, 308, 319, 320,
          2147483647}) {
        const std::string name = vtuQParserNonTerminalName(code);
        for (const bool isDimension : {true, false}) {
            const auto answerOf = [&](const Tree& tree) { return isDimension ? dimension(tree) : condition(tree); };
            expectOneReport(answerOf, rule(code, alone), "UnhandledExpression(" + name + ", text, 0)@0");
            expectOneReport(answerOf, token(code, "?", 2), "UnhandledExpression(?, text, 2)@2");
        }
    }
    // An element where a row should stand
    expectOneReport(dimension, rule(27, alone), "UnhandledExpression(a, text, 0)@0");
    expectOneReport(condition, rule(27, alone), "UnhandledExpression(a, text, 0)@0");
    expectOneReport(condition, rule(301, alone), "UnhandledExpression(a, text, 0)@0");
}

TEST_F(QuillBounds, Dump) {
    checker.disableDiagnostics();
    const auto dumpOf = [&](const char* text) {
        testing::internal::CaptureStdout();
        conditions(text, true);
        return testing::internal::GetCapturedStdout();
    };
    std::string dump;
    for (const CaseRow& row : casesOf("quill-meaning.txt", "dump", 1))
        dump += row[0] + "\n";
    EXPECT_EQ(dumpOf("f(A)+1"), dump);
    EXPECT_EQ(dumpOf("A +"), "======Q-Parse tree not found for expression 'A +'\n");
    testing::internal::CaptureStdout();
    conditions("A");
    EXPECT_EQ(testing::internal::GetCapturedStdout(), "");

    // Depth is shown, but does not make the text grow with its square.
    const std::string deep = times(50'000, "A+") + "1";
    EXPECT_LT(dumpOf(deep.c_str()).size(), 200 * deep.size());
}

TEST_F(QuillBounds, SlotsAreWhereHostsCallThem) {
    using Base = SymbolicExprFromQParseTree;
    using Variants = SymbolicExprFromQParseTreeBlockVariants;
    const std::ptrdiff_t slots[] = {
        slotOf(&Base::supportIntegerOnly), slotOf(&Base::shouldCreateIntValueNodeForIntegerValue),
        slotOf(&Base::supportLogicalValues), slotOf(&Base::supportOperator),
        // 4 and 5 are the destructor's.
        4, 5, slotOf(&Base::enableDiagnostics), slotOf(&Base::reportInvalidLiteralValue),
        slotOf(&Base::reportNonScalarValue), slotOf(&Base::reportComplexValue), slotOf(&Base::reportLogicalValue),
        slotOf(&Base::reportNonIntegerLiteralValue), slotOf(&Base::reportNonIntegerValue),
        slotOf(&Base::reportUnsupportedValue), slotOf(&Base::reportDiagnostic), slotOf(&Base::visitTerminal),
        slotOf(&Base::getFunctionNameSymId), slotOf(&Base::resolveIdentifier), slotOf(&Base::supportFcn),
        slotOf(&Base::getNumberFromQxArray), slotOf(&Base::visitNonTerminal), slotOf(&Base::reportUnhandledExpr),
        slotOf(&Base::reportDivisionExpr), slotOf(&Base::reportUnsupportedFcn), slotOf(&Base::reportInvalidNumArgs),
        slotOf(&Base::reportInvalidExpr), slotOf(&Base::visitMatrixNode), slotOf(&Base::visitMDot),
        slotOf(&Base::destroy), slotOf(&Base::destroyAndFree), slotOf(&Variants::visitCellIndexNode),
        slotOf(&Variants::visitCellArrayNode), slotOf(&Variants::parseArrayBodyNode)};
    for (std::ptrdiff_t slot = 0; slot < std::ssize(slots); ++slot)
        EXPECT_EQ(slots[slot], slot);
}

TEST_F(QuillBounds, SlotsEndAConverter) {
    struct Counted final : SymbolicExprFromQParseTreeBlockVariants {
        using SymbolicExprFromQParseTreeBlockVariants::SymbolicExprFromQParseTreeBlockVariants;

        ~Counted() override { ++*ends; }

        int* ends = nullptr;
    };

    int ends = 0;
    alignas(Counted) std::array<std::byte, sizeof(Counted)> memory;
    Counted* const converters[] = {new Counted(table, checker), new (memory.data()) Counted(table, checker)};
    for (Counted* const converter : converters)
        converter->ends = &ends;
    static_cast<SymbolicExprFromQParseTree*>(converters[0])->destroyAndFree();
    EXPECT_EQ(ends, 1);
    static_cast<SymbolicExprFromQParseTree*>(converters[1])->destroy();
    EXPECT_EQ(ends, 2);
}

} // namespace
} // namespace VT::Testing
