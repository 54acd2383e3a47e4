// Printed texts are read back as what was printed; the readers are tested against readings of their own.
#include "base/print/ExpressionPrinter.hpp"
#include "base/transform/QuillConversion.hpp"
#include "parser/QuillConverterBlockVariants.hpp"
#include "tests/support/AnyNode.hpp"
#include "tests/support/Corpus.hpp"
#include "tests/support/Parsing.hpp"
#include "tests/support/RandomExpression.hpp"
#include "tests/support/TreeText.hpp"

#include <gtest/gtest.h>

namespace VT::Testing {
namespace {

using Op = SymbolicOp;

/// The operators of which texts of a language stand for trees, whatever their operands; ranges are never wrapped.
std::vector<Op> written(bool quill) {
    std::vector<Op> operators{Op::FcnCall0U, Op::FcnCall1U, Op::FcnCall2U, Op::FcnCall};
    operators.push_back(quill ? Op::MemberValue : Op::DimsND);
    for (const OperatorInfo& row : operatorTable())
        if (row.form == OperatorForm::Prefix || (row.form == OperatorForm::Infix && (quill || row.op < Op::Power)) ||
            (row.form == OperatorForm::Postfix && quill))
            operators.push_back(row.op);
    return operators;
}

/// As treeText, but minus signs before a literal belong to it, two of them are none, no zero has a sign, and integers
/// and reals are but numbers.
std::string normal(const SymbolicExprTable& table, SymbolicExprId id) { // NOLINT(misc-no-recursion): small trees only
    const SymbolicExpr& node = *table.get(id);
    if (node.isNumValue())
        return node.getNumValue() == 0 ? "0" : realText(node.getNumValue());
    if (node.isTermExpr())
        return treeText(table, id);
    std::string text;
    for (std::size_t i = 0; i < node.getNumInputs(); ++i)
        text += (i > 0 ? "," : "") + normal(table, node.getInput(i));
    if (node.op() == Op::UnaryMinus && text == "0")
        return text;
    if (node.op() == Op::UnaryMinus && text.ends_with('r') &&
        std::string_view("-0123456789").find(text[0]) != std::string_view::npos)
        return text[0] == '-' ? text.substr(1) : "-" + text;
    return std::string(callOps.contains(node.op()) ? "call" : operatorInfo(node.op()).name) + "(" + text + ")";
}

/// The printers of a language, spaced and not, and its reader, over one table.
struct Press {
    explicit Press(bool inQuill) : quill(inQuill) {}

    std::string normalOf(SymbolicExprId id) {
        return normal(table, quill && table.has(id) ? SymbolicExprC2Q(table)(id) : id);
    }

    void expectReadsBack(SymbolicExprId id) {
        for (const bool spaced : {false, true}) {
            const std::string text = SymbolicExprPrinter(table, quill, spaced)(id);
            SymbolicExprId read = invalidId;
            ASSERT_NO_THROW(read = quill ? fromQuill(text) : parse(table, text).id) << text;
            ASSERT_TRUE(table.has(read)) << text;
            ASSERT_EQ(normalOf(read), normalOf(id)) << text;
        }
    }

    bool quill;
    SymbolicExprTable table{};
    VTSymbolicExprErrorCheckerBlockVariants checker{};
    SymbolicExprFromQParseTreeBlockVariants fromQuill{table, checker};
};

TEST(ReadBack, EveryOperatorUnderEveryOther) {
    for (const bool quill : {false, true}) {
        Press press(quill);
        const Trees tree{press.table};
        const SymbolicExprId name = tree.name("n");
        /// An operator with an operand at one place and names at the others.
        const auto around = [&](Op op, SymbolicExprId operand, std::size_t place) {
            std::vector<SymbolicExprId> inputs(operandCount(op).value_or(3), name);
            inputs.at(std::min(place, inputs.size() - 1)) = operand;
            const bool number = press.normalOf(operand).find_first_not_of("-0123456789.er+") == std::string::npos;
            if (callOps.contains(op) || (op == Op::MemberValue && number))
                inputs[0] = name; // numbers are not called and have no members
            return tree(op, inputs);
        };
        const std::vector<SymbolicExprId> leaves{tree.name("a"),  tree.integer(0), tree.integer(5), tree.integer(-5),
                                                 tree.real(-0.0), tree.real(-2.5), tree.real(1e22)};
        for (const Op outer : written(quill))
            for (const std::size_t place : {0U, 1U})
                for (const SymbolicExprId leaf : leaves) {
                    press.expectReadsBack(around(outer, leaf, place));
                    for (const Op inner : written(quill))
                        press.expectReadsBack(around(outer, around(inner, leaf, 0), place));
                }
    }
}

TEST(ReadBack, RandomTrees) {
    std::mt19937_64 random(1);
    for (const bool quill : {false, true}) {
        Press press(quill);
        for (int i = 0; i < 2500; ++i)
            press.expectReadsBack(randomTree(press.table, random, written(quill), 1 + i % 7));
    }
}

TEST(ReadBack, RealConditions) {
    Press press(false);
    std::size_t conditions = 0;
    for (const CorpusFile& file : corpusFiles)
        for (const std::string& line : corpusLines(file.name))
            if (const ParseAnswer read = parse(press.table, line); !read.error) {
                ++conditions;
                press.expectReadsBack(read.id);
            }
    EXPECT_GT(conditions, 10000U);
}

} // namespace
} // namespace VT::Testing
