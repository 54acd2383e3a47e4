// Walks the paths of a diagram to the smallest assignment that reaches `always`.
//
// Method: branch and bound. A frame for each node on the path holds the solution of the bounds so far, which is a lower
// bound for all assignments below; edges are tried from that solution outwards.
//
// Cost: one step for each edge tried plus those of the difference system.
#include "base/decide/witness/WitnessSearch.hpp"

#include "base/core/Check.hpp"
#include "base/core/Limits.hpp"

#include <algorithm>

namespace VT {

namespace {

/// The edges of a node from one of them outwards: itself, the one above, the one below, and so on.
std::size_t outward(std::size_t origin, std::size_t step, std::size_t count) {
    const std::size_t below = origin;
    const std::size_t above = count - 1 - origin;
    const std::size_t pairs = std::min(below, above);
    if (step > 2 * pairs)
        return above > below ? origin + (step - pairs) : origin - (step - pairs);
    return step % 2 == 1 ? origin + (step + 1) / 2 : origin - step / 2;
}

} // namespace

WitnessSearch::WitnessSearch(TermPlans& plans, Unknowns& unknowns, Diagrams& diagrams, Steps& steps)
    : plans_(plans),
      unknowns_(unknowns),
      diagrams_(diagrams),
      steps_(steps),
      system_(steps),
      smallest_(steps),
      pathSystem_(unknowns, steps) {}

Decision WitnessSearch::find(const Question& question, Diagram diagram, std::span<const UnknownLeaf> leaves) {
    question_ = &question;
    terms_.clear();
    if (diagram == never)
        return {Answer::No, DecisionBound::None, std::nullopt};
    if (!diagrams_.needsChecking(diagram))
        return {Answer::Yes, DecisionBound::None, smallestOf(diagram, leaves)};
    DecisionBound bound = DecisionBound::None;
    best_.reset();
    unconfirmed_ = false;
    tooHard_ = false;
    first_ = true;
    try {
        collect(diagram, leaves, Order::Mentioned);
        walkPaths(diagram);
    } catch (const StepsUsedUp&) {
        bound = DecisionBound::Steps;
    }
    if (!best_) {
        if (tooHard_)
            bound = DecisionBound::Steps;
        else if (bound == DecisionBound::None && unconfirmed_)
            bound = DecisionBound::Terms;
        return {bound == DecisionBound::None ? Answer::No : Answer::Undecided, bound, std::nullopt};
    }
    const std::vector<std::int64_t> mentioned = std::move(*best_);
    bool isWide = isWide_;
    bool isLarge = isLarge_;
    const std::vector<Unknown> unknowns = order_;
    steps_.spellOut([&] {
        best_.reset();
        collect(diagram, leaves, Order::Texts);
        std::vector<std::int64_t> values(order_.size() + 1);
        for (std::size_t i = 0; i < unknowns.size(); ++i)
            values[numberOf(unknowns[i])] = mentioned[i + 1];
        first_ = !terms_.empty();
        if (!first_)
            best_ = values;
        walkPaths(diagram);
        if (best_) {
            isWide = isWide_;
            isLarge = isLarge_;
        } else {
            best_ = std::move(values);
        }
    });
    VTSYM_CHECK(!best_ || isLarge || holds(*best_));
    if (isWide)
        return {Answer::Yes, DecisionBound::None, std::nullopt};
    if (best_)
        return {Answer::Yes, DecisionBound::None,
                witness(leaves, [&](Unknown unknown) { return (*best_)[numberOf(unknown)]; })};
    IdMap<std::int64_t> values;
    for (std::size_t i = 0; i < unknowns.size(); ++i)
        values.insert(unknowns[i], mentioned[i + 1]);
    return {Answer::Yes, DecisionBound::None, witness(leaves, [&](Unknown unknown) { return *values.find(unknown); })};
}

// Paths.

void WitnessSearch::beginNumbers() {
    order_.clear();
    numbers_.clear();
    terms_.clear();
    movable_.clear();
    path_.clear();
    triesLeft_ = limits::confirmations;
}

void WitnessSearch::meet(Unknown unknown) {
    if (numbers_.find(unknown) == nullptr) {
        numbers_.insert(unknown, 0);
        order_.push_back(unknown);
    }
}

/// Numbers the unknowns below a diagram and those of the leaves.
void WitnessSearch::collect(Diagram diagram, std::span<const UnknownLeaf> leaves, Order order) {
    beginNumbers();
    IdMap<bool> seen;
    std::vector<Diagram> pending{diagram};
    while (!pending.empty()) {
        const Diagram next = pending.back();
        pending.pop_back();
        if (next <= never || seen.find(next >> 1U) != nullptr)
            continue;
        seen.insert(next >> 1U, true);
        steps_.take(diagrams_.edgeCount(next));
        const LevelInfo& level = question_->levels()[diagrams_.level(next)];
        meet(level.plus);
        if (level.minus != noUnknown)
            meet(level.minus);
        for (std::size_t i = 0; i < diagrams_.edgeCount(next); ++i)
            pending.push_back(diagrams_.edge(next, i).child);
    }
    number(leaves, order);
}

/// Numbers the unknowns that were met, those of the leaves and what they are computed from.
void WitnessSearch::number(std::span<const UnknownLeaf> leaves, Order order) {
    wantsSmallest_ = order == Order::Texts;
    for (const UnknownLeaf& leaf : leaves)
        meet(leaf.unknown);
    free_.clear();
    const auto meetOperand = [&](Unknown operand) {
        meet(operand);
        if (!unknowns_[operand].isComputed())
            free_.push_back(operand);
    };
    for (std::size_t i = 0; i < order_.size(); ++i) { // NOLINT(modernize-loop-convert): meeting more appends
        const UnknownInfo& info = unknowns_[order_[i]];
        if (!info.isComputed())
            continue;
        terms_.push_back({order_[i], nullptr}); // its number follows
        for (const LinearPart& part : info.sum)
            meetOperand(part.unknown);
        if (info.floor != nullptr)
            for (const WidePart& part : info.floor->form.parts)
                meetOperand(part.unknown);
        if (info.kind == UnknownKind::Term) {
            TermPlan& plan = plans_.of(info.node); // may move what was known of the unknown
            terms_.back().plan = &plan;
            steps_.take(plan.size() * limits::plannedNodeSteps);
            for (const Unknown unknown : plan.unknowns()) {
                meet(unknown);
                free_.push_back(unknown);
            }
        }
    }
    std::ranges::sort(order_, [&](Unknown a, Unknown b) { return comesBefore(a, b, order); });
    for (std::size_t i = 0; i < order_.size(); ++i)
        numbers_.insert(order_[i], static_cast<Number>(i + 1));
    const auto isSum = [&](const Term& term) { return unknowns_[order_[term.number - 1]].kind == UnknownKind::Sum; };
    for (Term& term : terms_)
        term.number = numberOf(term.number);
    std::ranges::sort(terms_, {}, [&](const Term& term) { return std::pair(isSum(term), term.number); });
    for (const Unknown unknown : free_)
        movable_.push_back(numberOf(unknown));
    std::ranges::sort(movable_);
    movable_.erase(std::unique(movable_.begin(), movable_.end()), movable_.end());
    system_.begin(order_.size());
    for (const Unknown each : order_)
        restrictSystem(each, noUnknown, unknowns_[each].low, unknowns_[each].high);
}

/// What is computed comes after what it may be computed from, whatever the order.
bool WitnessSearch::comesBefore(Unknown a, Unknown b, Order order) const {
    const UnknownKind kindA = unknowns_[a].kind;
    const UnknownKind kindB = unknowns_[b].kind;
    if (kindA != kindB && (unknowns_[a].isComputed() || unknowns_[b].isComputed()))
        return kindA < kindB;
    if (order == Order::Texts && !unknowns_[a].isComputed())
        return unknowns_.before(a, b);
    if (kindA == UnknownKind::Sum && kindB == UnknownKind::Sum) // which are not mentioned themselves
        return question_->levelOf(unknowns_[a].quantity) < question_->levelOf(unknowns_[b].quantity);
    return question_->rankOf(a) < question_->rankOf(b);
}

/// Throws StepsUsedUp, too, where paths that nothing meets take more than a part of the steps: a search that learns
/// from them takes fewer.
void WitnessSearch::walkPaths(Diagram diagram) {
    std::uint64_t inVain = 0;
    frames_.clear();
    solutions_.assign(1, {});
    if (!system_.solve(solutions_.back()))
        return;
    enter(diagram);
    while (!frames_.empty()) {
        Frame& frame = frames_.back();
        shrink(frame.bounds);
        solutions_.resize(frame.solutions);
        const std::size_t count = diagrams_.edgeCount(frame.diagram);
        if (frame.next == count || (first_ && best_) || (best_ && !improves(solutions_.back()))) {
            frames_.pop_back();
            continue;
        }
        const std::size_t edge = outward(frame.origin, frame.next++, count);
        const Diagram child = diagrams_.edge(frame.diagram, edge).child;
        steps_.take();
        if (child == never || !take(frame, edge))
            continue;
        if (child != always) {
            enter(child);
            continue;
        }
        const std::uint64_t before = steps_.left();
        const PathEnd end = reachedTruth(steps_.total() / limits::pathShare);
        unconfirmed_ = unconfirmed_ || end == PathEnd::Open;
        tooHard_ = tooHard_ || end == PathEnd::Hard;
        if (end == PathEnd::Excluded)
            inVain += before - steps_.left();
        if (inVain > steps_.total() / limits::vainShare)
            throw StepsUsedUp{};
    }
}

void WitnessSearch::enter(Diagram diagram) {
    const LevelInfo& level = question_->levels()[diagrams_.level(diagram)];
    const std::vector<std::int64_t>& values = solutions_.back();
    std::int64_t value = values[numberOf(level.plus)] - (level.minus != noUnknown ? values[numberOf(level.minus)] : 0);
    frames_.push_back({diagram, diagrams_.edgeOf(diagram, value), 0, system_.size(), solutions_.size()});
}

void WitnessSearch::restrict(const LevelInfo& level, std::int64_t low, std::int64_t high) {
    if (level.opposed)
        restrict(noUnknown, level.plus, low, high);
    else
        restrict(level.plus, level.minus, low, high);
}

void WitnessSearch::restrict(Unknown plus, Unknown minus, std::int64_t low, std::int64_t high) {
    path_.push_back({plus, minus, low, high, system_.size()});
    restrictSystem(plus, minus, low, high);
}

/// Whether the question has the opposite of a sum; the difference system has the same.
bool WitnessSearch::isOpposed(Unknown unknown) const {
    const Level level = question_->levelOf(unknowns_[unknown].quantity);
    return level != noLevel && question_->levels()[level].opposed;
}

void WitnessSearch::restrictSystem(Unknown plus, Unknown minus, std::int64_t low, std::int64_t high) {
    if (plus == noUnknown)
        system_.restrict(numberOf(minus), 0, low, high);
    else if (isOpposed(plus)) {
        system_.restrict(numberOf(plus), 0, high == plusInfinite ? minusInfinite : -high,
                         low == minusInfinite ? plusInfinite : -low);
    } else {
        system_.restrict(numberOf(plus), minus != noUnknown ? numberOf(minus) : 0, low, high);
    }
}

/// Takes the latest bounds away.
void WitnessSearch::shrink(std::size_t size) {
    while (!path_.empty() && path_.back().bounds >= size)
        path_.pop_back();
    system_.shrink(size);
}

/// Adds the bounds of an edge; false where they cannot be met, or only by what is no better than the witness at hand.
bool WitnessSearch::take(const Frame& frame, std::size_t edge) {
    const LevelInfo& level = question_->levels()[diagrams_.level(frame.diagram)];
    const std::int64_t low = edge == 0 ? minusInfinite : diagrams_.edge(frame.diagram, edge - 1).high + 1;
    const std::int64_t high = diagrams_.edge(frame.diagram, edge).high;
    const bool isOrigin = edge == frame.origin;
    restrict(level, low, high);
    if (isOrigin)
        return true;
    std::vector<std::int64_t> values;
    if (!system_.solve(values) || (best_ && !improves(values)))
        return false;
    solutions_.push_back(std::move(values));
    return true;
}

bool WitnessSearch::improves(const std::vector<std::int64_t>& values) const {
    for (std::size_t i = 1; i < values.size(); ++i)
        if (values[i] != (*best_)[i])
            return isSmaller(values[i], (*best_)[i]);
    return false;
}

/// Looks for values within the bounds, whose smallest solution is at hand; they are in best_ then.
WitnessSearch::PathEnd WitnessSearch::reachedTruth() {
    isWide_ = false;
    isLarge_ = false;
    if (terms_.empty()) {
        best_ = solutions_.back();
        return PathEnd::Met;
    }
    if (confirm(solutions_.back())) {
        best_ = trial_;
        return PathEnd::Met;
    }
    switch (solveSums()) {
    case SumsOnPath::Unsolvable:
        return PathEnd::Excluded;
    case SumsOnPath::Solved:
        best_ = trial_;
        return PathEnd::Met;
    case SumsOnPath::Open:
        break;
    }
    return confirmNear(solutions_.back()) ? PathEnd::Met : PathEnd::Open;
}

/// The same in so many steps.
WitnessSearch::PathEnd WitnessSearch::reachedTruth(std::uint64_t most) {
    try {
        const Steps::Share share(steps_, most);
        return reachedTruth();
    } catch (const StepsUsedUp&) {
        if (steps_.left() == 0)
            throw;
        return PathEnd::Hard;
    }
}

// Paths that a search finds.

void WitnessSearch::beginPaths(const Question& question, std::span<const UnknownLeaf> leaves, Order order) {
    question_ = &question;
    beginNumbers();
    steps_.take(question.levels().size());
    for (const LevelInfo& level : question.levels()) {
        meet(level.plus);
        if (level.minus != noUnknown)
            meet(level.minus);
    }
    number(leaves, order);
}

void WitnessSearch::restrictPaths(Unknown unknown, std::int64_t low, std::int64_t high) {
    restrict(unknown, noUnknown, low, high);
}

WitnessSearch::PathEnd WitnessSearch::tryPath(std::span<const LevelRange> ranges, std::uint64_t most) {
    const std::size_t before = system_.size();
    for (const LevelRange& range : ranges)
        restrict(question_->levels()[range.level], range.low, range.high);
    solutions_.assign(1, {});
    best_.reset();
    const PathEnd end = system_.solve(solutions_.back()) ? reachedTruth(most) : PathEnd::Excluded;
    shrink(before);
    if (end == PathEnd::Met) {
        VTSYM_CHECK(isLarge_ || holds(*best_));
        isPathWide_ = isWide_;
        pathValues_.clear();
        for (std::size_t i = 0; i < order_.size(); ++i)
            pathValues_.insert(order_[i], (*best_)[i + 1]);
    }
    return end;
}

bool WitnessSearch::excludesPath(std::span<const LevelRange> ranges, std::uint64_t most) {
    const std::size_t before = system_.size();
    const Steps::Share share(steps_, most);
    bool excludes = false;
    try {
        for (const LevelRange& range : ranges)
            restrict(question_->levels()[range.level], range.low, range.high);
        std::vector<std::int64_t> values;
        excludes = !system_.solve(values) || (!terms_.empty() && !solvePath(false));
    } catch (const StepsUsedUp&) { // a question whose own steps are used up notices soon
    }
    shrink(before);
    return excludes;
}

std::optional<Witness> WitnessSearch::pathWitness(std::span<const UnknownLeaf> leaves) const {
    if (isPathWide_)
        return std::nullopt;
    return witness(leaves, [&](Unknown unknown) { return pathValue(unknown); });
}

} // namespace VT
