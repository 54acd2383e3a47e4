// The condition grammar.  Only the parser includes this; the implementation, expensive to compile, is in one source
// file.
#pragma once

#include "parser/SyntaxValue.hpp"

#include <cstddef>
#include <optional>
#include <string_view>

namespace VT::Parser {

/// The variants of the language.
struct GrammarOptions {
    bool cOperators = true;       ///< ~ is the complement, and ~= is not an operator
    bool variantKeywords = false; ///< (sim) and (codegen) are operands
};

/// The result of reading a text.
struct SyntaxResult {
    std::optional<expression_ast> value; ///< nothing where the text is not one complete expression
    std::size_t stop = 0;                ///< where reading stopped, in bytes from the start of the text
};

/// Reads a whole text.  The value refers to `text` and to parts in `arena`.  Linear in the length of the text; the
/// depth of the stack is bounded by limits::nesting.  Throws std::bad_alloc only.
SyntaxResult readCondition(std::string_view text, const GrammarOptions& options, SyntaxArena& arena);

} // namespace VT::Parser
