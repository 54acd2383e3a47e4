// Exact answers to questions about conditions.
#pragma once

#include "base/core/Limits.hpp"
#include "base/core/Table.hpp"
#include "base/decide/Budget.hpp"
#include "base/decide/Decision.hpp"

#include <memory>
#include <span>
#include <string>

namespace VT {

class SolverPlugin;

struct DecisionOptions {
    bool keywordsInForce = true; ///< "(sim)" and "(codegen)" are opposites; plain symbols otherwise
    bool bits32 = false;         ///< unknowns are signed 32-bit integers; integers without bounds otherwise
    std::uint64_t steps = limits::decisionSteps; ///< that one question may cost, 2^24 at most
    SolverPlugin* solver = nullptr; ///< asked what stays undecided: SolverPlugin::installed(), which outlives this
};

/// Decides questions about conditions of one table.
///
/// Conditions are over integers: every symbol stands for an integer, a truth value is an integer that is not zero, a
/// truth value in arithmetic is 1 or 0.  Linear arithmetic is decided: sums of integer multiples of any size, quotients
/// and remainders by constants (cut toward zero), shifts and masks by constants, real literals (exact fractions; an
/// operation on two literals is rounded), and everything that && || ! make of comparisons of these.  All of it is exact
/// over the integers without bounds; their bits are those of two's complement without an end, so that an answer holds
/// for operands of any width. A call is a function of its arguments, except for `defined` and names that begin with
/// `__has_`, which are unknowns whatever they name; a member is an unknown, unless a value is bound to it.  Any other
/// arithmetic is an unknown for each node: equal nodes are equal, and a product is 0 where a factor is.  It is
/// evaluated where a witness is confirmed.  A question that this leaves undecided goes to the solver of the options;
/// with it, products and bits of unknowns are decided within its bounds.
///
/// An answer is proven or it is "undecided"; it depends on the conditions and on whether there is a solver, not on what
/// was interned or asked before.  Real conditions take microseconds.
///
/// What was read of a condition is kept, and nodes never change; a value that is bound to a member later goes unnoticed
/// until clear().  A decider is used by one thread at a time; its table outlives it.  Interns nothing.
class VTSYM_API Decider {
public:
    explicit Decider(const SymbolicExprTable& table, const DecisionOptions& options = {});
    Decider(Decider&&) noexcept;
    Decider& operator=(Decider&&) noexcept;
    ~Decider();

    // One condition.  The witness of "yes" makes it hold, that of "no" makes it fail.

    Decision canHold(SymbolicExprId condition);
    Decision mustHold(SymbolicExprId condition);

    // Two.  A witness of "no" breaks what was asked: a holds and b does not, both hold, one alone holds.  The witness
    // of overlaps() makes both hold.

    Decision implies(SymbolicExprId a, SymbolicExprId b);
    Decision equivalent(SymbolicExprId a, SymbolicExprId b);
    Decision disjoint(SymbolicExprId a, SymbolicExprId b);
    Decision overlaps(SymbolicExprId a, SymbolicExprId b);
    /// Whether a and b agree wherever `known` holds; the witness of "no" is where they differ.
    Decision equivalentGiven(SymbolicExprId a, SymbolicExprId b, SymbolicExprId known);
    /// How a and b relate, with the three witnesses that there may be.  Three questions; after one that
    /// gives up, the others may take limits::furtherSteps each.
    Relation classify(SymbolicExprId a, SymbolicExprId b);

    // A set, n log n in the number of similar conditions.

    /// Whether some condition always holds; the witness of "no" is left out by all.
    SetDecision covers(std::span<const SymbolicExprId> conditions);
    /// Whether no two hold together; "no" comes with a witness and the first two that hold for it, or with neither
    /// where the witness has a number beyond 64 bits.
    SetDecision disjoint(std::span<const SymbolicExprId> conditions);

    /// Whether a condition holds under an assignment, by evaluation; unknowns that it does not name are 0.  Nothing
    /// where some node has no value: a division by zero, a number beyond 64 bits.
    [[nodiscard]] std::optional<bool> holds(SymbolicExprId condition, const Witness& witness);
    /// The text of an unknown of a witness.
    [[nodiscard]] std::string nameOf(SymbolicExprId unknown) const;

    [[nodiscard]] const DecisionOptions& options() const noexcept;
    /// What a further question may cost, at most what the options say.
    void limitSteps(std::uint64_t steps) noexcept;
    /// How many further questions may go to the solver, any number at first.  Returns how many might have so far.
    std::size_t limitSolver(std::size_t questions) noexcept;
    /// Takes the steps of further questions from a budget as well, which outlives them; nullptr ends that.  What the
    /// budget has left bounds a question like its own steps do.
    void share(Budget* budget) noexcept;
    /// Steps that the latest question took.
    [[nodiscard]] std::uint64_t stepsTaken() const noexcept;
    /// Forgets everything that was read.
    void clear();

private:
    struct State;
    std::unique_ptr<State> state_;
};

} // namespace VT
