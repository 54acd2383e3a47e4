// What Quill texts become, in dimensions and in conditions: trees, or the key, the arguments and the place of a report,
// and what the host may change about it; trees that a host may hand over, bounds, slots, and the debug dump.
#include "base/VTSymbolicExpr.hpp"
#include "base/core/Limits.hpp"
#include "base/variants/Features.hpp"
#include "host/Messages.hpp"
#include "host/Text.hpp"
#include "parser/ParseTreeDump.hpp"
#include "parser/QuillConverterBlockVariants.hpp"
#include "tests/support/Cases.hpp"
#include "tests/support/FlagSetting.hpp"
#include "tests/support/Slots.hpp"
#include "tests/support/Times.hpp"
#include "tests/support/TreeText.hpp"

#include <algorithm>
#include <array>
#include <cstddef>
#include <gtest/gtest.h>
#include <limits>
#include <map>
#include <new>
#include <optional>
#include <string>
#include <type_traits>
#include <utility>
#include <vector>

namespace VT::Testing {
namespace {

using Dimensions = SymbolicExprFromQParseTree;
using Conditions = SymbolicExprFromQParseTreeBlockVariants;

struct QuillAnswer {
    std::string tree; ///< "invalid" for a text that is refused
    std::vector<HostDiagnostic> reports;
    std::optional<HostDiagnostic> thrown;
};

/// The answer of a converter of class Converter that was made for this text alone.
template <class Converter, class Text>
QuillAnswer readQuill(const Text& text, SymbolValidator* validator = nullptr) {
    SymbolicExprTable table;
    VTSymbolicExprErrorChecker checker;
    Converter converter(table, checker, validator);
    QuillAnswer answer;
    try {
        answer.tree = treeText(table, converter(text));
    } catch (const HostDiagnostic& diagnostic) {
        answer.tree = "invalid";
        answer.thrown = diagnostic;
    }
    answer.reports = checker.diagnostics();
    return answer;
}

/// Converters of one table.
class QuillTest : public testing::Test {
protected:
    SymbolicExprTable table;
    VTSymbolicExprErrorChecker checker; // collects
    Dimensions dimensions{table, checker};
    Conditions conditions{table, checker};
};

/// A diagnostic in one line: the key, the arguments, the offset.  Its sentence must have room for the arguments and
/// quote the text.
std::string reportText(const HostDiagnostic& report) {
    const MessageInfo* const row = findMessage(report.messageId());
    EXPECT_TRUE(row != nullptr && fits(*row, report.arguments())) << report.messageId();
    const std::size_t textAt = row != nullptr && row->arguments.size() > 2 ? 1 : 0;
    const std::string quoted = shownText(std::get<std::string>(report.arguments().at(textAt)), 10);
    EXPECT_NE(std::string(report.what()).find(quoted.substr(0, quoted.find("..."))), std::string::npos)
        << report.what();
    std::string text = report.messageId().substr(report.messageId().rfind(':') + 1) + "(";
    const char* separator = "";
    for (const DiagnosticArgument& argument : report.arguments()) {
        const auto* const words = std::get_if<std::string>(&argument);
        text += std::exchange(separator, ", ") + (words ? *words : std::to_string(std::get<std::int64_t>(argument)));
    }
    return text + ")@" + (report.offset() ? std::to_string(*report.offset()) : "none");
}

/// The reports of an answer, one after another.
std::string reportsText(const QuillAnswer& answer) {
    std::string text;
    for (const HostDiagnostic& report : answer.reports)
        text += (text.empty() ? "" : " ") + reportText(report);
    return text;
}

using QuillMeaning = QuillTest;
using QuillReports = QuillTest;
using QuillBounds = QuillTest;

constexpr double infinity = std::numeric_limits<double>::infinity();

QxArray scalar(QxArray::Type type, double value, bool complex = false) {
    return {type, complex, {1, 1}, {value}};
}

QxArray array(std::vector<std::size_t> dimensions, std::vector<double> elements) {
    return {QxArray::Type::Real, false, std::move(dimensions), std::move(elements)};
}

/// A workspace: names that are not in it are unknown, but for symbols, which begin with a capital.
class Workspace final : public SymbolValidator {
public:
    SymbolMeaning resolveSymbol(const std::string& name, const char* text, std::size_t position) override {
        asked += name + "@" + std::to_string(position) + " ";
        EXPECT_EQ(std::string(text).substr(position, name.size()), name);
        if (name == "fails")
            throw std::runtime_error("the workspace is closed");
        if (const auto value = values.find(name); value != values.end())
            return value->second;
        if (name.front() >= 'A' && name.front() <= 'Z')
            return SymbolName{};
        return UnknownSymbol{};
    }

