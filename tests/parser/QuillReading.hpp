// One conversion of Quill text with its answer as a value.
#pragma once

#include "base/VTSymbolicExpr.hpp"
#include "host/Messages.hpp"
#include "host/Text.hpp"
#include "parser/QuillConverterBlockVariants.hpp"
#include "tests/support/TreeText.hpp"

#include <gtest/gtest.h>

#include <optional>
#include <string>
#include <type_traits>
#include <utility>
#include <vector>

namespace VT::Testing {

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

template <class Text>
QuillAnswer readDimension(const Text& text, SymbolValidator* validator = nullptr) {
    return readQuill<SymbolicExprFromQParseTree>(text, validator);
}

template <class Text>
QuillAnswer readCondition(const Text& text, SymbolValidator* validator = nullptr) {
    return readQuill<SymbolicExprFromQParseTreeBlockVariants>(text, validator);
}

/// Converters of one table.
class QuillTest : public testing::Test {
protected:
    SymbolicExprTable table;
    VTSymbolicExprErrorChecker checker; // collects
    SymbolicExprFromQParseTree dimensions{table, checker};
    SymbolicExprFromQParseTreeBlockVariants conditions{table, checker};
};

/// A diagnostic in one line: the key, the arguments, the offset.  Its sentence must have room for the arguments and
/// quote the text.
inline std::string reportText(const HostDiagnostic& report) {
    const MessageInfo* const row = findMessage(report.messageId());
    EXPECT_TRUE(row != nullptr && fits(*row, report.arguments())) << report.messageId();
    const std::size_t textAt = row != nullptr && row->arguments.size() > 2 ? 1 : 0;
    const std::string quoted = shownText(std::get<std::string>(report.arguments().at(textAt)), 10);
    EXPECT_NE(std::string(report.what()).find(quoted.substr(0, quoted.find("..."))), std::string::npos)
        << report.what();
    std::string text = report.messageId().substr(report.messageId().rfind(':') + 1) + "(";
    const char* separator = "";
    for (const DiagnosticArgument& argument : report.arguments()) {
        text += std::exchange(separator, ", ");
        std::visit(
            [&text](const auto& value) {
                if constexpr (std::is_same_v<std::decay_t<decltype(value)>, std::string>)
                    text += value;
                else
                    text += std::to_string(value);
            },
            argument);
    }
    return text + ")@" + (report.offset() ? std::to_string(*report.offset()) : "none");
}

/// The reports of an answer, one after another.
inline std::string reportsText(const QuillAnswer& answer) {
    std::string text;
    for (const HostDiagnostic& report : answer.reports)
        text += (text.empty() ? "" : " ") + reportText(report);
    return text;
}

} // namespace VT::Testing
