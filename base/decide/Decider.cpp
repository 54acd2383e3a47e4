// Conditions are read into a circuit, once, which is kept.  A question makes of them what has to hold (a && !b), which
// the circuit simplifies while it is made: conditions that share operands are often decided by that.  What is left gets
// its levels in the order in which the question mentions them, and is decided by the first of three ways that can: a
// look at the comparisons, where they are independent; diagrams, for a share of the steps; a search over the
// comparisons.  What stays undecided goes to another solver, if there is one.  A question is charged what reading its
// conditions cost even where they were read before: that makes answers, undecided ones too, independent of earlier
// questions.
#include "base/decide/Decider.hpp"

#include "base/core/Limits.hpp"
#include "base/decide/ConditionReader.hpp"
#include "base/decide/circuit/Question.hpp"
#include "base/decide/external/ExternalSolver.hpp"
#include "base/decide/search/ConditionSearch.hpp"
#include "base/decide/witness/CallCongruence.hpp"
#include "base/decide/witness/WitnessSearch.hpp"

#include <boost/container/small_vector.hpp>

#include <algorithm>
#include <iterator>
#include <limits>
#include <utility>

namespace VT {

namespace {

// Numbers of nodes and edges have 31 bits.
static_assert(limits::decisionSteps <= limits::settableSteps);

} // namespace

struct Decider::State {
    State(const SymbolicExprTable& symbols, const DecisionOptions& asked)
        : options{asked.keywordsInForce, asked.bits32, std::min(asked.steps, limits::settableSteps), asked.solver},
          questionSteps(options.steps),
          printer(symbols, false),
          leafReader(symbols, asked.keywordsInForce),
          unknowns(symbols, printer, asked.bits32 ? std::numeric_limits<std::int32_t>::min() : minusInfinite,
                   asked.bits32 ? std::numeric_limits<std::int32_t>::max() : plusInfinite),
          circuit(unknowns, steps),
          reader(leafReader, unknowns, circuit, steps),
          diagrams(steps),
          witnesses(leafReader, unknowns, diagrams, steps),
          search(unknowns, witnesses, steps) {}

    struct Read {
        ReadCondition condition;
        std::uint64_t steps = 0; ///< that reading took
    };

    using Leaves = std::vector<UnknownLeaf>;

    const Read& read(SymbolicExprId id);
    bool isReadable(SymbolicExprId id);
    const Leaves& leavesOf(std::span<const ReadCondition* const> conditions);
    Decision hold(Gate truth, std::span<const ReadCondition* const> conditions);
    void confine(Decision& decision, Gate truth, std::span<const ReadCondition* const> conditions);
    void makeSmallest(Decision& decision, Gate truth, std::span<const ReadCondition* const> conditions);
    void keepFunctions(Decision& decision, Gate truth, std::span<const ReadCondition* const> conditions);
    template <class Combine>
    Decision decide(AskedOf asked, std::span<const SymbolicExprId> ids, Combine combine);
    void askSolver(AskedOf asked, std::span<const SymbolicExprId> ids, Decision& decision);
    std::optional<bool> evaluate(SymbolicExprId condition, const Witness& witness);
    Decision same();
    void begin();
    std::uint64_t end();
    void clear();

