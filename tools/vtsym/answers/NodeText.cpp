// Labels come from the operator table, so that a new operator needs no edit here.
// Names are cut to nameBytes and escaped.
#include "tools/vtsym/answers/NodeText.hpp"

#include "base/core/Nodes.hpp"
#include "host/Numbers.hpp"
#include "host/Text.hpp"

namespace vtsym {

namespace {

constexpr std::size_t nameBytes = 100; ///< shown of a name

} // namespace

std::string labelOf(const VT::SymbolicExpr& node) {
    if (const auto* name = dynamic_cast<const VT::SymbolicString*>(&node))
        return VT::shownText(name->getName(), nameBytes);
    if (const auto* integer = dynamic_cast<const VT::SymbolicIntValue*>(&node))
        return std::to_string(integer->getValue());
    const VT::OperatorInfo& row = VT::operatorInfo(node.op());
    if (const auto* real = dynamic_cast<const VT::SymbolicDoubleValue*>(&node))
        return vtsv_dtoa(real->getValue(), true) + " (" + std::string(row.meaning) + ")";
    std::string label(row.name);
    if (const auto* member = dynamic_cast<const VT::SymbolicMemberValue*>(&node))
        return label + " ." + VT::shownText(member->getMemberName(), nameBytes);
    if (const std::string_view spelling = row.c.empty() ? row.quill : row.c; !spelling.empty())
        label.append(" ").append(spelling);
    return label;
}

std::string lengthOfText(std::uint64_t bytes) {
    std::string text = "(";
    return text.append(std::to_string(bytes)).append(" bytes of text)");
}

} // namespace vtsym
