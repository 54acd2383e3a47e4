// One conversion of Quill text with its answer as a value.
#pragma once

#include "base/VTSymbolicExpr.hpp"
#include "parser/QuillConverterBlockVariants.hpp"
#include "tests/support/TreeText.hpp"

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

/// A diagnostic in one line: the key, the arguments, the offset.
inline std::string reportText(const HostDiagnostic& report) {
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
