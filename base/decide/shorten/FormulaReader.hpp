// Conditions as formulas.
#pragma once

#include "base/decide/shorten/ComparedTerms.hpp"
#include "base/decide/shorten/FormulaWriter.hpp"
#include "base/decide/shorten/Formulas.hpp"
#include "base/util/IdMap.hpp"

#include <optional>
#include <vector>

namespace VT {

struct ReadFormula {
    Formula formula;
    std::size_t comparisons; ///< leaves of the condition's And, Or and Not, each occurrence counted
};

/// Reads And, Or and Not of comparisons and other truth values.  A comparison of a truth value with a number is the
/// truth value, its opposite or a constant: (A == 1) == true is A == 1.
class FormulaReader {
public:
    FormulaReader(const SymbolicExprTable& table, Formulas& formulas, ComparedTerms& terms)
        : table_(table),
          formulas_(formulas),
          terms_(terms) {}

    /// Nothing where an operand is missing or there are more than limits::shortenComparisons.  Linear in the operands
    /// of all distinct nodes.
    std::optional<ReadFormula> read(SymbolicExprId condition);

    /// The operators of the chains that were read: Quill's element-wise ones where there were no others.
    [[nodiscard]] ChainOps chainOps() const;

private:
    /// A node whose operands are being read.
    struct Frame {
        SymbolicExprId id;
        SymbolicOp op;        ///< And, Or, Not, or a comparison that is taken away
        std::size_t operands; ///< where they begin in operands_
        std::size_t next;
    };

    bool enter(SymbolicExprId id);
    bool collectChain(SymbolicExprId root, SymbolicOp op);
    ReadFormula leave(const Frame& frame);
    [[nodiscard]] std::optional<std::size_t> truthSide(const SymbolicExpr& comparison);

    const SymbolicExprTable& table_;
    Formulas& formulas_;
    ComparedTerms& terms_;
    IdMap<ReadFormula> read_;
    std::vector<Frame> frames_;
    std::vector<SymbolicExprId> operands_;
    OperatorSet seen_;
};

} // namespace VT
