// Comparisons as sets of integers that linear terms may lie in, and back.
//
// An atom is a sum of multiples of unknowns without a constant, its factors without a common divisor and the first one
// positive, so that A-1==0, 2*A==2 and 1==A are one atom in one set.  A truth value A is A in all but 0.  What is not
// linear is an unknown for each node; comparisons that real arithmetic takes part in are truth values of their own.
// All numbers are exact: a form that leaves the bound of linear forms is an unknown as well.
//
// Sets are written as the caller's condition writes them where it does, so that B == 1 || B == 2 does not become a
// range; only where fewer comparisons will do are they put together anew.
#pragma once

#include "base/core/Limits.hpp"
#include "base/core/Table.hpp"
#include "base/cover/Cover.hpp"
#include "base/decide/LeafReader.hpp"
#include "base/integer/LinearForm.hpp"
#include "base/print/ExpressionPrinter.hpp"
#include "base/util/IdMap.hpp"

#include <boost/container/small_vector.hpp>
#include <boost/unordered_map.hpp>

#include <optional>
#include <vector>

namespace VT {

/// A chain of comparisons: the operator, or None where there is one operand.
struct WrittenSet {
    SymbolicOp op = SymbolicOp::None;
    boost::container::small_vector<SymbolicExprId, 2> operands; ///< none where a bound has no literal
};

class ComparedTerms {
public:
    /// `printer` writes the language in which lengths count.
    ComparedTerms(SymbolicExprTable& table, const SymbolicExprPrinter& printer, bool keywordsInForce);

    /// What a leaf of a condition (no And, Or or Not) says; a set of all integers or of none where it is constant.
    /// Nothing where an operand is missing.  Linear in the nodes that were not read before.
    std::optional<Constraint> read(SymbolicExprId leaf);

    /// The number that a node always is; nothing for any other.
    std::optional<double> constant(SymbolicExprId node);

    /// Comparisons that it takes to write a constraint.
    [[nodiscard]] std::size_t comparisons(const Constraint& constraint) const;
    /// The comparisons.
    WrittenSet write(const Constraint& constraint);

    /// The unknowns of an atom; empty for a truth value that no other atom shares an unknown with.
    [[nodiscard]] const LinearParts& unknowns(Atom atom) const { return entries_[atom].parts; }

    /// Whether an atom is made of plain unknowns: then no other atom without one of them says anything about it.
    [[nodiscard]] bool isPlain(Atom atom) const { return entries_[atom].plain; }

    [[nodiscard]] std::size_t atoms() const noexcept { return entries_.size(); }

private:
    /// The value of a node as a number.
    struct Number {
        enum class Kind : std::uint8_t { Linear, Real, RealTerm, Missing } kind = Kind::Linear;
        LinearForm form = {};
        double real = 0;
    };

    struct Entry {
        LinearParts parts;  ///< none for a truth value of its own
        SymbolicExprId own; ///< the node of such a truth value
        bool plain;
    };

    struct UnknownNode {
        SymbolicExprId node;
        bool plain;
        Atom atom; ///< of the unknown alone
    };

    /// How a run of neighbouring intervals is written.
    struct Run {
        std::size_t first;
        std::size_t cost;
    };

    using Runs = boost::container::small_vector<Run, 4>;

    Number numberOf(SymbolicExprId root);
    std::optional<Number> leafNumber(SymbolicExprId id);
    Number compute(SymbolicExprId id, const SymbolicExpr& node);
    Unknown unknownOf(SymbolicExprId node, bool plain);
    Atom atomOf(const LinearParts& parts);
    Constraint truthOf(SymbolicExprId own, bool positive, SymbolicExprId leaf);
    std::optional<Constraint> readComparison(SymbolicExprId leaf, SymbolicOp op);
    Constraint restriction(SymbolicExprId leaf, SymbolicOp op, const LinearForm& form);
    Constraint enter(Atom atom, IntegerSet set, SymbolicExprId leaf);

    [[nodiscard]] SymbolicExprId known(Atom atom, const IntegerSet& set) const;
    [[nodiscard]] std::size_t unseen(Atom atom, const IntegerSet& set) const;
    [[nodiscard]] bool isRange(Atom atom, const IntegerSet::Interval& interval) const;
    [[nodiscard]] std::size_t cost(Atom atom, const IntegerSet::Interval& interval) const;
    [[nodiscard]] Runs runs(const Constraint& constraint) const;
    bool append(Atom atom, const IntegerSet& set, WrittenSet& out);
    bool writeRun(const Constraint& constraint, std::size_t first, std::size_t last, WrittenSet& out);
    SymbolicExprId literal(Atom atom, const IntegerSet& set);
    SymbolicExprId compose(Atom atom, const IntegerSet& set, bool strict);
    SymbolicExprId side(const LinearParts& parts, std::int64_t sign, std::int64_t constant);

    SymbolicExprTable& table_;
    const SymbolicExprPrinter& printer_;
    LeafReader leafReader_;
    std::size_t partsLeft_ = limits::shortenWork; ///< that sums may add up; beyond it each is an unknown of its own
    IdMap<Number> numbers_;
    IdMap<Unknown> byNode_;
    std::vector<UnknownNode> unknowns_;
    std::vector<Entry> entries_;
    IdMap<Atom> truths_;                                     ///< truth values of their own, by node
    std::vector<Atom> sums_;                                 ///< atoms of several unknowns
    boost::unordered_map<Constraint, SymbolicExprId> known_; ///< the shortest comparison that was read
};

} // namespace VT
