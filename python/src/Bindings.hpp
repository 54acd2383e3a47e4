// The parts of the module: each adds its classes and functions.
#pragma once

#include "host/Diagnostics.hpp"
#include "python/src/Table.hpp"

namespace vtsym::python {

using TableClass = py::class_<Table, std::shared_ptr<Table>>;

void addErrors(py::module_& module);
void addConditions(TableClass& table);
void addStructure(TableClass& table);
void addDecisions(TableClass& table);
void addDimensions(TableClass& table);
void addEvaluation(py::module_& module, TableClass& table);
void addModels(py::module_& module);
void addScan(py::module_& module);

/// A decision as Python sees it: the answer or None, the bound that left it open or None, the witness or None.
py::tuple decisionOf(Table& table, const VT::Decision& decision);

/// A text of a file or of a file's name as Python keeps bytes that are not UTF-8: each is a surrogate of its own.
inline py::str foreignText(const std::string& text) {
    return py::reinterpret_steal<py::str>(
        PyUnicode_DecodeUTF8(text.data(), static_cast<py::ssize_t>(text.size()), "surrogateescape"));
}

/// Raises the Python exception of a text that was refused.
[[noreturn]] void throwParseError(const VT::HostDiagnostic& diagnostic, const std::string& text);

} // namespace vtsym::python
