#include "tests/support/generators/RandomExpression.hpp"

#include "tests/support/generators/AnyNode.hpp"

#include <limits>

namespace VT::Testing {

namespace {

template <class T>
const T& anyOf(std::mt19937_64& random, const std::vector<T>& all) {
    return all[random() % all.size()];
}

using Int = std::numeric_limits<int>;
using Real = std::numeric_limits<double>;
const std::vector<std::string> names{"", "a", "b", "N", "f", "true", "(sim)", "\xff"};
const std::vector<int> integers{-2, -1, 0, 1, 2, 3, Int::min(), Int::max()};
const std::vector<double> reals{0.0, -0.0, 0.5, 1.0, -2.75, 1.0 + Real::epsilon(), 1e300, Real::infinity()};
const std::vector<double> oddReals{0.5, -Real::infinity(), Real::quiet_NaN()};

/// A node whose operands are what `pick` answers for an operator and a position.
template <class Pick>
SymbolicExprId make(SymbolicExprTable& table, std::mt19937_64& random, SymbolicOp op, double real, Pick pick) {
    NodeParts parts{anyOf(random, names), anyOf(random, integers), real, {}};
    const std::size_t count = operandCount(op).value_or(random() % 6);
    for (std::size_t i = 0; i < count; ++i)
        parts.inputs.push_back(pick(i));
    const SymbolicExprId id = makeAny(table, op, parts);
    return id == invalidId ? table.size() - 1 : id; // no look-up finds a NaN
}

} // namespace

std::vector<SymbolicExprId> randomGraph(std::mt19937_64& random, SymbolicExprTable& table, std::size_t nodes) {
    std::vector<SymbolicExprId> ids;
    while (ids.size() < nodes) {
        const bool leaf = ids.size() < nodes / 4;
        const auto op = static_cast<SymbolicOp>(leaf && random() % 2 == 0 ? 0 : random() % (leaf ? 3 : operatorCount));
        ids.push_back(make(table, random, op, anyOf(random, random() % 4 == 0 ? oddReals : reals), [&](std::size_t i) {
            return i == 0 && callOps.contains(op) ? SymbolicString(table, anyOf(random, names)).getId(table)
                                                  : anyOf(random, ids);
        }));
    }
    return ids;
}

SymbolicExprId makeRandom(SymbolicExprTable& table, std::mt19937_64& random) {
    const bool leaf = table.size() == 0 || random() % 4 == 0;
    const auto op = static_cast<SymbolicOp>(leaf ? random() % 3 : 3 + random() % (operatorCount - 3));
    return make(table, random, op, anyOf(random, reals), [&](std::size_t) { return random() % table.size(); });
}

SymbolicExprId randomTree(SymbolicExprTable& table, std::mt19937_64& random, const std::vector<SymbolicOp>& operators,
                          int depth, // NOLINT(misc-no-recursion): as deep as asked for
                          const std::function<SymbolicExprId()>& leaf) {
    const Trees tree{table};
    if (depth == 0 || random() % 6 == 0) {
        if (leaf)
            return leaf();
        const std::size_t kind = random() % 6;
        return kind == 0   ? tree.integer(static_cast<int>(random() % 7) - 3)
               : kind == 1 ? tree.real((static_cast<double>(random() % 9) - 4) * 0.5)
                           : tree.name(std::string(1, "abcd"[random() % 4]));
    }
    const SymbolicOp op = anyOf(random, operators);
    std::vector<SymbolicExprId> inputs;
    for (std::size_t left = operandCount(op).value_or(1 + random() % 4); left > 0; --left)
        inputs.push_back((callOps.contains(op) || op == SymbolicOp::MemberValue) && inputs.empty()
                             ? tree.name("f")
                             : randomTree(table, random, operators, depth - 1, leaf));
    return tree(op, inputs);
}

} // namespace VT::Testing
