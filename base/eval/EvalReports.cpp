// The errors of evaluation, thrown as host diagnostics.
//
// An expression is named by its C text; one whose text is longer than limits::namedBytes by the name of its operator.
#include "base/eval/EvalReports.hpp"

#include "base/core/Limits.hpp"
#include "base/print/ExpressionPrinter.hpp"
#include "host/Diagnostics.hpp"

#include <cstdint>
#include <stdexcept>
#include <string>
#include <utility>
#include <vector>

namespace VT::detail {

namespace {

/// The text of an expression; what kind of expression it is, where the text would be long.
std::string nameOf(const SymbolicExprTable& table, const SymbolicExpr& node) {
    try {
        SymbolicExprPrinter printer(table, false);
        printer.setTextBound(limits::namedBytes);
        return printer(node);
    } catch (const std::logic_error&) { // too long, or an operand is missing
        return std::string(operatorInfo(node.op()).meaning);
    }
}

[[noreturn]] void report(const char* messageId, std::vector<DiagnosticArgument> arguments) {
    vtsvThrowIExceptionFromDiagnostic(vtsvCreateDiagnostic(messageId, std::move(arguments), ""));
}

} // namespace

void throwUnboundSymbol(const SymbolicExprTable& table, const SymbolicExpr& symbol) {
    report("Vantor:SymbolicDims:UnboundSymbol", {nameOf(table, symbol)});
}

void throwCyclicValue(const SymbolicExprTable& table, const SymbolicExpr& symbol) {
    report("Vantor:SymbolicDims:CyclicValue", {nameOf(table, symbol)});
}

void throwNotEvaluable(const SymbolicExprTable& table, const SymbolicExpr& node) {
    report("Vantor:SymbolicDims:NotEvaluable", {nameOf(table, node)});
}

void throwMissingNode(const SymbolicExprTable& table, SymbolicExprId id, const SymbolicExpr* parent) {
    if (parent != nullptr)
        throwNotEvaluable(table, *parent);
    report("Vantor:SymbolicDims:NotEvaluable", {std::to_string(id).insert(0, 1, '#')});
}

void throwSizeMismatch(const SymbolicExprTable& table, const SymbolicExpr& node, std::size_t left, std::size_t right) {
    report("Vantor:SymbolicDims:SizeMismatch",
           {nameOf(table, node), static_cast<std::int64_t>(left), static_cast<std::int64_t>(right)});
}

} // namespace VT::detail
