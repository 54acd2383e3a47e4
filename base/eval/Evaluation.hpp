// How the value of a node is found, by its operator; the literals and constants that need no search.
#pragma once

#include "base/core/Nodes.hpp"
#include "base/eval/ScalarRules.hpp"

#include <array>
#include <optional>

namespace VT::detail {

/// Where the value of a node comes from.
enum class Evaluation : std::uint8_t {
    None,     ///< the node has no value
    Literal,  ///< in the node itself
    Symbol,   ///< bound to it, or a truth value
    Member,   ///< bound to it
    Operands, ///< computed from the operands' values
};

inline constexpr auto evaluations = [] {
    std::array<Evaluation, static_cast<std::size_t>(operatorCount)> ways{};
    for (const OperatorInfo& row : operatorTable())
        if (scalarRuleIndex(row.op) != ScalarRuleIndex::None || dimensionOps.contains(row.op))
            ways[static_cast<std::size_t>(row.op)] = Evaluation::Operands;
    ways[static_cast<std::size_t>(SymbolicOp::String)] = Evaluation::Symbol;
    ways[static_cast<std::size_t>(SymbolicOp::IntValue)] = Evaluation::Literal;
    ways[static_cast<std::size_t>(SymbolicOp::DoubleValue)] = Evaluation::Literal;
    ways[static_cast<std::size_t>(SymbolicOp::MemberValue)] = Evaluation::Member;
    return ways;
}();

constexpr Evaluation evaluationOf(SymbolicOp op) {
    return evaluations[static_cast<std::size_t>(op)];
}

/// The value of a literal with this operator.
inline SymbolicScalar literalValue(const SymbolicExpr& literal, SymbolicOp op) {
    if (op == SymbolicOp::IntValue)
        return static_cast<const SymbolicIntValue&>(literal).getValue();
    return static_cast<const SymbolicDoubleValue&>(literal).getValue();
}

/// The value of the identifiers "true" and "false"; nothing for others.
inline std::optional<bool> truthConstant(const SymbolicExpr& identifier) {
    const std::string& name = static_cast<const SymbolicString&>(identifier).getName();
    if (name == "true")
        return true;
    if (name == "false")
        return false;
    return std::nullopt;
}

} // namespace VT::detail
