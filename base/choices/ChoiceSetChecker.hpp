// Checks whether the choices of a block fit together: none dead, none doubled, none missing.
#pragma once

#include "base/core/Limits.hpp"
#include "base/decide/Decision.hpp"

#include <memory>
#include <optional>
#include <span>
#include <vector>

namespace VT {

class VCService;

/// Options of a checker, for all of its sets.
struct ChoiceSetOptions {
    bool bits32 = false;                           ///< unknowns are signed 32-bit integers
    std::uint64_t steps = limits::choiceSteps;     ///< that all sets may cost together
    std::size_t overlaps = limits::choiceOverlaps; ///< that are reported of one set
};

/// What can be wrong with a choice set.
enum class ChoiceFault : std::uint8_t {
    Dead,         ///< a choice is never active where its parent is
    AlwaysActive, ///< it is active wherever its parent is
    Redundant,    ///< its condition has an operand that can go, given the parent's
    Overlap,      ///< two choices are active at once
    Missing,      ///< no choice is active somewhere
};

/// A fault of a set, or one that could not be decided.
struct ChoiceFinding {
    ChoiceFault fault;
    std::size_t choice = 0;                    ///< position
    std::size_t other = 0;                     ///< the second of an overlap
    Witness witness = {};                      ///< the parent is active and the fault shows; none for a dead choice
    bool firstCovered = false;                 ///< of an overlap: the first is active only where the second is
    bool secondCovered = false;                ///< and the other way round
    SymbolicExprId proposed = invalidId;       ///< of a redundant operand: the condition without it
    DecisionBound bound = DecisionBound::None; ///< the bound that left it undecided
};

/// The findings about one set.
struct ChoiceSetReport {
    bool parentNeverHolds = false;       ///< nothing else was checked then
    std::vector<ChoiceFinding> findings; ///< by choice, then fault; overlaps and a gap come last
    std::vector<ChoiceFinding> undecided;
    bool allOverlaps = true; ///< false where there may be more overlaps, beyond the bound
};

/// Checks choice sets against exact decisions: every finding is proven.
///
/// Ranges of names separate most choices without a decision.  Other overlaps are looked for by halves: where no
/// choice of one half overlaps one of the other, one decision settles all pairs.  So a set of n choices without
/// overlaps takes some n log n steps, and each overlap found a few decisions more for each level of halves.  Steps are
/// counted over all sets; when they are used up everything further is undecided.
class VTSYM_API ChoiceSetChecker {
public:
    /// The service outlives the checker.
    explicit ChoiceSetChecker(VCService& service, const ChoiceSetOptions& options = {});
    ChoiceSetChecker(ChoiceSetChecker&&) noexcept;
    ChoiceSetChecker& operator=(ChoiceSetChecker&&) noexcept;
    ~ChoiceSetChecker();

    /// Checks the conditions of choices where `parent` holds.  With an identifier that is not of the service's table
    /// everything stays undecided.
    /// A default choice is active where no other one is, whatever its own condition.
    ChoiceSetReport check(SymbolicExprId parent, std::span<const SymbolicExprId> choices,
                          std::optional<std::size_t> defaultChoice = std::nullopt);
    /// Checks one condition alone: whether it is dead, always active, or has a redundant operand.
    ChoiceSetReport checkCondition(SymbolicExprId parent, SymbolicExprId condition);

    /// Whether a condition can hold.
    Decision canHold(SymbolicExprId condition);
    [[nodiscard]] bool stepsUsedUp() const noexcept;

private:
    struct State;
    std::unique_ptr<State> state_;
};

} // namespace VT
