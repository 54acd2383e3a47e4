// Identity of expressions: hashes, copies from table to table, and their structure as plain values, for pickling.
//
// The structure is a list of nodes, operands before the nodes that use them; shared nodes are in it once.
#include "base/core/Make.hpp"
#include "base/core/Walk.hpp"
#include "python/src/Bindings.hpp"

#include <pybind11/stl.h>

#include <functional>
#include <variant>

namespace vtsym::python {

namespace {

using Payload = std::variant<std::monostate, std::string, std::int32_t, double>;

/// The number of an operator, the name or number of a leaf or member, and the places of the operands in the list.
using Part = std::tuple<unsigned, Payload, std::vector<std::size_t>>;

Payload payloadOf(const VT::SymbolicExpr& node) {
    switch (node.op()) {
    case VT::SymbolicOp::String:
        return static_cast<const VT::SymbolicString&>(node).getName();
    case VT::SymbolicOp::IntValue:
        return static_cast<const VT::SymbolicIntValue&>(node).getValue();
    case VT::SymbolicOp::DoubleValue:
        return static_cast<const VT::SymbolicDoubleValue&>(node).getValue();
    case VT::SymbolicOp::MemberValue:
        return static_cast<const VT::SymbolicMemberValue&>(node).getMemberName();
    default:
        return {};
    }
}

std::vector<Part> structure(Table& table, SymbolicExprId id) {
    const Lengthy use(table);
    std::vector<Part> parts;
    VT::IdMap<std::size_t> places;
    VT::walkDistinct(
        table.nodes(), table.checked(id),
        [&](SymbolicExprId met, const VT::SymbolicExpr& node) {
            std::vector<std::size_t> operands;
            for (std::size_t i = 0; i < node.getNumInputs(); ++i)
                operands.push_back(*places.find(node.getInput(i)));
            places.insert(met, parts.size());
            parts.emplace_back(static_cast<unsigned>(node.op()), payloadOf(node), std::move(operands));
        },
        [](SymbolicExprId) {});
    return parts;
}

/// Makes a node; the invalid identifier where the parts are not those of one.
SymbolicExprId make(VT::SymbolicExprTable& nodes, VT::SymbolicOp op, const Payload& payload,
                    const std::vector<SymbolicExprId>& operands) {
    if (op == VT::SymbolicOp::MemberValue) {
        const auto* const name = std::get_if<std::string>(&payload);
        return name != nullptr && operands.size() == 1 ? VT::SymbolicMemberValue(nodes, operands[0], *name).getId(nodes)
                                                       : VT::invalidId;
    }
    if (const auto* const name = std::get_if<std::string>(&payload); name != nullptr)
        return op == VT::SymbolicOp::String ? VT::SymbolicString(nodes, *name).getId(nodes) : VT::invalidId;
    if (const auto* const integer = std::get_if<std::int32_t>(&payload); integer != nullptr)
        return op == VT::SymbolicOp::IntValue ? VT::SymbolicIntValue(nodes, *integer).getId(nodes) : VT::invalidId;
    if (const auto* const real = std::get_if<double>(&payload); real != nullptr)
        return op == VT::SymbolicOp::DoubleValue ? VT::SymbolicDoubleValue(nodes, *real).getId(nodes) : VT::invalidId;
    if (operands.size() == 1)
        if (const SymbolicExprId id = makeUnary(nodes, op, operands[0]); id != VT::invalidId)
            return id;
    if (operands.size() == 2)
        if (const SymbolicExprId id = makeBinary(nodes, op, operands[0], operands[1]); id != VT::invalidId)
            return id;
    if (operands.size() == 3)
        if (const SymbolicExprId id = makeTernary(nodes, op, operands[0], operands[1], operands[2]);
            id != VT::invalidId)
            return id;
    return makeMulti(nodes, op, operands);
}

SymbolicExprId restore(Table& table, const std::vector<Part>& parts) {
    const Lengthy use(table);
    std::vector<SymbolicExprId> ids;
    for (const auto& [op, payload, places] : parts) {
        std::vector<SymbolicExprId> operands;
        for (const std::size_t place : places)
            operands.push_back(ids.at(place));
        const bool isOperator = op < VT::operatorTable().size();
        const SymbolicExprId id =
            isOperator ? make(table.nodes(), static_cast<VT::SymbolicOp>(op), payload, operands) : VT::invalidId;
        if (id == VT::invalidId)
            throw std::invalid_argument("not the structure of an expression");
        ids.push_back(id);
    }
    if (ids.empty())
        throw std::invalid_argument("not the structure of an expression");
    return ids.back();
}

/// Uses two tables while other threads run Python.
class LengthyPair {
public:
    LengthyPair(Table& a, Table& b) : lock_(a.mutex, b.mutex) {}

private:
    py::gil_scoped_release release_;
    std::scoped_lock<std::mutex, std::mutex> lock_;
};

SymbolicExprId adopt(Table& table, Table& source, SymbolicExprId id) {
    if (&table == &source)
        return id;
    const LengthyPair use(table, source);
    const SymbolicExprId ids[] = {id};
    return table.adopt(source, ids).front();
}

} // namespace

void addStructure(TableClass& table) {
    table
        .def(
            "hash",
            [](Table& self, SymbolicExprId id) {
                const Brief use(self);
                return static_cast<std::int64_t>(self.hashOf(self.checked(id)));
            },
            py::arg("id"))
        .def("structure", &structure, py::arg("id"))
        .def("restore", &restore, py::arg("parts"))
        .def("adopt", &adopt, py::arg("source"), py::arg("id"))
        .def(
            "successor",
            [](Table& self, SymbolicExprId id) {
                const Lengthy use(self);
                return self.successor(self.checked(id));
            },
            py::arg("id"))
        .def("is_full", [](Table& self) {
            const Brief use(self);
            return self.isFull();
        });
}

} // namespace vtsym::python
