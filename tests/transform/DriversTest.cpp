// Real literals made integers, divisions pulled outwards, C operators and calls of Quill functions, and every driver
// over shared and deep expressions.
#include "base/print/ExpressionPrinter.hpp"
#include "base/transform/Cast2Int.hpp"
#include "base/transform/Copy.hpp"
#include "base/transform/FactorDivision.hpp"
#include "base/transform/QuillConversion.hpp"
#include "base/transform/Replacement.hpp"
#include "base/transform/XForm.hpp"
#include "tests/support/Cases.hpp"
#include "tests/support/Parsing.hpp"
#include "tests/support/TreeReader.hpp"
#include "tests/support/TreeText.hpp"
#include "tests/support/generators/AnyNode.hpp"
#include "tests/support/generators/RandomExpression.hpp"

#include <cstdlib>
#include <gtest/gtest.h>
#include <map>
#include <random>

namespace VT::Testing {
namespace {

using Op = SymbolicOp;

TEST(Cast2Int, RoundsEveryRealLiteral) {
    for (const CaseRow& row : casesOf("transform.txt", "rounded", 2)) {
        SymbolicExprTable table;
        SymbolicDoubleValue(table, std::strtod(row[0].c_str(), nullptr));
        const SymbolicExprId cast = SymbolicExprCast2Int(table).cast2Int(0);
        EXPECT_EQ(treeText(table, cast), row[1]) << row[0];
    }
}

TEST(Cast2Int, LeavesEverythingElse) {
    SymbolicExprTable table;
    const SymbolicExprCast2Int cast(table);
    for (const CaseRow& row : casesOf("transform.txt", "integers", 2))
        EXPECT_EQ(cast.cast2Int(read(table, row[0])), read(table, row[1])) << row[0];
    EXPECT_EQ(cast.cast2Int(invalidId), invalidId);
    EXPECT_EQ(cast.cast2Int(table.size()), invalidId);
    std::mt19937_64 random(7);
    for (const SymbolicExprId id : randomGraph(random, table, 2000)) {
        const SymbolicExprId whole = cast.cast2Int(id);
        EXPECT_EQ(cast.cast2Int(whole), whole);
        EXPECT_NE(table.get(whole)->op(), Op::DoubleValue);
    }
}

constexpr std::int64_t prime = 2'147'483'647;

std::int64_t power(std::int64_t base, std::int64_t exponent) {
    std::int64_t result = 1;
    for (; exponent > 0; exponent /= 2, base = base * base % prime)
        if (exponent % 2 != 0)
            result = result * base % prime;
    return result;
}

/// The value modulo a prime, each name worth a number of its own.
std::int64_t valueOf(const SymbolicExprTable& table, SymbolicExprId id, std::map<SymbolicExprId, std::int64_t>& known) {
    if (const auto found = known.find(id); found != known.end())
        return found->second;
    const SymbolicExpr& node = *table.get(id);
    const Op op = node.op();
    const auto in = [&](std::size_t i) { return valueOf(table, node.getInput(i), known); };
    const std::int64_t value = op == Op::IntValue   ? static_cast<std::int64_t>(node.getNumValue())
                               : op == Op::Plus     ? in(0) + in(1)
                               : op == Op::Minus    ? in(0) - in(1)
                               : op == Op::Multiply ? in(0) * in(1)
                               : op == Op::Divide   ? in(0) * power(in(1), prime - 2)
                                                    : static_cast<std::int64_t>(node.getHash() % prime);
    return known[id] = (value % prime + prime) % prime;
}

class FactorDivision : public testing::Test {
protected:
    SymbolicExprId factored(SymbolicExprId id) { return SymbolicExprFactorDivision(table).factorDivision(id); }

    SymbolicExprTable table;
};

TEST_F(FactorDivision, EveryOperatorOfQuotients) {
    const SymbolicExprPrinter print(table, false);
    for (const CaseRow& row : casesOf("transform.txt", "factored", 2)) {
        const SymbolicExprId before = read(table, row[0]), after = factored(before);
        EXPECT_TRUE(row[1].empty() ? after == before : print(after) == row[1]) << row[0] << " becomes " << print(after);
    }
    for (const SymbolicExprId id : {invalidId, SymbolicExprId{table.size()}})
        EXPECT_EQ(factored(id), invalidId);
    const SymbolicExprId elementWise = readTree(table, "DotDiv(LDiv(x,x),x)");
    EXPECT_EQ(factored(elementWise), elementWise);
}

TEST_F(FactorDivision, KeepsTheValueAndLeavesOneQuotient) {
    static constexpr Op operators[] = {Op::Plus, Op::Minus, Op::Multiply, Op::Divide};
    const Trees tree{table};
    std::mt19937_64 random(6);
    for (int round = 0; round < 300; ++round) {
        std::vector<SymbolicExprId> nodes{tree.name("N"), tree.name("M"), tree.name("K"), tree.integer(3),
                                          tree.integer(7)};
        for (int i = 0; i < 12; ++i) {
            const SymbolicExprId a = nodes[random() % nodes.size()], b = nodes[random() % nodes.size()];
            std::map<SymbolicExprId, std::int64_t> values;
            const SymbolicExprId chosen = tree(operators[random() % 4], a, b);
            if (valueOf(table, chosen, values) != 0) // so that no divisor is zero
                nodes.push_back(chosen);
        }
        const SymbolicExprId after = factored(nodes.back());
        std::map<SymbolicExprId, std::int64_t> values;
        std::map<SymbolicExprId, std::int64_t> below; // the nodes of the result
        EXPECT_EQ(valueOf(table, nodes.back(), values), valueOf(table, after, below));
        below.erase(after);
        for (const auto& [id, value] : below)
            EXPECT_NE(table.get(id)->op(), SymbolicOp::Divide) << SymbolicExprPrinter(table, false)(after);
        EXPECT_EQ(factored(after), after);
    }

    const SymbolicExprId doubled = tree.doubled(Op::Plus, read(table, "N/2"));
    std::map<SymbolicExprId, std::int64_t> values;
    EXPECT_EQ(table.get(factored(doubled))->op(), SymbolicOp::Divide);
    EXPECT_EQ(valueOf(table, doubled, values), valueOf(table, factored(doubled), values));
}

class QuillConversion : public testing::Test {
protected:
    template <class Driver>
    void expectConverted(const std::string& section) {
        for (const CaseRow& row : casesOf("transform.txt", section, 2)) {
            const SymbolicExprId before = read(table, row[0]), after = Driver(table)(before);
            EXPECT_TRUE(row[1].empty() ? after == before : treeText(table, after) == row[1])
                << row[0] << " becomes " << treeText(table, after);
        }
    }

