// What Quill texts become, in dimensions and in conditions: trees, or the key, the arguments and the place of a report,
// and what the host may change about it.
#include "base/variants/Features.hpp"
#include "tests/parser/QuillReading.hpp"
#include "tests/support/Cases.hpp"
#include "tests/support/FlagSetting.hpp"

#include <gtest/gtest.h>

#include <algorithm>
#include <limits>
#include <map>

namespace VT::Testing {
namespace {

using QuillMeaning = QuillTest;
using QuillReports = QuillTest;

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
class IntegerConverter final : public SymbolicExprFromQParseTree {
public:
    using SymbolicExprFromQParseTree::SymbolicExprFromQParseTree;

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
    constexpr bool throws = std::is_base_of_v<SymbolicExprFromQParseTreeBlockVariants, Converter>;
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
        expectMeanings<SymbolicExprFromQParseTree>(section);
    for (const std::string section : {"both", "conditions"})
        expectMeanings<SymbolicExprFromQParseTreeBlockVariants>(section);
    expectMeanings<SymbolicExprFromQParseTree>("workspace", &workspace);
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
    const auto report = [](const std::u16string& text) { return reportsText(readDimension(text)); };
    EXPECT_EQ(report(u"\u00e9"), "InvalidExpression(\xc3\xa9, 0)@0");
    EXPECT_EQ(report(std::u16string(u"A%\u00e9") + char16_t{0xd800} + u"x"),
              "NonASCIIText(A%\xc3\xa9\xef\xbf\xbdx, 4)@4");
    EXPECT_EQ(report(std::u16string(1, char16_t{0xdc00})), "NonASCIIText(\xef\xbf\xbd, 0)@0");
    EXPECT_EQ(report(std::u16string{u"A%"} + char16_t{0xdbff} + char16_t{0xdbff} + char16_t{0xdc00}),
              "NonASCIIText(A%\xef\xbf\xbd\xf4\x8f\xb0\x80, 2)@2");
    EXPECT_EQ(report(u"[A;B]"), "NonVectorValue([A;B], 0)@0");
    EXPECT_EQ(readCondition(std::u16string(1, char16_t{0xdc00})).thrown.value().offset(), 0U);
}

/// Refuses every call without a report, as an override may.
class SilentConverter final : public SymbolicExprFromQParseTreeBlockVariants {
public:
    using SymbolicExprFromQParseTreeBlockVariants::SymbolicExprFromQParseTreeBlockVariants;

    SymbolicExprId visitNonTerminal(const ParseTree& node, const char* text) override {
        const bool isCall = node.code == static_cast<std::int32_t>(QuillRule::Call);
        return isCall ? invalidId : SymbolicExprFromQParseTreeBlockVariants::visitNonTerminal(node, text);
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
        EXPECT_EQ(reason(lone), "\"b + \xef\xbf\xbd\" holds no valid character at byte 5, before \"\xef\xbf\xbd\": "
                                "replace it.@4");
        EXPECT_EQ(reason("1 + f(x)"), "@0");
        EXPECT_EQ(reason("2i"), "\"2i\" has no meaning where it stands in \"2i\": write the expression without it.@0");
    }
    EXPECT_EQ(checker.diagnostics().size(), 6U);
}

TEST_F(QuillReports, TextsWithNulAreQuotedWhole) {
    const std::string nul(1, '\0');
    for (const std::string& front : {"sqrt('a" + nul + "b')", "[1;2]%" + nul + "\n", "1e999 %" + nul, "'a" + nul + "'",
                                     "rem(1)%" + nul, "A" + nul + "B", "[[1],2]%" + nul, "z%" + nul}) {
        Workspace workspace;
        for (const QuillAnswer& answer : {readDimension(front, &workspace),
                                          readDimension(std::u16string(front.begin(), front.end()), &workspace)}) {
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
    SymbolicExprFromQParseTreeBlockVariants converter(table, latest);
    EXPECT_THROW(converter("A +"), HostDiagnostic);
    EXPECT_THROW(converter("'text'"), HostDiagnostic);
    ASSERT_EQ(latest.diagnostics().size(), 1U);
    EXPECT_EQ(reportText(latest.diagnostics().front()), "UnhandledExpression('text', 'text', 0)@0");
    converter("A");
    EXPECT_TRUE(latest.diagnostics().empty());
}

TEST_F(QuillReports, ValidatorsAreAskedOnceForANameOfConditions) {
    Workspace workspace;
    SymbolicExprFromQParseTreeBlockVariants converter(table, checker, &workspace);
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
    expect(HostNodes<SymbolicExprFromQParseTree>(table, checker));
    expect(HostNodes<SymbolicExprFromQParseTreeBlockVariants>(table, checker));
}

TEST_F(QuillReports, ValidatorsThatFailLeaveAUsableConverter) {
    Workspace workspace;
    SymbolicExprFromQParseTree failing(table, checker, &workspace);
    SymbolicExprFromQParseTreeBlockVariants failingToo(table, checker, &workspace);
    for (int i = 0; i < 2; ++i) {
        EXPECT_THROW(failing("[A, (B+fails)*2]"), std::runtime_error);
        EXPECT_EQ(treeText(table, failing("[A, B]")), "Dims2D(A,B)");
        EXPECT_THROW(failingToo("f(A, (B+fails)*2)"), std::runtime_error);
        EXPECT_EQ(treeText(table, failingToo("f(A, B)")), "FcnCall(f,A,B)");
    }
    EXPECT_TRUE(checker.diagnostics().empty());
}

} // namespace
} // namespace VT::Testing
