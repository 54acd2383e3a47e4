// Values of expressions: one assignment, and many rows at once over columns that other libraries own.
//
// A prepared expression keeps its slots by name, so that one evaluation looks each name up once.  Columns are read
// through the buffer protocol, where they are.
#include "base/eval/Eval.hpp"
#include "base/print/ExpressionPrinter.hpp"
#include "base/transform/DimensionLists.hpp"
#include "base/transform/QuillConversion.hpp"
#include "host/Diagnostics.hpp"
#include "python/src/Bindings.hpp"

#include <pybind11/numpy.h>

#include <algorithm>
#include <bit>

namespace vtsym::python {

namespace {

/// Values that Python may hold: True, 3, 0.5, and lists of these.  Throws TypeError and OverflowError for others.
VT::SymbolicScalar scalarOf(py::handle value) {
    if (PyBool_Check(value.ptr()))
        return value.ptr() == Py_True;
    if (PyLong_Check(value.ptr())) {
        int overflow = 0;
        const long number = PyLong_AsLongAndOverflow(value.ptr(), &overflow);
        if (overflow != 0 || static_cast<std::int32_t>(number) != number)
            throw std::range_error("the integer " + py::cast<std::string>(py::str(value)) + " does not fit 32 bits");
        return static_cast<std::int32_t>(number);
    }
    if (PyFloat_Check(value.ptr()))
        return PyFloat_AS_DOUBLE(value.ptr());
    if (py::hasattr(value, "item")) // the scalars of numpy
        if (const py::object item = value.attr("item")();
            PyBool_Check(item.ptr()) || PyLong_Check(item.ptr()) || PyFloat_Check(item.ptr()))
            return scalarOf(item);
    throw py::type_error("a value is a bool, an int or a float, not " +
                         py::cast<std::string>(py::str(py::type::of(value).attr("__name__"))));
}

VT::SymbolicValue valueOf(py::handle value) {
    if (!PyList_Check(value.ptr()) && !PyTuple_Check(value.ptr()))
        return scalarOf(value);
    VT::SymbolicValue::Elements elements;
    for (const py::handle element : value)
        elements.push_back(scalarOf(element));
    return elements;
}

py::object objectOf(const VT::SymbolicScalar& scalar) {
    switch (scalar.type()) {
    case VT::ScalarType::Bool:
        return py::bool_(scalar.getBool());
    case VT::ScalarType::Int:
        return py::int_(scalar.getInt());
    default:
        return py::float_(scalar.getDouble());
    }
}

py::object objectOf(const VT::SymbolicValue& value) {
    if (!value.isVector())
        return objectOf(value.scalar());
    py::list list;
    for (const VT::SymbolicScalar& element : value.elements())
        list.append(objectOf(element));
    return list;
}

VT::ValueColumn::Type columnType(const std::string& name, const py::buffer_info& column) {
    using enum VT::ValueColumn::Type;
    const std::string format = column.format.substr(column.format.find_first_not_of("@=<"));
    const bool isNative = std::endian::native == std::endian::little || column.format.front() != '<';
    if (isNative && format == "?")
        return Bool;
    if (isNative && format == "d")
        return Double;
    if (isNative && format.size() == 1 && std::string("ilq").find(format) != std::string::npos)
        return column.itemsize == 4 ? Int32 : Int64;
    throw py::type_error("the column " + name + " holds values of format '" + column.format +
                         "': convert it to bool, int32, int64 or float64");
}

/// An expression ready for evaluation, of a table that lives as long.
class Prepared {
public:
    Prepared(std::shared_ptr<Table> table, SymbolicExprId id);

    [[nodiscard]] py::dict slots() const { return slots_; }

    py::object run(const py::dict& values);
    py::array runMany(const py::dict& columns);

private:
    static VT::PreparedExpr prepare(Table& table, SymbolicExprId id);
    [[noreturn]] void throwUnset(const std::vector<bool>& isSet) const;

