// What the printer writes in Quill is read back as the same nodes.
#include "base/print/ExpressionPrinter.hpp"
#include "parser/QuillConverterBlockVariants.hpp"
#include "tests/support/AnyNode.hpp"
#include "tests/support/TreeText.hpp"

#include <gtest/gtest.h>
#include <random>
#include <rapidcheck/gtest.h>

namespace VT::Testing {
namespace {

/// Kinds of expressions that Quill text stands for, whatever is an operand of what; ranges and anonymous functions are
/// never wrapped.
std::vector<SymbolicOp> writtenOperators() {
    std::vector<SymbolicOp> operators{SymbolicOp::MemberValue, SymbolicOp::FcnCall};
    for (const OperatorInfo& row : operatorTable())
        if ((row.form == OperatorForm::Infix || row.form == OperatorForm::Prefix ||
             row.form == OperatorForm::Postfix) &&
            !row.quill.empty())
            operators.push_back(row.op);
    return operators;
}

SymbolicExprId leaf(SymbolicExprTable& table, std::mt19937_64& random) {
    NodeParts parts;
    parts.text = std::string(1, "abxyN"[random() % 5]);
    parts.integer = random() % 4 == 0 ? 2147483647 : 1 + static_cast<int>(random() % 9); // -0 is written 0
    parts.real = static_cast<double>(random() % 1000) / 8 + 0.0625; // an integral literal is an integer in conditions
    return makeAny(table, static_cast<SymbolicOp>(random() % 3), parts);
}

SymbolicExprId expression(SymbolicExprTable& table, std::mt19937_64& random, int depth) {
    static const std::vector<SymbolicOp> operators = writtenOperators();
    if (depth == 0 || random() % 5 == 0)
        return leaf(table, random);
    const SymbolicOp op = operators[random() % operators.size()];
    NodeParts parts;
    parts.text = "m";
    if (op == SymbolicOp::MemberValue || op == SymbolicOp::FcnCall)
        parts.inputs.push_back(SymbolicString(table, "f").getId(table));
    const std::size_t operands = op == SymbolicOp::MemberValue ? 0 : operandCount(op).value_or(random() % 4);
    for (std::size_t i = 0; i < operands; ++i)
        parts.inputs.push_back(expression(table, random, depth - 1));
    return makeAny(table, op, parts);
}

RC_GTEST_PROP(QuillPrinted, IsReadBack, ()) {
    std::mt19937_64 random(*rc::gen::arbitrary<std::uint64_t>());
    SymbolicExprTable table;
    table.addBoolSymbols();
    VTSymbolicExprErrorCheckerBlockVariants checker;
    SymbolicExprFromQParseTreeBlockVariants read(table, checker);
    for (int i = 0; i < 20; ++i) {
        const SymbolicExprId id = expression(table, random, 1 + i % 5);
        for (const bool spaced : {false, true}) {
            const std::string text = SymbolicExprPrinter(table, true, spaced)(id);
            RC_LOG(text + "  read as  " + treeText(table, read(text)) + "  for  " + treeText(table, id) + "\n");
            RC_ASSERT(read(text) == id);
        }
    }
}

} // namespace
} // namespace VT::Testing
