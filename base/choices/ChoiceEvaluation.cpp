// Evaluates the operands of choices from plans that are made once.
//
// Cost: a look for each choice whose first operand fails; the nodes of the operands that are evaluated.  A step stands
// for so many of either that it takes as long as one of a decision.
#include "base/choices/ChoiceEvaluation.hpp"

#include "base/choices/ChoiceRanges.hpp"
#include "base/core/Limits.hpp"
#include "base/decide/witness/CallCongruence.hpp"

#include <algorithm>

namespace VT {

namespace {

constexpr std::size_t nodesPerStep = 8;
constexpr std::size_t choicesPerStep = 16;

} // namespace

ChoiceEvaluation::ChoiceEvaluation(const SymbolicExprTable& table, bool keywordsInForce,
                                   std::span<const SymbolicExprId> conditions)
    : leaves_(table, keywordsInForce),
      printer_(table, false),
      unknowns_(table, printer_, minusInfinite, plusInfinite),
      plans_(leaves_, unknowns_),
      conditions_(conditions),
      parts_(conditions.size()) {}

/// Positions of the operands of a choice that is an And of a few, or of the whole choice.
const std::vector<std::uint32_t>& ChoiceEvaluation::operandsOfChoice(std::size_t choice) {
    std::vector<std::uint32_t>& parts = parts_[choice];
    if (!parts.empty())
        return parts;
    const SymbolicExprId condition = conditions_[choice];
    auto operands = operandsOf(leaves_.table(), condition, SymbolicOp::And, limits::choiceOperands);
    if (!operands)
        operands.emplace(1, condition);
    for (const SymbolicExprId operand : *operands) {
        const std::uint32_t* known = position_.find(operand);
        if (known == nullptr) {
            TermPlan& plan = plans_.of(operand);
            const auto isCall = [&](Unknown unknown) {
                return unknowns_[unknown].kind == UnknownKind::Free &&
                       isFunctionCall(leaves_.table(), unknowns_[unknown].node);
            };
            isWithoutCalls_ = isWithoutCalls_ && std::ranges::none_of(plan.unknowns(), isCall);
            values_.resize(unknowns_.size(), 0); // none of the names that are new is in the witness
            operands_.push_back({&plan});
            known = &position_.insert(operand, static_cast<std::uint32_t>(operands_.size() - 1));
        }
        parts.push_back(*known);
    }
    return parts;
}

/// For the values at hand.
ChoiceEvaluation::Truth ChoiceEvaluation::truthOf(Operand& operand) {
    if (operand.witness == witness_)
        return operand.truth;
    operand.witness = witness_;
    nodes_ += operand.plan->size();
    const auto valueOf = [this](Unknown unknown) { return values_[unknown]; };
    if (const auto value = operand.plan->value(valueOf))
        return operand.truth = *value != 0 ? Truth::Holds : Truth::Fails;
    const auto exact = operand.plan->exactValue(valueOf);
    return operand.truth = !exact ? Truth::None : exact->sign() != 0 ? Truth::Holds : Truth::Fails;
}

/// The first operand that does not hold decides.
ChoiceEvaluation::Truth ChoiceEvaluation::truthOf(std::size_t choice) {
    for (const std::uint32_t operand : operandsOfChoice(choice))
        if (const Truth truth = truthOf(operands_[operand]); truth != Truth::Holds)
            return truth;
    return Truth::Holds;
}

void ChoiceEvaluation::remember(std::size_t choice) {
    std::erase(lately_, choice);
    lately_.push_back(choice);
    if (lately_.size() > limits::boxCorners)
        lately_.erase(lately_.begin());
}

ChoiceEvaluation::Hit ChoiceEvaluation::anyOf(std::span<const std::size_t> choices, const Witness& witness) {
    ++witness_;
    nodes_ = 0;
    std::ranges::fill(values_, 0);
    for (const UnknownValue& each : witness) {
        const LeafMeaning leaf = leaves_(each.unknown);
        const bool isKeyword =
            leaf.kind == LeafMeaning::Kind::Simulation || leaf.kind == LeafMeaning::Kind::CodeGeneration;
        const Unknown unknown = isKeyword ? unknowns_.simulation() : unknowns_.free(each.unknown);
        values_.resize(unknowns_.size(), 0);
        values_[unknown] = leaf.kind == LeafMeaning::Kind::CodeGeneration ? 1 - each.value : each.value;
    }
    std::size_t looks = 0;
    Hit hit{.answer = Answer::No};
    const auto isHit = [&](std::size_t choice) {
        ++looks;
        const Truth truth = truthOf(choice);
        if (truth == Truth::Fails && isWithoutCalls_)
            return false;
        hit.answer = truth == Truth::Holds && isWithoutCalls_ ? Answer::Yes : Answer::Undecided;
        hit.choice = choice;
        return true;
    };
    const auto wasHit = std::find_if(lately_.rbegin(), lately_.rend(), [&](std::size_t choice) {
        return std::ranges::binary_search(choices, choice) && isHit(choice);
    });
    if (wasHit == lately_.rend())
        static_cast<void>(std::ranges::find_if(choices, isHit));
    if (hit.answer == Answer::Yes)
        remember(hit.choice);
    hit.steps = looks / choicesPerStep + nodes_ / nodesPerStep + 1;
    return hit;
}

} // namespace VT
