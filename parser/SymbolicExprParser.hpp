// Conditions and dimension expressions in C-like text become nodes.
#pragma once

#include "base/core/Node.hpp"

#include <string>

namespace VT {

/// Parses text such as `Mode == 1 && Gear > 2`, `N*2+1` or `(sim)` into one interned expression.
///
/// Operators from the loosest to the tightest, all infix ones associating to the left:
///
///     ||   &&   |   ^   &   == !=   <= < >= >   >> <<   + -   * / %   prefix - + ! ~
///
/// Operands are names, integer literals of 32 bits, real literals (which need a decimal point: `5.`, `.5`, `1.0e3`),
/// calls `f(a, b)`, members `a.b.c`, lists `[a, b]` and expressions in parentheses.  A sign directly before the digits
/// of an operand belongs to the literal: `-5` is a literal, `- 5` a negation.  Letters, digits and blanks are those of
/// ASCII.
///
/// A parser keeps nothing from text to text except the nodes in its table.  It is used by one thread at a time.
class VTSYM_API SymbolicExprParser {
public:
    /// Parses into `table`, which must outlive the parser.
    ///
    /// With `cOperatorMode`, ~ is the bitwise complement; without, ~ is the logical not and ~= a second spelling of !=.
    /// With `allowVariantKeywords`, and while the feature flag VariantKeywordsSimCodegen is above 0, (sim) and
    /// (codegen) are operands of that text; otherwise they are names in parentheses.
    SymbolicExprParser(SymbolicExprTable& table, bool cOperatorMode, bool allowVariantKeywords)
        : table_(table),
          cOperatorMode_(cOperatorMode),
          allowVariantKeywords_(allowVariantKeywords) {}

    /// Parses a whole text and returns the identifier of its expression.
    ///
    /// Text that is not one complete expression is thrown as the host diagnostic "Vantor:Variants:ExpressionParseError"
    /// with two arguments, the text and a line of blanks that points below it with ^, and with the byte offset of the
    /// place: where the rules stop, after blanks, or the first digit of an integer literal beyond 32 bits, or
    /// the bracket or prefix operator beyond limits::nesting.  Nothing is interned for such a text.
    ///
    /// Linear in the length of the text.  When memory runs out, std::bad_alloc passes and nodes of the text may stay
    /// interned.
    SymbolicExprId operator()(const std::string& text);

private:
    SymbolicExprTable& table_;
    bool cOperatorMode_;
    bool allowVariantKeywords_;
};

} // namespace VT
