#include "fuzz/Choices.hpp"
#include "tests/support/generators/AnyNode.hpp"

#include <array>
#include <bit>

namespace VT::Fuzz {

SymbolicExprId chosenLeaf(SymbolicExprTable& table, Choices& choices, const Testing::ConditionWorld& world) {
    static constexpr std::array integers{0, 1, -1, 2, 3, 4, 7, 31, 32, 255, 65536, 2147483647, -2147483647 - 1};
    static constexpr std::array reals{0.0, 0.5, 1.0, 2.0, -1.5, 0.1, 1e300, 2147483648.0, 5e-324};
    static constexpr std::array constants{"true", "false", "(sim)", "(codegen)"};
    const Testing::Trees tree{table};
    const std::size_t kind = choices.below(16);
    if (kind < 7)
        return tree.name(choices.of(world.names));
    if (kind < 12)
        return tree.integer(choices.of(integers));
    if (kind == 12)
        return tree.integer(choices.integer());
    if (kind == 13 && world.reals)
        return tree.real(choices.of(reals));
    if (kind == 14 && world.reals)
        return tree.real(static_cast<double>(choices.integer()) / 256);
    return tree.name(choices.of(constants));
}

SymbolicExprId chosenCondition(SymbolicExprTable& table, Choices& choices, std::size_t operators,
                               const Testing::ConditionWorld& world) {
    const Testing::Trees tree{table};
    std::vector<SymbolicExprId> parts{chosenLeaf(table, choices, world)};
    const auto operand = [&] {
        const std::size_t which = choices.below(32);
        return which < 16 ? parts[parts.size() - 1 - which % parts.size()] : chosenLeaf(table, choices, world);
    };
    while (!choices.areUsedUp() && operators-- > 0) {
        const std::size_t which = choices.byte();
        const std::vector<SymbolicOp>& all = Testing::valueOperators();
        const SymbolicExprId first = operand();
        if (which == 255 && world.calls) {
            parts.push_back(tree(SymbolicOp::FcnCall1U, tree.name("f"), first));
            continue;
        }
        const SymbolicOp op = all[which % all.size()];
        parts.push_back(Testing::operandCount(op) == 1 ? tree(op, first) : tree(op, first, operand()));
    }
    return parts.back();
}

std::vector<Testing::Assignment> someAssignments(const Testing::ConditionWorld& world, std::size_t count) {
    std::mt19937_64 random(7);
    std::vector<Testing::Assignment> all;
    for (std::size_t i = 0; i < count; ++i)
        all.push_back(Testing::anyAssignment(random, world));
    return all;
}

} // namespace VT::Fuzz
