// Properties over random and over real conditions.
#include "tests/simplify/SimplifierFixture.hpp"
#include "tests/support/Parsing.hpp"
#include "tests/support/generators/AnyCondition.hpp"
#include "tests/support/generators/AnyNode.hpp"
#include "tests/support/generators/Corpus.hpp"
#include "tests/support/generators/RandomCondition.hpp"
#include "tests/support/generators/RandomExpression.hpp"
#include "tests/support/oracles/ExactValue.hpp"

#include <array>

namespace VT::Testing {
namespace {

const std::vector<std::string> symbols{"A", "B", "C"};

/// Shapes of conditions, with what their simplification has to decide.
const std::vector<ConditionShape> shapes{
    {},
    {.symbols = symbols, .lowest = -1, .highest = 2, .symbolPairs = true, .truthValues = true},
    {.symbols = {"A"}, .lowest = -3, .highest = 4, .symbolPairs = false, .truthValues = true},
};

std::string condition(std::uint64_t seed, const ConditionShape& shape) {
    std::mt19937_64 random(seed);
    const std::size_t comparisons = 3 + seed % 10;
    return randomCondition(random, comparisons, shape);
}

// Over single symbols every condition that is worth a constant becomes it, and how long results are stays as good as it
// is.
TEST(Simplify, KeepsTheTruthFindsConstantsAndIsAFixedPoint) {
    std::size_t constant = 0, before = 0, after = 0;
    for (std::uint64_t seed = 0; seed < 2500; ++seed) {
        const ConditionShape& shape = shapes[seed % shapes.size()];
        const std::string text = condition(seed, shape);
        SimplifierFixture bench;
        const SymbolicExprId id = bench.parse(text);
        const SymbolicExprId result = bench.simplify(id);
        ASSERT_EQ(bench.simplify(result), result) << text;
        const Truth given(bench.table, id), simplified(bench.table, result);
        bool sometimes = false, always = true;
        forEachAssignment(shape.symbols, -4, 5, [&](const Assignment& assignment) {
            const bool now = *given.under(assignment) != 0;
            ASSERT_EQ(now, *simplified.under(assignment) != 0) << text;
            sometimes = sometimes || now;
            always = always && now;
        });
        if (seed % shapes.size() != 0)
            continue;
        before += countComparisons(bench.table, id);
        after += countComparisons(bench.table, result);
        if (sometimes && !always)
            continue;
        ++constant;
        ASSERT_EQ(result, always ? bench.table.getIdTRUE() : bench.table.getIdFALSE()) << text;
    }
    EXPECT_GT(constant, 60U);
    EXPECT_LT(static_cast<double>(after), 0.42 * static_cast<double>(before));
}

TEST(Simplify, ProvesThatSumsAreSmallest) {
    std::size_t proven = 0;
    for (std::uint64_t seed = 0; seed < 1000; ++seed) {
        SimplifierFixture bench;
        SymbolicExprSimplifyVisitor visitor(bench.table, true, bench.simplifier.printer());
        const SymbolicExprId given = bench.parse(condition(seed, shapes[0]));
        const SymbolicExprId result = bench.simplifier.simplify(given, bench.passes, visitor);
        proven += visitor.isSmallest(result) ? 1U : 0U;
        EXPECT_EQ(bench.simplify(result), result);
    }
    EXPECT_GT(proven, 990U);
    SimplifierFixture bench; // more symbols than a grid has axes, and each implies the next one
    std::string cycle = "!V0 && V19";
    for (int i = 1; i < 20; ++i)
        cycle += " || !V" + std::to_string(i) + " && V" + std::to_string(i - 1);
    SymbolicExprSimplifyVisitor visitor(bench.table, true, bench.simplifier.printer());
    EXPECT_FALSE(visitor.isSmallest(bench.simplifier.simplify(bench.parse(cycle), bench.passes, visitor)));
    EXPECT_FALSE(visitor.isSmallest(invalidId));
}

RC_GTEST_PROP(Simplify, DoesNotDependOnWhatWasInternedBefore, ()) {
    const auto seed = *rc::gen::arbitrary<std::uint64_t>();
    const std::string text = condition(seed, shapes[1]);
    SimplifierFixture fresh;
    SimplifierFixture used;
    for (const char* name : {"C", "B>=2", "B", "A>1&&C<2", "A", "3", "1"})
        used.parse(name);
    for (std::uint64_t other = 0; other < 3; ++other)
        used.simplify(used.parse(condition(seed + other, shapes[0])));
    RC_ASSERT(fresh.simplified(text) == used.simplified(text));
}

// Every operator below every other, most of all And and Or where their value counts, and quotients in both contexts.
TEST(Simplify, KeepsTheValueOfMixedExpressions) {
    using Op = SymbolicOp;
    std::vector<Op> operators{Op::Plus, Op::Multiply, Op::Divide, Op::Divide, Op::And, Op::Or, Op::FcnCall1U};
    operators.insert(operators.end(), valueOperators().begin(), valueOperators().end());
    const std::vector<std::string> names{"A", "B", "C", "A", "B", "C", "true", "false"};
    std::mt19937_64 random(29);
    std::size_t judged = 0;
    for (int round = 0; round < 20000; ++round) {
        SimplifierFixture bench;
        const Trees tree{bench.table};
        const SymbolicExprId before = randomTree(bench.table, random, operators, 2 + round % 4, [&] {
            const std::uint64_t kind = random() % 12;
            return kind < 7    ? tree.name(names[random() % names.size()])
                   : kind < 11 ? tree.integer(static_cast<int>(random() % 7) - 3)
                               : tree.real((static_cast<double>(random() % 9) - 4) * 0.5);
        });
        const SymbolicExprId after = bench.simplify(before);
        const auto text = [&](SymbolicExprId id) { return SymbolicExprPrinter(bench.table, true)(id); };
        ASSERT_EQ(bench.simplify(after), after) << text(before) << " became " << text(after);
        const bool asTruth = booleanOps.contains(bench.table.get(before)->op());
        const ExactValue given(bench.table, before, Quotients::ByContext);
        const ExactValue simplified(bench.table, after, Quotients::ByContext);
        for (int trial = 0; trial < 20; ++trial) {
            Assignment assignment;
            for (const std::string& symbol : symbols)
                assignment[symbol] = static_cast<std::int64_t>(random() % 11) - 4;
            const std::optional<ExactNumber> expected = given.under(assignment);
            if (!expected)
                continue;
            ++judged;
            const std::optional<ExactNumber> value = simplified.under(assignment);
            ASSERT_TRUE(value) << text(before) << " became " << text(after);
            ASSERT_EQ(asTruth ? value->holds() : value->real, asTruth ? expected->holds() : expected->real)
                << text(before) << " became " << text(after) << " with A=" << assignment["A"]
                << " B=" << assignment["B"] << " C=" << assignment["C"];
        }
    }
    EXPECT_GT(judged, 150000U);
}

/// A sum or product as text.
std::string arithmetic(std::mt19937_64& random, int depth) {
    static const std::vector<std::string> leaves{"A", "B", "C",  "A",          "B",           "C",          "0",
                                                 "1", "2", "-3", "2147483647", "-2147483648", "1073741824", "65536"};
    if (depth == 0 || random() % 5 == 0)
        return leaves[random() % leaves.size()];
    if (random() % 6 == 0)
        return "-(" + arithmetic(random, depth - 1) + ")";
    const char* const op = std::array{"*", "-", "+", "+"}[random() % 4];
    return "(" + arithmetic(random, depth - 1) + ")" + op + "(" + arithmetic(random, depth - 1) + ")";
}

TEST(Simplify, SumsAndProductsKeepTheirWrappedValue) {
    std::mt19937_64 random(17);
    for (int i = 0; i < 4000; ++i) {
        const Assignment letters{{"A", static_cast<std::int32_t>(random())}, {"B", i}, {"C", 3}};
        const std::string text = arithmetic(random, 1 + i % 5);
        SimplifierFixture bench;
        const SymbolicExprId before = bench.parse(text);
        const SymbolicExprId after = bench.simplify(before);
        ASSERT_EQ(static_cast<std::uint32_t>(valueOf(bench.table, after, letters)),
                  static_cast<std::uint32_t>(valueOf(bench.table, before, letters)))
            << text;
        ASSERT_EQ(bench.simplify(after), after) << text;
    }
}

/// The value of calls, members and bit operations in real conditions is not known here, so real conditions are judged
/// by what their simplification must not do: fail, change again, or come out longer where it gave up.
TEST(Simplify, RealConditionsReachAFixedPoint) {
    std::size_t read = 0;
    for (const CorpusFile& file : corpusFiles) {
        SimplifierFixture bench;
        for (const std::string& line : corpusLines(file.name)) {
            const SymbolicExprId id = VT::Testing::parse(bench.table, line).id;
            if (id == invalidId)
                continue;
            ++read;
            const SymbolicExprId result = bench.simplify(id);
            ASSERT_TRUE(bench.table.has(result)) << line;
            ASSERT_EQ(bench.simplify(result), result) << line;
        }
    }
    EXPECT_GT(read, 16000U);
}

} // namespace
} // namespace VT::Testing
