// The line editor where there is no terminal: a prompt that ends at once.
// The program asks for one only on a terminal, which neither a page nor a module has.
#include "tools/vtsym/io/LineEditor.hpp"

namespace vtsym {

struct LineEditor::State {};

LineEditor::LineEditor(std::string, std::function<const std::set<std::string>&()>) {}

LineEditor::~LineEditor() = default;

std::optional<std::string> LineEditor::read() { // NOLINT(readability-convert-member-functions-to-static)
    return std::nullopt;
}

} // namespace vtsym
