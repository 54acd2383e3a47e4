// Replaces operands of an expression by other expressions.
#pragma once

#include "base/transform/XForm.hpp"

#include <unordered_map>

namespace VT {

/// Operands and their replacements; identifiers of the table that is built in.
using SymbolicExprReplacements = std::unordered_map<SymbolicExprId, SymbolicExprId>;

/// Rebuilds an expression and replaces operands on the way: those of operators, ranges and rows, and the arguments of
/// calls.  Names of functions, owners of members, dimensions, matrices, cell arrays and anonymous functions keep their
/// operands, though not those further down: [f(x), 2] becomes [f(y), 2], but [x, 2] stays.
///
/// An operand is looked up as it was rebuilt, once: a replacement is not looked up again, so x and y can be
/// exchanged.  The root is not an operand and is never replaced, nor is an operand that is missing.  A replacement that
/// is not of the target when it is needed is ignored.
class VTSYM_API SymbolicExprReplacementVisitor : public SymbolicExprXFormVisitor {
public:
    /// A visitor that builds in `target`; `replacements` outlives it.
    SymbolicExprReplacementVisitor(SymbolicExprTable& target, const SymbolicExprReplacements& replacements);

#define VTSYM_OPERATOR(Code, Name, Class, ...) void visit(const Class& node) override;
#include "base/core/operators.def"
#undef VTSYM_OPERATOR

    /// Whether an operand was replaced since the visitor was made.
    [[nodiscard]] bool replaced() const noexcept {
        return replaced_;
    }

private:
    template <class Node>
    void replaceOperands(const Node& node);
    SymbolicExprId replacementOf(SymbolicExprId operand);

    const SymbolicExprReplacements& replacements_;
    bool replaced_ = false;
};

/// Replaces in expressions of one table, in that table.
class VTSYM_API SymbolicExprReplacement {
public:
    /// The table and the replacements outlive the driver.
    SymbolicExprReplacement(SymbolicExprTable& table, const SymbolicExprReplacements& replacements)
        : table_(table),
          replacements_(replacements) {}

    /// The expression with its operands replaced: itself where nothing is replaced.  An identifier that is not of the
    /// table yields the invalid one.  Linear in the number of distinct nodes.
    SymbolicExprId operator()(SymbolicExprId id);

    /// Whether the last call replaced an operand.
    [[nodiscard]] bool replaced() const noexcept { return replaced_; }

private:
    SymbolicExprTable& table_;
    const SymbolicExprReplacements& replacements_;
    bool replaced_ = false;
};

} // namespace VT
