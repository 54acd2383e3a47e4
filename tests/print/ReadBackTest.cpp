// Printed texts are read back as what was printed; the readers are tested against readings of their own.
#include "base/print/ExpressionPrinter.hpp"
#include "base/transform/QuillConversion.hpp"
#include "parser/QuillConverterBlockVariants.hpp"
#include "tests/support/Cases.hpp"
#include "tests/support/Parsing.hpp"
#include "tests/support/TreeReader.hpp"
#include "tests/support/TreeText.hpp"
#include "tests/support/generators/AnyNode.hpp"
#include "tests/support/generators/RandomExpression.hpp"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <cstdlib>
#include <limits>

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

/// A number as treeText writes it, but a zero has neither sign nor kind.  With `asWritten` it has the kind that it has
/// in Quill text, where an integral number of 32 bits is an integer.
std::string numberText(double value, bool isReal, bool asWritten) {
    const bool fits = value == std::trunc(value) && value >= std::numeric_limits<int>::min() &&
                      value <= std::numeric_limits<int>::max();
    std::string text = value == 0 ? "0r" : realText(value);
    if (value == 0 || !isReal || (asWritten && fits))
        text.pop_back();
    return text;
}

/// As treeText, but minus signs before a literal belong to it, two of them are none, infinity is a name, and every list
/// has rows.
std::string normal(const SymbolicExprTable& table, SymbolicExprId id, // NOLINT(misc-no-recursion): small trees only
                   bool asWritten) {
    const SymbolicExpr& node = *table.get(id);
    if (node.isNumValue() && std::isinf(node.getNumValue()))
        return node.getNumValue() < 0 ? "UnaryMinus(Inf)" : "Inf";
    if (node.isNumValue())
        return numberText(node.getNumValue(), node.op() == Op::DoubleValue, asWritten);
    if (node.isTermExpr())
        return treeText(table, id);
    const bool isList = node.op() == Op::Matrix || node.op() == Op::CellArray;
    std::string text;
    for (std::size_t i = 0; i < node.getNumInputs(); ++i) {
        const std::string input = normal(table, node.getInput(i), asWritten);
        const bool isRow = !isList || table.get(node.getInput(i))->op() == Op::Row;
        text += (i > 0 ? "," : "") + (isRow ? input : "Row(" + input + ")");
    }
    if (node.op() == Op::MemberValue)
        text += "." + static_cast<const SymbolicMemberValue&>(node).getMemberName();
    if (text.starts_with("bitshift,") && text.ends_with("2147483648"))
        text.back() = '7'; // as far as any shift goes
    if (dimensionOps.contains(node.op()))
        return "Matrix(Row(" + text + "))";
    if (node.op() == Op::UnaryMinus && text == "UnaryMinus(Inf)")
        return "Inf";
    const bool isNumber = std::string_view("0123456789").find(text[text.starts_with('-') ? 1 : 0]) != std::string::npos;
    if (node.op() == Op::UnaryMinus && isNumber)
        return numberText(-std::strtod(text.c_str(), nullptr), text.ends_with('r'), asWritten);
    return std::string(callOps.contains(node.op()) ? "call" : operatorInfo(node.op()).name) + "(" + text + ")";
}

/// The printers of a language, spaced and not, and its reader, over one table.
struct Press {
    explicit Press(bool inQuill) : quill(inQuill) {}

    std::string normalOf(SymbolicExprId id, bool asWritten) {
        return normal(table, quill ? SymbolicExprC2Q(table)(id) : id, quill && asWritten);
    }

    SymbolicExprId read(const std::string& text) {
        SymbolicExprId id = invalidId;
        EXPECT_NO_THROW(id = quill ? fromQuill(text) : parse(table, text).id) << text;
        return id;
    }

    /// What is read from a text prints as a text that does not change any more.
    void expectSettles(const std::string& text, bool spaced) {
        const SymbolicExprPrinter print(table, quill, spaced);
        const std::string first = print(read(text));
        ASSERT_EQ(print(read(first)), first) << text;
    }

