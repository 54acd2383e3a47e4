// Walks the paths of a diagram to the smallest assignment that reaches `always`.
//
// Method: branch and bound. A frame for each node on the path holds the solution of the bounds so far, which is a lower
// bound for all assignments below; edges are tried from that solution outwards. Where the diagram branches on unknowns
// alone, one descent suffices.
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

WitnessSearch::WitnessSearch(const LeafReader& leaves, Unknowns& unknowns, Diagrams& diagrams, Steps& steps)
    : leafReader_(leaves),
      unknowns_(unknowns),
      diagrams_(diagrams),
      steps_(steps),
      system_(steps) {}

Decision WitnessSearch::find(Diagram diagram, std::span<const UnknownLeaf> leaves) {
    if (diagram == never)
        return {Answer::No, DecisionBound::None, std::nullopt};
    if (!diagrams_.needsChecking(diagram))
        return {Answer::Yes, DecisionBound::None, walkDown(diagram, leaves)};
    DecisionBound bound = DecisionBound::None;
    best_.reset();
    unconfirmed_ = false;
    try {
        collect(diagram, leaves);
        walkPaths(diagram);
    } catch (const StepsUsedUp&) {
        bound = DecisionBound::Steps;
    }
    if (best_) {
        VTSYM_CHECK(follow(*best_).end == always);
        return {Answer::Yes, DecisionBound::None, witness(*best_, leaves)};
    }
    if (bound == DecisionBound::None && unconfirmed_)
        bound = DecisionBound::Terms;
    return {bound == DecisionBound::None ? Answer::No : Answer::Undecided, bound, std::nullopt};
}

// Unknowns alone.

Witness WitnessSearch::walkDown(Diagram diagram, std::span<const UnknownLeaf> leaves) const {
    Witness result;
    result.reserve(leaves.size());
    for (const UnknownLeaf& leaf : leaves) {
        std::int64_t value = 0;
        if (!result.empty() && leaf.unknown == (&leaf)[-1].unknown) {
            // The second keyword, or another spelling of the first.
            value = (leaf.opposite != (&leaf)[-1].opposite) ? 1 - result.back().value : result.back().value;
            result.push_back({leaf.node, value});
            continue;
        }
        const Quantity quantity = unknowns_[leaf.unknown].quantity;
        if (diagram > never && diagrams_.quantity(diagram) == quantity) {
            const QuantityInfo& info = unknowns_.quantity(quantity);
            std::optional<std::int64_t> nearest;
            Diagram below = never;
            std::int64_t low = info.low;
            for (std::size_t i = 0; i < diagrams_.edgeCount(diagram); ++i) {
                const Diagrams::Edge edge = diagrams_.edge(diagram, i);
                const std::int64_t candidate = std::clamp(std::int64_t{0}, low, std::min(edge.high, info.high));
                if (edge.child != never && (!nearest || isSmaller(candidate, *nearest))) {
                    nearest = candidate;
                    below = edge.child;
                }
                low = edge.high == plusInfinite ? edge.high : edge.high + 1;
            }
            value = *nearest;
            diagram = below;
        }
        result.push_back({leaf.node, leaf.opposite ? 1 - value : value});
    }
    return result;
}

Witness WitnessSearch::witness(const std::vector<std::int64_t>& values, std::span<const UnknownLeaf> leaves) const {
    Witness result;
    result.reserve(leaves.size());
    for (const UnknownLeaf& leaf : leaves) {
        const std::int64_t value = values[numberOf(leaf.unknown)];
        result.push_back({leaf.node, leaf.opposite ? 1 - value : value});
    }
    return result;
}

// Paths.

