#include "tests/support/generators/AnyNode.hpp"

#include <type_traits>

namespace VT::Testing {

namespace {

template <class Node>
constexpr std::optional<std::size_t> countOf() {
    if constexpr (std::is_base_of_v<SymbolicUnaryExpr, Node>)
        return 1;
    else if constexpr (std::is_base_of_v<SymbolicBinaryExpr, Node>)
        return 2;
    else if constexpr (std::is_base_of_v<SymbolicTernaryExpr, Node>)
        return 3;
    else if constexpr (std::is_base_of_v<SymbolicMultiExpr, Node>)
        return std::nullopt;
    else
        return 0;
}

template <class Node>
SymbolicExprId make(SymbolicExprTable& table, const NodeParts& parts) {
    const auto& in = parts.inputs;
    if constexpr (std::is_same_v<Node, SymbolicString>)
        return Node(table, parts.text).getId(table);
    else if constexpr (std::is_same_v<Node, SymbolicIntValue>)
        return Node(table, parts.integer).getId(table);
    else if constexpr (std::is_same_v<Node, SymbolicDoubleValue>)
        return Node(table, parts.real).getId(table);
    else if constexpr (std::is_same_v<Node, SymbolicMemberValue>)
        return Node(table, in.at(0), parts.text).getId(table);
    else if constexpr (countOf<Node>() == 1)
        return Node(table, in.at(0)).getId(table);
    else if constexpr (countOf<Node>() == 2)
        return Node(table, in.at(0), in.at(1)).getId(table);
    else if constexpr (countOf<Node>() == 3)
        return Node(table, in.at(0), in.at(1), in.at(2)).getId(table);
    else
        return Node(table, in).getId(table);
}

} // namespace

std::optional<std::size_t> operandCount(SymbolicOp op) {
    static constexpr std::optional<std::size_t> counts[] = {
#define VTSYM_OPERATOR(Code, Name, Class, ...) countOf<Class>(),
#include "base/core/operators.def"
#undef VTSYM_OPERATOR
    };
    return counts[static_cast<std::size_t>(op)];
}

SymbolicExprId makeAny(SymbolicExprTable& table, SymbolicOp op, const NodeParts& parts) {
    static constexpr SymbolicExprId (*makers[])(SymbolicExprTable&, const NodeParts&) = {
#define VTSYM_OPERATOR(Code, Name, Class, ...) make<Class>,
#include "base/core/operators.def"
#undef VTSYM_OPERATOR
    };
    return makers[static_cast<std::size_t>(op)](table, parts);
}

SymbolicExprId Trees::doubled(SymbolicOp op, SymbolicExprId id, int times) const {
    for (int i = 0; i < times; ++i)
        id = (*this)(op, id, id);
    return id;
}

SymbolicExprId Trees::zigzag(SymbolicOp left, SymbolicOp right, SymbolicExprId id, SymbolicExprId leaf,
                             int depth) const {
    for (int i = 0; i < depth; ++i)
        id = i % 2 == 0 ? (*this)(left, id, leaf) : (*this)(right, leaf, id);
    return id;
}

} // namespace VT::Testing
