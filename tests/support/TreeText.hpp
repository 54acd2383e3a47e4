// Expressions as prefix text for the expectations of tests: Or(a,Equal(b,2)).
#pragma once

#include "base/core/Nodes.hpp"

#include <array>
#include <charconv>
#include <string>

namespace VT::Testing {

/// A real as it is in such a text, in every locale.
inline std::string realText(double value) {
    std::array<char, 40> digits{};
    const auto end = std::to_chars(digits.begin(), digits.end(), value, std::chars_format::general, 17).ptr;
    return std::string(digits.begin(), end) + "r";
}

/// The node kinds by the names of their operators, names and integers as they are, a real with an r after it, a
/// member's name after its owner.  The invalid identifier is "invalid".  Recurses; for small expressions only.
inline std::string treeText(const SymbolicExprTable& table, SymbolicExprId id) { // NOLINT(misc-no-recursion)
    const SymbolicExpr* node = table.get(id);
    if (node == nullptr)
        return "invalid";
    if (node->op() == SymbolicOp::String)
        return static_cast<const SymbolicString&>(*node).getName();
    if (node->op() == SymbolicOp::IntValue)
        return std::to_string(static_cast<const SymbolicIntValue&>(*node).getValue());
    if (node->op() == SymbolicOp::DoubleValue)
        return realText(node->getNumValue());
    std::string text = std::string(operatorInfo(node->op()).name) + "(";
    for (std::size_t i = 0; i < node->getNumInputs(); ++i)
        text += (i > 0 ? "," : "") + treeText(table, node->getInput(i));
    if (node->op() == SymbolicOp::MemberValue)
        text += "," + static_cast<const SymbolicMemberValue&>(*node).getMemberName();
    return text + ")";
}

} // namespace VT::Testing
