// Long chains, deep and shared graphs, and the operand limit.
#include "tests/simplify/SimplifierFixture.hpp"

#include "base/core/Limits.hpp"
#include "tests/support/Cases.hpp"
#include "tests/support/Times.hpp"
#include "tests/support/generators/AnyNode.hpp"

#include <random>

namespace VT::Testing {
namespace {

constexpr std::size_t limit = limits::chainOperands;

/// `count` different operands joined by an operator.
SymbolicExprId chain(SymbolicExprTable& table, SymbolicOp op, std::size_t count, bool leftDeep) {
    const Trees tree{table};
    SymbolicExprId sum = tree.name("S" + std::to_string(count));
    for (std::size_t i = 1; i < count; ++i) {
        const SymbolicExprId symbol = tree.name("S" + std::to_string(count - i));
        sum = leftDeep ? tree(op, sum, symbol) : tree(op, symbol, sum);
    }
    return sum;
}

/// So many copies of two texts in turn, with the number of the copy for every # and a literal of so many symbols, drawn
/// at random, for every @.
std::string joined(std::size_t n, const std::string& between, const std::string& even, const std::string& odd = "",
                   std::uint64_t symbols = 0) {
    std::mt19937_64 random(n);
    std::string text;
    for (std::size_t i = 0; i < n; ++i) {
        text += i == 0 ? "" : between;
        for (const char c : i % 2 == 0 || odd.empty() ? even : odd)
            text += c == '#'   ? std::to_string(i)
                    : c == '@' ? std::string(random() % 2, '!') + "V" + std::to_string(random() % symbols)
                               : std::string(1, c);
    }
    return text;
}

TEST(OperandLimit, HoldsAtTheBoundAndGivesUpOneBeyond) {
    using Operands = boost::container::flat_set<SymbolicExprId>;
    for (const SymbolicOp op : {SymbolicOp::And, SymbolicOp::Or}) {
        for (const bool leftDeep : {true, false}) {
            SimplifierFixture bench;
            const SymbolicExprId within = chain(bench.table, op, limit, leftDeep);
            const SymbolicExprId beyond = chain(bench.table, op, limit + 1, leftDeep);
            const SymbolicExprId sorted = bench.simplify(within);
            EXPECT_NE(sorted, within);
            EXPECT_EQ(bench.simplify(sorted), sorted);
            EXPECT_EQ(bench.simplify(beyond), beyond);
            const auto operandsOf = [&](SymbolicExprId id, bool ofAnd) {
                Operands operands;
                const SymbolicExpr& node = *bench.table.get(id);
                ofAnd ? bench.simplifier.computeUniqueAndOperandsId(node, operands)
                      : bench.simplifier.computeUniqueOrOperandsId(node, operands);
                return operands;
            };
            const bool isAnd = op == SymbolicOp::And;
            EXPECT_EQ(operandsOf(within, isAnd).size(), limit);
            EXPECT_EQ(operandsOf(beyond, isAnd), Operands{beyond});
            EXPECT_EQ(operandsOf(within, !isAnd), Operands{within});
        }
    }
}

TEST(OperandLimit, BoundsDistribution) {
    SimplifierFixture bench;
    const std::string within = "(" + joined(25, "||", "A#") + ")&&(" + joined(40, "||", "B#") + ")";
    const std::string beyond = "(" + joined(25, "||", "A#") + ")&&(" + joined(41, "||", "B#") + ")";
    EXPECT_EQ(countComparisons(bench.table, bench.simplify(bench.parse(within))), 2000U);
    EXPECT_EQ(bench.simplified(beyond), beyond);
}

TEST(LongChains, AreReducedWhateverTheirLength) {
    SimplifierFixture bench;
    std::string contradiction = "A==0";
    std::string range = "A>0";
    for (int i = 1; i < 20000; ++i) {
        contradiction += "&&A==" + std::to_string(i % limit);
        range += "&&A>" + std::to_string(i % limit);
    }
    EXPECT_EQ(bench.simplified(contradiction), "false");
    EXPECT_EQ(bench.simplified(range), "A>999");
    // One operand more is one too many, although the pairs would merge.
    EXPECT_TRUE(bench.simplified(range + "&&A>1000") == range + "&&A>1000");
}

/// The condition of a family with so many parts.
std::string grown(const CaseRow& family, std::size_t n) {
    const std::string& symbols = family[8];
    const std::size_t count = symbols.starts_with("n/") ? n / std::stoul(symbols.substr(2)) : std::stoul("0" + symbols);
    return family[5] + joined(n, family[2], family[3], family[4], count) + family[6] + times(n, family[7]);
}

// The nodes that a call makes are bounded by those that it is given and by what it may multiply out, and what it
// returns stays as it is, also where a bound was met.
TEST(GrowingFamilies, MakeNoMoreNodesThanTheirBoundAndStayAsTheyAre) {
    for (const CaseRow& family : casesOf("simplify.txt", "growing families", 9)) {
        const std::size_t size = std::stoul(family[1]);
        for (const std::size_t n : {size / 4, size / 2, size}) {
            SCOPED_TRACE(family[0] + std::to_string(n));
            SimplifierFixture bench;
            const SymbolicExprId condition = bench.parse(grown(family, n));
            const std::size_t given = bench.table.size();
            const SymbolicExprId result = bench.simplify(condition);
            EXPECT_LE(bench.table.size(), 4 * given + limits::multipliedLiterals);
            EXPECT_LT(bench.passes, limits::simplifyPasses);
            EXPECT_EQ(bench.simplify(result), result);
            if (n == size)
                continue;
            SimplifierFixture used; // in which names and parts have other identifiers
            used.simplify(used.parse(grown(family, n / 2 + 1)));
            EXPECT_TRUE(used.simplified(grown(family, n)) == SymbolicExprPrinter(bench.table, false)(result));
        }
    }
}

// Each graph has few nodes and more paths than could be walked.
TEST(SharedGraphs, CostTheirNodes) {
    SimplifierFixture bench;
    const Trees tree{bench.table};
    const SymbolicExprId condition = bench.parse("A == 1");
    for (const SymbolicOp op : {SymbolicOp::And, SymbolicOp::Or})
        EXPECT_EQ(bench.simplify(tree.doubled(op, condition)), condition);
    for (const SymbolicOp op : {SymbolicOp::Multiply, SymbolicOp::Plus})
        EXPECT_TRUE(bench.table.has(bench.simplify(tree.doubled(op, condition))));
    SymbolicExprId compared = condition;
    for (int level = 0; level < 64; ++level)
        compared = tree(SymbolicOp::LessThan, compared, tree(SymbolicOp::Power, compared, compared));
    EXPECT_TRUE(bench.table.has(bench.simplify(compared)));
}

TEST(DeepGraphs, NeedNoDeepStack) {
    using Op = SymbolicOp;
    SimplifierFixture bench;
    const Trees tree{bench.table};
    const SymbolicExprId a = bench.parse("A");
    const auto deep = [&](auto wrap) {
        SymbolicExprId id = a;
        for (int level = 0; level < 200000; ++level)
            id = wrap(id);
        return bench.simplify(id);
    };
    EXPECT_EQ(deep([&](SymbolicExprId x) { return tree(Op::And, a, x); }), a);
    EXPECT_EQ(deep([&](SymbolicExprId x) { return tree(Op::Minus, x, a); }), bench.parse("-199999*A"));
    EXPECT_EQ(deep([&](SymbolicExprId x) { return tree(Op::UnaryMinus, x); }), a);
    EXPECT_EQ(deep([&](SymbolicExprId x) { return tree(Op::Not, x); }), bench.parse("!!A"));
    EXPECT_TRUE(bench.table.has(deep([&](SymbolicExprId x) { return tree(Op::Modulo, a, x); })));
    EXPECT_TRUE(bench.table.has(deep([&](SymbolicExprId x) { return tree(Op::LessThan, x, a); })));
}

} // namespace
} // namespace VT::Testing