    SymbolicExprTable table;
};

TEST_F(QuillConversion, NamesAreInternedInOrder) {
    SymbolicExprQ2CVisitor visitor(table);
    std::string names;
    for (SymbolicExprId id = 0; id < table.size(); ++id)
        names += treeText(table, id) + " ";
    EXPECT_EQ(names, "idivide rem bitand bitor bitxor bitcmp bitshift ");
    EXPECT_EQ(visitor.get(), invalidId);
}

TEST_F(QuillConversion, CallsBecomeOperators) {
    expectConverted<SymbolicExprQ2C>("calls to operators");
}

TEST_F(QuillConversion, OperatorsBecomeCalls) {
    expectConverted<SymbolicExprC2Q>("operators to calls");
}

TEST_F(QuillConversion, TheCallClassDoesNotMatter) {
    for (const char* const call : {"FcnCall2U(rem,x,x)", "FcnCall(rem,x,x)"}) {
        SymbolicExprTable fresh;
        EXPECT_EQ(treeText(fresh, SymbolicExprQ2C(fresh)(readTree(fresh, call))), "Modulo(x,x)");
    }
    for (const char* const call : {"FcnCall()", "FcnCall2U(Plus(rem,1),a,b)"}) {
        const SymbolicExprId id = readTree(table, call);
        EXPECT_EQ(SymbolicExprQ2C(table)(id), id);
    }
}

TEST_F(QuillConversion, IdentifiersThatAreNotOfTheTable) {
    for (const SymbolicExprId id : {invalidId, SymbolicExprId{1}, SymbolicExprId{3}}) { // of names interned later
        SymbolicExprTable small, other;
        const SymbolicString a(small, "a"), alike(other, "a");
        EXPECT_EQ(SymbolicExprQ2C(small)(id), invalidId);
        EXPECT_EQ(SymbolicExprC2Q(other)(id), invalidId);
    }
}

TEST(Drivers, SharedAndDeepExpressions) {
    SymbolicExprTable table;
    const Trees tree{table};
    const auto grown = [&](const char* text) {
        return tree.zigzag(Op::Plus, Op::Minus, tree.doubled(Op::Plus, read(table, text)), tree.name("z"), 300'000);
    };
    const SymbolicExprReplacements replacements{{tree.name("x"), tree.name("y")}};

    const struct {
        const char* name;
        std::function<SymbolicExprId(SymbolicExprId)> run;
        const char* from;
        const char* to;
    } cases[] = {
        {"cast", [&](SymbolicExprId id) { return SymbolicExprCast2Int(table).cast2Int(id); }, "x+1.5", "x+2"},
        {"to C", [&](SymbolicExprId id) { return SymbolicExprQ2C(table)(id); }, "rem(bitshift(x,-2),3)", "(x>>2)%3"},
        {"to Quill", [&](SymbolicExprId id) { return SymbolicExprC2Q(table)(id); }, "x/2", "idivide(x,2)"},
        {"replace", [&](SymbolicExprId id) { return SymbolicExprReplacement(table, replacements)(id); }, "x", "y"},
        {"rebuild", [&](SymbolicExprId id) { return SymbolicExprXFormVisitor(table).rebuild(table, id); }, "x", "x"},
        {"factor", [&](SymbolicExprId id) { return SymbolicExprFactorDivision(table).factorDivision(id); }, "x", "x"},
    };

    for (const auto& [name, run, from, to] : cases)
        EXPECT_EQ(run(grown(from)), grown(to)) << name;

    SymbolicExprTable source, target;
    const Trees original{source};
    const SymbolicExprId x = original.name("x");
    const SymbolicExprId id = original.zigzag(Op::Plus, Op::Minus, original.doubled(Op::Plus, x), x, 300'000);
    EXPECT_NE(SymbolicExprCopy(source, target)(id), invalidId);
    EXPECT_EQ(target.size(), source.size());

    // A visitor of a host meets every occurrence.
    const SymbolicExprId deep = tree.zigzag(Op::Plus, Op::Plus, tree.name("x"), tree.name("x"), 1'000'000);
    for (const bool accept : {false, true}) {
        SymbolicExprXFormVisitor visitor(table);
        accept ? table.get(deep)->accept(table, visitor) : visitor.execute(table, deep);
        EXPECT_EQ(visitor.get(), deep);
    }
}

} // namespace
} // namespace VT::Testing