/// Numbers the unknowns below a diagram and those of the leaves, in their order.
void WitnessSearch::collect(Diagram diagram, std::span<const UnknownLeaf> leaves) {
    root_ = diagram;
    order_.clear();
    numbers_.clear();
    terms_.clear();
    movable_.clear();
    triesLeft_ = limits::confirmations;
    const auto meet = [&](Unknown unknown) {
        if (numbers_.find(unknown) == nullptr) {
            numbers_.insert(unknown, 0);
            order_.push_back(unknown);
        }
    };
    IdMap<bool> seen;
    std::vector<Diagram> pending{diagram};
    while (!pending.empty()) {
        const Diagram next = pending.back();
        pending.pop_back();
        if (next <= never || seen.find(next >> 1U) != nullptr)
            continue;
        seen.insert(next >> 1U, true);
        steps_.take(diagrams_.edgeCount(next));
        const QuantityInfo& info = unknowns_.quantity(diagrams_.quantity(next));
        meet(info.plus);
        if (info.isDifference())
            meet(info.minus);
        for (std::size_t i = 0; i < diagrams_.edgeCount(next); ++i)
            pending.push_back(diagrams_.edge(next, i).child);
    }
    for (const UnknownLeaf& leaf : leaves)
        meet(leaf.unknown);
    std::vector<Unknown> free;                         // what terms are computed from
    for (std::size_t i = 0; i < order_.size(); ++i) {  // NOLINT(modernize-loop-convert): meeting more appends
        const UnknownInfo info = unknowns_[order_[i]]; // a copy, which stays where it is
        if (info.kind == UnknownKind::Sum) {
            for (const LinearPart& part : info.sum) {
                meet(part.unknown);
                if (!unknowns_[part.unknown].isComputed())
                    free.push_back(part.unknown);
            }
        }
        if (info.kind == UnknownKind::Term) {
            terms_.push_back({0, std::make_unique<TermPlan>(leafReader_, unknowns_, info.node)});
            steps_.take(terms_.back().plan->size());
            for (const Unknown unknown : terms_.back().plan->unknowns()) {
                meet(unknown);
                free.push_back(unknown);
            }
        }
        if (info.isComputed() && info.kind == UnknownKind::Sum)
            terms_.push_back({0, nullptr});
        if (info.isComputed())
            terms_.back().number = order_[i]; // for the time being
    }
    std::ranges::sort(order_, [&](Unknown a, Unknown b) { return unknowns_.before(a, b); });
    for (std::size_t i = 0; i < order_.size(); ++i)
        numbers_.insert(order_[i], static_cast<Number>(i + 1));
    for (Term& term : terms_)
        term.number = numberOf(term.number);
    std::ranges::sort(terms_, {}, &Term::number); // sums come behind the terms that they add up
    for (const Unknown unknown : free)
        movable_.push_back(numberOf(unknown));
    std::ranges::sort(movable_);
    movable_.erase(std::unique(movable_.begin(), movable_.end()), movable_.end());
    system_.begin(order_.size());
    for (std::size_t i = 0; i < order_.size(); ++i)
        system_.restrict(static_cast<Number>(i + 1), 0, unknowns_[order_[i]].low, unknowns_[order_[i]].high);
}

void WitnessSearch::walkPaths(Diagram diagram) {
    frames_.clear();
    solutions_.assign(1, {});
    if (!system_.solve(solutions_.back()))
        return;
    enter(diagram);
    while (!frames_.empty()) {
        Frame& frame = frames_.back();
        system_.shrink(frame.bounds);
        solutions_.resize(frame.solutions);
        const std::size_t count = diagrams_.edgeCount(frame.diagram);
        if (frame.next == count || (!terms_.empty() && best_) || (best_ && !improves(solutions_.back()))) {
            frames_.pop_back();
            continue;
        }
        const std::size_t edge = outward(frame.origin, frame.next++, count);
        const Diagram child = diagrams_.edge(frame.diagram, edge).child;
        steps_.take();
        if (child == never || !take(frame, edge))
            continue;
        if (child == always)
            reachedTruth();
        else
            enter(child);
    }
}

void WitnessSearch::enter(Diagram diagram) {
    const QuantityInfo& info = unknowns_.quantity(diagrams_.quantity(diagram));
    const std::vector<std::int64_t>& values = solutions_.back();
    const std::int64_t value = values[numberOf(info.plus)] - (info.isDifference() ? values[numberOf(info.minus)] : 0);
    frames_.push_back({diagram, diagrams_.edgeOf(diagram, value), 0, system_.size(), solutions_.size()});
}

/// Adds the bounds of an edge; false where they cannot be met, or only by what is no better than the witness at hand.
bool WitnessSearch::take(const Frame& frame, std::size_t edge) {
    const QuantityInfo& info = unknowns_.quantity(diagrams_.quantity(frame.diagram));
    const std::int64_t low = edge == 0 ? minusInfinite : diagrams_.edge(frame.diagram, edge - 1).high + 1;
    const bool isOrigin = edge == frame.origin;
    system_.restrict(numberOf(info.plus), info.isDifference() ? numberOf(info.minus) : 0, low,
                     diagrams_.edge(frame.diagram, edge).high);
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

void WitnessSearch::reachedTruth() {
    if (terms_.empty()) {
        best_ = solutions_.back();
        return;
    }
    if (confirm(solutions_.back())) {
        best_ = trial_;
        return;
    }
    if (isExcluded())
        return;
    switch (solveSums()) {
    case SumsOnPath::Unsolvable:
        return;
    case SumsOnPath::Solved:
        best_ = trial_;
        return;
    case SumsOnPath::Open:
        break;
    }
    if (!confirmNear(solutions_.back()))
        unconfirmed_ = true;
}

} // namespace VT
