// Reading, combining, rewriting and printing.
//
// Combining is brief and keeps Python's lock, everything else lets other threads run.
#include "base/core/Make.hpp"
#include "base/print/PreprocessorVCExpr.hpp"
#include "base/service/VCSymbols.hpp"
#include "base/simplify/Simplify.hpp"
#include "base/transform/Cast2Int.hpp"
#include "base/transform/FactorDivision.hpp"
#include "base/transform/QuillConversion.hpp"
#include "base/transform/Replacement.hpp"
#include "host/Diagnostics.hpp"
#include "parser/QuillConverter.hpp"
#include "python/src/Bindings.hpp"
#include "tools/vtsym/answers/TreeWriters.hpp"

#include <pybind11/stl.h>

#include <unordered_map>
#include <unordered_set>

namespace vtsym::python {

namespace {

/// What combining, and making literals, returns instead of an identifier where the table is full.
constexpr std::int64_t full = -1;

std::int64_t numberOf(SymbolicExprId id) {
    return static_cast<std::int64_t>(id);
}

/// Runs `read` on a text without Python's lock; its diagnostics become parse errors.
template <class Read>
SymbolicExprId reading(Table& table, const std::string& text, Read read) {
    std::optional<VT::HostDiagnostic> refused;
    {
        const Lengthy use(table);
        try {
            return read();
        } catch (const VT::HostDiagnostic& diagnostic) {
            refused = diagnostic;
        }
    }
    throwParseError(*refused, text);
}

std::int64_t parse(Table& table, const std::string& text, bool isQuill) {
    return numberOf(
        reading(table, text, [&] { return isQuill ? table.service().parseQ(text) : table.service().parseC(text); }));
}

/// Dimension expressions in Quill, with integers for their numbers.
std::int64_t parseDimension(Table& table, const std::string& text) {
    return numberOf(reading(table, text, [&] {
        VT::VTSymbolicExprErrorChecker checker;
        const SymbolicExprId id = VT::SymbolicExprFromQParseTree(table.nodes(), checker)(text);
        if (!checker.diagnostics().empty())
            throw VT::HostDiagnostic(checker.diagnostics().front());
        return VT::SymbolicExprCast2Int(table.nodes()).cast2Int(id);
    }));
}

/// A name, or the path of a member.  Throws what parsing throws, and std::invalid_argument for other text.
std::int64_t symbol(Table& table, const std::string& name) {
    const SymbolicExprId id = reading(table, name, [&] { return table.service().parseC(name); });
    const Brief use(table);
    const VT::SymbolicOp op = table.nodes().get(id)->op();
    const bool isTruth = id == table.nodes().getIdTRUE() || id == table.nodes().getIdFALSE();
    if (isTruth || (op != VT::SymbolicOp::String && op != VT::SymbolicOp::MemberValue))
        throw std::invalid_argument("not a name: " + name);
    return numberOf(id);
}

template <class Node, class Value>
std::int64_t literal(Table& table, Value value) {
    const Brief use(table);
    return table.isFull() ? full : numberOf(Node(table.nodes(), value).getId(table.nodes()));
}

/// One node; the service decides what constants do to conditions.
std::int64_t combine(Table& table, unsigned op, SymbolicExprId a, SymbolicExprId b) {
    const Brief use(table);
    if (table.isFull())
        return full;
    const auto code = static_cast<VT::SymbolicOp>(op);
    static_cast<void>(table.checked(a));
    static_cast<void>(table.checked(b));
    if (code == VT::SymbolicOp::And)
        return numberOf(table.service().AND(a, b, false).id());
    if (code == VT::SymbolicOp::Or)
        return numberOf(table.service().OR(a, b, false).id());
    if (code == VT::SymbolicOp::Not)
        return numberOf(table.service().NOT(a, false).id());
    if (!VT::symbolOps.contains(code))
        throw std::invalid_argument("not an operator");
    const bool isUnary = code == VT::SymbolicOp::UnaryMinus || code == VT::SymbolicOp::BitCompl;
    return numberOf(table.checked(isUnary ? makeUnary(table.nodes(), code, a) : makeBinary(table.nodes(), code, a, b)));
}

std::string print(Table& table, SymbolicExprId id, const std::string& language) {
    const Lengthy use(table);
    static_cast<void>(table.checked(id));
    if (language == "pp")
        return VT::PreprocessorVCExpr(table.nodes(), false, true).print(VT::SymbolicExprQ2C(table.nodes())(id));
    std::string text =
        language == "quill" ? table.service().printQExprWithConversion(id) : table.service().printCExpr(id);
    return text.empty() ? "true" : text;
}

/// Names and members, as they are written, in the order of their first occurrence.
std::vector<std::string> symbols(Table& table, SymbolicExprId id) {
    using enum VT::VCSymbolType;
    const Lengthy use(table);
    std::vector<std::string> all;
    table.service().getSymbolsFromExpression(table.checked(id), all, {Identifier, BoundMember, UnboundMember});
    std::unordered_set<std::string> seen{"true", "false"};
    std::erase_if(all, [&](const std::string& name) { return !seen.insert(name).second; });
    return all;
}

SymbolicExprId replace(Table& table, SymbolicExprId id, const VT::SymbolicExprReplacements& replacements) {
    const Lengthy use(table);
    static_cast<void>(table.checked(id));
    for (const auto& [from, to] : replacements)
        static_cast<void>(table.checked(from) + table.checked(to));
    const auto whole = replacements.find(id); // the root is no operand
    return whole != replacements.end() ? whole->second : VT::SymbolicExprReplacement(table.nodes(), replacements)(id);
}

SymbolicExprId given(Table& table, SymbolicExprId condition, SymbolicExprId known) {
    const Lengthy use(table);
    return table.service().getImpliedCondition(table.checked(condition), table.checked(known)).id();
}

SymbolicExprId factored(Table& table, SymbolicExprId id) {
    const Lengthy use(table);
    return VT::SymbolicExprFactorDivision(table.nodes()).factorDivision(table.checked(id));
}

std::string tree(Table& table, SymbolicExprId id) {
    const Lengthy use(table);
    std::string drawing;
    appendDrawing(table.nodes(), table.checked(id), Style(false), drawing);
    return drawing;
}

} // namespace

void addConditions(TableClass& table) {
    table.def("parse", &parse, py::arg("text"), py::arg("is_quill"))
        .def("parse_dimension", &parseDimension, py::arg("text"))
        .def("symbol", &symbol, py::arg("name"))
        .def("combine", &combine, py::arg("op"), py::arg("a"), py::arg("b"))
        .def(
            "integer", [](Table& self, int value) { return literal<VT::SymbolicIntValue>(self, value); },
            py::arg("value"))
        .def(
            "real", [](Table& self, double value) { return literal<VT::SymbolicDoubleValue>(self, value); },
            py::arg("value"))
        .def(
            "truth",
            [](Table& self, bool value) {
                const Brief use(self);
                return value ? self.nodes().getIdTRUE() : self.nodes().getIdFALSE();
            },
            py::arg("value"))
        .def(
            "simplify",
            [](Table& self, SymbolicExprId id) {
                const Lengthy use(self);
                return self.service().simplify(self.checked(id), false).id();
            },
            py::arg("id"))
        .def(
            "shortest",
            [](Table& self, SymbolicExprId id) {
                const Lengthy use(self);
                return self.service().shortestCondition(self.checked(id), false).id();
            },
            py::arg("id"))
        .def("given", &given, py::arg("id"), py::arg("known"))
        .def("factored", &factored, py::arg("id"))
        .def("replace", &replace, py::arg("id"), py::arg("replacements"))
        .def("print", &print, py::arg("id"), py::arg("language"))
        .def("symbols", &symbols, py::arg("id"))
        .def("tree", &tree, py::arg("id"));
}

} // namespace vtsym::python
