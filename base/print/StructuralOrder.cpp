// Orders expressions by structure.
//
// Method: both expressions are walked in parallel from the root, in pre-order on an explicit stack.  Nodes are
// interned, so operands of one identifier are equal and skipped, and the walk goes straight down to the first
// difference.
// Cost: linear in the depth of that difference.  Only copies of NaN are equal under several identifiers; pairs of nodes
// built on them are remembered, so that shared operands are compared once.
// Relies on: interning (equal structure has one identifier, but for NaN).
#include "base/print/StructuralOrder.hpp"

#include "base/core/Nodes.hpp"

#include <array>
#include <bit>
#include <boost/unordered_set.hpp>
#include <cmath>
#include <utility>
#include <vector>

namespace VT {

namespace {

template <class Value>
int order(const Value& a, const Value& b) {
    return a < b ? -1 : static_cast<int>(b < a);
}

/// The operator of a node; that of the class with a fixed number of operands for a generic call or dimension list,
/// because it depends on the table's history which of the two stands for both.
SymbolicOp canonicalOp(const SymbolicExpr& node) {
    const SymbolicOp op = node.op();
    const std::size_t inputs = node.getNumInputs();
    constexpr auto dimensions = std::to_array({SymbolicOp::Dims2D, SymbolicOp::Dims3D});
    constexpr auto calls = std::to_array({SymbolicOp::FcnCall0U, SymbolicOp::FcnCall1U, SymbolicOp::FcnCall2U});
    if (op == SymbolicOp::DimsND && inputs >= 2 && inputs < 2 + dimensions.size())
        return dimensions[inputs - 2];
    if (op == SymbolicOp::FcnCall && inputs >= 1 && inputs < 1 + calls.size())
        return calls[inputs - 1];
    return op;
}

/// Numbers by value; where values do not differ, by their bits (-0, NaN).
int orderDoubles(double a, double b) {
    if (a < b || b < a)
        return a < b ? -1 : 1;
    return order(std::bit_cast<std::int64_t>(a), std::bit_cast<std::int64_t>(b));
}

int orderPayloads(const SymbolicExpr& a, const SymbolicExpr& b) {
    switch (a.op()) {
    case SymbolicOp::String:
        return order(static_cast<const SymbolicString&>(a).getName(), static_cast<const SymbolicString&>(b).getName());
    case SymbolicOp::IntValue:
        return order(static_cast<const SymbolicIntValue&>(a).getValue(),
                     static_cast<const SymbolicIntValue&>(b).getValue());
    case SymbolicOp::DoubleValue:
        return orderDoubles(static_cast<const SymbolicDoubleValue&>(a).getValue(),
                            static_cast<const SymbolicDoubleValue&>(b).getValue());
    case SymbolicOp::MemberValue:
        return order(static_cast<const SymbolicMemberValue&>(a).getMemberName(),
                     static_cast<const SymbolicMemberValue&>(b).getMemberName());
    default:
        return 0;
    }
}

/// Orders two nodes without their operands.
int orderNodes(const SymbolicExpr& a, const SymbolicExpr& b) {
    if (const int ops = order(canonicalOp(a), canonicalOp(b)); ops != 0)
        return ops;
    if (const int payloads = orderPayloads(a, b); payloads != 0)
        return payloads;
    return order(a.getNumInputs(), b.getNumInputs());
}

} // namespace

int compareStructure(const SymbolicExprTable& table, SymbolicExprId left, SymbolicExprId right) {
    std::vector<std::pair<SymbolicExprId, SymbolicExprId>> stack{{left, right}};
    boost::unordered_set<std::pair<SymbolicExprId, SymbolicExprId>> compared;
    while (!stack.empty()) {
        const auto [a, b] = stack.back();
        stack.pop_back();
        if (a == b)
            continue;
        if (!table.has(a) || !table.has(b)) {
            if (table.has(a) == table.has(b))
                continue;
            return table.has(a) ? 1 : -1;
        }
        const SymbolicExpr& one = *table.get(a);
        const SymbolicExpr& two = *table.get(b);
        if (const int nodes = orderNodes(one, two); nodes != 0)
            return nodes;
        if (one.getNumInputs() == 0 || !compared.emplace(a, b).second)
            continue;
        for (std::size_t i = one.getNumInputs(); i-- > 0;) {
            const auto operand = [&](SymbolicExprId id, const SymbolicExpr& node) {
                return table.hasOperand(id, node.getInput(i)) ? node.getInput(i) : invalidId;
            };
            stack.emplace_back(operand(a, one), operand(b, two));
        }
    }
    return 0;
}

} // namespace VT
