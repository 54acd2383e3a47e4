// Solves bounds on integers and their differences.
//
// Method: shortest paths after Bellman and Ford find a negative cycle; then values are fixed one after the other, each
// as near to 0 as the ranges allow, and the ranges are tightened after each (Cormen et al., "Introduction to
// Algorithms", difference constraints).
//
// Relies on: every bound is within `limits::formNumber`, so a path of at most 2^20 of them stays within 64 bits.
#include "base/decide/solver/DifferenceSystem.hpp"

#include "base/core/Check.hpp"
#include "base/core/Limits.hpp"
#include "base/integer/LinearForm.hpp"

#include <algorithm>

namespace VT {

namespace {

/// Looking at a bound is that much cheaper than joining an edge.
constexpr std::size_t boundsPerStep = 16;

} // namespace

void DifferenceSystem::begin(std::size_t unknowns) {
    if (unknowns >= limits::systemUnknowns)
        throw StepsUsedUp{};
    count_ = unknowns + 1;
    bounds_.clear();
}

void DifferenceSystem::restrict(Number x, Number y, std::int64_t low, std::int64_t high) {
    if (high != plusInfinite)
        bounds_.push_back({x, y, high});
    if (low != minusInfinite)
        bounds_.push_back({y, x, -low});
}

bool DifferenceSystem::canBeMet() {
    distance_.assign(count_, 0);
    // No path without a cycle is shorter, so nothing leaves 64 bits.
    const std::int64_t shortest = -2 * limits::formNumber * static_cast<std::int64_t>(count_);
    for (std::size_t round = 0; round <= count_; ++round) {
        steps_.take(bounds_.size() / boundsPerStep + 1);
        bool changed = false;
        for (const Bound& bound : bounds_) {
            if (distance_[bound.x] > distance_[bound.y] + bound.most) {
                distance_[bound.x] = distance_[bound.y] + bound.most;
                changed = true;
                if (distance_[bound.x] < shortest)
                    return false;
            }
        }
        if (!changed)
            return true;
    }
    return false;
}

/// Carries ranges along the bounds until they fit.
void DifferenceSystem::tighten() {
    for (bool changed = true; changed;) {
        steps_.take(bounds_.size() / boundsPerStep + 1);
        changed = false;
        for (const Bound& bound : bounds_) {
            if (high_[bound.y] != plusInfinite && high_[bound.y] + bound.most < high_[bound.x]) {
                high_[bound.x] = high_[bound.y] + bound.most;
                changed = true;
            }
            if (low_[bound.x] != minusInfinite && low_[bound.x] - bound.most > low_[bound.y]) {
                low_[bound.y] = low_[bound.x] - bound.most;
                changed = true;
            }
        }
    }
}

void DifferenceSystem::findRanges() {
    low_.assign(count_, minusInfinite);
    high_.assign(count_, plusInfinite);
    low_[0] = high_[0] = 0;
    tighten();
}

/// Values by their own bounds alone, below which no solution goes; whether they are one, if no range is empty.
std::optional<bool> DifferenceSystem::solveApart(std::vector<std::int64_t>& values) {
    steps_.take(bounds_.size() / boundsPerStep + 1);
    low_.assign(count_, minusInfinite);
    high_.assign(count_, plusInfinite);
    low_[0] = high_[0] = 0;
    for (const Bound& bound : bounds_) {
        if (bound.y == 0)
            high_[bound.x] = std::min(high_[bound.x], bound.most);
        else if (bound.x == 0)
            low_[bound.y] = std::max(low_[bound.y], -bound.most);
    }
    values.resize(count_);
    for (Number x = 0; x < count_; ++x) {
        if (low_[x] > high_[x])
            return std::nullopt;
        values[x] = std::clamp(std::int64_t{0}, low_[x], high_[x]);
    }
    return std::ranges::all_of(bounds_, [&](const Bound& b) { return values[b.x] - values[b.y] <= b.most; });
}

bool DifferenceSystem::solve(std::vector<std::int64_t>& values) {
    if (const auto apart = solveApart(values); !apart || *apart)
        return apart.has_value();
    if (!canBeMet())
        return false;
    findRanges();
    for (Number x = 1; x < count_; ++x) {
        if (low_[x] == high_[x])
            continue;
        low_[x] = high_[x] = std::clamp(std::int64_t{0}, low_[x], high_[x]);
        tighten();
    }
    values.assign(low_.begin(), low_.end());
    VTSYM_CHECK(std::ranges::all_of(bounds_, [&](const Bound& b) { return values[b.x] - values[b.y] <= b.most; }));
    return true;
}

} // namespace VT
