// And and Or chains, and the negation of one.
#pragma once

#include "base/simplify/RuleContext.hpp"

namespace VT {

/// Whether the And or Or chain rooted at a node has at most so many distinct operands.  Linear in the distinct nodes of
/// the chain up to the one that is too many.
bool chainIsWithin(const SymbolicExprTable& table, const SymbolicExpr& root, std::uint64_t limit);

/// Simplifies the And or Or chain rooted at a node, whose operands are simplified already: to a truth constant, an
/// operand or a sum of products in the order of texts.  Gives up, and returns the chain unchanged, where the operand
/// limit is exceeded.
SymbolicExprId simplifyChain(RuleContext& context, SymbolicExprId root);

/// The negation of an And or Or chain by De Morgan's laws as a sum of products; the invalid identifier where it gives
/// up.
SymbolicExprId negateChain(RuleContext& context, SymbolicExprId root);

} // namespace VT
