// Hashes as fixed numbers, which nodes are one, and interning against a map of structures.
#include "base/core/Nodes.hpp"
#include "tests/support/Cases.hpp"
#include "tests/support/StructureNumbers.hpp"
#include "tests/support/TreeReader.hpp"
#include "tests/support/TreeText.hpp"
#include "tests/support/generators/AnyNode.hpp"
#include "tests/support/generators/RandomExpression.hpp"

#include <cmath>
#include <gtest/gtest.h>
#include <limits>
#include <rapidcheck/gtest.h>

namespace VT::Testing {
namespace {

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
    for (const CaseRow& row : casesOf("hashes.txt", "seeds", 2)) {
        const int op = std::stoi(row[0]);
        const std::uint64_t seed = std::stoull(row[1], nullptr, 16);
        EXPECT_EQ(step(0, op), seed) << op;
        EXPECT_EQ(hashSeed(static_cast<SymbolicOp>(op)), seed) << op;
    }
}

TEST(Hash, Leaves) {
    SymbolicExprTable table;
    const auto wanted = [](const CaseRow& row) { return std::stoull(row[1], nullptr, 16); };
    for (const CaseRow& row : casesOf("hashes.txt", "names", 2))
        EXPECT_EQ(SymbolicString(table, row[0]).getHash(), wanted(row)) << row[0];
    for (const std::string& text : {std::string("True"), std::string("\xc3\xa4"), std::string("a\0", 2)})
        EXPECT_EQ(SymbolicString(table, text).getHash(), steps(0, {text.begin(), text.end()})) << "bytes are signed";
    for (const CaseRow& row : casesOf("hashes.txt", "integers", 2))
        EXPECT_EQ(SymbolicIntValue(table, std::stoi(row[0])).getHash(), wanted(row)) << row[0];
    for (const CaseRow& row : casesOf("hashes.txt", "reals", 2))
        EXPECT_EQ(SymbolicDoubleValue(table, std::stod(row[0])).getHash(), wanted(row)) << row[0];
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
    for (const CaseRow& row : casesOf("hashes.txt", "twins", 2))
        for (const std::size_t first : {0U, 1U}) {
            SCOPED_TRACE(row[first]);
            SymbolicExprTable table, other;
            const SymbolicExprId id = readTree(table, row[first]);
            EXPECT_EQ(readTree(table, row[1 - first]), id);
            EXPECT_EQ(treeText(table, id), row[first]) << "the first one stands for both";
            EXPECT_EQ(table.size(), 2U);
            EXPECT_TRUE(*other.get(readTree(other, row[1 - first])) == *table.get(id));
        }
}

TEST(Equality, RealsWithinTheTolerance) {
    for (const CaseRow& row : casesOf("hashes.txt", "pairs of reals", 4)) {
        SCOPED_TRACE(row[0] + " " + row[1]);
        SymbolicExprTable table;
        const SymbolicDoubleValue first(table, std::stod(row[0])), second(table, std::stod(row[1]));
        EXPECT_EQ(first == second, row[2] == "equal");
        EXPECT_EQ(second == first, row[2] == "equal");
        EXPECT_EQ(table.size(), row[3] == "one" ? 1U : 2U);
    }
}

TEST(Equality, ANaNThatIsInTheTableIsFoundAndOthersAreNot) {
    // As many as would take minutes if each had to be compared with all others.
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
