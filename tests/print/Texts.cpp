// What expressions look like in both languages.
#include "base/print/Predicates.hpp"
#include "base/print/StringifySymbolicExpr.hpp"
#include "tests/support/AnyNode.hpp"
#include "tests/support/Locales.hpp"
#include "tests/support/Parsing.hpp"

#include <gtest/gtest.h>

#include <bit>
#include <cmath>
#include <limits>
#include <random>

namespace VT::Testing {
namespace {

using Op = SymbolicOp;

struct Writing {
    SymbolicExprId id;
    std::string quill;
    std::string c;
};

class Texts : public testing::Test {
protected:
    void expectWritten(const std::vector<Writing>& writings, bool spaced = false) const {
        const SymbolicExprPrinter inQuill(table, true, spaced);
        const SymbolicExprPrinter inC(table, false, spaced);
        for (const Writing& writing : writings) {
            EXPECT_EQ(inQuill(writing.id), writing.quill);
            EXPECT_EQ(inC(writing.id), writing.c);
            StringifySymbolicExpr visitor(table, true, spaced);
            table.get(writing.id)->accept(table, visitor);
            EXPECT_EQ(visitor.get(), writing.quill) << "by accept";
            StringifySymbolicExpr executed(table, false, spaced);
            executed.execute(table, writing.id);
            EXPECT_EQ(executed.get(), writing.c) << "by execute";
            EXPECT_EQ(inC(*table.get(writing.id)), writing.c) << "by node";
            EXPECT_EQ(inC.textLength(writing.id), writing.c.size());
        }
    }

