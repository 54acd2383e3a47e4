// Makes the witness of a question one that can be shown: of 64 bits, the smallest, with one value for equal calls.
//
// Method: further questions, each with a condition added to what was asked: bounds on names, or that calls agree where
// their arguments do.  They are asked while the witness at hand breaks what is wanted.
//
// Cost: that of the further questions, whose steps are those of the first; all but the last kind may be given up.
#include "base/core/Limits.hpp"
#include "base/decide/DeciderState.hpp"
#include "base/decide/witness/CallCongruence.hpp"

#include <algorithm>
#include <utility>

namespace VT {

namespace {

/// Leaves calls of functions that are called at least twice.
void keepCallsOfOneFunction(const SymbolicExprTable& table, std::vector<SymbolicExprId>& calls) {
    const auto functionOf = [&](SymbolicExprId call) { return table.get(call)->getInput(0); };
    std::vector<SymbolicExprId> functions(calls.size());
    std::ranges::transform(calls, functions.begin(), functionOf);
    std::ranges::sort(functions);
    std::erase_if(calls, [&](SymbolicExprId call) {
        const auto first = std::ranges::lower_bound(functions, functionOf(call));
        return functions.end() - first < 2 || first[0] != first[1];
    });
}

} // namespace

/// Looks for a witness with numbers of 64 bits where the one that was found has larger ones.
void Decider::State::confine(Decision& decision, Gate truth, Conditions conditions) {
    steps.spellOut([&] {
        std::vector<Gate> truths{truth};
        for (const UnknownLeaf& leaf : Leaves(leavesOf(conditions)))
            truths.push_back(circuit.between(unknowns[leaf.unknown].quantity, -limits::formNumber, limits::formNumber));
        Decision confined = hold(circuit.all(truths), conditions);
        if (confined.isYes())
            decision = std::move(confined);
    });
}

/// Makes the witness the smallest, one name after the other: questions with narrower and narrower bounds on it.  Not
/// where terms take part, whose values may not exist where these bounds leave them out of the question.
void Decider::State::makeSmallest(Decision& decision, Gate truth, Conditions conditions) {
    for (const ReadCondition* read : conditions)
        if (std::ranges::any_of(read->met, [&](Unknown met) { return unknowns[met].kind == UnknownKind::Term; }))
            return;
    steps.spellOut([&] {
        const Leaves leaves = leavesOf(conditions); // a copy, since further questions follow
        for (std::size_t i = 0; i < leaves.size(); ++i) {
            const Quantity quantity = unknowns[leaves[i].unknown].quantity;
            if (unknowns[leaves[i].unknown].kind != UnknownKind::Free)
                continue;
            const auto valueAtHand = [&] { return (*decision.witness)[i].value; };
            // Whether a witness lies within bounds, which is then at hand.
            const auto holdsWithin = [&](std::int64_t low, std::int64_t high) {
                Decision nearer = hold(circuit.both(truth, circuit.between(quantity, low, high)), conditions);
                const bool isFound = nearer.isYes() && nearer.witness;
                if (!isFound && !nearer.isNo())
                    throw StepsUsedUp{};
                if (isFound)
                    decision = std::move(nearer);
                return isFound;
            };
            if (!isWithinBound(valueAtHand()))
                return;
            std::int64_t low = 0;
            std::int64_t high = std::abs(valueAtHand());
            for (std::int64_t middle = high - 1; low < high; middle = low + (high - low) / 2) { // mostly it is smallest
                if (holdsWithin(-middle, middle))
                    high = std::abs(valueAtHand());
                else
                    low = middle + 1;
            }
            if (valueAtHand() < 0)
                holdsWithin(high, high);
            truth = circuit.both(truth, circuit.between(quantity, valueAtHand(), valueAtHand()));
        }
    });
}

/// Looks for a witness for which the names in arguments of calls have different values: the smallest ones, large
/// ones on either side of 0, or ascending ones, in the order in which the question mentions them.  Undecided where none
/// of these is possible, or takes too many steps.
Decision Decider::State::withDifferentArguments(std::span<const SymbolicExprId> calls, Gate truth,
                                                Conditions conditions) {
    std::vector<const ReadCondition*> all(conditions.begin(), conditions.end());
    constexpr std::int64_t large = std::int64_t{1} << 30U; // within 32 bits
    std::vector<Gate> smallest{truth};
    std::vector<Gate> largest{truth};
    std::vector<Gate> lowest{truth};
    std::vector<Gate> ascending{truth};
    Unknown before = noUnknown;
    std::int64_t value = 0;
    const auto add = [&](Unknown name) {
        all.push_back(&read(unknowns[name].node).condition);
        const auto equals = [&](std::int64_t number) {
            return circuit.between(unknowns[name].quantity, number, number);
        };
        const auto position = static_cast<std::int64_t>(smallest.size());
        smallest.push_back(equals(value));
        largest.push_back(equals(large + position));
        lowest.push_back(equals(-large - position));
        value = value > 0 ? -value : 1 - value; // 0, 1, -1, 2, ...
        if (before != noUnknown) {
            const auto [difference, isSwapped] = unknowns.difference(before, name);
            ascending.push_back(isSwapped ? circuit.between(difference, 1, plusInfinite)
                                          : circuit.between(difference, minusInfinite, -1));
        }
        before = name;
    };
    IdMap<bool> isMet;
    for (const SymbolicExprId call : calls) {
        const SymbolicExpr& node = *leafReader.table().get(call);
        for (std::size_t i = 1; i < node.getNumInputs(); ++i) {
            const TermPlan& argument = plans.of(node.getInput(i));
            steps.take(argument.size());
            for (const Unknown name : argument.unknowns()) {
                if (unknowns[name].kind != UnknownKind::Free || isMet.find(unknowns[name].node) != nullptr)
                    continue;
                isMet.insert(unknowns[name].node, true);
                add(name);
            }
        }
    }
    for (const std::vector<Gate>& truths : {smallest, largest, lowest, ascending}) {
        try {
            const Steps::Share share(steps, steps.left() / 4);
            Decision different = hold(circuit.all(truths), all);
            if (different.isYes() && different.witness)
                return different;
        } catch (const StepsUsedUp&) { // what the calls at fault say may be less
        }
    }
    return {};
}

/// Looks for another witness while the one at hand gives a function two values for equal arguments: that the
/// calls at fault agree where their arguments do becomes part of the question.  Of many such calls a witness with
/// different arguments is looked for first.
void Decider::State::keepFunctions(Decision& decision, Gate truth, Conditions conditions) {
    std::vector<SymbolicExprId> calls;
    for (const ReadCondition* read : conditions)
        calls.insert(calls.end(), read->calls.begin(), read->calls.end());
    keepCallsOfOneFunction(leafReader.table(), calls);
    const std::vector<SymbolicExprId> asMentioned = calls;
    std::ranges::sort(calls, {}, [&](SymbolicExprId call) { return unknowns[unknowns.free(call)].label; });
    calls.erase(std::unique(calls.begin(), calls.end()), calls.end());
    if (calls.size() < 2)
        return;
    std::vector<const ReadCondition*> all(conditions.begin(), conditions.end());
    CallCongruence functions(leafReader, unknowns, plans, steps);
    bool hasManyCalls = false;
    while (decision.isYes()) {
        if (!decision.witness) { // its numbers are too large to evaluate arguments with
            decision = {Answer::Undecided, DecisionBound::Terms, std::nullopt};
            return;
        }
        const auto violations = functions.findViolations(calls, *decision.witness);
        if (violations.empty())
            return;
        if (violations.size() == limits::callPairs && !std::exchange(hasManyCalls, true)) {
            Decision different = withDifferentArguments(asMentioned, truth, all);
            if (different.isYes() && different.witness && functions.findViolations(calls, *different.witness).empty()) {
                decision = std::move(different);
                return;
            }
        }
        std::vector<Gate> truths{truth};
        for (const auto& [first, second] : violations) {
            const ReadCondition& equal = congruence(first, second).condition;
            if (equal.bound != DecisionBound::None) {
                decision = {Answer::Undecided, equal.bound, std::nullopt};
                return;
            }
            all.push_back(&equal);
            truths.push_back(equal.truth);
        }
        truth = circuit.all(truths);
        decision = hold(truth, all);
    }
}

} // namespace VT
