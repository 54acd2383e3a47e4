// Parses conditions.  The quick reader reads ordinary ones; what it leaves, the grammar reads to a syntax value, which
// is then interned.  A text that is refused interns nothing, and is read twice: only the grammar says where it stops.
// Linear in the text.
#include "parser/SymbolicExprParser.hpp"

#include "base/variants/VariantKeywords.hpp"
#include "host/Diagnostics.hpp"
#include "parser/ConditionGrammar.hpp"
#include "parser/QuickReader.hpp"
#include "parser/SyntaxConverter.hpp"

#include <utility>

namespace VT {

namespace {

[[noreturn]] void throwParseError(const std::string& text, std::size_t offset) {
    std::string pointer(offset + 1, ' ');
    pointer += '^';
    vtsvThrowIExceptionFromDiagnostic(
        vtsvCreateDiagnostic("Vantor:Variants:ExpressionParseError", {text, std::move(pointer)}, "", offset));
}

} // namespace

SymbolicExprId SymbolicExprParser::operator()(const std::string& text) {
    const bool keywords = allowVariantKeywords_ && isVariantKeywordsSimCodegenFeatureOn();
    const Parser::GrammarOptions options{cOperatorMode_, keywords};
    if (const SymbolicExprId id = Parser::QuickReader(table_, options).read(text); id != invalidId)
        return id;
    Parser::SyntaxArena arena;
    const Parser::SyntaxResult result = Parser::readCondition(text, options, arena);
    if (!result.value)
        throwParseError(text, result.stop);
    return Parser::convertSyntax(table_, *result.value, cOperatorMode_);
}

} // namespace VT
