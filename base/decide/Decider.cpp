// Questions are asked of two kinds of diagrams: those of conditions, which are read once and kept, and those that a
// question makes of them (a && !b).  All questions come down to whether one diagram can hold.  A question is charged
// what reading its conditions cost even where they were read before, and the And of two diagrams is remembered within a
// question only: that makes answers, undecided ones too, independent of earlier questions, for the price of some work
// done again.
#include "base/decide/Decider.hpp"

#include "base/decide/ConditionReader.hpp"
#include "base/decide/witness/WitnessSearch.hpp"

#include <boost/container/small_vector.hpp>

#include <algorithm>
#include <iterator>
#include <limits>

namespace VT {

namespace {

/// Numbers of nodes and edges have 31 bits.
constexpr std::uint64_t mostSteps = std::uint64_t{1} << 24U;
static_assert(limits::decisionSteps <= mostSteps);

} // namespace

struct Decider::State {
    State(const SymbolicExprTable& symbols, const DecisionOptions& asked)
        : options{asked.keywordsInForce, asked.bits32, std::min(asked.steps, mostSteps)},
          questionSteps(options.steps),
          printer(symbols, false),
          leafReader(symbols, asked.keywordsInForce),
          unknowns(symbols, printer, asked.bits32 ? std::numeric_limits<std::int32_t>::min() : minusInfinite,
                   asked.bits32 ? std::numeric_limits<std::int32_t>::max() : plusInfinite),
          diagrams(unknowns, steps),
          reader(leafReader, unknowns, diagrams, steps),
          search(leafReader, unknowns, diagrams, steps) {}

    struct Read {
        ReadCondition condition;
        std::uint64_t steps = 0; ///< that reading took
    };

    using Leaves = std::vector<UnknownLeaf>;

    const Read& read(SymbolicExprId id);
    bool isReadable(SymbolicExprId id);
    const Leaves& leavesOf(std::span<const Read* const> conditions);
    template <class Combine>
    Decision decide(std::span<const SymbolicExprId> ids, Combine combine);
    void clear();

