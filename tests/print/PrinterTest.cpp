// What expressions look like in both languages.
#include "base/print/Predicates.hpp"
#include "base/print/StringifySymbolicExpr.hpp"
#include "tests/support/Cases.hpp"
#include "tests/support/Locales.hpp"
#include "tests/support/Parsing.hpp"
#include "tests/support/TreeReader.hpp"

#include <gtest/gtest.h>

#include <bit>
#include <cmath>
#include <limits>
#include <random>

namespace VT::Testing {
namespace {

using Op = SymbolicOp;

class Texts : public testing::Test {
protected:
    SymbolicExprTable table;
    Trees tree{table};
    SymbolicExprId a = tree.name("a"), b = tree.name("b"), c = tree.name("c"), x = tree.name("x");
};

TEST_F(Texts, OfBothLanguages) {
    for (const bool spaced : {false, true})
        for (const CaseRow& row : casesOf("print.txt", spaced ? "spaced texts" : "texts", 3)) {
            SCOPED_TRACE(row[0]);
            SymbolicExprTable fresh; // 0.0 and -0.0 are one node, which keeps the first sign
            const SymbolicExprPrinter inQuill(fresh, true, spaced);
            const SymbolicExprPrinter inC(fresh, false, spaced);
            const SymbolicExprId id = readTree(fresh, row[0]);
            EXPECT_EQ(inQuill(id), row[1]);
            EXPECT_EQ(inC(id), row[2]);
            StringifySymbolicExpr visitor(fresh, true, spaced);
            fresh.get(id)->accept(fresh, visitor);
            EXPECT_EQ(visitor.get(), row[1]) << "by accept";
            StringifySymbolicExpr executed(fresh, false, spaced);
            executed.execute(fresh, id);
            EXPECT_EQ(executed.get(), row[2]) << "by execute";
            EXPECT_EQ(inC(*fresh.get(id)), row[2]) << "by node";
            EXPECT_EQ(inC.textLength(id), row[2].size());
        }
    EXPECT_EQ(SymbolicExprPrinter(table, true)(SymbolicDoubleValue(table, std::nan(""))), "NaN");
}

TEST_F(Texts, OperatorsOfBoth) {
    for (const OperatorInfo& row : operatorTable())
        for (const bool quill : {false, true}) {
            const bool isInfix = row.form == OperatorForm::Infix, isPrefix = row.form == OperatorForm::Prefix;
            if (!isInfix && !isPrefix && row.form != OperatorForm::Postfix)
                continue;
            const std::string spelling(quill ? row.quill : row.c);
            const std::string other = quill && row.op == Op::ShiftRight ? "-b" : "b"; // Quill shifts to the left
            std::string wanted = isPrefix ? spelling + "a" : "a" + spelling + (isInfix ? other : "");
            if (spelling.empty())
                wanted = std::string(row.quillCall) + "(a" + (isInfix ? "," + other : "") + ")";
            const SymbolicExprId id = isInfix ? tree(row.op, a, b) : tree(row.op, a);
            EXPECT_EQ(SymbolicExprPrinter(table, quill)(id), wanted) << row.name;
        }
}

TEST_F(Texts, NumbersReadBackInEveryLocale) {
    std::mt19937_64 random(7);
    inEveryLocale([&] {
        const SymbolicExprPrinter printer(table, false);
        for (int i = 0; i < 500; ++i) {
            const auto value = std::bit_cast<double>(random());
            const auto integer = static_cast<int>(random());
            if (!std::isfinite(value) || integer == std::numeric_limits<int>::min())
                continue;
            const SymbolicExprId real = parse(table, printer(tree.real(value))).id;
            EXPECT_EQ(std::bit_cast<std::uint64_t>(table.get(real)->getNumValue()),
                      std::bit_cast<std::uint64_t>(value));
            EXPECT_EQ(parse(table, printer(tree.integer(integer))).id, tree.integer(integer));
        }
    });
}

TEST_F(Texts, PredicatesNameIdentifiers) {
    table.insertAliasInfo("a", "(p+q)");
    table.insertAliasInfo("b", "");
    table.insertAliasInfo("rem", "mod");
    const SymbolicExprId id = tree(Op::Modulo, tree(Op::MemberValue, a), tree(Op::Multiply, b, c));
    const SymbolicExprAliasPrinterPredicate aliases(table);
    EXPECT_EQ(SymbolicExprPrinter(table, false, false, aliases)(id), "(p+q).field%(b*c)");
    EXPECT_EQ(SymbolicExprPrinter(table, true, false, InlineVariantParameterAliasPrinterPredicate(table))(id),
              "mod((p+q).field,b*c)");
    EXPECT_EQ(SymbolicExprPrinter(table, false, false, SymbolicExprPrinter::Predicate())(id), "a.field%(b*c)");
}

TEST_F(Texts, EveryAnswerFollowsNewAliases) {
    const std::vector<SymbolicExprId> ids{a, x, tree(Op::Plus, a, b), tree(Op::Modulo, x, tree(Op::Plus, b, c)),
                                          tree(Op::ShiftRight, x, tree(Op::UnaryMinus, c))};
    const std::vector<std::string> names{"a", "b", "c", "x", "rem", "bitshift"};
    std::mt19937_64 random(5);
    for (const bool quill : {false, true}) {
        SymbolicExprTable other; // the aliases are another table's
        const SymbolicExprAliasPrinterPredicate aliases(other);
        const SymbolicExprPrinter printer(table, quill, false, aliases);
        const SymbolicExprPrinter plain(table, quill);
        StringifySymbolicExpr visitor(table, quill, false, aliases);
        for (int round = 0; round < 200; ++round) {
            if (random() % 20 == 0)
                other.insertAliasInfo(names[random() % names.size()],
                                      std::string(1 + random() % 3, "mnyz"[random() % 4]));
            const SymbolicExprId one = ids[random() % ids.size()], two = ids[random() % ids.size()];
            const SymbolicExprPrinter fresh(table, quill, false, InlineVariantParameterAliasPrinterPredicate(other));
            const std::uint64_t way = random() % 5;
            ASSERT_TRUE(way == 0   ? printer.printIdUsingCache(one) == fresh(one)
                        : way == 1 ? printer.textLength(one) == fresh(one).size()
                        : way == 2 ? printer.compareUsingCache(one, two) == fresh.compareUsingCache(one, two)
                        : way == 3 ? printer(one) == fresh(one)
                                   : visitor.print(one) == fresh(one))
                << way << " " << fresh(one);
            ASSERT_EQ(plain.printIdUsingCache(a), "a");
        }
    }
}

TEST_F(Texts, OtherNamesAreKept) {
    struct Moody : SymbolicExprPrinter::Predicate {
        mutable int asked = 0;

        std::string printIdentifier(const SymbolicString& node) const override {
            return node.getName() + std::to_string(++asked);
        }
    };

    const Moody moody;
    const SymbolicExprPrinter printer(table, false, false, moody);
    EXPECT_EQ(printer.printIdUsingCache(x), "x1");
    EXPECT_EQ(printer(x), "x2");
    EXPECT_EQ(printer.printIdUsingCache(x), "x1");
}

/// A printer for people who want to see every blank and another spelling of access.
class Airy : public StringifySymbolicExpr {
public:
    using StringifySymbolicExpr::StringifySymbolicExpr;
    using StringifySymbolicExpr::visit;

