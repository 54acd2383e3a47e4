// Interning against an independent model: a map keyed by text.
#include "base/core/Nodes.hpp"
#include "tests/support/RandomExpression.hpp"

#include <rapidcheck/gtest.h>

#include <bit>
#include <map>

namespace VT::Testing {
namespace {

/// What makes a node what it is, as text: equal for exactly those nodes that are to be one.
std::string keyOf(const SymbolicExpr& node) {
    int code = static_cast<int>(node.op());
    const std::size_t count = node.getNumInputs();
    if (code >= 24 && code <= 26)
        code = 26;
    if (code >= 27 && code <= 30)
        code = 30;
    std::string key = std::to_string(code);
    for (std::size_t i = 0; i < count; ++i)
        key += ' ' + std::to_string(node.getInput(i));
    if (code == 0)
        key += '"' + static_cast<const SymbolicString&>(node).getName();
    if (code == 1)
        key += ' ' + std::to_string(static_cast<const SymbolicIntValue&>(node).getValue());
    if (code == 2) // to the bit, but for the sign of zero
        key += ' ' + std::to_string(std::bit_cast<std::uint64_t>(node.getNumValue() + 0.0));
    if (code == 31)
        key += '"' + static_cast<const SymbolicMemberValue&>(node).getMemberName();
    return key;
}

RC_GTEST_PROP(Interning, AgreesWithAMapOfTexts, (std::uint64_t seed)) {
    std::mt19937_64 random(seed);
    SymbolicExprTable table;
    std::map<std::string, SymbolicExprId> model;
    const auto rounds = *rc::gen::inRange(0, 2000);
    for (int i = 0; i < rounds; ++i) {
        const std::size_t before = table.size();
        const SymbolicExprId id = makeRandom(table, random);
        RC_ASSERT(table.has(id));
        const auto [known, isNew] = model.emplace(keyOf(*table.get(id)), id);
        RC_ASSERT(known->second == id);
        RC_ASSERT(isNew == (id == before));
        RC_ASSERT(table.size() == before + (isNew ? 1 : 0));
    }
    RC_ASSERT(model.size() == table.size());
    for (SymbolicExprId id = 0; id < table.size(); ++id) {
        RC_ASSERT(table.lookup(table.get(id)) == id);
        RC_ASSERT(table.contains(table.get(id)));
        RC_ASSERT(model.at(keyOf(*table.get(id))) == id);
    }
}

RC_GTEST_PROP(Interning, EqualityIsSymmetricAndAgreesWithHashes, (std::uint64_t seed)) {
    std::mt19937_64 random(seed);
    SymbolicExprTable table;
    SymbolicExprTable other; // the same identifiers, nodes of its own
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
