// Prints doubles with the digits that read back as the same value, in text as in JSON.
// Numbers that JSON lacks are quoted there.
#include "tools/vtsym/answers/ValueText.hpp"

#include "tools/vtsym/io/Json.hpp"

namespace vtsym {

namespace {

/// A scalar as text or as JSON.
std::string scalarText(const VT::SymbolicScalar& scalar, bool json) {
    switch (scalar.type()) {
    case VT::ScalarType::Bool:
        return scalar.getBool() ? "true" : "false";
    case VT::ScalarType::Int:
        return std::to_string(scalar.getInt());
    default:
        break;
    }
    std::string text = jsonNumber(scalar.getDouble());
    if (!json && text.starts_with('"'))
        text = text.substr(1, text.size() - 2);
    return text;
}

} // namespace

std::string valueText(const VT::SymbolicValue& value, bool json) {
    if (!value.isVector())
        return scalarText(value.scalar(), json);
    std::string text = "[";
    for (const VT::SymbolicScalar& element : value.elements())
        text.append(text.size() > 1 ? "," : "").append(scalarText(element, json));
    return text + "]";
}

std::string_view typeText(const VT::SymbolicValue& value) {
    constexpr std::string_view names[] = {"bool", "int", "double"};
    return value.isVector() ? "vector" : names[value.scalar().index()];
}

} // namespace vtsym
