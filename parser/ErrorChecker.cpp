// Collects the reports of converters of Quill text as host diagnostics.
//
// Each report costs a copy of the text; a converter makes one for each text that it refuses.
#include "parser/ErrorChecker.hpp"

#include <utility>

namespace VT {

namespace {

/// The name of a node in a report.
std::string nameOf(const _Q_parse_tree_T<char>& node) {
    if (node.kind == _Q_parse_tree_T<char>::terminal)
        return {node.text, node.length};
    return vtuQParserNonTerminalName(node.code);
}

/// The callee of a call; the node itself where it has no children.
const _Q_parse_tree_T<char>& calleeOf(const _Q_parse_tree_T<char>& node) {
    const bool hasChildren = node.kind == _Q_parse_tree_T<char>::nonTerminal && node.childCount > 0;
    return hasChildren ? node.children[0] : node;
}

} // namespace

HostDiagnostic symbolicDimsDiagnostic(std::string_view key, std::vector<DiagnosticArgument> arguments,
                                      std::size_t position, std::string additionalText) {
    arguments.emplace_back(static_cast<std::int64_t>(position));
    return vtsvCreateDiagnostic(std::string("Vantor:SymbolicDims:").append(key), std::move(arguments),
                                std::move(additionalText), position);
}

std::string sentenceOf(const QuillFailure& failure) {
    std::string sentence(failure.reason);
    if (sentence.empty())
        return sentence;
    if (sentence.front() >= 'a' && sentence.front() <= 'z')
        sentence.front() = static_cast<char>(sentence.front() - 'a' + 'A');
    return sentence.back() == '.' ? sentence : sentence + '.';
}

VTSymbolicExprErrorChecker::~VTSymbolicExprErrorChecker() = default;

std::size_t VTSymbolicExprErrorChecker::getNodeStartIdx(const ParseTree& node) const {
    return node.start;
}

void VTSymbolicExprErrorChecker::startText() {}

std::string VTSymbolicExprErrorChecker::wholeText(const char* text) const {
    return text == text_.data() ? std::string(text_) : std::string(text);
}

void VTSymbolicExprErrorChecker::collect(std::string_view key, std::vector<DiagnosticArgument> arguments,
                                         std::size_t position, std::string additionalText) {
    if (!skip_)
        diagnostics_.push_back(symbolicDimsDiagnostic(key, std::move(arguments), position, std::move(additionalText)));
}

void VTSymbolicExprErrorChecker::collectNamed(std::string_view key, std::string name, const char* text,
                                              std::size_t position) {
    collect(key, {std::move(name), wholeText(text)}, position);
}

void VTSymbolicExprErrorChecker::reportInvalidLiteralValue(const std::string& literal, const char* text,
                                                           std::size_t position) {
    collectNamed("InvalidLiteralValue", literal, text, position);
}

void VTSymbolicExprErrorChecker::reportNonScalarValue(const std::string& name, const char* text, std::size_t position) {
    collectNamed("NonScalarValue", name, text, position);
}

void VTSymbolicExprErrorChecker::reportComplexValue(const std::string& name, const char* text, std::size_t position) {
    collectNamed("ComplexValue", name, text, position);
}

void VTSymbolicExprErrorChecker::reportLogicalValue(const std::string& name, const char* text, std::size_t position) {
    collectNamed("LogicalValue", name, text, position);
}

void VTSymbolicExprErrorChecker::reportNonIntegerLiteralValue(const std::string& literal, const char* text,
                                                              std::size_t position) {
    collectNamed("NonIntegerLiteralValue", literal, text, position);
}

void VTSymbolicExprErrorChecker::reportNonIntegerValue(const std::string& name, const char* text,
                                                       std::size_t position) {
    collectNamed("NonIntegerValue", name, text, position);
}

void VTSymbolicExprErrorChecker::reportUnsupportedValue(const std::string& name, const char* text,
                                                        std::size_t position) {
    collectNamed("NonNumericValue", name, text, position);
}

void VTSymbolicExprErrorChecker::reportDiagnostic(const HostDiagnostic& diagnostic) {
    if (!skip_)
        diagnostics_.push_back(diagnostic);
}

void VTSymbolicExprErrorChecker::reportUnhandledExpr(const ParseTree& node, const char* text) {
    collectNamed("UnhandledExpression", nameOf(node), text, getNodeStartIdx(node));
}

void VTSymbolicExprErrorChecker::reportDivisionExpr(const ParseTree& node, const char* text) {
    collect("UnsupportedDivision", {wholeText(text)}, getNodeStartIdx(node));
}

void VTSymbolicExprErrorChecker::reportUnsupportedFcn(SymbolicExprId, const ParseTree& node, const char* text) {
    collectNamed("UnsupportedFunction", nameOf(calleeOf(node)), text, getNodeStartIdx(node));
}

void VTSymbolicExprErrorChecker::reportInvalidNumArgs(SymbolicExprId, std::size_t expected, std::size_t actual,
                                                      const ParseTree& node, const char* text) {
    if (skipDiagnostics())
        return;
    const std::size_t position = getNodeStartIdx(node);
    diagnostics_.push_back(
        vtsvCreateDiagnostic("Vantor:SymbolicDims:InvalidNumFcnArgs",
                             {nameOf(calleeOf(node)), wholeText(text), static_cast<std::int64_t>(position),
                              static_cast<std::int64_t>(expected), static_cast<std::int64_t>(actual)},
                             {}, position));
}

void VTSymbolicExprErrorChecker::reportInvalidExpr(const char* text, const QuillFailure& failure) {
    collect("InvalidExpression", {wholeText(text)}, failure.position, sentenceOf(failure));
}

void VTSymbolicExprErrorCheckerBlockVariants::startText() {
    clear();
}

} // namespace VT
