// Shortened conditions in the words of their author.
#pragma once

#include "base/scan/DirectiveCondition.hpp"

#include <functional>
#include <optional>
#include <span>
#include <string>

namespace VT {

/// Returns the text of a part of a condition that is not a chain of && or ||: as it is written in the tokens, or a
/// comparison or a question in ordinary spelling.  Nothing where the part has no such text.
std::optional<std::string> partText(const SymbolicExprTable& table, const MacroUnknowns& unknowns,
                                    const std::vector<PartSpelling>& spellings, std::span<const DirectiveToken> tokens,
                                    SymbolicExprId part);

/// Returns the text of the opposite of a part: "!A", "!(A + B)".
std::string negatedText(const std::string& text);

/// Returns the text of a part of a condition, or of its opposite; nothing where it has none.
using PartText = std::function<std::optional<std::string>(SymbolicExprId part, bool isNegated)>;

/// How chains are written.
struct ChainStyle {
    bool bracketed = false;   ///< && is in parentheses between ||
    bool withoutNots = false; ///< a negated chain is the other one, of negated parts
};

/// Returns the text of chains of && and ||, with the parts that they join as `textOf` writes them; nothing where one
/// has no text.  A negated part is handed over as it is.
std::optional<std::string> chainText(const SymbolicExprTable& table, SymbolicExprId condition, ChainStyle style,
                                     const PartText& textOf);

/// Returns the text of `proposal`, which was made from parts of `condition`: the parts as they are written in its
/// tokens, and further comparisons in ordinary spelling.  Nothing where a part has no such text.
std::optional<std::string> proposalText(const SymbolicExprTable& table, const MacroUnknowns& unknowns,
                                        const DirectiveCondition& condition, std::span<const DirectiveToken> tokens,
                                        SymbolicExprId proposal);

} // namespace VT
