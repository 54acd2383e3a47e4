// Conflict-driven clause learning; see the header for the method.
#include "base/decide/search/ClauseSearch.hpp"

#include "base/core/Check.hpp"

#include <algorithm>

namespace VT {

namespace {

constexpr std::uint32_t notInHeap = ~std::uint32_t{0};
constexpr double decay = 1.0 / 0.95;
constexpr double rescaleAt = 1e100;
constexpr std::uint64_t restartAfter = 64; ///< conflicts, times Luby's sequence
constexpr std::size_t firstLearnt = 2000;  ///< clauses kept before some are thrown away
constexpr std::size_t watchesPerStep = 8;

/// 1 1 2 1 1 2 4 1 1 2 1 1 2 4 8 ...
std::uint64_t luby(std::uint64_t at) {
    for (;;) {
        std::uint64_t size = 1;
        std::uint64_t power = 1;
        while (size < at + 1) {
            size = size * 2 + 1;
            power *= 2;
        }
        if (size == at + 1)
            return power;
        at -= size / 2;
    }
}

} // namespace

void ClauseSearch::begin(std::size_t vertices) {
    graph_.begin(vertices);
    contradicts_ = false;
    arena_.clear();
    learnt_.clear();
    mostLearnt_ = firstLearnt;
    watches_.clear();
    bounds_.clear();
    values_.clear();
    levelOf_.clear();
    reasons_.clear();
    phases_.clear();
    activity_.clear();
    increment_ = 1;
    heap_.clear();
    heapAt_.clear();
    trail_.clear();
    levels_.clear();
    clausesAt_ = boundsAt_ = 0;
    isSeen_.clear();
}

Literal ClauseSearch::addVariable(bool first) {
    const auto variable = static_cast<Variable>(levelOf_.size());
    steps_.take();
    watches_.resize(watches_.size() + 2);
    bounds_.resize(bounds_.size() + 2);
    values_.resize(values_.size() + 2, 0);
    levelOf_.push_back(0);
    reasons_.push_back(none);
    phases_.push_back(first ? 1 : 0);
    activity_.push_back(0);
    isSeen_.push_back(0);
    heapAt_.push_back(notInHeap);
    pushHeap(variable);
    return variable * 2;
}

void ClauseSearch::addClause(std::span<const Literal> clause) {
    backtrack(0);
    steps_.take(clause.size());
    learning_.clear();
    for (const Literal literal : clause) {
        const bool isTrue = values_[literal] > 0 || std::ranges::find(learning_, negated(literal)) != learning_.end();
        if (isTrue)
            return;
        if (values_[literal] == 0 && std::ranges::find(learning_, literal) == learning_.end())
            learning_.push_back(literal);
    }
    if (learning_.empty())
        contradicts_ = true;
    else if (learning_.size() == 1)
        assign(learning_.front(), none);
    else
        watch(store(learning_, 0));
}

void ClauseSearch::addBound(Literal literal, const DifferenceGraph::Bound& bound) {
    backtrack(0);
    VTSYM_CHECK(values_[literal] == 0);
    bounds_[literal].push_back(bound);
}

ClauseSearch::Clause ClauseSearch::store(std::span<const Literal> literals, std::uint32_t joined) {
    const auto clause = static_cast<Clause>(arena_.size());
    arena_.push_back(static_cast<std::uint32_t>(literals.size()));
    arena_.push_back(joined);
    arena_.insert(arena_.end(), literals.begin(), literals.end());
    return clause;
}

void ClauseSearch::watch(Clause clause) {
    const Literal* all = literals(clause);
    watches_[all[0]].push_back({clause, all[1]});
    watches_[all[1]].push_back({clause, all[0]});
}

void ClauseSearch::assign(Literal literal, Clause reason) {
    values_[literal] = 1;
    values_[negated(literal)] = -1;
    levelOf_[literal / 2] = level();
    reasons_[literal / 2] = reason;
    trail_.push_back(literal);
}

// Propagation.

bool ClauseSearch::propagate() {
    return propagateClauses() && propagateBounds();
}

bool ClauseSearch::propagateClauses() {
    while (clausesAt_ < trail_.size()) {
        const Literal fails = negated(trail_[clausesAt_++]);
        std::vector<Watch>& watches = watches_[fails];
        steps_.take(1 + watches.size() / watchesPerStep);
        std::size_t kept = 0;
        for (std::size_t i = 0; i < watches.size(); ++i) {
            const Watch current = watches[i];
            if (values_[current.other] > 0) {
                watches[kept++] = current;
                continue;
            }
            Literal* all = literals(current.clause);
            const std::uint32_t size = arena_[current.clause];
            if (all[0] == fails)
                std::swap(all[0], all[1]);
            std::uint32_t next = 2;
            if (values_[all[0]] <= 0)
                while (next < size && values_[all[next]] < 0)
                    ++next;
            if (values_[all[0]] > 0) {
                watches[kept++] = {current.clause, all[0]};
            } else if (next < size) {
                std::swap(all[1], all[next]);
                watches_[all[1]].push_back({current.clause, all[0]});
            } else {
                watches[kept++] = {current.clause, all[0]};
                if (values_[all[0]] == 0) {
                    assign(all[0], current.clause);
                    continue;
                }
                conflict_.assign(all, all + size);
                while (++i < watches.size())
                    watches[kept++] = watches[i];
                watches.resize(kept);
                return false;
            }
        }
        watches.resize(kept);
    }
    return true;
}

bool ClauseSearch::propagateBounds() {
    for (; boundsAt_ < trail_.size(); ++boundsAt_) {
        const Literal literal = trail_[boundsAt_];
        for (const DifferenceGraph::Bound& bound : bounds_[literal]) {
            if (graph_.add(bound, literal))
                continue;
            conflict_.clear();
            for (const Literal name : graph_.contradiction())
                if (std::ranges::find(conflict_, negated(name)) == conflict_.end())
                    conflict_.push_back(negated(name));
            steps_.take(conflict_.size());
            return false;
        }
    }
    return true;
}

void ClauseSearch::newLevel() {
    levels_.emplace_back(trail_.size(), graph_.size());
}

void ClauseSearch::backtrack(std::uint32_t level) {
    if (level >= this->level())
        return;
    const auto [trail, bounds] = levels_[level];
    for (std::size_t i = trail_.size(); i-- > trail;) {
        const Literal literal = trail_[i];
        values_[literal] = values_[negated(literal)] = 0;
        phases_[literal / 2] = (literal & 1U) == 0 ? 1 : 0;
        pushHeap(literal / 2);
    }
    trail_.resize(trail);
    graph_.shrink(bounds);
    levels_.resize(level);
    clausesAt_ = std::min(clausesAt_, trail);
    boundsAt_ = std::min(boundsAt_, trail);
}

// Learning.

/// Whether a literal of the learnt clause follows from others of it.
bool ClauseSearch::isImplied(Literal literal) {
    const Clause reason = reasons_[literal / 2];
    if (reason == none)
        return false;
    const Literal* all = literals(reason);
    return std::all_of(all, all + arena_[reason], [&](Literal other) {
        return other / 2 == literal / 2 || isSeen_[other / 2] != 0 || levelOf_[other / 2] == 0;
    });
}

/// Resolves the conflict with the reasons of its literals until one literal of the current level is left.
void ClauseSearch::analyze() {
    learning_.assign(1, 0);
    seen_.clear();
    std::size_t open = 0;
    std::size_t at = trail_.size();
    std::span<const Literal> clause(conflict_);
    Literal resolved = ~Literal{0};
    for (;;) {
        steps_.take(1 + clause.size() / 4);
        for (const Literal literal : clause) {
            const Variable variable = literal / 2;
            if (literal == resolved || isSeen_[variable] != 0 || levelOf_[variable] == 0)
                continue;
            isSeen_[variable] = 1;
            seen_.push_back(variable);
            bump(variable);
            if (levelOf_[variable] == level())
                ++open;
            else
                learning_.push_back(literal);
        }
        while (isSeen_[trail_[at - 1] / 2] == 0)
            --at;
        resolved = trail_[--at];
        if (--open == 0)
            break;
        const Clause reason = reasons_[resolved / 2];
        clause = {literals(reason), arena_[reason]};
    }
    learning_[0] = negated(resolved);
    const auto redundant =
        std::remove_if(learning_.begin() + 1, learning_.end(), [&](Literal literal) { return isImplied(literal); });
    learning_.erase(redundant, learning_.end());
    target_ = 0;
    if (learning_.size() > 1) {
        const auto last = std::max_element(learning_.begin() + 1, learning_.end(),
                                           [&](Literal a, Literal b) { return levelOf_[a / 2] < levelOf_[b / 2]; });
        std::iter_swap(learning_.begin() + 1, last);
        target_ = levelOf_[learning_[1] / 2];
    }
    for (const Variable variable : seen_)
        isSeen_[variable] = 0;
}

void ClauseSearch::learn() {
    std::vector<std::uint32_t> joined;
    joined.reserve(learning_.size());
    for (const Literal literal : learning_)
        joined.push_back(levelOf_[literal / 2]);
    std::ranges::sort(joined);
    const auto levels = static_cast<std::uint32_t>(std::unique(joined.begin(), joined.end()) - joined.begin());
    backtrack(target_);
    if (learning_.size() == 1) {
        assign(learning_.front(), none);
    } else {
        const Clause clause = store(learning_, levels);
        learnt_.push_back(clause);
        watch(clause);
        assign(learning_.front(), clause);
    }
    increment_ *= decay;
}

/// Throws the half of the learnt clauses away that join the most levels; without decisions, so none is a reason.
void ClauseSearch::forget() {
    VTSYM_CHECK(level() == 0);
    steps_.take(arena_.size() / watchesPerStep);
    std::ranges::stable_sort(learnt_, {}, [&](Clause clause) { return arena_[clause + 1]; });
    std::vector<Clause> thrown(learnt_.begin() + static_cast<std::ptrdiff_t>(learnt_.size() / 2), learnt_.end());
    std::ranges::sort(thrown);
    std::vector<std::uint32_t> old;
    old.swap(arena_);
    learnt_.clear();
    for (std::vector<Watch>& watches : watches_)
        watches.clear();
    for (Clause clause = 0; clause < old.size(); clause += header + old[clause]) {
        if (std::ranges::binary_search(thrown, clause))
            continue;
        const std::span<const Literal> all(old.data() + clause + header, old[clause]);
        if (std::ranges::any_of(all, [&](Literal literal) { return values_[literal] > 0; }))
            continue; // holds for good
        const Clause kept = store(all, old[clause + 1]);
        Literal* moved = literals(kept); // watched literals have no value
        std::stable_partition(moved, moved + all.size(), [&](Literal literal) { return values_[literal] == 0; });
        watch(kept);
        if (arena_[kept + 1] != 0)
            learnt_.push_back(kept);
    }
    std::ranges::fill(reasons_, none); // what has a value needs none any more
    mostLearnt_ += mostLearnt_ / 4;
}

bool ClauseSearch::solve(std::span<const Literal> assumptions) {
    backtrack(0);
    if (contradicts_)
        return false;
    std::uint64_t restarts = 0;
    std::uint64_t conflicts = 0;
    for (;;) {
        if (!propagate()) {
            if (level() == 0) {
                contradicts_ = true;
                return false;
            }
            analyze();
            learn();
            ++conflicts;
            continue;
        }
        if (conflicts >= restartAfter * luby(restarts)) {
            ++restarts;
            conflicts = 0;
            const bool isAtStart = level() == 0;
            backtrack(0);
            if (!isAtStart)
                continue;
        }
        if (level() == 0 && learnt_.size() > mostLearnt_)
            forget();
        if (level() < assumptions.size()) {
            const Literal assumed = assumptions[level()];
            if (values_[assumed] < 0)
                return false;
            newLevel();
            if (values_[assumed] == 0)
                assign(assumed, none);
            continue;
        }
        const Variable variable = nextDecision();
        if (variable == notInHeap)
            return true;
        newLevel();
        assign(variable * 2 + (phases_[variable] != 0 ? 0U : 1U), none);
    }
}

// Activity.

void ClauseSearch::bump(Variable variable) {
    activity_[variable] += increment_;
    if (activity_[variable] > rescaleAt) {
        for (double& activity : activity_)
            activity /= rescaleAt;
        increment_ /= rescaleAt;
    }
    if (heapAt_[variable] != notInHeap)
        siftUp(heapAt_[variable]);
}

ClauseSearch::Variable ClauseSearch::nextDecision() {
    while (!heap_.empty()) {
        const Variable top = heap_.front();
        heapAt_[top] = notInHeap;
        const Variable last = heap_.back();
        heap_.pop_back();
        if (!heap_.empty()) {
            heap_.front() = last;
            heapAt_[last] = 0;
            siftDown(0);
        }
        if (values_[std::size_t{top} * 2] == 0)
            return top;
    }
    return notInHeap;
}

void ClauseSearch::pushHeap(Variable variable) {
    if (heapAt_[variable] != notInHeap)
        return;
    heapAt_[variable] = static_cast<std::uint32_t>(heap_.size());
    heap_.push_back(variable);
    siftUp(heap_.size() - 1);
}

void ClauseSearch::siftUp(std::size_t at) {
    const Variable moved = heap_[at];
    for (; at > 0 && isAhead(moved, heap_[(at - 1) / 2]); at = (at - 1) / 2) {
        heap_[at] = heap_[(at - 1) / 2];
        heapAt_[heap_[at]] = static_cast<std::uint32_t>(at);
    }
    heap_[at] = moved;
    heapAt_[moved] = static_cast<std::uint32_t>(at);
}

void ClauseSearch::siftDown(std::size_t at) {
    const Variable moved = heap_[at];
    for (std::size_t child = 2 * at + 1; child < heap_.size(); child = 2 * at + 1) {
        if (child + 1 < heap_.size() && isAhead(heap_[child + 1], heap_[child]))
            ++child;
        if (!isAhead(heap_[child], moved))
            break;
        heap_[at] = heap_[child];
        heapAt_[heap_[at]] = static_cast<std::uint32_t>(at);
        at = child;
    }
    heap_[at] = moved;
    heapAt_[moved] = static_cast<std::uint32_t>(at);
}

} // namespace VT
