// The tokens of the parse-tree converter: names, the values that a validator knows for them, and numbers.
//
// Every refusal goes through one report operation.  Linear in the token, or in the elements of a name's value.
#include "parser/QuillConverter.hpp"
#include "parser/QuillNumber.hpp"

#include <algorithm>
#include <cmath>

namespace VT {

SymbolicExprId SymbolicExprFromQParseTree::visitTerminal(const ParseTree& node, const char* text) {
    switch (static_cast<QuillToken>(node.code)) {
    case QuillToken::Identifier:
        return resolveIdentifier(textOf(node), text, checker_.getNodeStartIdx(node));
    case QuillToken::Number:
        return getNumberFromString(textOf(node), text, checker_.getNodeStartIdx(node));
    default:
        return refuse(node, text);
    }
}

SymbolicExprId SymbolicExprFromQParseTree::resolveIdentifier(const std::string& name, const char* text,
                                                             std::size_t position) {
    if (validator_ == nullptr)
        return factory_.make<SymbolicString>(name);
    const SymbolMeaning meaning = validator_->resolveSymbol(name, text, position);
    if (std::holds_alternative<SymbolName>(meaning))
        return factory_.make<SymbolicString>(name);
    if (const auto* array = std::get_if<QxArray>(&meaning))
        return getNumberFromQxArray(*array, name, text, position);
    reportUnsupportedValue(name, text, position);
    return invalidId;
}

SymbolicExprId SymbolicExprFromQParseTree::getNumberFromQxArray(const QxArray& array, const std::string& name,
                                                                const char* text, std::size_t position) {
    const std::size_t size = array.elements.size();
    const bool isScalar = size == 1 && std::ranges::all_of(array.dimensions, [](std::size_t n) { return n == 1; });
    const bool isRow = size > 1 && array.dimensions == std::vector<std::size_t>{1, size};
    if (array.type == QxArray::Type::Other)
        reportUnsupportedValue(name, text, position);
    else if (array.complex)
        reportComplexValue(name, text, position);
    else if (array.type == QxArray::Type::Logical && !supportLogicalValues())
        reportLogicalValue(name, text, position);
    else if (isScalar)
        return getNumberFromValue(array.elements.front(), name, text, position, false);
    else if (!isRow)
        reportNonScalarValue(name, text, position);
    else {
        std::vector<SymbolicExprId> numbers;
        numbers.reserve(size);
        for (const double element : array.elements) {
            numbers.push_back(getNumberFromValue(element, name, text, position, false));
            if (numbers.back() == invalidId)
                return invalidId;
        }
        return dimensions(numbers);
    }
    return invalidId;
}

SymbolicExprId SymbolicExprFromQParseTree::getNumberFromString(const std::string& literal, const char* text,
                                                               std::size_t position) {
    const ParsedNumber number = quillNumber(literal);
    switch (number.error) {
    case NumberError::Syntax:
        reportInvalidLiteralValue(literal, text, position);
        return invalidId;
    case NumberError::Overflow:
        reportDiagnostic(
            symbolicDimsDiagnostic("UnsupportedLiteralValue", {literal, checker_.wholeText(text)}, position));
        return invalidId;
    case NumberError::None:
        break;
    }
    return getNumberFromValue(number.value, literal, text, position, true);
}

SymbolicExprId SymbolicExprFromQParseTree::getNumberFromValue(double value, const std::string& literal,
                                                              const char* text, std::size_t position, bool isLiteral) {
    const bool integerOnly = supportIntegerOnly();
    if (!integerOnly && !shouldCreateIntValueNodeForIntegerValue())
        return factory_.make<SymbolicDoubleValue>(value);
    const bool integral = std::isfinite(value) && value == std::trunc(value);
    if (integral && value > -2147483649.0 && value < 2147483648.0)
        return factory_.make<SymbolicIntValue>(static_cast<int>(value));
    if (!integerOnly)
        return factory_.make<SymbolicDoubleValue>(value);
    if (integral)
        reportDiagnostic(symbolicDimsDiagnostic("IntegerOverflow", {literal, checker_.wholeText(text)}, position));
    else if (isLiteral)
        reportNonIntegerLiteralValue(literal, text, position);
    else
        reportNonIntegerValue(literal, text, position);
    return invalidId;
}

} // namespace VT
