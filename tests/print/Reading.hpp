// What a printed text says, found without the printer's knowledge: an independent reader, and the same notation for
// trees.
#pragma once

#include "tests/support/AnyNode.hpp"

#include <random>
#include <string>
#include <string_view>

namespace VT::Testing {

enum class Language : bool { C, Quill };

/// A text with every operation in parentheses, read by the language's own levels of operators.  A negative literal and
/// a minus before a literal are the same.  Throws std::runtime_error for a text that is none.
std::string readingOf(std::string_view text, Language language);

/// A tree in the same notation; in Quill, C's own operators as the calls that the conversion makes of them.
std::string meaningOf(SymbolicExprTable& table, SymbolicExprId id, Language language);

/// Whether trees of an operator can be written in a language so that they read back.
bool isWritten(SymbolicOp op, Language language);

/// A random tree of the operators that are written in a language.
SymbolicExprId randomTree(SymbolicExprTable& table, Language language, std::mt19937& random, int depth);

} // namespace VT::Testing