    void visit(const SymbolicString& node) override { push(Op::String, "<" + identifier(node) + ">", 0); }

    void visit(const SymbolicMemberValue& node) override {
        push(Op::String, node.getMemberName(), 0);
        appendBinary(Op::MemberValue, " of kind ", 1, OpAssociativity::Left);
    }

    std::string get() const override { return "[" + StringifySymbolicExpr::get() + "]"; }

    std::string print(SymbolicExprId id) override { return "[" + StringifySymbolicExpr::print(id) + "]"; }

protected:
    void appendBinary(const Op& op, const char* spelling, unsigned char precedence, OpAssociativity assoc) override {
        StringifySymbolicExpr::appendBinary(op, op == Op::LessThan ? "less than" : spelling, precedence, assoc);
    }

    Delimiters isDelimitWithSpacesAndWrapParenthesis(const Op& op, unsigned char, OpAssociativity, const Printed& lhs,
                                                     const Printed&) const override {
        return {.wrapRight = false, .wrapLeft = lhs.op == Op::Plus, .spaced = op != Op::MemberValue};
    }
};

TEST_F(Texts, DerivedPrintersDecideForThemselves) {
    const SymbolicExprId id = tree(Op::Minus, tree(Op::Plus, a, tree(Op::MemberValue, b)), tree.integer(-1));
    Airy airy(table, true);
    StringifySymbolicExpr& base = airy;
    base.execute(table, tree(Op::BitAnd, id, c));
    EXPECT_EQ(base.get(), "[<bitand>((<a> + <b> of kind field) - -1,<c>)]");
    EXPECT_EQ(base.print(tree(Op::LessThan, id, c)), "[(<a> + <b> of kind field) - -1 less than <c>]");
}

} // namespace
} // namespace VT::Testing