    std::shared_ptr<Table> table_;
    VT::PreparedExpr expression_;
    std::vector<std::string> names_; ///< by slot
    py::dict slots_;                 ///< by name
};

VT::PreparedExpr Prepared::prepare(Table& table, SymbolicExprId id) {
    const Lengthy use(table);
    const SymbolicExprId inC = VT::SymbolicExprQ2C(table.nodes())(table.checked(id));
    return VT::SymbolicExprEval(table.nodes()).prepare(VT::SymbolicExprDimensionLists(table.nodes())(inC));
}

Prepared::Prepared(std::shared_ptr<Table> table, SymbolicExprId id)
    : table_(std::move(table)),
      expression_(prepare(*table_, id)) {
    {
        const Lengthy use(*table_);
        const VT::SymbolicExprPrinter printer(table_->nodes(), false);
        for (std::size_t slot = 0; slot < expression_.slotCount(); ++slot)
            names_.push_back(printer(expression_.symbol(slot)));
    }
    for (std::size_t slot = 0; slot < names_.size(); ++slot)
        slots_[py::str(names_[slot])] = slot;
}

void Prepared::throwUnset(const std::vector<bool>& isSet) const {
    for (std::size_t slot = 0; slot < names_.size(); ++slot)
        if (!isSet[slot])
            throw vtsvCreateDiagnostic("Vantor:SymbolicDims:UnboundSymbol", {names_[slot]}, {});
    throw std::logic_error("every slot has a value");
}

py::object Prepared::run(const py::dict& values) {
    // Converted before the table is used: an object of Python may ask it in turn.
    std::vector<std::pair<std::size_t, VT::SymbolicValue>> given;
    given.reserve(names_.size());
    std::vector<bool> isSet(names_.size());
    for (const auto& [name, slot] : slots_)
        if (PyObject* const value = PyDict_GetItemWithError(values.ptr(), name.ptr()); value != nullptr) {
            given.emplace_back(PyLong_AsSize_t(slot.ptr()), valueOf(value));
            isSet[given.back().first] = true;
        }
    if (given.size() != names_.size())
        throwUnset(isSet);
    VT::SymbolicValue result = false;
    {
        const Brief use(*table_);
        for (const auto& [slot, value] : given)
            expression_.set(slot, value);
        result = expression_.run();
    }
    return objectOf(result);
}

py::array Prepared::runMany(const py::dict& columns) {
    std::vector<py::buffer_info> buffers; // held until the end
    std::vector<VT::ValueColumn> read;
    std::vector<std::pair<std::size_t, VT::SymbolicValue>> constants;
    std::vector<bool> isSet(names_.size());
    std::optional<std::size_t> rows;
    for (const auto& [key, value] : columns) {
        const std::string name = py::cast<std::string>(key);
        const bool isUsed = slots_.contains(key);
        const std::size_t slot = isUsed ? py::cast<std::size_t>(slots_[key]) : 0;
        if (isUsed)
            isSet[slot] = true;
        const bool isColumn = PyObject_CheckBuffer(value.ptr()) != 0 &&
                              (!py::hasattr(value, "ndim") || py::cast<int>(value.attr("ndim")) != 0);
        if (!isColumn) {
            if (isUsed)
                constants.emplace_back(slot, scalarOf(value));
            continue;
        }
        buffers.push_back(py::reinterpret_borrow<py::buffer>(value).request());
        const py::buffer_info& buffer = buffers.back();
        if (buffer.ndim != 1)
            throw py::value_error("the column " + name + " has " + std::to_string(buffer.ndim) + " dimensions, not 1");
        const auto size = static_cast<std::size_t>(buffer.shape[0]);
        if (rows && *rows != size)
            throw py::value_error("the column " + name + " has " + std::to_string(size) + " rows, another one has " +
                                  std::to_string(*rows));
        rows = size;
        if (isUsed)
            read.push_back({slot, columnType(name, buffer), buffer.ptr, buffer.strides[0]});
    }
    if (!rows)
        throw py::value_error("there is no column: give at least one array");
    if (std::find(isSet.begin(), isSet.end(), false) != isSet.end())
        throwUnset(isSet);
    py::array result;
    const Lengthy use(*table_);
    for (const auto& [slot, value] : constants)
        expression_.set(slot, value);
    expression_.runMany(read, *rows, [&](VT::ScalarType type) -> void* {
        const py::gil_scoped_acquire python;
        if (type == VT::ScalarType::Bool)
            result = py::array_t<bool>(static_cast<py::ssize_t>(*rows));
        else if (type == VT::ScalarType::Int)
            result = py::array_t<std::int32_t>(static_cast<py::ssize_t>(*rows));
        else
            result = py::array_t<double>(static_cast<py::ssize_t>(*rows));
        return result.mutable_data();
    });
    return result;
}

} // namespace

void addEvaluation(py::module_& module, TableClass& table) {
    py::class_<Prepared>(module, "Prepared")
        .def("slots", &Prepared::slots)
        .def("run", &Prepared::run, py::arg("values"))
        .def("run_many", &Prepared::runMany, py::arg("columns"));
    table.def(
        "prepare", [](std::shared_ptr<Table> self, SymbolicExprId id) { return Prepared(std::move(self), id); },
        py::arg("id"));
}

} // namespace vtsym::python
