// Claims about dimension expressions, under what the table assumes.
//
// Relies on DimensionProofs; every question is a proof of its own.
#include "python/src/Bindings.hpp"

#include <array>

namespace vtsym::python {

namespace {

/// In the order of VT::DimensionOrder.
constexpr std::array<const char*, 7> orders{"==", "<", "<=", ">", ">=", "!=", "?"};

template <class Ask>
auto proving(Table& table, Ask ask) {
    const Lengthy use(table);
    return ask(table.dimensionProofs());
}

} // namespace

void addDimensions(TableClass& table) {
    table
        .def(
            "prove",
            [](Table& self, SymbolicExprId claim) {
                return decisionOf(self, proving(self, [&](VT::DimensionProofs& proofs) {
                                      return proofs.holds(self.checked(claim));
                                  }));
            },
            py::arg("claim"))
        .def(
            "is_non_negative",
            [](Table& self, SymbolicExprId id) {
                return decisionOf(self, proving(self, [&](VT::DimensionProofs& proofs) {
                                      return proofs.isNonNegative(self.checked(id));
                                  }));
            },
            py::arg("id"))
        .def(
            "is_divisible",
            [](Table& self, SymbolicExprId id, int divisor) {
                return decisionOf(self, proving(self, [&](VT::DimensionProofs& proofs) {
                                      return proofs.isDivisible(self.checked(id), divisor);
                                  }));
            },
            py::arg("id"), py::arg("divisor"))
        .def(
            "order",
            [](Table& self, SymbolicExprId a, SymbolicExprId b) {
                const auto order = proving(self, [&](VT::DimensionProofs& proofs) {
                    return proofs.compare(self.checked(a), self.checked(b));
                });
                return orders.at(static_cast<std::size_t>(order));
            },
            py::arg("a"), py::arg("b"));
}

} // namespace vtsym::python