    std::map<std::string, QxArray> values{
        {"on", scalar(QxArray::Type::Logical, 1)},
        {"eight", scalar(QxArray::Type::Integer, 8)},
        {"half", scalar(QxArray::Type::Real, 0.5)},
        {"big", scalar(QxArray::Type::Real, 2147483648.0)},
        {"least", scalar(QxArray::Type::Real, -2147483648.0)},
        {"endless", scalar(QxArray::Type::Real, infinity)},
        {"z", scalar(QxArray::Type::Real, 1, true)},
        {"text", {QxArray::Type::Other, false, {1, 3}, {}}},
        {"row", array({1, 3}, {2, 3, 4})},
        {"mixed", array({1, 2}, {2, 0.5})},
        {"column", array({2, 1}, {2, 3})},
        {"block", array({1, 1, 2}, {1, 2})},
        {"lying", array({1, 5}, {1, 2})},
    };
    std::string asked;
};

/// Dimensions that must be integers.
class IntegerConverter final : public Dimensions {
public:
    using Dimensions::Dimensions;

    [[nodiscard]] bool supportIntegerOnly() const override { return true; }

    [[nodiscard]] bool supportLogicalValues() const override { return false; }

    bool supportOperator(const ParseTree& node, const char* text) override {
        if (node.code != static_cast<std::int32_t>(QuillRule::Divide))
            return true;
        reportDivisionExpr(node, text);
        return false;
    }
};

/// Each row of a section of quill-meaning.txt is a text, its tree or the only report of it, and for some refused
/// conditions the sentence.
template <class Converter>
void expectMeanings(const std::string& section, SymbolValidator* validator = nullptr) {
    constexpr bool throws = std::is_base_of_v<Conditions, Converter>;
    for (const CaseRow& row : casesOf("quill-meaning.txt", section, 3)) {
        SCOPED_TRACE(row[0]);
        const QuillAnswer answer = readQuill<Converter>(row[0], validator);
        const bool refused = answer.tree == "invalid";
        EXPECT_EQ(refused ? reportsText(answer) : answer.tree, row[1]);
        ASSERT_EQ(answer.reports.size(), refused ? 1U : 0U);
        ASSERT_EQ(answer.thrown.has_value(), refused && throws);
        if (!answer.thrown)
            continue;
        EXPECT_EQ(answer.thrown->messageId(), "Vantor:Variants:ExpressionParseError");
        EXPECT_EQ(answer.thrown->offset(), answer.reports[0].offset());
        const std::vector<DiagnosticArgument> arguments{row[0],
                                                        std::string(answer.thrown->offset().value() + 1, ' ') + "^"};
        EXPECT_EQ(answer.thrown->arguments(), arguments);
        EXPECT_TRUE(row[2].empty() || row[2] == answer.thrown->what()) << answer.thrown->what();
    }
}

// Operators, lists, calls and functions of each other are printed and read back in tests/print.
TEST_F(QuillMeaning, Cases) {
    Workspace workspace;
    for (const std::string section : {"both", "dimensions"})
        expectMeanings<Dimensions>(section);
    for (const std::string section : {"both", "conditions"})
        expectMeanings<Conditions>(section);
    expectMeanings<Dimensions>("workspace", &workspace);
    expectMeanings<IntegerConverter>("integers", &workspace);
}

TEST_F(QuillMeaning, VariantKeywords) {
    for (const int value : {1, 0, 1}) {
        const FlagSetting setting(*VTFEAT_VariantKeywordsSimCodegen, value);
        EXPECT_EQ(treeText(table, conditions("(sim) || x && (codegen)")),
                  value == 1 ? "Or((sim),And(x,(codegen)))" : "Or(sim,And(x,codegen))");
        EXPECT_EQ(treeText(table, dimensions("(sim)")), "sim");
    }
}

TEST_F(QuillReports, InUtf16Text) {
    const auto report = [](const std::u16string& text) { return reportsText(readQuill<Dimensions>(text)); };
    EXPECT_EQ(report(u"\u00e9"), "InvalidExpression(\xc3\xa9, 0)@0");
    EXPECT_EQ(report(std::u16string(u"A%\u00e9") + char16_t{0xd800} + u"x"),
              "NonASCIIText(A%\xc3\xa9\xef\xbf\xbdx, 4)@4");
    EXPECT_EQ(report(std::u16string(1, char16_t{0xdc00})), "NonASCIIText(\xef\xbf\xbd, 0)@0");
    EXPECT_EQ(report(std::u16string{u"A%"} + char16_t{0xdbff} + char16_t{0xdbff} + char16_t{0xdc00}),
              "NonASCIIText(A%\xef\xbf\xbd\xf4\x8f\xb0\x80, 2)@2");
    EXPECT_EQ(report(u"[A;B]"), "NonVectorValue([A;B], 0)@0");
    EXPECT_EQ(readQuill<Conditions>(std::u16string(1, char16_t{0xdc00})).thrown.value().offset(), 0U);
}

/// Refuses every call without a report, as an override may.
class SilentConverter final : public Conditions {
public:
    using Conditions::Conditions;

