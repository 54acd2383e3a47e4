// The condition grammar, hidden from everyone but the parser: its implementation is expensive to compile.
#pragma once

#include "parser/SyntaxValue.hpp"

#include <cstddef>
#include <optional>
#include <string_view>

namespace VT::Parser {

/// Which texts are conditions.
struct GrammarOptions {
    bool cOperators = true;       ///< ~ is the complement and ~= no operator
    bool variantKeywords = false; ///< (sim) and (codegen) are operands
};

struct SyntaxResult {
    std::optional<expression_ast> value; ///< nothing where the text is no complete expression
    std::size_t stop = 0;                ///< where reading stopped, in bytes from the start of the text
};

/// Reads a whole text.  The value refers to `text` and to parts in `arena`.  Linear in the length of the text; the
/// depth of the stack is bounded by limits::nesting.  Throws std::bad_alloc only.
SyntaxResult readCondition(std::string_view text, const GrammarOptions& options, SyntaxArena& arena);

} // namespace VT::Parser
