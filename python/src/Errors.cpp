// Turns the library's errors into the exceptions of vtsym.errors.
//
// The classes are Python's: they are looked up when the first error is raised, by when the package is loaded.
#include "host/Diagnostics.hpp"
#include "host/embedded/ModelFile.hpp"
#include "python/src/Bindings.hpp"
#include "tools/vtsym/io/ErrorText.hpp"
#include "tools/vtsym/io/Files.hpp"

#include <algorithm>

namespace vtsym::python {

namespace {

template <class... Arguments>
void raise(const char* name, Arguments&&... arguments) {
    const py::object type = py::module_::import("vtsym.errors").attr(name);
    const py::object error = type(std::forward<Arguments>(arguments)...);
    PyErr_SetObject(type.ptr(), error.ptr());
}

/// Characters before a byte of a text, which is how Python counts.
std::size_t charactersBefore(const std::string& text, std::size_t offset) {
    const auto end = text.begin() + static_cast<std::ptrdiff_t>(std::min(offset, text.size()));
    return static_cast<std::size_t>(
        std::count_if(text.begin(), end, [](char c) { return (static_cast<unsigned char>(c) & 0xc0U) != 0x80U; }));
}

} // namespace

void throwParseError(const VT::HostDiagnostic& diagnostic, const std::string& text) {
    py::object offset = py::none();
    std::string caret;
    if (diagnostic.offset()) {
        offset = py::int_(charactersBefore(text, *diagnostic.offset()));
        caret = withCaret(text, *diagnostic.offset(), Style(false));
        caret.pop_back(); // the end of the line
    }
    raise("ParseError", diagnostic.what(), diagnostic.messageId(), text, offset, caret);
    throw py::error_already_set();
}

void addErrors(py::module_&) {
    py::register_exception_translator([](std::exception_ptr error) {
        try {
            std::rethrow_exception(error);
        } catch (const VT::HostDiagnostic& diagnostic) {
            raise("EvaluationError", diagnostic.what(), diagnostic.messageId());
        } catch (const VT::Embedded::ModelError& wrong) {
            raise("ModelError", wrong.what(), wrong.place().line, wrong.place().column);
        } catch (const FileError& wrong) {
            raise("SourceError", wrong.what());
        } catch (const std::range_error& wrong) {
            PyErr_SetString(PyExc_OverflowError, wrong.what());
        }
    });
}

} // namespace vtsym::python