    DecisionOptions options;
    std::uint64_t questionSteps;                                           ///< that a question may cost
    Budget* budget = nullptr;                                              ///< of several questions
    std::size_t solverQuestions = std::numeric_limits<std::size_t>::max(); ///< that may go to the solver
    SymbolicExprPrinter printer;
    LeafReader leafReader;
    Steps steps;
    Unknowns unknowns;
    Circuit circuit;
    ConditionReader reader;
    Question question;
    Diagrams diagrams;
    WitnessSearch witnesses;
    ConditionSearch search;
    IdMap<std::unique_ptr<Read>> known;
    Leaves joined;
    bool isSmallest = true; ///< the latest witness, by the way in which it was found
    std::uint64_t taken = 0;
};

Decider::Decider(const SymbolicExprTable& table, const DecisionOptions& options)
    : state_(std::make_unique<State>(table, options)) {}

Decider::Decider(Decider&&) noexcept = default;
Decider& Decider::operator=(Decider&&) noexcept = default;
Decider::~Decider() = default;

void Decider::State::clear() {
    known.clear();
    circuit.clear();
    unknowns.clear();
    question.clear();
}

/// Begins a question with the steps that it may cost.
void Decider::State::begin() {
    steps.refill(budget == nullptr ? questionSteps : std::min(questionSteps, budget->left()));
}

/// Ends it; returns the steps that it took.
std::uint64_t Decider::State::end() {
    const std::uint64_t all = steps.total() - steps.left();
    if (budget != nullptr)
        budget->take(all + 1);
    return all;
}

/// Reads a condition, or charges what reading it cost.
const Decider::State::Read& Decider::State::read(SymbolicExprId id) {
    static const Read missing = [] {
        Read none;
        none.condition.bound = DecisionBound::NoCondition;
        return none;
    }();
    if (!leafReader.table().has(id))
        return missing;
    if (const auto* before = known.find(id); before != nullptr) {
        steps.take((*before)->steps);
        return **before;
    }
    const std::uint64_t available = steps.left();
    auto fresh = std::make_unique<Read>();
    fresh->condition = reader.read(id);
    fresh->steps = available - steps.left();
    return *known.insert(id, std::move(fresh));
}

bool Decider::State::isReadable(SymbolicExprId id) {
    begin();
    try {
        const bool isRead = read(id).condition.bound == DecisionBound::None;
        end();
        return isRead;
    } catch (const StepsUsedUp&) {
        end();
        return false;
    } catch (...) {
        clear();
        throw;
    }
}

/// The leaves of several conditions, each once.
const Decider::State::Leaves& Decider::State::leavesOf(std::span<const ReadCondition* const> conditions) {
    if (conditions.size() == 1)
        return conditions.front()->leaves;
    joined.clear();
    const auto before = [&](const UnknownLeaf& a, const UnknownLeaf& b) { return comesBefore(unknowns, a, b); };
    if (conditions.size() == 2) {
        std::ranges::merge(conditions[0]->leaves, conditions[1]->leaves, std::back_inserter(joined), before);
    } else {
        for (const ReadCondition* read : conditions)
            joined.insert(joined.end(), read->leaves.begin(), read->leaves.end());
        std::ranges::sort(joined, before);
    }
    joined.erase(std::unique(joined.begin(), joined.end()), joined.end());
    return joined;
}

/// Whether what was made of the conditions can hold.
Decision Decider::State::hold(Gate truth, std::span<const ReadCondition* const> conditions) {
    if (truth == never)
        return {Answer::No, DecisionBound::None, std::nullopt};
    question.begin();
    for (const ReadCondition* condition : conditions)
        question.mention(condition->met);
    question.ask(circuit, unknowns, steps, truth);
    const Leaves& leaves = leavesOf(conditions);
    isSmallest = true;
    if (auto atOnce = witnesses.findAtOnce(question, leaves))
        return *std::move(atOnce);
    try {
        const Steps::Share share(steps, std::max(steps.total() / limits::diagramShare, limits::diagramSteps));
        Decision decision = witnesses.find(question, diagrams.of(question), leaves);
        isSmallest = !witnesses.hasTerms();
        if (decision.bound != DecisionBound::Steps)
            return decision;
    } catch (const StepsUsedUp&) { // the search may take fewer
    }
    Decision decision = search.find(question, leaves);
    isSmallest = !witnesses.hasTerms();
    return decision;
}

/// Looks for a witness with numbers of 64 bits where the one that was found has larger ones.
void Decider::State::confine(Decision& decision, Gate truth, std::span<const ReadCondition* const> conditions) {
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
void Decider::State::makeSmallest(Decision& decision, Gate truth, std::span<const ReadCondition* const> conditions) {
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

/// Looks for another witness while the one at hand gives a function two values for equal arguments: that the
/// calls at fault agree where their arguments do becomes part of the question.
void Decider::State::keepFunctions(Decision& decision, Gate truth, std::span<const ReadCondition* const> conditions) {
    std::vector<SymbolicExprId> calls;
    for (const ReadCondition* read : conditions)
        calls.insert(calls.end(), read->calls.begin(), read->calls.end());
    if (calls.size() < 2)
        return;
    std::ranges::sort(calls, {}, [&](SymbolicExprId call) { return unknowns[unknowns.free(call)].label; });
    calls.erase(std::unique(calls.begin(), calls.end()), calls.end());
    if (calls.size() < 2)
        return;
    std::vector<const ReadCondition*> all(conditions.begin(), conditions.end());
    std::vector<std::unique_ptr<ReadCondition>> added;
    CallCongruence congruence(leafReader, unknowns, steps);
    while (decision.isYes()) {
        if (!decision.witness) { // its numbers are too large to evaluate arguments with
            decision = {Answer::Undecided, DecisionBound::Terms, std::nullopt};
            return;
        }
        const auto violations = congruence.findViolations(calls, *decision.witness);
        if (violations.empty())
            return;
        std::vector<Gate> truths{truth};
        for (const auto& [first, second] : violations) {
            added.push_back(std::make_unique<ReadCondition>(reader.readCongruence(first, second)));
            const ReadCondition& equal = *added.back();
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

/// Asks another solver what stayed undecided.
void Decider::State::askSolver(AskedOf asked, std::span<const SymbolicExprId> ids, Decision& decision) {
    if (options.solver == nullptr || solverQuestions == 0)
        return;
    if (budget != nullptr && budget->left() < limits::solverSteps)
        return;
    --solverQuestions;
    if (budget != nullptr)
        budget->take(limits::solverSteps);
    const auto confirms = [&](const Witness& witness, std::span<const SymbolicExprId> calls) {
        std::vector<bool> truths;
        for (const SymbolicExprId id : ids) {
            const auto truth = evaluate(id, witness);
            if (!truth)
                return false;
            truths.push_back(*truth);
        }
        begin();
        const bool isConfirmed = isAsAsked(asked, truths) &&
                                 CallCongruence(leafReader, unknowns, steps).findViolations(calls, witness).empty();
        taken += end();
        return isConfirmed;
    };
    Decision other = decideExternally(*options.solver, {leafReader, ids, asked, options.bits32,
                                                        [&](SymbolicExprId id) { return printer(id); }, confirms});
    if (!other.isUndecided())
        decision = std::move(other);
}

/// Asks whether what `combine` makes of the conditions, which is what `asked` says, can hold.
template <class Combine>
Decision Decider::State::decide(AskedOf asked, std::span<const SymbolicExprId> ids, Combine combine) {
    if (circuit.size() > limits::circuitSize)
        clear();
    begin();
    Decision decision;
    try {
        boost::container::small_vector<const ReadCondition*, 4> conditions;
        conditions.reserve(ids.size());
        for (const SymbolicExprId id : ids) {
            conditions.push_back(&read(id).condition);
            if (conditions.back()->bound != DecisionBound::None)
                decision.bound = conditions.back()->bound;
        }
        if (decision.bound == DecisionBound::None) {
            boost::container::small_vector<Gate, 4> truths(ids.size(), always);
            std::ranges::transform(conditions, truths.begin(), &ReadCondition::truth);
            const Gate truth = combine(std::span<const Gate>(truths.data(), truths.size()));
            decision = hold(truth, {conditions.data(), conditions.size()});
            const std::span<const ReadCondition* const> all(conditions.data(), conditions.size());
            if (decision.isYes() && !decision.witness)
                confine(decision, truth, all);
            if (decision.isYes() && decision.witness && !isSmallest)
                makeSmallest(decision, truth, all);
            if (decision.isYes())
                keepFunctions(decision, truth, all);
        }
    } catch (const StepsUsedUp&) {
        decision = {Answer::Undecided, DecisionBound::Steps, std::nullopt};
    } catch (...) { // memory ran out somewhere between two structures that go together
        clear();
        throw;
    }
    taken = end();
    if (decision.isUndecided() && decision.bound != DecisionBound::NoCondition) {
        try {
            askSolver(asked, ids, decision);
        } catch (const StepsUsedUp&) { // stays undecided
        } catch (...) {
            clear();
            throw;
        }
    }
    return decision;
}

/// What needs no reading: a condition agrees with itself.
Decision Decider::State::same() {
    taken = 0;
    return {Answer::Yes, DecisionBound::None, std::nullopt};
}

Decision Decider::canHold(SymbolicExprId condition) {
    return state_->decide(AskedOf::Holds, std::span(&condition, 1), [](std::span<const Gate> c) { return c[0]; });
}

Decision Decider::mustHold(SymbolicExprId condition) {
    return state_
        ->decide(AskedOf::Fails, std::span(&condition, 1), [](std::span<const Gate> c) { return opposite(c[0]); })
        .opposite();
}

Decision Decider::overlaps(SymbolicExprId a, SymbolicExprId b) {
    const SymbolicExprId pair[] = {a, b};
    return state_->decide(AskedOf::Both, pair,
                          [&](std::span<const Gate> c) { return state_->circuit.both(c[0], c[1]); });
}

Decision Decider::disjoint(SymbolicExprId a, SymbolicExprId b) {
    return overlaps(a, b).opposite();
}

Decision Decider::implies(SymbolicExprId a, SymbolicExprId b) {
    if (a == b && state_->leafReader.table().has(a))
        return state_->same();
    const SymbolicExprId pair[] = {a, b};
    return state_
        ->decide(AskedOf::FirstAlone, pair,
                 [&](std::span<const Gate> c) { return state_->circuit.both(c[0], opposite(c[1])); })
        .opposite();
}

Decision Decider::equivalent(SymbolicExprId a, SymbolicExprId b) {
    if (a == b && state_->leafReader.table().has(a))
        return state_->same();
    const SymbolicExprId pair[] = {a, b};
    Circuit& circuit = state_->circuit;
    return state_
        ->decide(AskedOf::Differ, pair,
                 [&](std::span<const Gate> c) {
                     return circuit.either(circuit.both(c[0], opposite(c[1])), circuit.both(opposite(c[0]), c[1]));
                 })
        .opposite();
}

Decision Decider::equivalentGiven(SymbolicExprId a, SymbolicExprId b, SymbolicExprId known) {
    if (a == b && state_->leafReader.table().has(a) && state_->leafReader.table().has(known))
        return state_->same();
    const SymbolicExprId three[] = {a, b, known};
    Circuit& circuit = state_->circuit;
    return state_
        ->decide(AskedOf::DifferGiven, three,
                 [&](std::span<const Gate> c) {
                     const Gate onlyA = circuit.both(c[0], opposite(c[1]));
                     const Gate onlyB = circuit.both(opposite(c[0]), c[1]);
                     return circuit.both(c[2], circuit.either(onlyA, onlyB));
                 })
        .opposite();
}

Relation Decider::classify(SymbolicExprId a, SymbolicExprId b) {
    std::uint64_t taken = 0;
    const std::uint64_t allowed = state_->questionSteps;
    const auto counted = [&](Decision decision) {
        taken += state_->taken;
        if (decision.bound == DecisionBound::Steps)
            limitSteps(std::min(allowed, limits::furtherSteps));
        return decision;
    };
    Decision onlyA = counted(implies(a, b).opposite());
    Decision onlyB = counted(implies(b, a).opposite());
    Relation relation = Relation::of(std::move(onlyA), std::move(onlyB), counted(overlaps(a, b)));
    state_->taken = taken;
    limitSteps(allowed);
    return relation;
}

SetDecision Decider::covers(std::span<const SymbolicExprId> conditions) {
    return {state_
                ->decide(AskedOf::NoneHolds, conditions,
                         [&](std::span<const Gate> c) { return opposite(state_->circuit.any(c)); })
                .opposite(),
            std::nullopt};
}

SetDecision Decider::disjoint(std::span<const SymbolicExprId> conditions) {
    Circuit& circuit = state_->circuit;
    const auto either = [&](Gate a, Gate b) { return opposite(circuit.nested(opposite(a), opposite(b))); };
    // For halves of the set: where one holds, and where two do.
    const auto two = [&](std::span<const Gate> c) {
        std::vector<std::pair<Gate, Gate>> level;
        level.reserve(c.size());
        for (const Gate truth : c)
            level.emplace_back(truth, never);
        while (level.size() > 1) {
            for (std::size_t i = 0; i + 1 < level.size(); i += 2) {
                const auto [oneA, twoA] = level[i];
                const auto [oneB, twoB] = level[i + 1];
                const Gate twoAB = either(either(twoA, twoB), circuit.nested(oneA, oneB));
                level[i / 2] = {either(oneA, oneB), twoAB};
            }
            if (level.size() % 2 != 0)
                level[level.size() / 2] = level.back();
            level.resize((level.size() + 1) / 2);
        }
        return level.empty() ? never : level.front().second;
    };
    SetDecision decision{state_->decide(AskedOf::TwoHold, conditions, two).opposite(), std::nullopt};
    if (!decision.isNo() || !decision.witness)
        return decision;
    std::optional<std::size_t> first;
    for (std::size_t i = 0; i < conditions.size(); ++i) {
        if (!holds(conditions[i], *decision.witness).value_or(false))
            continue;
        if (first) {
            decision.members = {*first, i};
            break;
        }
        first = i;
    }
    return decision;
}

std::optional<bool> Decider::holds(SymbolicExprId condition, const Witness& witness) {
    return state_->isReadable(condition) ? state_->evaluate(condition, witness) : std::nullopt;
}

/// The same for a condition without missing operands.
std::optional<bool> Decider::State::evaluate(SymbolicExprId condition, const Witness& witness) {
    IdMap<std::int64_t> values;
    std::int64_t simulation = 0;
    for (const UnknownValue& each : witness) {
        values.insert(each.unknown, each.value);
        if (!leafReader.table().has(each.unknown))
            continue;
        const LeafMeaning::Kind kind = leafReader(each.unknown).kind;
        if (kind == LeafMeaning::Kind::Simulation || kind == LeafMeaning::Kind::CodeGeneration)
            simulation = (kind == LeafMeaning::Kind::Simulation) == (each.value != 0) ? 1 : 0;
    }
    TermPlan plan(leafReader, unknowns, condition);
    const auto valueOf = [&](Unknown unknown) {
        const UnknownInfo& info = unknowns[unknown];
        if (info.kind == UnknownKind::Simulation)
            return simulation;
        const std::int64_t* found = values.find(info.node);
        return found != nullptr ? *found : std::int64_t{0};
    };
    if (const auto value = plan.value(valueOf))
        return *value != 0;
    const auto exact = plan.exactValue(valueOf); // beyond 64 bits, or with real literals
    return exact ? std::optional(exact->sign() != 0) : std::nullopt;
}

std::string Decider::nameOf(SymbolicExprId unknown) const {
    return state_->printer(unknown);
}

const DecisionOptions& Decider::options() const noexcept {
    return state_->options;
}

void Decider::limitSteps(std::uint64_t steps) noexcept {
    state_->questionSteps = std::min(steps, state_->options.steps);
}

std::size_t Decider::limitSolver(std::size_t questions) noexcept {
    return std::exchange(state_->solverQuestions, questions);
}

void Decider::share(Budget* budget) noexcept {
    state_->budget = budget;
}

std::uint64_t Decider::stepsTaken() const noexcept {
    return state_->taken;
}

void Decider::clear() {
    state_->clear();
}

} // namespace VT
