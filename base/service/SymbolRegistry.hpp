// Names for the dimension expressions of blocks.
#pragma once

#include "base/print/ExpressionPrinter.hpp"
#include "base/simplify/Simplify.hpp"
#include "host/Model.hpp"

#include <boost/unordered_map.hpp>
#include <boost/unordered_set.hpp>

#include <string>
#include <vector>

namespace VT {

/// Gives the dimension expressions of blocks identifiers.  Only the address of a block is used.
///
/// An expression is simplified and printed as C text.  A text that is an identifier is used as it is; any other one
/// becomes `dim_` followed by the text with _ written as __ and all but letters and digits as _xx, in hexadecimal:
/// `N*2+1` is `dim_N_2a2_2b1`.  Where that is longer than 63 characters, which C compilers need not distinguish, it is
/// `dimx_`, the beginning and a hash of the whole text.  So an identifier is the same in every run, and two texts never
/// share one.
///
/// Used by one thread at a time.
class VTSYM_API SymbolRegistry {
public:
    /// `table` outlives the registry.
    explicit SymbolRegistry(SymbolicExprTable& table);
    SymbolRegistry(const SymbolRegistry&) = delete;
    SymbolRegistry& operator=(const SymbolRegistry&) = delete;

    /// Registers an expression for a block and returns its identifier, which has the expression's text, in parentheses
    /// where it needs them, as its alias in the table.  The same expression again, or another one with the same
    /// simplified text, returns the same identifier.  Returns the empty text for an identifier that is not of the
    /// table.
    ///
    /// Linear in the size of the expression.  When memory runs out or the text is beyond the printer's bound, the
    /// exception passes and the block has registered what it had.
    std::string registerExpression(const VTBlock* block, SymbolicExprId expression);

    /// The identifiers that a block has registered, each once, in order.
    [[nodiscard]] std::vector<std::string> registeredBy(const VTBlock* block) const;
    /// Forgets what a block has registered; identifiers keep their expressions.  To be called when the block is gone.
    void forgetBlock(const VTBlock* block);

    /// The simplified expression of an identifier; the invalid identifier for one that is not registered.
    [[nodiscard]] SymbolicExprId expressionOf(const std::string& identifier) const;

    /// Records an alias of an identifier in the table, that of a negative literal in parentheses; the first alias
    /// stays.
    void insertAlias(const std::string& identifier, const std::string& alias);
    /// The alias of an identifier, or the empty text.
    [[nodiscard]] std::string aliasOf(const std::string& identifier) const;

private:
    std::string identifierOf(const std::string& text) const;

    struct Entry {
        std::string text;
        SymbolicExprId expression;
    };

    struct Registered {
        std::vector<std::string> inOrder;
        boost::unordered_set<std::string> all;
    };

    SymbolicExprTable& table_;
    SymbolicExprSimplify simplifier_;
    SymbolicExprPrinter printer_;
    boost::unordered_map<std::string, Entry> entries_; ///< by identifier
    boost::unordered_map<const VTBlock*, Registered> blocks_;
};

} // namespace VT
