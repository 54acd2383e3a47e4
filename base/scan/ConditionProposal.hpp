// Shortened conditions in the words of their author.
#pragma once

#include "base/scan/DirectiveCondition.hpp"

#include <optional>
#include <span>
#include <string>

namespace VT {

/// The text of a condition that was made from parts of another one, which is given with its tokens: the parts as they
/// are written there, and further comparisons in ordinary spelling.  Nothing where there is no such text.
std::optional<std::string> proposalText(const SymbolicExprTable& table, const MacroUnknowns& unknowns,
                                        const DirectiveCondition& condition, std::span<const DirectiveToken> tokens,
                                        SymbolicExprId proposal);

} // namespace VT
