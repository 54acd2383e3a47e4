// Reports of the parse-tree converter of dimensions, and what it supports.
//
// Each report notes its position and goes to the checker's operation of the same name.
#include "parser/QuillConverter.hpp"

namespace VT {

bool SymbolicExprFromQParseTree::supportIntegerOnly() const {
    return false;
}

bool SymbolicExprFromQParseTree::shouldCreateIntValueNodeForIntegerValue() const {
    return false;
}

bool SymbolicExprFromQParseTree::supportLogicalValues() const {
    return true;
}

bool SymbolicExprFromQParseTree::supportOperator(const ParseTree&, const char*) {
    return true;
}

void SymbolicExprFromQParseTree::enableDiagnostics() {
    checker_.enableDiagnostics();
}

void SymbolicExprFromQParseTree::reportInvalidLiteralValue(const std::string& literal, const char* text,
                                                           std::size_t position) {
    reportedPosition_ = position;
    checker_.reportInvalidLiteralValue(literal, text, position);
}

void SymbolicExprFromQParseTree::reportNonScalarValue(const std::string& name, const char* text, std::size_t position) {
    reportedPosition_ = position;
    checker_.reportNonScalarValue(name, text, position);
}

void SymbolicExprFromQParseTree::reportComplexValue(const std::string& name, const char* text, std::size_t position) {
    reportedPosition_ = position;
    checker_.reportComplexValue(name, text, position);
}

void SymbolicExprFromQParseTree::reportLogicalValue(const std::string& name, const char* text, std::size_t position) {
    reportedPosition_ = position;
    checker_.reportLogicalValue(name, text, position);
}

void SymbolicExprFromQParseTree::reportNonIntegerLiteralValue(const std::string& literal, const char* text,
                                                              std::size_t position) {
    reportedPosition_ = position;
    checker_.reportNonIntegerLiteralValue(literal, text, position);
}

void SymbolicExprFromQParseTree::reportNonIntegerValue(const std::string& name, const char* text,
                                                       std::size_t position) {
    reportedPosition_ = position;
    checker_.reportNonIntegerValue(name, text, position);
}

void SymbolicExprFromQParseTree::reportUnsupportedValue(const std::string& name, const char* text,
                                                        std::size_t position) {
    reportedPosition_ = position;
    checker_.reportUnsupportedValue(name, text, position);
}

void SymbolicExprFromQParseTree::reportDiagnostic(const HostDiagnostic& diagnostic) {
    reportedPosition_ = diagnostic.offset().value_or(0);
    checker_.reportDiagnostic(diagnostic);
}

void SymbolicExprFromQParseTree::reportUnhandledExpr(const ParseTree& node, const char* text) {
    reportedPosition_ = checker_.getNodeStartIdx(node);
    checker_.reportUnhandledExpr(node, text);
}

void SymbolicExprFromQParseTree::reportDivisionExpr(const ParseTree& node, const char* text) {
    reportedPosition_ = checker_.getNodeStartIdx(node);
    checker_.reportDivisionExpr(node, text);
}

void SymbolicExprFromQParseTree::reportUnsupportedFcn(SymbolicExprId functionNameId, const ParseTree& node,
                                                      const char* text) {
    reportedPosition_ = checker_.getNodeStartIdx(node);
    checker_.reportUnsupportedFcn(functionNameId, node, text);
}

void SymbolicExprFromQParseTree::reportInvalidNumArgs(SymbolicExprId functionNameId, std::size_t expected,
                                                      std::size_t actual, const ParseTree& node, const char* text) {
    reportedPosition_ = checker_.getNodeStartIdx(node);
    checker_.reportInvalidNumArgs(functionNameId, expected, actual, node, text);
}

void SymbolicExprFromQParseTree::reportInvalidExpr(const char* text) {
    reportedPosition_ = failure_.position;
    checker_.reportInvalidExpr(text, failure_);
}

} // namespace VT
