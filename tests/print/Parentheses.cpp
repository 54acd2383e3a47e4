// Texts read back as the trees that were printed, by a reader that knows nothing of the printer.
#include "base/print/ExpressionPrinter.hpp"
#include "tests/print/Reading.hpp"
#include "tests/support/Corpus.hpp"
#include "tests/support/Parsing.hpp"

#include <gtest/gtest.h>

namespace VT::Testing {
namespace {

constexpr Language languages[] = {Language::C, Language::Quill};

/// A language's printers over a table of their own.
struct Workbench {
    Language language;
    SymbolicExprTable table{};
    SymbolicExprPrinter printer{table, language == Language::Quill};
    SymbolicExprPrinter spacedPrinter{table, language == Language::Quill, true};

    void expectReadsBack(SymbolicExprId id) {
        const std::string meaning = meaningOf(table, id, language);
        for (const std::string& text : {printer(id), spacedPrinter(id)}) {
            std::string reading;
            ASSERT_NO_THROW(reading = readingOf(text, language)) << text;
            EXPECT_EQ(reading, meaning) << text;
        }
    }
};

/// A node of an operator with `operand` at one place and names at the others.
SymbolicExprId around(const Trees& tree, SymbolicOp op, SymbolicExprId operand, bool right) {
    const OperatorForm form = operatorInfo(op).form;
    const SymbolicExprId name = tree.name("n");
    if (form == OperatorForm::Infix || form == OperatorForm::Range)
        return right ? tree(op, name, operand) : tree(op, operand, name);
    switch (op) {
    case SymbolicOp::Dims2D:
        return tree(op, operand, name);
    case SymbolicOp::Dims3D:
        return tree(op, name, operand, name);
    case SymbolicOp::FcnCall0U:
        return tree(op, operand);
    case SymbolicOp::FcnCall1U:
        return right ? tree(op, name, operand) : tree(op, operand, name);
    case SymbolicOp::FcnCall2U:
        return right ? tree(op, name, name, operand) : tree(op, name, operand, name);
    default:
        return tree(op, std::vector{operand});
    }
}

TEST(Parentheses, EveryOperatorUnderEveryOther) {
    for (const Language language : languages) {
        Workbench bench{language};
        const Trees tree{bench.table};
        for (const OperatorInfo& inner : operatorTable()) {
            std::vector<SymbolicExprId> operands;
            if (inner.form == OperatorForm::Leaf) {
                operands = {tree.name("a"),   tree.integer(0), tree.integer(5),
                            tree.integer(-5), tree.real(-0.0), tree.real(-2.5)};
            } else if (isWritten(inner.op, language)) {
                for (const SymbolicExprId operand : {tree.name("b"), tree.integer(-7), tree.real(1e22)})
                    operands.push_back(around(tree, inner.op, operand, false));
            }
            for (const OperatorInfo& outer : operatorTable()) {
                if (outer.form == OperatorForm::Leaf || !isWritten(outer.op, language) ||
                    (outer.form == OperatorForm::Range && inner.precedence >= outer.precedence)) // never wrapped
                    continue;
                for (const SymbolicExprId operand : operands) {
                    bench.expectReadsBack(around(tree, outer.op, operand, false));
                    bench.expectReadsBack(around(tree, outer.op, operand, true));
                }
            }
        }
    }
}

TEST(Parentheses, RandomTrees) {
    std::mt19937 random(1);
    for (const Language language : languages) {
        Workbench bench{language};
        for (int i = 0; i < 1500; ++i)
            bench.expectReadsBack(randomTree(bench.table, language, random, 1 + i % 7));
    }
}

TEST(Parentheses, RealConditionsParseBackToTheSameTree) {
    SymbolicExprTable table;
    const SymbolicExprPrinter printer(table, false, true);
    std::size_t conditions = 0;
    for (const CorpusFile& file : corpusFiles) {
        for (const std::string& line : corpusLines(file.name)) {
            const ParseAnswer read = parse(table, line);
            if (read.error)
                continue;
            ++conditions;
            EXPECT_EQ(parse(table, printer(read.id)).id, read.id) << line;
        }
    }
    EXPECT_GT(conditions, 10000U);
}

} // namespace
} // namespace VT::Testing
