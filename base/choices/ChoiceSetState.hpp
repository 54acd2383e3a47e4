// What the checks of choice sets share: the decider, the bounds of names, and the steps that are left.
#pragma once

#include "base/choices/AssignmentCounter.hpp"
#include "base/choices/ChoiceEvaluation.hpp"
#include "base/choices/ChoiceMerges.hpp"
#include "base/choices/ChoiceRuns.hpp"
#include "base/choices/ChoiceSetChecker.hpp"
#include "base/choices/OrdinaryChoices.hpp"
#include "base/choices/SmallestRemoval.hpp"
#include "base/choices/boxes/ChoiceBoxes.hpp"
#include "base/core/Table.hpp"
#include "base/decide/Assumptions.hpp"
#include "base/decide/Decider.hpp"
#include "base/service/VCService.hpp"
#include "base/transform/QuillConversion.hpp"

namespace VT {

struct ChoiceSetChecker::State {
    State(VCService& theService, const ChoiceSetOptions& theOptions);

    /// Where a choice is asked about.
    struct Place {
        SymbolicExprId context;                       ///< its parent is active and names are in bounds; in C shape
        std::vector<SymbolicExprId> premises;         ///< the same, as written
        std::vector<SymbolicExprId> earlierHold = {}; ///< what may hide it, in C shape
        std::vector<std::size_t> earlier = {};        ///< the choices that it is; none where they are too many
        std::vector<std::size_t> living = {};         ///< the choices that it is, however many
        ChoiceEvaluation* evaluation = nullptr;       ///< of these
        std::span<const SymbolicExprId> conditions{}; ///< of all choices, in C shape
        bool isHidden = false;                        ///< an earlier choice is active somewhere
        bool isDeadByEarlier = false;                 ///< these hide the choice, which is not dead alone

        [[nodiscard]] bool isCrowded() const { return earlier.empty() && !earlierHold.empty(); }
    };

    /// The choices of a set that come before one.
    struct EarlierChoices {
        EarlierChoices(std::size_t choices, SymbolicExprId none) : isDead(choices, false), anyHolds(none) {}

        std::vector<bool> isDead;        ///< by choice
        std::vector<std::size_t> living; ///< the others
        SymbolicExprId anyHolds;         ///< where one of them does
        bool isAnyActive = false;        ///< one of them is active somewhere
    };

    Decision ask(Decision (Decider::*question)(SymbolicExprId), SymbolicExprId condition);
    Decision ask(Decision (Decider::*question)(SymbolicExprId, SymbolicExprId), SymbolicExprId a, SymbolicExprId b);
    void begin(std::size_t choices);
    void take(std::uint64_t steps);
    [[nodiscard]] std::uint64_t share() const;
    Decision counted(Decision decision);

    /// An answer from boxes, whose steps count.
    template <class Result>
    Result counted(ChoiceBoxes& boxes, Result result) {
        take(boxes.takeSteps());
        return result;
    }

    [[nodiscard]] std::size_t operandsOf(SymbolicExprId condition) const;
    static void add(ChoiceFinding finding, Decision decision, ChoiceSetReport& report);

    SymbolicExprId both(SymbolicExprId a, SymbolicExprId b);
    Place placeIn(SymbolicExprId parent, std::span<const SymbolicExprId> conditions);
    void placeAfter(Place& place, std::size_t position, const std::vector<ChoiceRun>& runs,
                    const EarlierChoices& earlier);
    static void placeAfter(Place& place, const std::vector<std::size_t>& hiding);
    Answer checkOne(std::size_t position, Place place, SymbolicExprId condition, ChoiceBoxes& boxes,
                    const ChoiceBoxes::Activity& seen, ChoiceSetReport& report);
    OrdinaryChoices ordinaryIn(SymbolicExprId context);
    void checkDefault(std::size_t position, SymbolicExprId context, const std::vector<ChoiceRun>& runs,
                      const Decision& gap, ChoiceSetReport& report);
    void findHiding(ChoiceFinding& finding, const Place& place, SymbolicExprId condition, SymbolicExprId holds,
                    ChoiceBoxes& boxes);
    Decision heldAt(const BoxPoint& point, SymbolicExprId condition, const ChoiceBoxes& boxes);
    Decision findActive(Place& place, SymbolicExprId holds, SymbolicExprId left);
    Decision findBeyond(const Place& place, SymbolicExprId holds, std::vector<std::size_t>& hiding);
    bool isDeadAlone(std::size_t position, SymbolicExprId holds, ChoiceBoxes& boxes);
    template <class Search>
    Reasons reasonsBy(Search search);
    SymbolicExprId shorten(SymbolicExprId context, SymbolicExprId condition,
                           const std::function<Answer(SymbolicExprId)>& isEqual = {});

    struct Gap {
        Decision decision; ///< whether there is one
        bool isExact;      ///< it was decided for all choices at once
    };

    Gap findGap(SymbolicExprId context, const std::vector<ChoiceRun>& runs, ChoiceBoxes& boxes);
    Decision overlapOf(const ChoiceRun& a, const ChoiceRun& b, ChoiceBoxes& boxes);
    void findOverlaps(const std::vector<ChoiceRun>& runs, std::span<const SymbolicExprId> holds, ChoiceBoxes& boxes,
                      ChoiceSetReport& report);
    void reportOverlap(std::size_t first, std::size_t second, Decision decision, std::span<const SymbolicExprId> holds,
                       ChoiceSetReport& report);

    // What a set can do about its faults.

    SymbolicExprId shortestGiven(SymbolicExprId context, SymbolicExprId condition);
    SymbolicExprId missingChoice(SymbolicExprId context, std::span<const SymbolicExprId> choices,
                                 std::optional<std::size_t> left);
    static void findRemoval(ChoiceSetReport& report);
    void findMerges(const Place& place, std::span<const SymbolicExprId> choices, const std::vector<bool>& isDead,
                    bool inOrder, ChoiceSetReport& report);
    /// `hiding` holds by choice what hides it, in C shape, under ChoicePolicy::First.
    void countAssignments(SymbolicExprId parent, std::span<const SymbolicExprId> choices,
                          std::optional<std::size_t> defaultChoice, std::span<const std::vector<SymbolicExprId>> hiding,
                          ChoiceSetReport& report);

    VCService& service;
    SymbolicExprTable& table;
    SymbolicExprQ2C toC;
    Decider decider;
    Assumptions bounds; ///< declared values of names, and what is assumed
    ChoiceSetOptions options;
    std::vector<SymbolicExprId> assumed; ///< by the service, in C shape
    std::uint64_t stepsLeft;
    std::uint64_t setLeft = limits::setSteps;            ///< of the set that is being checked
    std::uint64_t questionSteps = limits::decisionSteps; ///< a quarter after each question of a set that gives up
};

} // namespace VT