    DecisionOptions options;
    std::uint64_t questionSteps; ///< that a question may cost
    SymbolicExprPrinter printer;
    LeafReader leafReader;
    Steps steps;
    Unknowns unknowns;
    Diagrams diagrams;
    ConditionReader reader;
    WitnessSearch search;
    IdMap<std::unique_ptr<Read>> known;
    Leaves joined;
    std::uint64_t taken = 0;
};

Decider::Decider(const SymbolicExprTable& table, const DecisionOptions& options)
    : state_(std::make_unique<State>(table, options)) {}

Decider::Decider(Decider&&) noexcept = default;
Decider& Decider::operator=(Decider&&) noexcept = default;
Decider::~Decider() = default;

void Decider::State::clear() {
    known.clear();
    diagrams.clear();
    unknowns.clear();
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
    diagrams.beginQuestion();
    const std::uint64_t available = steps.left();
    auto fresh = std::make_unique<Read>();
    fresh->condition = reader.read(id);
    fresh->steps = available - steps.left();
    return *known.insert(id, std::move(fresh));
}

bool Decider::State::isReadable(SymbolicExprId id) {
    steps.refill(questionSteps);
    try {
        return read(id).condition.bound == DecisionBound::None;
    } catch (const StepsUsedUp&) {
        return false;
    } catch (...) {
        clear();
        throw;
    }
}

/// The leaves of several conditions, each once.
const Decider::State::Leaves& Decider::State::leavesOf(std::span<const Read* const> conditions) {
    if (conditions.size() == 1)
        return conditions.front()->condition.leaves;
    joined.clear();
    const auto before = [&](const UnknownLeaf& a, const UnknownLeaf& b) { return comesBefore(unknowns, a, b); };
    if (conditions.size() == 2) {
        std::ranges::merge(conditions[0]->condition.leaves, conditions[1]->condition.leaves, std::back_inserter(joined),
                           before);
    } else {
        for (const Read* read : conditions)
            joined.insert(joined.end(), read->condition.leaves.begin(), read->condition.leaves.end());
        std::ranges::sort(joined, before);
    }
    joined.erase(std::unique(joined.begin(), joined.end()), joined.end());
    return joined;
}

/// Asks whether what `combine` makes of the conditions' diagrams can hold.
template <class Combine>
Decision Decider::State::decide(std::span<const SymbolicExprId> ids, Combine combine) {
    if (diagrams.edgesHeld() > limits::diagramEdges)
        clear();
    steps.refill(questionSteps);
    Decision decision;
    try {
        boost::container::small_vector<const Read*, 4> conditions;
        conditions.reserve(ids.size());
        for (const SymbolicExprId id : ids) {
            conditions.push_back(&read(id));
            if (conditions.back()->condition.bound != DecisionBound::None)
                decision.bound = conditions.back()->condition.bound;
        }
        if (decision.bound == DecisionBound::None) {
            diagrams.beginQuestion();
            boost::container::small_vector<Diagram, 4> truths;
            truths.reserve(ids.size());
            for (const Read* condition : conditions)
                truths.push_back(condition->condition.truth);
            const Diagram diagram = combine(std::span<const Diagram>(truths.data(), truths.size()));
            decision =
                search.find(diagram, diagram == never ? joined : leavesOf({conditions.data(), conditions.size()}));
        }
    } catch (const StepsUsedUp&) {
        decision = {Answer::Undecided, DecisionBound::Steps, std::nullopt};
    } catch (...) { // memory ran out somewhere between two structures that go together
        clear();
        throw;
    }
    taken = questionSteps - steps.left();
    return decision;
}

Decision Decider::canHold(SymbolicExprId condition) {
    return state_->decide(std::span(&condition, 1), [](std::span<const Diagram> c) { return c[0]; });
}

Decision Decider::mustHold(SymbolicExprId condition) {
    return state_->decide(std::span(&condition, 1), [](std::span<const Diagram> c) { return opposite(c[0]); })
        .opposite();
}

Decision Decider::overlaps(SymbolicExprId a, SymbolicExprId b) {
    const SymbolicExprId pair[] = {a, b};
    return state_->decide(pair, [&](std::span<const Diagram> c) { return state_->diagrams.both(c[0], c[1]); });
}

Decision Decider::disjoint(SymbolicExprId a, SymbolicExprId b) {
    return overlaps(a, b).opposite();
}

Decision Decider::implies(SymbolicExprId a, SymbolicExprId b) {
    const SymbolicExprId pair[] = {a, b};
    return state_->decide(pair, [&](std::span<const Diagram> c) { return state_->diagrams.both(c[0], opposite(c[1])); })
        .opposite();
}

Decision Decider::equivalent(SymbolicExprId a, SymbolicExprId b) {
    const SymbolicExprId pair[] = {a, b};
    Diagrams& diagrams = state_->diagrams;
    return state_
        ->decide(pair,
                 [&](std::span<const Diagram> c) {
                     return diagrams.either(diagrams.both(c[0], opposite(c[1])), diagrams.both(opposite(c[0]), c[1]));
                 })
        .opposite();
}

Decision Decider::equivalentGiven(SymbolicExprId a, SymbolicExprId b, SymbolicExprId known) {
    const SymbolicExprId three[] = {a, b, known};
    Diagrams& diagrams = state_->diagrams;
    return state_
        ->decide(three,
                 [&](std::span<const Diagram> c) {
                     const Diagram onlyA = diagrams.both(c[0], opposite(c[1]));
                     const Diagram onlyB = diagrams.both(opposite(c[0]), c[1]);
                     return diagrams.both(c[2], diagrams.either(onlyA, onlyB));
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
    return {state_->decide(conditions, [&](std::span<const Diagram> c) { return opposite(state_->diagrams.any(c)); })
                .opposite(),
            std::nullopt};
}

SetDecision Decider::disjoint(std::span<const SymbolicExprId> conditions) {
    Diagrams& diagrams = state_->diagrams;
    // For halves of the set: where one holds, and where two do.
    const auto two = [&](std::span<const Diagram> c) {
        std::vector<std::pair<Diagram, Diagram>> level;
        level.reserve(c.size());
        for (const Diagram diagram : c)
            level.emplace_back(diagram, never);
        while (level.size() > 1) {
            for (std::size_t i = 0; i + 1 < level.size(); i += 2) {
                const auto [oneA, twoA] = level[i];
                const auto [oneB, twoB] = level[i + 1];
                const Diagram twoAB = diagrams.either(diagrams.either(twoA, twoB), diagrams.both(oneA, oneB));
                level[i / 2] = {diagrams.either(oneA, oneB), twoAB};
            }
            if (level.size() % 2 != 0)
                level[level.size() / 2] = level.back();
            level.resize((level.size() + 1) / 2);
        }
        return level.empty() ? never : level.front().second;
    };
    SetDecision decision{state_->decide(conditions, two).opposite(), std::nullopt};
    if (!decision.isNo())
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
    if (!state_->isReadable(condition))
        return std::nullopt;
    IdMap<std::int64_t> values;
    std::int64_t simulation = 0;
    for (const UnknownValue& each : witness) {
        values.insert(each.unknown, each.value);
        if (!state_->leafReader.table().has(each.unknown))
            continue;
        const LeafMeaning::Kind kind = state_->leafReader(each.unknown).kind;
        if (kind == LeafMeaning::Kind::Simulation || kind == LeafMeaning::Kind::CodeGeneration)
            simulation = (kind == LeafMeaning::Kind::Simulation) == (each.value != 0) ? 1 : 0;
    }
    TermPlan plan(state_->leafReader, state_->unknowns, condition);
    const auto value = plan.value([&](Unknown unknown) {
        const UnknownInfo& info = state_->unknowns[unknown];
        if (info.kind == UnknownKind::Simulation)
            return simulation;
        const std::int64_t* found = values.find(info.node);
        return found != nullptr ? *found : std::int64_t{0};
    });
    return value ? std::optional(*value != 0) : std::nullopt;
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

std::uint64_t Decider::stepsTaken() const noexcept {
    return state_->taken;
}

void Decider::clear() {
    state_->clear();
}

} // namespace VT
