// Choices that compare names with integers, as unions of boxes.
#pragma once

#include "base/choices/boxes/BoxUnion.hpp"
#include "base/core/Limits.hpp"
#include "base/core/Table.hpp"
#include "base/util/IdMap.hpp"

#include <optional>
#include <span>
#include <vector>

namespace VT {

/// Answers questions about the choices of a set from the sides of boxes, without a decision.
///
/// A choice is known where it is an And, or an Or of Ands, of operands that each compare one name with integers.
/// Questions are about the values that the context allows; operands of it that compare more than one name are left out
/// where they share no name with a choice, and nothing is known of any choice where they do.  All answers are exact, or
/// undecided where a choice is not known or the steps ran out.
class ChoiceBoxes {
public:
    /// Where a choice is active, or what hides it.
    struct Activity {
        Answer answer = Answer::Undecided;
        BoxPoint point = {};                    ///< after Yes
        std::vector<std::size_t> hiddenBy = {}; ///< after No, choices that hide it together, in ascending order
    };

    /// `context` can hold.  With `bits32` names are signed integers of 32 bits.
    ChoiceBoxes(const SymbolicExprTable& table, SymbolicExprId context, std::span<const SymbolicExprId> choices,
                bool bits32);

    [[nodiscard]] bool isKnown(std::size_t choice) const { return isUsable_ && forms_[choice].has_value(); }

    /// Whether a choice and all that hide it are known.
    [[nodiscard]] bool isHidingKnownOf(std::size_t choice) const { return isKnown(choice) && areHidingKnown_; }

    /// Whether all choices are known.
    [[nodiscard]] bool areKnown() const noexcept { return isUsable_ && areAllRead_; }

    /// Whether two choices overlap.
    [[nodiscard]] Answer overlap(std::size_t a, std::size_t b) const;
    /// Whether a choice is active where none of some others is.
    Answer isActiveWithout(std::size_t choice, std::span<const std::size_t> others);
    /// Whether no choice is active somewhere.
    BoxGap gapOf(std::span<const std::size_t> choices);

    /// Takes note of a living choice that hides those after it.
    void hide(std::size_t choice);
    /// Whether a choice is active where none is that hides it.
    Activity activityOf(std::size_t choice);
    /// Whether a condition equals that of a choice where none is active that hides it.
    Answer isEqual(std::size_t choice, SymbolicExprId condition);
    /// Whether a choice is certainly without faults where none is active that hides it: active, not always active, and
    /// no operand can be left out, nor a whole And or Or be written as one comparison.  It may be so where this is
    /// false.
    bool isFaultless(std::size_t choice);

    /// Values of names at a point: of those in the choices that say something of them.
    [[nodiscard]] std::vector<UnknownValue> valuesAt(const BoxPoint& point) const;

    /// Whether operands of the context are about other names, so that a point says nothing of them.
    [[nodiscard]] bool hasOtherNames() const noexcept { return hasOtherNames_; }

    /// Steps that were taken since the last call.
    std::uint64_t takeSteps();

private:
    /// What one operand of an And allows, and the same without each of its own operands.
    struct Operand {
        Constraint allows;
        std::vector<IntegerSet> shorter = {};
    };

    struct Product {
        std::vector<Operand> operands;
        Cube box; ///< of all operands within the context; unused where `isEmpty`
        bool isEmpty = false;
    };

    using Form = std::vector<Product>;

    class FaultSearch;

    std::optional<Constraint> constraintOf(SymbolicExprId operand);
    std::optional<Operand> operandOf(SymbolicExprId operand);
    std::optional<Form> formOf(SymbolicExprId choice);
    bool readContext(SymbolicExprId context);
    Atom atomOf(SymbolicExprId name);
    void restrict(Form& form) const;
    void findCuts();
    void findHidingGap();
    [[nodiscard]] static std::vector<Cube> boxesOf(const Form& form);
    BoxGap ask(BoxUnion& boxes, const Cube& region, std::span<const Cube> further);
    BoxGap leaves(std::span<const Cube> regions, BoxUnion& boxes, std::span<const Cube> further);

    const SymbolicExprTable& table_;
    bool isUsable_ = true;
    bool areAllRead_ = true;
    IdMap<Atom> atoms_;                            ///< by name
    IdMap<std::optional<Constraint>> constraints_; ///< by operand; nothing where it is not about one name
    std::size_t atomCount_ = 0;                    ///< names of the choices; atoms beyond are of the context alone
    Cube context_;
    std::vector<std::optional<Form>> forms_;                  ///< by choice
    std::vector<SymbolicExprId> names_;                       ///< by atom
    std::vector<std::pair<std::int64_t, std::int64_t>> cuts_; ///< by atom: the first value and the last that is an end
    bool hasOtherNames_ = false;
    std::optional<BoxUnion> hiding_;         ///< the choices that hide later ones
    std::vector<std::size_t> hidingChoices_; ///< by box of these: its choice
    /// Where none of them is active within the context, if that is known; covered where they always are.
    std::optional<BoxGap> hidingGap_;
    std::optional<BoxUnion> none_; ///< no box
    bool areHidingKnown_ = true;
    std::uint64_t left_ = 0;  ///< steps of further questions
    std::uint64_t steps_ = 0; ///< taken since they were last asked for
};

} // namespace VT
