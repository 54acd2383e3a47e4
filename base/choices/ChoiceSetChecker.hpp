// Checks whether the choices of a block fit together: none dead, none doubled, none missing.
#pragma once

#include "base/choices/ChoiceAdvice.hpp"
#include "base/core/Limits.hpp"
#include "base/decide/Decision.hpp"
#include "base/decide/reasons/Reasons.hpp"

#include <memory>
#include <optional>
#include <span>
#include <vector>

namespace VT {

class VCService;

/// Which choice of a set is the active one.
enum class ChoicePolicy : std::uint8_t {
    Unique,  ///< the one whose condition holds: overlaps are faults
    First,   ///< the first whose condition holds: an earlier choice hides a later one
    Collect, ///< every one whose condition holds: overlaps are wanted
};

/// Options of a checker, for all of its sets.
struct ChoiceSetOptions {
    bool bits32 = false;                           ///< unknowns are signed 32-bit integers
    bool reasons = false;                          ///< findings come with reasons
    bool merges = false;                           ///< choices that can be merged are looked for
    std::vector<SymbolDomain> domains = {};        ///< values that names have, which bound every decision
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
    std::size_t choice = 0;     ///< position
    std::size_t other = 0;      ///< the second of an overlap
    Witness witness = {};       ///< the parent is active and the fault shows; none for a dead choice
    bool firstCovered = false;  ///< of an overlap: the first is active only where the second is
    bool secondCovered = false; ///< and the other way round
    /// Of a redundant operand the condition without it; of a missing choice the shortest condition found of a further
    /// one that closes the gap, or the invalid identifier where it is long or not proven.
    SymbolicExprId proposed = invalidId;
    std::vector<std::size_t> hiddenBy = {}; ///< of a dead choice: earlier ones that hide it, unless there are many
    bool isHidden = false;                  ///< of a dead choice: earlier ones hide it, it is not dead by itself
    /// Operands of declared values, assumptions, the parent and the choice for which it is dead, always active or
    /// redundant, where they were asked for; of a hidden choice those that hide it are left out.
    Reasons reasons = {};
    DecisionBound bound = DecisionBound::None; ///< that left it undecided
};

/// The findings about one set.
struct ChoiceSetReport {
    bool parentNeverHolds = false;       ///< nothing else was checked then
    std::vector<ChoiceFinding> findings; ///< by choice, then fault; overlaps and a gap come last
    std::vector<ChoiceFinding> undecided;
    ChoiceRemoval removal = {};           ///< a smallest set of choices without which there are no overlaps
    std::vector<ChoiceMerge> merges = {}; ///< where they were asked for
    /// By choice, the number of assignments for which it is active, of all names in the set, where they have declared
    /// values and can be counted; empty without declared values.
    std::vector<std::optional<std::uint64_t>> assignments = {};
    std::optional<std::uint64_t> parentAssignments = {}; ///< the same for the parent
    bool allOverlaps = true;                             ///< whether the overlaps found are all; false beyond the bound
    std::uint64_t furtherOverlaps = 0;                   ///< pairs beyond the bound, which are only counted
    bool allCounted = true;                              ///< whether there are no more than these
};

/// Checks choice sets against exact decisions: every finding is proven.
///
/// Choices that compare names with integers are unions of boxes, and most questions about them are answered from the
/// sides of those.  Ranges of names separate most other choices without a decision.  Other overlaps are looked for by
/// halves: where no choice of one half overlaps one of the other, one decision settles all pairs.  So a set of n
/// choices without overlaps takes some n log n steps, and each overlap found a few decisions more for each level of
/// halves. Steps are counted over all sets; when they are used up everything further is undecided.
class VTSYM_API ChoiceSetChecker {
public:
    /// The service outlives the checker.  What it assumes at this moment bounds every decision, as declared values do.
    explicit ChoiceSetChecker(VCService& service, const ChoiceSetOptions& options = {});
    ChoiceSetChecker(ChoiceSetChecker&&) noexcept;
    ChoiceSetChecker& operator=(ChoiceSetChecker&&) noexcept;
    ~ChoiceSetChecker();

    /// Checks the conditions of choices where `parent` holds.  With an identifier that is not of the service's table
    /// everything stays undecided.
    /// A default choice is active where no other one is, whatever its own condition.
    /// Under ChoicePolicy::First a choice counts as active where no earlier one is, but for the default choice.
    ChoiceSetReport check(SymbolicExprId parent, std::span<const SymbolicExprId> choices,
                          std::optional<std::size_t> defaultChoice = std::nullopt,
                          ChoicePolicy policy = ChoicePolicy::Unique);
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