    void expectReadsBack(SymbolicExprId id) {
        for (const bool spaced : {false, true}) {
            const std::string text = SymbolicExprPrinter(table, quill, spaced)(id);
            const SymbolicExprId again = read(text);
            ASSERT_TRUE(table.has(again)) << text;
            ASSERT_EQ(normalOf(again, false), normalOf(id, true)) << text;
            if (quill)
                expectSettles(text, spaced);
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
            if (!quill && callOps.contains(op))
                inputs[0] = name;
            return tree(op, inputs);
        };
        for (const Op outer : written(quill))
            for (const std::size_t place : {0U, 1U})
                for (const char* const text :
                     {"a", "0", "5", "-5", "-2147483648", "-0.0r", "-2.5r", "1e22r", "2147483648r"}) {
                    const SymbolicExprId leaf = readTree(press.table, text);
                    press.expectReadsBack(around(outer, leaf, place));
                    for (const Op inner : written(quill))
                        press.expectReadsBack(around(outer, around(inner, leaf, 0), place));
                }
    }
}

TEST(ReadBack, RandomTreesOfC) {
    std::mt19937_64 random(1);
    Press press(false);
    for (int i = 0; i < 2500; ++i)
        press.expectReadsBack(randomTree(press.table, random, written(false), 1 + i % 7));
}

/// Trees of everything that Quill has: besides operators, lists, callees and owners of every kind, ranges and anonymous
/// functions, and numbers at the bounds.
struct QuillTrees {
    SymbolicExprTable& table;
    std::mt19937_64& random;
    bool ranges; ///< of any bounds and inside operators too, though bounds are written without parentheses

    Trees make{table};

    std::size_t below(std::size_t bound) { return static_cast<std::size_t>(random() % bound); }

    SymbolicExprId leaf() {
        static const std::vector<CaseRow> leaves = casesOf("print.txt", "leaves of Quill", 1);
        return readTree(table, leaves[below(leaves.size())][0]);
    }

    // NOLINTBEGIN(misc-no-recursion): as deep as asked for

    std::vector<SymbolicExprId> several(int depth) {
        std::vector<SymbolicExprId> trees(below(4));
        std::ranges::generate(trees, [&] { return alone(depth); });
        return trees;
    }

    /// What has brackets or commas around it, or is the whole.
    SymbolicExprId alone(int depth) {
        const std::size_t kind = below(6);
        return kind == 0   ? make(Op::QColon, leaf(), leaf())
               : kind == 1 ? make(Op::QColon3, leaf(), leaf(), leaf())
               : kind == 2 ? make(Op::AnonymousFunc, make.name("@(p,q)"), tree(depth))
                           : tree(depth);
    }

    SymbolicExprId withParts(Op op, SymbolicExprId first, int depth) {
        std::vector<SymbolicExprId> inputs = several(depth - 1);
        inputs.resize(operandCount(op).value_or(inputs.size() + 1) - 1, first);
        inputs.insert(inputs.begin(), first);
        return make(op, inputs);
    }

    SymbolicExprId tree(int depth) {
        static const std::vector<Op> operators = written(true);
        return randomTree(table, random, operators, depth, [&] { return depth > 0 ? compound(depth) : leaf(); });
    }

    SymbolicExprId compound(int depth) {
        static const std::vector<Op> lists{Op::FcnCall0U, Op::FcnCall1U, Op::FcnCall2U, Op::FcnCall,
                                           Op::Dims2D,    Op::Dims3D,    Op::DimsND};
        const std::size_t kind = below(8);
        if (kind < 2)
            return withParts(lists[below(lists.size())], tree(depth - 1), depth);
        if (kind == 2)
            return make(Op::MemberValue, tree(depth - 1));
        if (kind < 5) {
            std::vector<SymbolicExprId> rows(1 + below(3));
            std::ranges::generate(rows, [&] { return make(Op::Row, several(depth - 1)); });
            return make(below(2) == 0 ? Op::Matrix : Op::CellArray, rows);
        }
        return kind == 5 && ranges ? make(Op::QColon, tree(depth - 1), tree(depth - 1)) : leaf();
    }

    // NOLINTEND(misc-no-recursion)
};

TEST(ReadBack, EveryShapeOfQuill) {
    std::mt19937_64 random(3);
    for (int i = 0; i < 2000; ++i) {
        Press press(true);
        const int depth = i % 4;
        press.expectReadsBack(QuillTrees{press.table, random, false}.alone(depth));
        QuillTrees anything{press.table, random, true};
        press.expectSettles(SymbolicExprPrinter(press.table, true)(anything.alone(depth)), false);
    }
}

} // namespace
} // namespace VT::Testing
