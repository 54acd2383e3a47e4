// Operations on sorted lists of intervals, each in one walk over the lists.
//
// The extreme 64-bit values are the infinities; no walk counts beyond them.
#include "base/integer/IntegerSet.hpp"

#include "base/core/Check.hpp"

#include <algorithm>

namespace VT {

IntegerSet IntegerSet::satisfying(SymbolicOp op, std::int64_t constant) {
    switch (op) {
    case SymbolicOp::Equal:
        return point(constant);
    case SymbolicOp::NotEqual:
        return allBut(constant);
    case SymbolicOp::LessThan:
        return {minusInfinity, constant - 1};
    case SymbolicOp::LessThanEqual:
        return {minusInfinity, constant};
    case SymbolicOp::GreaterThan:
        return {constant + 1, plusInfinity};
    case SymbolicOp::GreaterThanEqual:
        return {constant, plusInfinity};
    default:
        return all();
    }
}

IntegerSet IntegerSet::of(std::vector<Interval> intervals) {
    std::ranges::sort(intervals);
    IntegerSet result;
    for (const Interval& next : intervals) {
        Intervals& joined = result.intervals_;
        const bool touches =
            !joined.empty() && (joined.back().high == plusInfinity || next.low <= joined.back().high + 1);
        if (touches)
            joined.back().high = std::max(joined.back().high, next.high);
        else
            joined.push_back(next);
    }
    VTSYM_CHECK(result.isSound());
    return result;
}

bool IntegerSet::isSound() const noexcept {
    for (std::size_t i = 0; i < intervals_.size(); ++i)
        if (intervals_[i].low > intervals_[i].high || (i > 0 && intervals_[i].low - 1 <= intervals_[i - 1].high))
            return false;
    return true;
}

bool IntegerSet::isAll() const noexcept {
    return intervals_.size() == 1 && low() == minusInfinity && high() == plusInfinity;
}

IntegerSet IntegerSet::complement() const {
    IntegerSet result;
    std::int64_t next = minusInfinity;
    for (const Interval& interval : intervals_) {
        if (interval.low > next)
            result.intervals_.push_back({next, interval.low - 1});
        if (interval.high == plusInfinity)
            return result;
        next = interval.high + 1;
    }
    result.intervals_.push_back({next, plusInfinity});
    VTSYM_CHECK(result.isSound());
    return result;
}

IntegerSet IntegerSet::intersect(const IntegerSet& other) const {
    IntegerSet result;
    auto a = intervals_.begin();
    auto b = other.intervals_.begin();
    while (a != intervals_.end() && b != other.intervals_.end()) {
        const std::int64_t low = std::max(a->low, b->low);
        const std::int64_t high = std::min(a->high, b->high);
        if (low <= high)
            result.intervals_.push_back({low, high});
        if (a->high < b->high)
            ++a;
        else
            ++b;
    }
    VTSYM_CHECK(result.isSound());
    return result;
}

IntegerSet IntegerSet::unite(const IntegerSet& other) const {
    return complement().intersect(other.complement()).complement();
}

bool IntegerSet::contains(std::int64_t value) const noexcept {
    return std::ranges::any_of(intervals_, [value](const Interval& i) { return i.low <= value && value <= i.high; });
}

bool IntegerSet::isSubsetOf(const IntegerSet& other) const noexcept {
    // An interval that lies in a set lies in one interval of it, since those do not touch.
    auto outer = other.intervals_.begin();
    for (const Interval& inner : intervals_) {
        while (outer != other.intervals_.end() && outer->high < inner.high)
            ++outer;
        if (outer == other.intervals_.end() || outer->low > inner.low)
            return false;
    }
    return true;
}

bool IntegerSet::intersects(const IntegerSet& other) const noexcept {
    auto a = intervals_.begin();
    auto b = other.intervals_.begin();
    while (a != intervals_.end() && b != other.intervals_.end()) {
        if (std::max(a->low, b->low) <= std::min(a->high, b->high))
            return true;
        if (a->high < b->high)
            ++a;
        else
            ++b;
    }
    return false;
}

std::size_t IntegerSet::comparisons() const noexcept {
    if (intervals_.empty())
        return 0;
    const bool point = low() == high();
    const std::size_t bounds = point ? 1 : std::size_t{low() != minusInfinity} + std::size_t{high() != plusInfinity};
    std::size_t missing = 0;
    for (std::size_t i = 1; i < intervals_.size(); ++i)
        missing += static_cast<std::size_t>(intervals_[i].low - intervals_[i - 1].high - 1);
    return bounds + missing;
}

std::vector<std::int64_t> IntegerSet::holes() const {
    std::vector<std::int64_t> result;
    for (std::size_t i = 1; i < intervals_.size(); ++i)
        for (std::int64_t value = intervals_[i - 1].high + 1; value < intervals_[i].low; ++value)
            result.push_back(value);
    return result;
}

} // namespace VT
