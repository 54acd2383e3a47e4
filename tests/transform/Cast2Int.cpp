#include "base/transform/Cast2Int.hpp"
#include "parser/SymbolicExprParser.hpp"
#include "tests/support/RandomExpression.hpp"
#include "tests/support/TreeText.hpp"

#include <gtest/gtest.h>

#include <cmath>
#include <limits>

namespace VT::Testing {
namespace {

TEST(Cast2Int, RoundsEveryRealLiteral) {
    constexpr int out = std::numeric_limits<int>::min();
    const double infinity = std::numeric_limits<double>::infinity();
    const std::vector<std::pair<double, int>> rows{
        {2.5, 3},
        {-2.5, -3},
        {0.49999999999999994, 0},
        {-0.49999999999999994, 0},
        {-0.0, 0},
        {2147483647.4999995, 2147483647},
        {2147483647.5, out},
        {-2147483648.4, out},
        {-2147483648.5, out},
        {infinity, out},
        {-infinity, out},
        {std::nan(""), out},
    };
    for (const auto& [real, wanted] : rows) {
        SymbolicExprTable table;
        SymbolicDoubleValue(table, real);
        const SymbolicExprId cast = SymbolicExprCast2Int(table).cast2Int(0);
        EXPECT_EQ(treeText(table, cast), std::to_string(wanted)) << real;
    }
}

TEST(Cast2Int, LeavesEverythingElse) {
    SymbolicExprTable table;
    const SymbolicExprCast2Int cast(table);
    SymbolicExprParser parser(table, true, true);
    EXPECT_EQ(cast.cast2Int(parser("N*2.0+0.5")), parser("N*2+1"));
    EXPECT_EQ(cast.cast2Int(parser("[f(0.4,a.b),1.6] == 2")), parser("[f(0,a.b),2] == 2"));
    EXPECT_EQ(cast.cast2Int(invalidId), invalidId);
    EXPECT_EQ(cast.cast2Int(table.size()), invalidId);
    std::mt19937_64 random(7);
    for (const SymbolicExprId id : randomGraph(random, table, 2000)) {
        const SymbolicExprId whole = cast.cast2Int(id);
        EXPECT_EQ(cast.cast2Int(whole), whole);
        EXPECT_EQ(table.get(whole)->op() == SymbolicOp::DoubleValue, false);
    }
}

} // namespace
} // namespace VT::Testing
