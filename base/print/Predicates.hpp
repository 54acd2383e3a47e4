// Predicates that replace identifiers by their aliases on output.
#pragma once

#include "base/print/ExpressionPrinter.hpp"

namespace VT {

/// Prints an identifier as its alias in a table, or as its name where it has none.  An alias is printed as it is
/// stored, in any operand's place: an alias that is an expression carries its own parentheses.
class VTSYM_API SymbolicExprAliasPrinterPredicate : public SymbolicExprPrinter::Predicate {
public:
    /// `aliases` outlives the predicate.
    explicit SymbolicExprAliasPrinterPredicate(const SymbolicExprTable& aliases) : aliases_(&aliases) {}

    [[nodiscard]] std::string printIdentifier(const SymbolicString& node) const override;
    /// The number of aliases.
    [[nodiscard]] std::uint64_t version() const override;

private:
    const SymbolicExprTable* aliases_;
};

/// The same for the parameters of inlined variants.
class VTSYM_API InlineVariantParameterAliasPrinterPredicate : public SymbolicExprPrinter::Predicate {
public:
    /// `aliases` outlives the predicate.
    explicit InlineVariantParameterAliasPrinterPredicate(const SymbolicExprTable& aliases) : aliases_(&aliases) {}

    [[nodiscard]] std::string printIdentifier(const SymbolicString& node) const override;
    /// The number of aliases.
    [[nodiscard]] std::uint64_t version() const override;

private:
    const SymbolicExprTable* aliases_;
};

} // namespace VT
