// Nodes of any class, chosen by operator at run time.
#pragma once

#include "base/core/Nodes.hpp"

#include <concepts>
#include <optional>
#include <string>
#include <utility>
#include <vector>

namespace VT::Testing {

/// What a node can be made of; a class takes what it has room for.
struct NodeParts {
    std::string text;
    int integer = 0;
    double real = 0;
    std::vector<SymbolicExprId> inputs;
};

/// Number of operands of a class; nothing for those with any number.
std::optional<std::size_t> operandCount(SymbolicOp op);

/// Interns a node of an operator's class.
SymbolicExprId makeAny(SymbolicExprTable& table, SymbolicOp op, const NodeParts& parts);

/// Interns a node of any operator; a member is named "field".
inline SymbolicExprId makeNode(SymbolicExprTable& table, SymbolicOp op, std::vector<SymbolicExprId> inputs) {
    return makeAny(table, op, {"field", 0, 0, std::move(inputs)});
}

/// Leaves and operators in few words.
struct Trees {
    SymbolicExprTable& table;

    SymbolicExprId name(const std::string& text) const { return SymbolicString(table, text).getId(table); }

    SymbolicExprId integer(int value) const { return SymbolicIntValue(table, value).getId(table); }

    SymbolicExprId real(double value) const { return SymbolicDoubleValue(table, value).getId(table); }

    SymbolicExprId operator()(SymbolicOp op, std::vector<SymbolicExprId> inputs) const {
        return makeNode(table, op, std::move(inputs));
    }

    template <std::same_as<SymbolicExprId>... Inputs>
    SymbolicExprId operator()(SymbolicOp op, Inputs... inputs) const {
        return makeNode(table, op, {inputs...});
    }

    /// A node of a node with itself, and so on: few nodes, and more paths than could be walked.
    SymbolicExprId doubled(SymbolicOp op, SymbolicExprId id, int times = 64) const;

    /// A chain of operators with a leaf beside each, which goes down by the left and the right operand in turn.
    SymbolicExprId zigzag(SymbolicOp left, SymbolicOp right, SymbolicExprId id, SymbolicExprId leaf, int depth) const;
};

} // namespace VT::Testing
