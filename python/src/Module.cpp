// The Python module _vtsym: the library's tables and services as the package vtsym uses them.
//
// Conditions and expressions are a table and the number of a node, so that an operation on them makes no C++ object.
#include "python/src/Bindings.hpp"

namespace vtsym::python {

PYBIND11_MODULE(_vtsym, module) {
    module.doc() = "The C++ library below the package vtsym; its functions check their arguments and nothing else.";
    module.attr("version") = VTSYM_VERSION;
    py::dict operators;
    for (const VT::OperatorInfo& row : VT::operatorTable())
        operators[py::str(std::string(row.name))] = static_cast<int>(row.op);
    module.attr("operators") = operators;
    addErrors(module);
    TableClass table(module, "Table");
    table.def(py::init<bool, std::size_t>(), py::arg("bits32"), py::arg("capacity"));
    addConditions(table);
    addStructure(table);
    addDecisions(table);
    addDimensions(table);
    addEvaluation(module, table);
    addModels(module);
    addScan(module);
}

} // namespace vtsym::python
