// The operators of directives' conditions.
#pragma once

#include "base/core/Operators.hpp"
#include "base/scan/DirectiveReader.hpp"

namespace VT {

/// How loosely an open parenthesis binds: no operator goes beyond it.
inline constexpr std::uint8_t loosestPrecedence = 255;

/// Returns the infix operator of a token, alternative spellings included; None for other tokens.
SymbolicOp infixOf(const DirectiveToken& token);

/// Returns the operator of a prefix; Plus for a plus, None for other tokens.
SymbolicOp prefixOf(const DirectiveToken& token);

} // namespace VT