    SymbolicExprId visitNonTerminal(const ParseTree& node, const char* text) override {
        const bool isCall = node.code == static_cast<std::int32_t>(QuillRule::Call);
        return isCall ? invalidId : Conditions::visitNonTerminal(node, text);
    }
};

TEST_F(QuillReports, ThoseOfAnEarlierTextExplainNothing) {
    SilentConverter converter(table, checker);
    const auto reason = [&](const auto& text) -> std::string {
        try {
            converter(text);
        } catch (const HostDiagnostic& thrown) {
            return thrown.additionalText() + "@" + std::to_string(thrown.offset().value());
        }
        return "none";
    };
    const std::u16string lone = std::u16string(u"b + ") + char16_t{0xd800};
    for (int i = 0; i < 2; ++i) {
        EXPECT_EQ(reason("A +"), "The text ends where a value must follow.@3");
        EXPECT_EQ(reason(lone), "\"b + \xef\xbf\xbd\" holds an invalid character at byte 5, before \"\xef\xbf\xbd\": "
                                "replace it.@4");
        EXPECT_EQ(reason("1 + f(x)"), "@0");
        EXPECT_EQ(reason("2i"), "\"2i\" cannot be used in \"2i\": write the expression without it.@0");
    }
    EXPECT_EQ(checker.diagnostics().size(), 6U);
}

TEST_F(QuillReports, TextsWithNulAreQuotedWhole) {
    const std::string nul(1, '\0');
    for (const std::string& front : {"sqrt('a" + nul + "b')", "[1;2]%" + nul + "\n", "1e999 %" + nul, "'a" + nul + "'",
                                     "rem(1)%" + nul, "A" + nul + "B", "[[1],2]%" + nul, "z%" + nul}) {
        Workspace workspace;
        for (const QuillAnswer& answer :
             {readQuill<Dimensions>(front, &workspace),
              readQuill<Dimensions>(std::u16string(front.begin(), front.end()), &workspace)}) {
            ASSERT_EQ(answer.reports.size(), 1U);
            const std::vector<DiagnosticArgument>& arguments = answer.reports[0].arguments();
            EXPECT_NE(std::ranges::find(arguments, DiagnosticArgument(front)), arguments.end()) << reportsText(answer);
            EXPECT_EQ(answer.reports[0].offset(), front[0] == 'A' ? 1U : front[1] == '[' ? 1U : 0U);
        }
    }
    // No text is longer than it is: not one whose characters follow another's that has been converted.
    std::string buffer("A +\0B", 5);
    EXPECT_EQ(dimensions(buffer), invalidId);
    EXPECT_EQ(dimensions(buffer.c_str()), invalidId);
    checker.reportInvalidExpr(buffer.c_str());
    EXPECT_EQ(reportText(checker.diagnostics()[0]), "InvalidExpression(" + buffer + ", 3)@3");
    EXPECT_EQ(reportText(checker.diagnostics()[1]), "InvalidExpression(A +, 3)@3");
    EXPECT_EQ(reportText(checker.diagnostics()[2]), "InvalidExpression(A +, 0)@0");
}

TEST_F(QuillReports, AreSuppressedByTheCheckersFlag) {
    checker.disableDiagnostics();
    for (const std::string text : {"A +", "sqrt(1)", "rem(1)", "x{1}", "[1;2]", "1e999", "'t'"}) {
        EXPECT_EQ(dimensions(text), invalidId) << text;
        EXPECT_NO_THROW(conditions(text)) << text;
    }
    EXPECT_TRUE(dimensions.skipDiagnostics());
    EXPECT_TRUE(checker.diagnostics().empty());
    dimensions.enableDiagnostics();
    for (const std::string text : {"A +", "sqrt(1)"})
        EXPECT_EQ(dimensions(text), invalidId);
    EXPECT_EQ(checker.diagnostics().size(), 2U) << "they are collected";
}

TEST_F(QuillReports, TheCheckerOfConditionsKeepsThoseOfTheLatestText) {
    VTSymbolicExprErrorCheckerBlockVariants latest;
    Conditions converter(table, latest);
    EXPECT_THROW(converter("A +"), HostDiagnostic);
    EXPECT_THROW(converter("'text'"), HostDiagnostic);
    ASSERT_EQ(latest.diagnostics().size(), 1U);
    EXPECT_EQ(reportText(latest.diagnostics().front()), "UnhandledExpression('text', 'text', 0)@0");
    converter("A");
    EXPECT_TRUE(latest.diagnostics().empty());
}

TEST_F(QuillReports, ValidatorsAreAskedOnceForANameOfConditions) {
    Workspace workspace;
    Conditions converter(table, checker, &workspace);
    EXPECT_EQ(treeText(table, converter("text + unknown + text + f(unknown) + S.field")),
              "Plus(Plus(Plus(Plus(text,unknown),text),FcnCall(f,unknown)),MemberValue(S,field))");
    EXPECT_EQ(workspace.asked, "text@0 unknown@7 S@37 ");
    converter("f + field + text"); // names of functions and fields have not been seen
    EXPECT_EQ(workspace.asked, "text@0 unknown@7 S@37 f@0 field@4 ");
}

/// Answers nodes of its own, in the shape of Quill calls.
template <class Base>
class HostNodes final : public Base {
public:
    using Base::Base;

