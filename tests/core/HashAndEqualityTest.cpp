// Hashes as fixed numbers, which nodes are one, and interning against a map of structures.
#include "base/core/Nodes.hpp"
#include "tests/support/StructureNumbers.hpp"
#include "tests/support/generators/AnyNode.hpp"
#include "tests/support/generators/RandomExpression.hpp"

#include <cmath>
#include <gtest/gtest.h>
#include <limits>
#include <map>
#include <rapidcheck/gtest.h>

namespace VT::Testing {
namespace {

constexpr double infinity = std::numeric_limits<double>::infinity();
constexpr double nan = std::numeric_limits<double>::quiet_NaN();

/// The mixing step, written once more.
std::uint64_t step(std::uint64_t hash, std::int64_t key) {
    const std::uint64_t m = 14313749767032793493U;
    auto k = static_cast<std::uint64_t>(key) * m;
    k = (k ^ (k >> 47)) * m;
    return (hash ^ k) * m + 3864292196U;
}

std::uint64_t steps(std::uint64_t hash, const std::vector<std::int64_t>& keys) {
    for (const std::int64_t key : keys)
        hash = step(hash, key);
    return hash;
}

TEST(Hash, Seeds) {
    int op = 24;
    for (const std::uint64_t seed :
         {0x0fdae6de77aaba93U, 0x787a4f407d7cdda1U, 0x88aa289d8bcc8534U, 0xe5c6bd2ac9565810U, 0x330d65c2aad4576cU,
          0x3c2c6926fc977bb0U, 0x016a16511cb5a6fdU, 0x7cb93a5f4dd58737U}) {
        EXPECT_EQ(step(0, op), seed);
        EXPECT_EQ(hashSeed(static_cast<SymbolicOp>(op++)), seed);
    }
}

TEST(Hash, Leaves) {
    SymbolicExprTable table;
    for (const auto& [text, hash] :
         std::map<std::string, std::uint64_t>{{"true", 0xfffffffffffffffe},
                                              {"false", 0xfffffffffffffffd},
                                              {"", 0},
                                              {"True", steps(0, {84, 114, 117, 101})},
                                              {"\xc3\xa4", steps(0, {-61, -92})}, // bytes are signed
                                              {std::string("a\0", 2), steps(0, {97, 0})}})
        EXPECT_EQ(SymbolicString(table, text).getHash(), hash) << text;

    EXPECT_EQ(SymbolicIntValue(table, 7).getHash(), 7U);
    EXPECT_EQ(SymbolicIntValue(table, -2).getHash(), 0xfffffffffffffffe);
    EXPECT_EQ(SymbolicIntValue(table, std::numeric_limits<int>::min()).getHash(), 0xffffffff80000000);
    for (const auto& [value, hash] : std::vector<std::pair<double, std::uint64_t>>{{0.0, 0},
                                                                                   {-0.0, 0},
                                                                                   {1.0, 0x3ff0000000000000},
                                                                                   {-2.5, 0xc004000000000000},
                                                                                   {nan, 0xfffffffffffffffd},
                                                                                   {-nan, 0xfffffffffffffffd},
                                                                                   {infinity, 0xffffffffffffffff},
                                                                                   {-infinity, 0xfffffffffffffffe}})
        EXPECT_EQ(SymbolicDoubleValue(table, value).getHash(), hash) << value;
}

TEST(Hash, OperatorsMixTheirCodeAndThenTheirOperands) {
    SymbolicExprTable table;
    const SymbolicString x(table, "x"), y(table, "y");
    for (int code = 3; code < operatorCount; ++code) {
        const auto op = static_cast<SymbolicOp>(code);
        const auto fixed = operandCount(op);
        for (std::size_t count = fixed.value_or(0); count <= fixed.value_or(5); ++count) {
            NodeParts parts{"s\xff", 0, 0, {}};
            std::vector<std::int64_t> keys{code};
            if (code == 26)
                keys[0] = count == 2 ? 24 : count == 3 ? 25 : 26;
            if (code == 30)
                keys[0] = count >= 1 && count <= 3 ? 26 + static_cast<int>(count) : 30;
            if (code == 31)
                keys = {'s', -1, code};
            for (std::size_t i = 0; i < count; ++i) {
                parts.inputs.push_back(1 - i % 2);
                keys.push_back(static_cast<std::int64_t>(parts.inputs.back()));
            }
            EXPECT_EQ(table.get(makeAny(table, op, parts))->getHash(), steps(0, keys)) << code << " of " << count;
        }
    }
    EXPECT_EQ(SymbolicMemberValue(table, y, "").getHash(), step(0x7cb93a5f4dd58737, 1));
}

TEST(Equality, GenericClassesAndTheirTwinsAreOne) {
    using Op = SymbolicOp;
    for (const auto& [fixed, generic] : std::vector<std::pair<Op, Op>>{{Op::Dims2D, Op::DimsND},
                                                                       {Op::Dims3D, Op::DimsND},
                                                                       {Op::FcnCall0U, Op::FcnCall},
                                                                       {Op::FcnCall1U, Op::FcnCall},
                                                                       {Op::FcnCall2U, Op::FcnCall}}) {
        const NodeParts parts{"", 0, 0, std::vector<SymbolicExprId>(*operandCount(fixed), 0)};
        for (const auto& [first, second] : {std::pair{fixed, generic}, std::pair{generic, fixed}}) {
            SymbolicExprTable table, other;
            ASSERT_EQ(SymbolicString(table, "f").getId(table), SymbolicString(other, "f").getId(other));
            const SymbolicExprId id = makeAny(table, first, parts);
            EXPECT_EQ(makeAny(table, second, parts), id);
            EXPECT_EQ(table.get(id)->op(), first) << "the first one stands for both";
            EXPECT_EQ(table.size(), 2U);
            EXPECT_TRUE(*other.get(makeAny(other, second, parts)) == *table.get(id));
        }
    }
}

TEST(Equality, RealsWithinTheTolerance) {
    const double epsilon = std::numeric_limits<double>::epsilon();
    const double largest = std::numeric_limits<double>::max();

    const struct {
        double a, b;
        bool equal;
        bool merged; // equal, and of one hash
    } cases[] = {
        {1.5, 1.5, true, true},
        {0.0, -0.0, true, true},
        {1.0, 1.0 + epsilon, true, false},
        {1.0, 1.0 + 2 * epsilon, false, false},
        {largest, -largest, false, false},
        {largest, infinity, false, false},
        {infinity, infinity, true, true},
        {infinity, -infinity, false, false},
        {nan, nan, false, false},
        {nan, 0.0, false, false},
    };

    for (const auto& [a, b, equal, merged] : cases) {
        SymbolicExprTable table;
        const SymbolicDoubleValue first(table, a), second(table, b);
        EXPECT_EQ(first == second, equal) << a << ' ' << b;
        EXPECT_EQ(second == first, equal) << a << ' ' << b;
        EXPECT_EQ(table.size(), merged ? 1U : 2U) << a << ' ' << b;
    }
}

TEST(Equality, ANaNThatIsInTheTableIsFoundAndOthersAreNot) {
    // As many as would take minutes if each had to be told from all others.
    constexpr SymbolicExprId count = 300'000;
    SymbolicExprTable table, other;
    SymbolicString(table, "false"); // has the hash of NaN
    for (SymbolicExprId i = 1; i < count; ++i) {
        if (i % 3 == 0)
            table.add(new SymbolicDoubleValue(other, -nan));
        else
            EXPECT_EQ(SymbolicDoubleValue(table, nan).getId(table), invalidId);
    }
    ASSERT_EQ(table.size(), count);
    for (SymbolicExprId i = 0; i < count; ++i) {
        ASSERT_EQ(table.get(i)->getId(table), i);
        ASSERT_TRUE(table.contains(table.get(i)));
    }
    EXPECT_EQ(SymbolicString(table, "false").getId(table), 0U);
    EXPECT_EQ(SymbolicIntValue(table, -3).getId(table), count) << "of the same hash too";
}

/// Every two classes, in both orders.
template <class Left>
std::size_t comparisonsThatHold(const SymbolicExprTable& table, const Left& left) {
    std::size_t held = 0;
#define VTSYM_OPERATOR(Code, Name, Class, ...)                                                                         \
    {                                                                                                                  \
        const auto& right = static_cast<const Class&>(*table.get(Code));                                               \
        held += left == right ? 1U : 0U;                                                                               \
        held += left != right ? 0U : 1U;                                                                               \
        held += static_cast<const SymbolicExpr&>(left) == right ? 1U : 0U;                                             \
        held += right == static_cast<const SymbolicExpr&>(left) ? 1U : 0U;                                             \
    }
#include "base/core/operators.def"
#undef VTSYM_OPERATOR
    return held;
}

TEST(Equality, NodesOfAnyTwoClassesCompare) {
    SymbolicExprTable table;
    for (int code = 0; code < operatorCount; ++code) {
        const auto op = static_cast<SymbolicOp>(code);
        const SymbolicExprId id =
            makeAny(table, op, {"x", 1, 2, std::vector<SymbolicExprId>(operandCount(op).value_or(5), 0)});
        ASSERT_EQ(id, static_cast<SymbolicExprId>(code));
    }
#define VTSYM_OPERATOR(Code, Name, Class, ...)                                                                         \
    EXPECT_EQ(comparisonsThatHold(table, static_cast<const Class&>(*table.get(Code))), 4U) << #Class;
#include "base/core/operators.def"
#undef VTSYM_OPERATOR
}

RC_GTEST_PROP(Interning, AgreesWithAMapOfStructures, (std::uint64_t seed)) {
    std::mt19937_64 random(seed);
    SymbolicExprTable table;
    StructureNumbers structures;
    std::vector<SymbolicExprId> model; // by structure
    const auto structureOf = [&](SymbolicExprId id) {
        std::vector<std::size_t> operands;
        for (std::size_t i = 0; i < table.get(id)->getNumInputs(); ++i)
            operands.push_back(table.get(id)->getInput(i));
        return structures.number(*table.get(id), operands);
    };
    const auto rounds = *rc::gen::inRange(0, 2000);
    for (int i = 0; i < rounds; ++i) {
        const std::size_t before = table.size();
        const SymbolicExprId id = makeRandom(table, random);
        RC_ASSERT(table.has(id));
        const bool isNew = structureOf(id) == model.size();
        if (isNew)
            model.push_back(id);
        RC_ASSERT(model[structureOf(id)] == id);
        RC_ASSERT(isNew == (id == before));
        RC_ASSERT(table.size() == before + (isNew ? 1 : 0));
    }
    RC_ASSERT(model.size() == table.size());
    for (SymbolicExprId id = 0; id < table.size(); ++id) {
        RC_ASSERT(table.lookup(table.get(id)) == id);
        RC_ASSERT(table.contains(table.get(id)));
        RC_ASSERT(model.at(structureOf(id)) == id);
    }
}

RC_GTEST_PROP(Interning, EqualityIsSymmetricAndAgreesWithHashes, (std::uint64_t seed)) {
    std::mt19937_64 random(seed);
    SymbolicExprTable table, other; // the same identifiers, nodes of their own
    std::mt19937_64 again = random;
    for (int i = 0; i < 60; ++i) {
        makeRandom(table, random);
        makeRandom(other, again);
    }
    RC_ASSERT(table.size() == other.size());
    for (SymbolicExprId a = 0; a < table.size(); ++a)
        for (SymbolicExprId b = 0; b < other.size(); ++b) {
            const SymbolicExpr& left = *table.get(a);
            const SymbolicExpr& right = *other.get(b);
            RC_ASSERT((left == right) == (right == left));
            RC_ASSERT((left == right && left.getHash() == right.getHash()) == (a == b));
            if (left == right && left.op() != SymbolicOp::DoubleValue)
                RC_ASSERT(left.getHash() == right.getHash());
        }
}

} // namespace
} // namespace VT::Testing
