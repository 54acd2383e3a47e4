// Formulas as nodes, in the shortest text.
#pragma once

#include "base/decide/shorten/ComparedTerms.hpp"
#include "base/decide/shorten/Formulas.hpp"
#include "base/print/ExpressionPrinter.hpp"

#include <vector>

namespace VT {

/// The operators that chains are written with.
struct ChainOps {
    SymbolicOp conjunction = SymbolicOp::And;
    SymbolicOp disjunction = SymbolicOp::Or;
};

class FormulaWriter {
public:
    FormulaWriter(SymbolicExprTable& table, const SymbolicExprPrinter& printer, Formulas& formulas,
                  ComparedTerms& terms)
        : table_(table),
          printer_(printer),
          formulas_(formulas),
          terms_(terms) {}

    void use(const ChainOps& ops) noexcept { ops_ = ops; }

    /// The formula with every negation at a symbol or a comparison; the invalid identifier where a bound has no
    /// literal.
    SymbolicExprId writePlainly(Formula formula);
    /// The formula with negations of several operands drawn together where that is shorter and leaves half of them at
    /// most: !(A || B && C).  Chains are chosen from the inside out, each together with its opposite.
    SymbolicExprId write(Formula formula);

private:
    using Kind = Formulas::Kind;

    /// A formula and what was written for it.
    struct Written {
        SymbolicExprId plain = invalidId;
        SymbolicExprId negation = invalidId; ///< a Not of the opposite chain, where that may be shorter
        std::uint32_t negatedLeaves = 0;     ///< in the plain form
    };

    [[nodiscard]] SymbolicOp opOf(Kind kind) const { return kind == Kind::And ? ops_.conjunction : ops_.disjunction; }

    std::vector<Formula> byHeight(Formula formula, bool withOpposites);
    bool append(Kind kind, Formula operand, std::vector<SymbolicExprId>& out);
    void drawTogether(Kind kind, std::vector<SymbolicExprId>& operands);
    SymbolicExprId writeOne(Formula formula, bool together);
    void offerNegation(Formula chain);
    [[nodiscard]] std::uint32_t countNegations(Formula formula) const;
    [[nodiscard]] SymbolicExprId shorter(const Written& written, bool inBrackets) const;

    [[nodiscard]] bool isNegation(SymbolicExprId id) const { return table_.get(id)->op() == SymbolicOp::Not; }

    SymbolicExprTable& table_;
    const SymbolicExprPrinter& printer_;
    Formulas& formulas_;
    ComparedTerms& terms_;
    ChainOps ops_;
    std::vector<Written> written_; ///< by formula, of the formula that is being written
};

} // namespace VT
