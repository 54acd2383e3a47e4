#include "tests/support/generators/AnyCondition.hpp"

#include "base/eval/ScalarRules.hpp"
#include "tests/support/generators/AnyNode.hpp"

#include <array>
#include <limits>

namespace VT::Testing {

namespace {

using Op = SymbolicOp;

std::size_t below(std::mt19937_64& random, std::size_t bound) {
    return random() % bound;
}

/// Operators by how often conditions use them.
Op anyOperator(std::mt19937_64& random) {
    static const std::vector<Op> logic{Op::And, Op::Or, Op::Not};
    static const std::vector<Op> comparisons{Op::Equal,         Op::NotEqual,    Op::LessThan,
                                             Op::LessThanEqual, Op::GreaterThan, Op::GreaterThanEqual};
    static const std::vector<Op> sums{Op::Plus, Op::Minus, Op::Multiply, Op::Divide, Op::UnaryMinus};
    const std::size_t kind = below(random, 8);
    const std::vector<Op>& all = kind < 3 ? logic : kind < 5 ? comparisons : kind < 7 ? sums : valueOperators();
    return all[below(random, all.size())];
}

} // namespace

const std::vector<SymbolicOp>& valueOperators() {
    static const std::vector<SymbolicOp> operators = [] {
        std::vector<SymbolicOp> valued{Op::SingleAnd, Op::SingleOr};
        for (const OperatorInfo& row : operatorTable())
            if (scalarRuleIndex(row.op) != ScalarRuleIndex::None)
                valued.push_back(row.op);
        return valued;
    }();
    return operators;
}

SymbolicExprId anyLeaf(SymbolicExprTable& table, std::mt19937_64& random, const ConditionWorld& world) {
    using Int = std::numeric_limits<int>;
    constexpr double infinity = std::numeric_limits<double>::infinity();
    constexpr double nan = std::numeric_limits<double>::quiet_NaN();
    static constexpr std::array integers{0, 1, -1, 2, 3, 7, 31, Int::max(), Int::min()};
    static constexpr std::array reals{0.0, -0.0, 0.5, 1.0, 2.0, -1.5, 0.1, 1e300, 2147483648.0, infinity, nan};
    const Trees tree{table};
    const std::size_t kind = below(random, 16);
    if (kind < 2)
        return tree.name(below(random, 2) == 0 ? (kind == 0 ? "true" : "(sim)") : (kind == 0 ? "false" : "(codegen)"));
    if (kind < 6)
        return tree.integer(integers[below(random, integers.size())]);
    if (kind == 6 && world.reals) {
        const SymbolicExprId id = tree.real(reals[below(random, reals.size())]);
        return id == invalidId ? table.size() - 1 : id; // no look-up finds a NaN
    }
    return tree.name(world.names[below(random, world.names.size())]);
}

SymbolicExprId anyCondition(SymbolicExprTable& table, std::mt19937_64& random, std::size_t operators,
                            const ConditionWorld& world) {
    const Trees tree{table};
    std::vector<SymbolicExprId> parts;
    const auto operand = [&] {
        if (parts.empty() || below(random, 3) == 0)
            return anyLeaf(table, random, world);
        // Mostly the latest, so that the graph is deep; now and then one that another operator has already.
        return below(random, 3) == 0 ? parts[below(random, parts.size())] : parts.back();
    };
    for (std::size_t i = 0; i < operators; ++i) {
        if (world.calls && below(random, 24) == 0) {
            parts.push_back(tree(Op::FcnCall1U, tree.name("f"), operand()));
            continue;
        }
        const Op op = anyOperator(random);
        const SymbolicExprId a = operand();
        parts.push_back(operandCount(op) == 1 ? tree(op, a) : tree(op, a, operand()));
    }
    return parts.empty() ? anyLeaf(table, random, world) : parts.back();
}

Assignment anyAssignment(std::mt19937_64& random, const ConditionWorld& world) {
    static constexpr std::array<std::int64_t, 6> corners{2147483647, -2147483648, 2147483646, 65536, 31, -32};
    Assignment values;
    for (const std::string& name : world.names)
        values[name] = below(random, 12) == 0 ? corners[below(random, corners.size())]
                                              : static_cast<std::int64_t>(below(random, 9)) - 4;
    const bool simulating = below(random, 2) == 0;
    values["(sim)"] = simulating ? 1 : 0;
    values["(codegen)"] = simulating ? 0 : 1;
    return values;
}

} // namespace VT::Testing
