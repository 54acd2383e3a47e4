// Operations on single cubes, and the loop that reduces a cover by joining, absorbing and dropping.
//
// Constraints of a cube are sorted by atom, so that two cubes are compared in one walk or by binary search.  The
// loop ends because every step leaves fewer comparisons or fewer cubes.
// Relies on: IntegerSet for every question about one atom.
#include "base/cover/Cover.hpp"

#include "base/core/Limits.hpp"
#include "base/cover/CoverOccurrences.hpp"
#include "base/util/Hash.hpp"

#include <algorithm>
#include <numeric>
#include <utility>

namespace VT {

std::size_t hash_value(const Constraint& constraint) noexcept {
    std::uint64_t hash = constraint.atom;
    for (const IntegerSet::Interval& interval : constraint.set.intervals()) {
        hash = hashStep(hash, static_cast<std::uint64_t>(interval.low));
        hash = hashStep(hash, static_cast<std::uint64_t>(interval.high));
    }
    return hash;
}

// Cubes.

namespace {

auto position(auto& constraints, Atom atom) {
    return std::ranges::lower_bound(constraints, atom, {}, &Constraint::atom);
}

} // namespace

const IntegerSet* Cube::find(Atom atom) const noexcept {
    const auto at = position(constraints_, atom);
    return at != constraints_.end() && at->atom == atom ? &at->set : nullptr;
}

bool Cube::restrict(Atom atom, const IntegerSet& set) {
    const auto at = position(constraints_, atom);
    if (at == constraints_.end() || at->atom != atom) {
        if (!set.isAll())
            constraints_.insert(at, {atom, set});
        return !set.empty();
    }
    at->set = at->set.intersect(set);
    return !at->set.empty();
}

bool Cube::restrict(const Cube& other) {
    return std::ranges::all_of(other.constraints_, [this](const Constraint& c) { return restrict(c.atom, c.set); });
}

void Cube::assign(Atom atom, const IntegerSet& set) {
    const auto at = position(constraints_, atom);
    const bool present = at != constraints_.end() && at->atom == atom;
    if (set.isAll()) {
        if (present)
            constraints_.erase(at);
    } else if (present) {
        at->set = set;
    } else {
        constraints_.insert(at, {atom, set});
    }
}

bool Cube::isSubsetOf(const Cube& other) const noexcept {
    if (other.constraints_.size() > constraints_.size())
        return false;
    return std::ranges::all_of(other.constraints_, [this](const Constraint& c) {
        const IntegerSet* mine = find(c.atom);
        return mine != nullptr && mine->isSubsetOf(c.set);
    });
}

bool Cube::intersects(const Cube& other) const noexcept {
    return std::ranges::all_of(other.constraints_, [this](const Constraint& c) {
        const IntegerSet* mine = find(c.atom);
        return mine == nullptr || mine->intersects(c.set);
    });
}

std::size_t Cube::comparisons() const noexcept {
    return std::accumulate(constraints_.begin(), constraints_.end(), std::size_t{0},
                           [](std::size_t sum, const Constraint& c) { return sum + c.set.comparisons(); });
}

std::size_t comparisons(const Cover& cover) noexcept {
    return std::accumulate(cover.begin(), cover.end(), std::size_t{0},
                           [](std::size_t sum, const Cube& cube) { return sum + cube.comparisons(); });
}

CoverBudget searchBudget(const Cover& cover) noexcept {
    return {limits::coverSteps + limits::coverStepsPerLiteral * comparisons(cover)};
}

namespace {

void join(Cover& cover) {
    while (joinCubes(cover) || absorb(cover)) {
    }
}

} // namespace

bool reduce(Cover& cover, CoverBudget& budget) {
    join(cover);
    return reduceJoined(cover, budget);
}

bool reduceJoined(Cover& cover, CoverBudget& budget) {
    if (budget.exhausted())
        return false;
    if (cover.size() < 2 || isSumOfSeparateSets(cover))
        return true;
    Cover smaller = cover;
    bool any = false;
    for (; dropComparisons(smaller, budget) || dropCubes(smaller, budget); any = true)
        join(smaller);
    if (budget.exhausted())
        return false;
    if (any)
        cover = std::move(smaller);
    return true;
}

Cover complement(const Cube& cube) {
    Cover result;
    for (const Constraint& constraint : cube.constraints()) {
        for (const IntegerSet& set : joinSets({constraint.set.complement()})) {
            result.emplace_back();
            result.back().assign(constraint.atom, set);
        }
    }
    return result;
}

Cover product(const Cover& a, const Cover& b) {
    Cover result;
    for (const Cube& x : a) {
        for (const Cube& y : b) {
            Cube both = x;
            if (both.restrict(y))
                result.push_back(std::move(both));
        }
    }
    return result;
}

} // namespace VT
