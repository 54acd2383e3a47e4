// The quick reader of Quill conditions against the way through parse trees: the same nodes in the same order, and the
// same reports.
#include "base/VTSymbolicExpr.hpp"
#include "base/core/Limits.hpp"
#include "base/print/ExpressionPrinter.hpp"
#include "base/variants/Features.hpp"
#include "parser/QuillConverterBlockVariants.hpp"
#include "tests/support/FlagSetting.hpp"
#include "tests/support/Parsing.hpp"
#include "tests/support/generators/Corpus.hpp"
#include "tests/support/generators/RandomExpression.hpp"

#include <gtest/gtest.h>

#include <random>

namespace VT::Testing {
namespace {

/// With it, texts go through trees.
struct AnyName final : SymbolValidator {
    SymbolMeaning resolveSymbol(const std::string&, const char*, std::size_t) override { return SymbolName(); }
};

/// A text read in a table of its own.
struct Reading {
    Reading(const std::string& text, SymbolValidator* validator) {
        VTSymbolicExprErrorCheckerBlockVariants checker;
        try {
            id = SymbolicExprFromQParseTreeBlockVariants(table, checker, validator)(text);
        } catch (const HostDiagnostic& diagnostic) {
            refused = diagnostic.what();
        }
        reports = checker.diagnostics().size();
    }

    /// Operands are identifiers, so that nodes are equal one by one where tables are.
    [[nodiscard]] bool isSameAs(const Reading& other) const {
        bool same = id == other.id && refused == other.refused && reports == other.reports;
        same &= table.size() == other.table.size();
        for (SymbolicExprId each = 0; same && each < table.size(); ++each)
            same = table.get(each)->op() == other.table.get(each)->op() && *table.get(each) == *other.table.get(each);
        return same;
    }

    SymbolicExprTable table;
    SymbolicExprId id = invalidId;
    std::string refused;
    std::size_t reports = 0;
};

void expectAgreement(const std::string& text) {
    AnyName anyName;
    const Reading quick(text, nullptr);
    const Reading byTree(text, &anyName);
    ASSERT_TRUE(quick.isSameAs(byTree)) << text << "\n" << quick.refused << "\n" << byTree.refused;
}

class QuillAgreement : public testing::TestWithParam<bool> {
protected:
    FlagSetting keywords{*VTFEAT_VariantKeywordsSimCodegen, GetParam() ? 1 : 0};
    std::mt19937_64 random{12};

    std::size_t below(std::size_t bound) { return random() % bound; }

    /// Compares a text and then one that has lost, doubled or exchanged a few of its bytes.
    void expectAround(std::string text) {
        expectAgreement(text);
        for (std::size_t edits = 1 + below(3); edits > 0 && !text.empty(); --edits) {
            const std::size_t at = below(text.size());
            if (below(3) == 0)
                text.erase(at, 1 + below(3));
            else if (below(2) == 0)
                text.insert(at, text.substr(below(text.size()), 1 + below(4)));
            else
                text[at] = "()!-~&|=<.,1a+ '^%:e"[below(20)];
        }
        expectAgreement(text);
    }
};

TEST_P(QuillAgreement, OnTokens) {
    static const char* const all[] = {
        "a",         "b1",     "end",   "end1",    "f(",   "f (",  "f()",  "rem(",       "rem",        "(sim)",
        "(codegen)", "f(sim)", "g(a",   ".b",      ". c",  "1",    "23",   ".5",         "5.",         "1.5",
        "2.0",       "1e3",    "1.5e3", "1.5e400", "0x1F", "3i",   "1.5j", "2147483647", "2147483648", "-2147483648.0",
        "(",         "(",      ")",     ")",       "[",    "]",    "{",    ",",          ";",          ":",
        "||",        "&&",     "|",     "&",       "==",   "~=",   "!=",   "<",          "<=",         ">",
        ">=",        "+",      "-",     "*",       "/",    "\\",   "^",    ".*",         ".^",         "'",
        "~",         "!",      "=",     "...",     "%",    "@(x)", "\xc3", " ",          " ",          "\n",
        "\t"};
    for (int round = 0; round < 10000; ++round) {
        std::string text;
        for (std::size_t count = below(12); count > 0; --count)
            text += all[below(std::size(all))];
        expectAgreement(text);
    }
}

TEST_P(QuillAgreement, OnConditions) {
    std::vector<SymbolicOp> operators{SymbolicOp::FcnCall, SymbolicOp::MemberValue, SymbolicOp::And, SymbolicOp::Or};
    for (const OperatorInfo& row : operatorTable())
        if (row.form == OperatorForm::Prefix || row.form == OperatorForm::Infix)
            operators.push_back(row.op);
    for (int round = 0; round < 2000; ++round) {
        SymbolicExprTable table;
        const SymbolicExprId id = randomTree(table, random, operators, round % 7, [&] {
            const auto value = static_cast<int>(random());
            return value % 3 == 0   ? SymbolicIntValue(table, value).getId(table)
                   : value % 3 == 1 ? SymbolicDoubleValue(table, value * 0.25).getId(table)
                                    : SymbolicString(table, value % 2 == 0 ? "a" : "b1").getId(table);
        });
        expectAround(SymbolicExprPrinter(table, true, round % 2 == 0)(id));
    }
}

TEST_P(QuillAgreement, OnRealConditions) {
    for (const CorpusFile& file : corpusFiles)
        for (const std::string& line : corpusLines(file.name)) {
            expectAgreement(line);
            SymbolicExprTable table;
            if (const ParseAnswer read = parse(table, line); !read.error)
                expectAround(SymbolicExprPrinter(table, true)(read.id));
        }
}

TEST_P(QuillAgreement, AtTheBoundsOfNesting) {
    for (const std::size_t depth : {limits::nesting, limits::nesting + 1})
        for (const char* const prefix : {"(", "f(", "-", "~", "+", "a-("}) {
            std::string text;
            for (std::size_t i = 0; i < depth; ++i)
                text += prefix;
            text += "a";
            if (text.find('(') != std::string::npos)
                text.append(depth, ')');
            expectAgreement(text);
        }
}

INSTANTIATE_TEST_SUITE_P(Keywords, QuillAgreement, testing::Bool());

} // namespace
} // namespace VT::Testing