    SymbolicExprId resolveIdentifier(const std::string& name, const char* text, std::size_t position) override {
        asked += name + "@" + std::to_string(position) + " ";
        const SymbolicExprId id = Base::resolveIdentifier(name, text, position);
        return name == "low" ? this->factory().template make<SymbolicFcnCall2UExpr>(
                                   this->factory().template make<SymbolicString>("bitand"), id,
                                   this->factory().template make<SymbolicIntValue>(255))
                             : id;
    }

    std::string asked;
};

TEST_F(QuillReports, OverridesAreAskedForEveryNameAndMayAnswerCalls) {
    const auto expect = [&](auto&& converter) {
        EXPECT_EQ(treeText(table, converter("low + N + low + N")),
                  "Plus(Plus(Plus(BitAnd(low,255),N),BitAnd(low,255)),N)");
        EXPECT_EQ(treeText(table, converter("N")), "N");
        EXPECT_EQ(converter.asked, "low@0 N@6 low@10 N@16 N@0 ");
    };
    expect(HostNodes<Dimensions>(table, checker));
    expect(HostNodes<Conditions>(table, checker));
}

TEST_F(QuillReports, ValidatorsThatFailLeaveAUsableConverter) {
    Workspace workspace;
    Dimensions failing(table, checker, &workspace);
    Conditions failingToo(table, checker, &workspace);
    for (int i = 0; i < 2; ++i) {
        EXPECT_THROW(failing("[A, (B+fails)*2]"), std::runtime_error);
        EXPECT_EQ(treeText(table, failing("[A, B]")), "Dims2D(A,B)");
        EXPECT_THROW(failingToo("f(A, (B+fails)*2)"), std::runtime_error);
        EXPECT_EQ(treeText(table, failingToo("f(A, B)")), "FcnCall(f,A,B)");
    }
    EXPECT_TRUE(checker.diagnostics().empty());
}

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
        EXPECT_TRUE(fresh.has(Conditions(fresh, checker)(text))) << text.substr(0, 20);
        EXPECT_EQ(fresh.size(), nodes) << text.substr(0, 20);
    }
    EXPECT_FALSE(readQuill<Conditions>(times(limits::nesting, "(") + "A" + times(limits::nesting, ")")).thrown);
    EXPECT_TRUE(readQuill<Conditions>(times(limits::nesting + 1, "(") + "A" + times(limits::nesting + 1, ")")).thrown);
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
    using Base = Dimensions;
    const auto slotsOf = [](auto... members) { return std::vector<std::ptrdiff_t>{slotOf(members)...}; };
    std::vector<std::ptrdiff_t> slots = slotsOf(
        &Base::supportIntegerOnly, &Base::shouldCreateIntValueNodeForIntegerValue, &Base::supportLogicalValues,
        &Base::supportOperator, &Base::enableDiagnostics, &Base::reportInvalidLiteralValue, &Base::reportNonScalarValue,
        &Base::reportComplexValue, &Base::reportLogicalValue, &Base::reportNonIntegerLiteralValue,
        &Base::reportNonIntegerValue, &Base::reportUnsupportedValue, &Base::reportDiagnostic, &Base::visitTerminal,
        &Base::getFunctionNameSymId, &Base::resolveIdentifier, &Base::supportFcn, &Base::getNumberFromQxArray,
        &Base::visitNonTerminal, &Base::reportUnhandledExpr, &Base::reportDivisionExpr, &Base::reportUnsupportedFcn,
        &Base::reportInvalidNumArgs, &Base::reportInvalidExpr, &Base::visitMatrixNode, &Base::visitMDot, &Base::destroy,
        &Base::destroyAndFree, &Conditions::visitCellIndexNode, &Conditions::visitCellArrayNode,
        &Conditions::parseArrayBodyNode);
    slots.insert(slots.begin() + 4, {4, 5}); // the destructor's
    ASSERT_EQ(slots.size(), 33U);
    for (std::ptrdiff_t slot = 0; slot < std::ssize(slots); ++slot)
        EXPECT_EQ(slots[slot], slot);
}

TEST_F(QuillBounds, SlotsEndAConverter) {
    struct Counted final : Conditions {
        using Conditions::Conditions;

        ~Counted() override { ++*ends; }

        int* ends = nullptr;
    };

    int ends = 0;
    alignas(Counted) std::array<std::byte, sizeof(Counted)> memory;
    Counted* const converters[] = {new Counted(table, checker), new (memory.data()) Counted(table, checker)};
    for (Counted* const converter : converters)
        converter->ends = &ends;
    static_cast<Dimensions*>(converters[0])->destroyAndFree();
    EXPECT_EQ(ends, 1);
    static_cast<Dimensions*>(converters[1])->destroy();
    EXPECT_EQ(ends, 2);
}

} // namespace
} // namespace VT::Testing
