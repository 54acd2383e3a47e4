#include "tests/support/TreeText.hpp"

#include "base/core/Nodes.hpp"

#include <array>
#include <charconv>

namespace VT::Testing {

std::string realText(double value) {
    std::array<char, 40> digits{};
    const char* const end = std::to_chars(digits.data(), digits.data() + digits.size(), value,
                                          std::chars_format::general, 17) // in every locale
                                .ptr;
    return std::string(static_cast<const char*>(digits.data()), end) + "r";
}

std::string treeText(const SymbolicExprTable& table, SymbolicExprId id) { // NOLINT(misc-no-recursion): small trees only
    const SymbolicExpr* node = table.get(id);
    if (node == nullptr)
        return "invalid";
    switch (node->op()) {
    case SymbolicOp::String:
        return static_cast<const SymbolicString&>(*node).getName();
    case SymbolicOp::IntValue:
        return std::to_string(static_cast<const SymbolicIntValue&>(*node).getValue());
    case SymbolicOp::DoubleValue:
        return realText(node->getNumValue());
    default:
        break;
    }
    std::string text(operatorInfo(node->op()).name);
    text += '(';
    for (std::size_t i = 0; i < node->getNumInputs(); ++i)
        text += (i > 0 ? "," : "") + treeText(table, node->getInput(i));
    if (node->op() == SymbolicOp::MemberValue)
        text += "," + static_cast<const SymbolicMemberValue&>(*node).getMemberName();
    return text + ")";
}

} // namespace VT::Testing