    SymbolicExprTable table;
    Trees tree{table};
    SymbolicExprId a = tree.name("a"), b = tree.name("b"), c = tree.name("c"), x = tree.name("x");
};

TEST_F(Texts, OperatorsOfBothLanguages) {
    expectWritten({
        {tree(Op::NotEqual, a, tree(Op::Not, b)), "a~=~b", "a!=!b"},
        {tree(Op::Power, tree(Op::Power, a, b), c), "a^b^c", "a^b^c"},
        {tree(Op::Transpose, tree(Op::Transpose, x)), "(x')'", "(x')'"},
        {tree(Op::DotTranspose, tree(Op::LDiv, a, tree(Op::DotLDiv, b, c))), "(a\\(b.\\c)).'", "(a\\(b.\\c)).'"},
        {tree(Op::MemberValue, tree(Op::MemberValue, a)), "a.field.field", "a.field.field"},
        {tree(Op::FcnCall1U, tree(Op::MemberValue, a), x), "(a.field)(x)", "(a.field)(x)"},
        {tree(Op::FcnCall, a, x, tree(Op::Plus, b, c), x), "a(x,b+c,x)", "a(x,b+c,x)"},
        {tree(Op::QColon, tree(Op::Equal, a, b), c), "a==b:c", "a==b:c"},
        {tree(Op::QColon3, a, tree.integer(2), c), "a:2:c", "a:2:c"},
        {tree(Op::Matrix, tree(Op::Row, a, b), tree(Op::Row, c, x)), "[a,b;c,x]", "[a,b;c,x]"},
        {tree(Op::Dims3D, a, b, c), "[a,b,c]", "[a,b,c]"},
        {tree(Op::CellArray, a, b, tree(Op::Plus, c, x)), "{a;b;c+x}", "{a;b;c+x}"},
        {tree(Op::DimsND), "[]", "[]"},
        {tree(Op::AnonymousFunc, tree(Op::FcnCall1U, tree.name("@"), x), tree(Op::Plus, x, a)), "@(x) x+a", "@(x) x+a"},
    });
    const SymbolicExprId mixed = tree(Op::Or, tree(Op::And, tree(Op::Equal, a, b), tree(Op::BitAnd, a, b)),
                                      tree(Op::SingleAnd, a, tree(Op::SingleOr, b, c)));
    expectWritten({{mixed, "a==b&&bitand(a,b)||a&(b|c)", "a==b&&a&b||a&(b|c)"}});
    expectWritten({{mixed, "a==b && bitand(a,b) || a & (b | c)", "a==b && a&b || a & (b | c)"}}, true);
}

TEST_F(Texts, SignsThatWouldReadDifferently) {
    const SymbolicExprId zero = tree.integer(0);
    const SymbolicExprId minusX = tree(Op::UnaryMinus, x);
    expectWritten({
        {tree(Op::UnaryMinus, zero), "0", "0"},
        {tree(Op::UnaryMinus, tree.real(0.0)), "-0", "-0.0"},
        {tree(Op::UnaryMinus, tree.integer(-5)), "-(-5)", "-(-5)"},
        {tree(Op::Minus, a, tree.integer(-5)), "a-(-5)", "a-(-5)"},
        {tree(Op::Minus, a, tree(Op::Multiply, minusX, b)), "a-(-x*b)", "a-(-x*b)"},
        {tree(Op::Power, tree.integer(-5), b), "(-5)^b", "(-5)^b"},
        {tree(Op::Transpose, tree.real(-2.5)), "(-2.5)'", "(-2.5)'"},
    });
}

TEST_F(Texts, CallsForOperatorsThatQuillLacks) {
    const int smallest = std::numeric_limits<int>::min();
    const SymbolicExprId quotient = tree(Op::Divide, a, b);
    const auto minus = [&](SymbolicExprId id) { return tree(Op::UnaryMinus, id); };
    expectWritten({
        {tree(Op::Modulo, quotient, c), "rem(idivide(a,b),c)", "a/b%c"},
        {tree(Op::Plus, quotient,
              tree(Op::BitXOr, tree(Op::Plus, tree(Op::Divide, quotient, c), x), tree(Op::BitCompl, a))),
         "a/b+bitxor(idivide(idivide(a,b),c)+x,bitcmp(a))", "a/b+(a/b/c+x^~a)"},
        {tree(Op::BitOr, tree(Op::FcnCall, x, quotient, a, b), tree(Op::DimsND, quotient)),
         "bitor(x(idivide(a,b),a,b),[idivide(a,b)])", "x(a/b,a,b)|[a/b]"},
        {tree(Op::Multiply, a, tree(Op::BitCompl, tree(Op::UnaryMinus, quotient))), "a*bitcmp(-idivide(a,b))",
         "a*~(-(a/b))"},
        {tree(Op::ShiftLeft, a, minus(tree.integer(2))), "bitshift(a,-2)", "a<<-2"},
        {tree(Op::ShiftRight, a, tree.integer(-2)), "bitshift(a,2)", "a>>-2"},
        {tree(Op::ShiftRight, a, minus(x)), "bitshift(a,x)", "a>>-x"},
        {tree(Op::ShiftRight, a, minus(quotient)), "bitshift(a,idivide(a,b))", "a>>-(a/b)"},
        {tree(Op::ShiftRight, a, tree.integer(smallest)), "bitshift(a,-(-2147483648))", "a>>-2147483648"},
        {tree(Op::ShiftLeft, a, minus(tree.integer(smallest))), "bitshift(a,-(-2147483648))", "a<<-(-2147483648)"},
    });
}

TEST_F(Texts, RealLiterals) {
    const double infinity = std::numeric_limits<double>::infinity();
    expectWritten({
        {tree.real(2.0), "2", "2.0"},
        {tree.real(-0.0), "-0.0", "-0.0"},
        {tree.real(1e22), "1e+22", "1.0e+22"},
        {tree.real(-1.5e-7), "-1.5e-07", "-1.5e-07"},
        {tree.real(infinity), "Inf", "Inf"},
        {tree(Op::Minus, a, tree.real(-infinity)), "a-(-Inf)", "a-(-Inf)"},
    });
    EXPECT_EQ(SymbolicExprPrinter(table, true)(SymbolicDoubleValue(table, std::nan(""))), "NaN");
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
