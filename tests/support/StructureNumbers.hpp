// Whether expressions of several tables are the same tree, found without hashes, equality and walkers of the library.
#pragma once

#include "base/core/Nodes.hpp"

#include <bit>
#include <cstdint>
#include <map>
#include <string>
#include <tuple>
#include <vector>

namespace VT::Testing {

/// Numbers structures: equal trees, in whichever tables, have equal numbers, and others do not.  Reals are compared by
/// their bits, but for the sign of zero.  A class with any number of operands and its twin with a fixed number are one
/// structure.
class StructureNumbers {
public:
    /// The number of a node with these operands; that of an invalid operand is `none`.
    std::size_t number(const SymbolicExpr& node, const std::vector<std::size_t>& operands) {
        SymbolicOp family = node.op();
        if (callOps.contains(family))
            family = SymbolicOp::FcnCall;
        if (dimensionOps.contains(family))
            family = SymbolicOp::DimsND;
        return numbers_.try_emplace({family, payload(node), operands}, numbers_.size()).first->second;
    }

    /// The numbers of all nodes of a table, by identifier.
    std::vector<std::size_t> of(const SymbolicExprTable& table) {
        std::vector<std::size_t> all;
        for (SymbolicExprId id = 0; id < table.size(); ++id) {
            const SymbolicExpr& node = *table.get(id);
            std::vector<std::size_t> operands;
            for (std::size_t i = 0; i < node.getNumInputs(); ++i)
                operands.push_back(node.getInput(i) < id ? all[node.getInput(i)] : none);
            all.push_back(number(node, operands));
        }
        return all;
    }

    static constexpr std::size_t none = ~std::size_t{0};

private:
    static std::string payload(const SymbolicExpr& node) {
        if (node.op() == SymbolicOp::String)
            return static_cast<const SymbolicString&>(node).getName();
        if (node.op() == SymbolicOp::MemberValue)
            return static_cast<const SymbolicMemberValue&>(node).getMemberName();
        if (node.isNumValue())
            return std::to_string(std::bit_cast<std::uint64_t>(node.getNumValue() + 0.0));
        return {};
    }

    std::map<std::tuple<SymbolicOp, std::string, std::vector<std::size_t>>, std::size_t> numbers_;
};

} // namespace VT::Testing
