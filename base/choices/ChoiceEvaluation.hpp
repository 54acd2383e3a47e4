// The choices of a set, evaluated for one witness after the other.
#pragma once

#include "base/decide/Decision.hpp"
#include "base/decide/witness/TermPlans.hpp"
#include "base/print/ExpressionPrinter.hpp"
#include "base/util/IdMap.hpp"

#include <cstdint>
#include <span>
#include <vector>

namespace VT {

/// Finds choices that hold for a witness.  An operand that several choices share is evaluated once for each witness,
/// and one after an operand that fails not at all: so most choices cost one look.
class ChoiceEvaluation {
public:
    /// `conditions` have C shape and outlive this.
    ChoiceEvaluation(const SymbolicExprTable& table, bool keywordsInForce, std::span<const SymbolicExprId> conditions);

    struct Hit {
        Answer answer = Answer::Undecided; ///< No where none of the choices holds
        std::size_t choice = 0;            ///< after Yes, one that does
        std::uint64_t steps = 0;           ///< taken
    };

    /// Looks at choices, which are in ascending order: at those that were hit lately first.  Names that the witness
    /// does not have are 0.  Undecided where an operand has no value, or calls a function, whose value another call may
    /// decide.
    Hit anyOf(std::span<const std::size_t> choices, const Witness& witness);

private:
    enum class Truth : std::uint8_t { Open, Fails, Holds, None };

    /// A part of choices.
    struct Operand {
        TermPlan* plan;
        std::uint64_t witness = 0; ///< the number of that for which the truth is known
        Truth truth = Truth::Open;
    };

    [[nodiscard]] const std::vector<std::uint32_t>& operandsOfChoice(std::size_t choice);
    Truth truthOf(Operand& operand);
    Truth truthOf(std::size_t choice);
    void remember(std::size_t choice);

    LeafReader leaves_;
    SymbolicExprPrinter printer_;
    Unknowns unknowns_;
    TermPlans plans_;
    std::span<const SymbolicExprId> conditions_;
    std::vector<std::vector<std::uint32_t>>
        parts_; ///< by choice: positions of its operands; none until it is looked at
    std::vector<Operand> operands_;
    IdMap<std::uint32_t> position_;    ///< of an operand
    std::vector<std::int64_t> values_; ///< by unknown
    std::vector<std::size_t> lately_;  ///< choices that were hit, the latest last
    std::uint64_t witness_ = 0;        ///< number of the one at hand
    std::uint64_t nodes_ = 0;          ///< evaluated for it
    bool isWithoutCalls_ = true;
};

} // namespace VT
