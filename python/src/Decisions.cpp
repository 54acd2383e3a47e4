// Questions about conditions: whether they hold, how two relate, and why.
//
// A question runs without Python's lock; its answer is turned into plain values after that.
#include "python/src/Bindings.hpp"

#include <pybind11/stl.h>

#include <array>

namespace vtsym::python {

namespace {

/// In the order of VT::RelationKind.
constexpr std::array<const char*, 6> relations{"equivalent", "disjoint", "implies",
                                               "implied by", "overlaps", "undecided"};

py::object boundOf(VT::DecisionBound bound) {
    switch (bound) {
    case VT::DecisionBound::None:
        return py::none();
    case VT::DecisionBound::Steps:
        return py::str("steps");
    default:
        return py::str("terms");
    }
}

template <class Ask>
auto asking(Table& table, Ask ask) {
    const Lengthy use(table);
    table.countDecisions(3);
    return ask(table.service());
}

py::tuple compare(Table& table, SymbolicExprId a, SymbolicExprId b) {
    const VT::Relation relation =
        asking(table, [&](VT::VCService& service) { return service.compare(table.checked(a), table.checked(b)); });
    return py::make_tuple(relations.at(static_cast<std::size_t>(relation.kind)), boundOf(relation.bound),
                          decisionOf(table, relation.onlyA), decisionOf(table, relation.onlyB),
                          decisionOf(table, relation.both));
}

/// Whether the reasons are proven, whether they are minimal, and the operands.
py::tuple reasonsOf(const VT::Reasons& reasons) {
    return py::make_tuple(reasons.isProven, reasons.isMinimal, reasons.operands);
}

std::vector<VT::VCSymbolicExprId> allOf(Table& table, const std::vector<SymbolicExprId>& ids) {
    std::vector<VT::VCSymbolicExprId> conditions;
    for (const SymbolicExprId id : ids)
        conditions.emplace_back(table.checked(id));
    return conditions;
}

py::tuple setDecisionOf(Table& table, const VT::SetDecision& decision) {
    return py::make_tuple(decisionOf(table, decision), decision.members);
}

} // namespace

py::tuple decisionOf(Table& table, const VT::Decision& decision) {
    py::object answer = py::none();
    if (!decision.isUndecided())
        answer = py::bool_(decision.isYes());
    py::object witness = py::none();
    if (decision.witness) {
        std::vector<std::string> names;
        {
            const Lengthy use(table);
            for (const VT::UnknownValue& unknown : *decision.witness)
                names.push_back(table.service().printCExpr(unknown.unknown));
        }
        py::dict values;
        for (std::size_t i = 0; i < names.size(); ++i)
            values[py::str(names[i])] = (*decision.witness)[i].value;
        witness = values;
    }
    return py::make_tuple(answer, boundOf(decision.bound), witness);
}

void addDecisions(TableClass& table) {
    const auto one = [&](const char* name, VT::Decision (VT::VCService::*question)(const VT::VCSymbolicExprId&)) {
        table.def(
            name,
            [question](Table& self, SymbolicExprId id) {
                return decisionOf(
                    self, asking(self, [&](VT::VCService& service) { return (service.*question)(self.checked(id)); }));
            },
            py::arg("id"));
    };
    const auto two = [&](const char* name, VT::Decision (VT::VCService::*question)(const VT::VCSymbolicExprId&,
                                                                                   const VT::VCSymbolicExprId&)) {
        table.def(
            name,
            [question](Table& self, SymbolicExprId a, SymbolicExprId b) {
                return decisionOf(self, asking(self, [&](VT::VCService& service) {
                                      return (service.*question)(self.checked(a), self.checked(b));
                                  }));
            },
            py::arg("a"), py::arg("b"));
    };
    one("can_hold", &VT::VCService::canHold);
    one("must_hold", &VT::VCService::mustHold);
    two("equivalent", &VT::VCService::isEquivalent);
    two("implies", &VT::VCService::implies);
    two("disjoint", &VT::VCService::isDisjoint);
    table.def("compare", &compare, py::arg("a"), py::arg("b"))
        .def(
            "why_implies",
            [](Table& self, SymbolicExprId a, SymbolicExprId b) {
                return reasonsOf(asking(self, [&](VT::VCService& service) {
                    return service.explainImplies(self.checked(a), self.checked(b));
                }));
            },
            py::arg("a"), py::arg("b"))
        .def(
            "why_disjoint",
            [](Table& self, const std::vector<SymbolicExprId>& ids) {
                return reasonsOf(
                    asking(self, [&](VT::VCService& service) { return service.explainDisjoint(allOf(self, ids)); }));
            },
            py::arg("ids"))
        .def(
            "covers",
            [](Table& self, const std::vector<SymbolicExprId>& ids) {
                return setDecisionOf(
                    self, asking(self, [&](VT::VCService& service) { return service.covers(allOf(self, ids)); }));
            },
            py::arg("ids"))
        .def(
            "all_disjoint",
            [](Table& self, const std::vector<SymbolicExprId>& ids) {
                return setDecisionOf(
                    self, asking(self, [&](VT::VCService& service) { return service.isDisjoint(allOf(self, ids)); }));
            },
            py::arg("ids"))
        .def(
            "assume",
            [](Table& self, SymbolicExprId id) {
                const Lengthy use(self);
                self.assume(self.checked(id));
            },
            py::arg("id"));
}

} // namespace vtsym::python
