// Directives as findings quote them.
#pragma once

#include "base/scan/DirectiveReader.hpp"

#include <string>
#include <string_view>

namespace VT {

/// Whether a directive's condition is an expression rather than a name.
bool isExpression(DirectiveKind kind);
/// Whether it begins a chain of branches; whether it goes on with the next branch of one.
bool opensChain(DirectiveKind kind);
bool continuesChain(DirectiveKind kind);
/// Whether it begins, continues or ends a chain; only a chain that was begun is continued or ended.
bool belongsToChain(DirectiveKind kind, bool isBegun);

/// The keyword of a directive that begins a branch: "#elif".
std::string_view keywordText(DirectiveKind kind);
/// The keyword and the condition: "#elifdef A".  Linear in the tokens.
std::string directiveText(const Directive& directive);
/// The condition: "defined(A)".  The directive has tokens.
std::string conditionText(const Directive& directive);
/// A directive as a reason quotes it: cut beyond limits::quotedBytes.
std::string quotedDirective(std::string text);

} // namespace VT
