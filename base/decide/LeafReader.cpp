// Classifies a leaf by its node and, for a member, by the value bound to it. O(1); interns nothing.
#include "base/decide/LeafReader.hpp"

#include "base/core/Nodes.hpp"
#include "base/variants/VariantKeywords.hpp"

namespace VT {

LeafMeaning LeafReader::operator()(SymbolicExprId id) const {
    using Kind = LeafMeaning::Kind;
    const SymbolicExpr* node = table_.get(id);
    const bool isMember = node->op() == SymbolicOp::MemberValue;
    if (isMember) {
        const SymbolicExprId bound = table_.getValueId(id);
        if (!table_.has(bound))
            return {Kind::Free, 0, 0, id};
        id = bound;
        node = table_.get(id);
    }
    if (callOps.contains(node->op()))
        return {Kind::Free, 0, 0, id};
    switch (node->op()) {
    case SymbolicOp::IntValue:
        return {Kind::Integer, static_cast<const SymbolicIntValue*>(node)->getValue()};
    case SymbolicOp::DoubleValue:
        return {Kind::Real, 0, node->getNumValue()};
    case SymbolicOp::String: {
        const std::string& name = static_cast<const SymbolicString*>(node)->getName();
        if (name == "true" || name == "false")
            return {Kind::Integer, name == "true"};
        // Only what holds a parenthesis can be a keyword, whatever blanks stand around it.
        if (keywordsInForce_ && name.find('(') != std::string::npos) {
            if (VariantKeywords::isSimVariantKeyword(name, true))
                return {Kind::Simulation, 0, 0, id};
            if (VariantKeywords::isCodegenVariantKeyword(name, true))
                return {Kind::CodeGeneration, 0, 0, id};
        }
        return {Kind::Free, 0, 0, id};
    }
    default:
        return {isMember ? Kind::Opaque : Kind::Compound};
    }
}

} // namespace VT
