// Conditions of every shape that has a value: any operator in any operand of any other, shared parts, corner literals.
#pragma once

#include "base/VTSymbolicExpr.hpp"
#include "tests/support/oracles/Truth.hpp"

#include <random>
#include <string>
#include <vector>

namespace VT::Testing {

/// What conditions are made of.  Names are in the worst order: what is used together is far apart in the alphabet.
struct ConditionWorld {
    std::vector<std::string> names{"m", "Z", "a", "z9"};
    bool reals = true;
    bool calls = true;
};

/// The operators whose value is that of their operands: arithmetic, bits, shifts, comparisons, logic.
const std::vector<SymbolicOp>& valueOperators();

/// A name, or a literal from the corners of its type.
SymbolicExprId anyLeaf(SymbolicExprTable& table, std::mt19937_64& random, const ConditionWorld& world);

/// A graph of so many operators over leaves, whose nodes are operands of several others.  The root is the last one.
SymbolicExprId anyCondition(SymbolicExprTable& table, std::mt19937_64& random, std::size_t operators,
                            const ConditionWorld& world = {});

/// Values for the names: mostly small, now and then at the bounds of their type.  Both keywords get opposite truths.
Assignment anyAssignment(std::mt19937_64& random, const ConditionWorld& world);

} // namespace VT::Testing
