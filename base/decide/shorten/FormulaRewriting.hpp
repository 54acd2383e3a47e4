// Formulas made shorter by algebra.  Each operation yields a formula of the same meaning, where facts hold if there are
// some; work beyond limits::shortenWork is left undone.
#pragma once

#include "base/core/Limits.hpp"
#include "base/decide/shorten/Formulas.hpp"

#include <boost/unordered_map.hpp>

#include <cstddef>
#include <optional>

namespace VT {

/// What atoms are known to lie in.
using AtomFacts = boost::unordered_map<Atom, IntegerSet>;

class FormulaRewriting {
public:
    FormulaRewriting(Formulas& formulas, Formulas::Comparisons comparisons)
        : formulas_(formulas),
          comparisons_(std::move(comparisons)) {}

    /// Every constraint by what those around it leave open: A && (A || B) is A, A || !A && B is A || B.  Linear in the
    /// occurrences of constraints.
    Formula inContext(Formula formula, const AtomFacts& facts);
    /// Common operands taken out, the most frequent first: A && B || A && C is A && (B || C), and the same with And and
    /// Or swapped (literal factoring; Brayton, "Factoring logic functions", 1987).  The rounds are bounded.
    Formula factored(Formula formula);
    /// A sum of products without redundancy; nothing where it becomes too large.
    std::optional<Formula> minimalSum(Formula formula);

private:
    using Kind = Formulas::Kind;
    using Range = std::optional<IntegerSet>;

    /// A chain whose operands are being looked at.
    struct Frame {
        Formula chain;
        std::size_t next = 0;
        std::size_t facts = 0; ///< on the trail when it was entered
        std::size_t done = 0;  ///< results when it was entered
    };

    /// An operand of a chain after a common one was taken out.
    struct Quotient {
        std::size_t place;
        Formula left;
        std::uint32_t saved; ///< comparisons
    };

    bool takeWork(std::size_t amount);
    void assume(const Constraint& constraint, bool holds);
    Formula relaxed(Formula leaf);
    Formula within(Formula leaf, const IntegerSet& range);
    void enter(Formula chain);
    Formula leave(const Frame& frame);
    Formula factoredOnce(Formula formula);
    void appendParts(Kind chain, Formula leaf, std::vector<Formula>& out);
    std::optional<Quotient> without(Formula chain, Formula common);
    std::size_t savedBy(Formula common, Kind inner, const Formulas::Operands& operands);
    Formula bestCommonOperand(Kind kind, const Formulas::Operands& operands);
    Formula withCommonOperand(Kind kind, const Formulas::Operands& operands);
    std::optional<Cover> coverOf(Formula formula);

    Formulas& formulas_;
    Formulas::Comparisons comparisons_;
    std::size_t workLeft_ = limits::shortenWork;
    std::vector<Range> known_; ///< by atom
    std::vector<std::pair<Atom, Range>> trail_;
    std::vector<Frame> frames_;
    std::vector<Formula> results_;
};

} // namespace VT
