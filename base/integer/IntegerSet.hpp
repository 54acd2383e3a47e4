// Sets of integers that comparisons with constants describe.
#pragma once

#include "base/core/Operators.hpp"
#include "base/integer/Int32.hpp"
#include "base/util/ShortVector.hpp"

#include <compare>
#include <cstdint>
#include <limits>
#include <vector>

namespace VT {

/// A set of unbounded integers as a sorted list of disjoint intervals that do not touch.  Bounds come from 32-bit
/// constants, so they and their neighbours fit 64 bits; the extreme 64-bit values stand for the infinities.
class IntegerSet {
public:
    static constexpr std::int64_t minusInfinity = std::numeric_limits<std::int64_t>::min();
    static constexpr std::int64_t plusInfinity = std::numeric_limits<std::int64_t>::max();

    /// All integers from `low` to `high`, both included.
    struct Interval {
        std::int64_t low;
        std::int64_t high;
        auto operator<=>(const Interval&) const = default; // NOLINT(modernize-use-nullptr): no pointer here
    };

    using Intervals = ShortVector<Interval, 2>;

    IntegerSet() = default; ///< the empty set

    IntegerSet(std::int64_t low, std::int64_t high) { intervals_.push_back({low, high}); }

    static IntegerSet all() { return {minusInfinity, plusInfinity}; }

    static IntegerSet point(std::int64_t value) { return {value, value}; }

    static IntegerSet allBut(std::int64_t value) { return point(value).complement(); }

    /// The union of intervals in any order.
    static IntegerSet of(std::vector<Interval> intervals);
    /// The integers x for which `x op constant` holds; `op` is a comparison.
    static IntegerSet satisfying(SymbolicOp op, std::int64_t constant);

    [[nodiscard]] bool empty() const noexcept { return intervals_.empty(); }

    [[nodiscard]] bool isAll() const noexcept;

    [[nodiscard]] const Intervals& intervals() const noexcept { return intervals_; }

    /// The smallest and the largest member, or an infinity.  Not for the empty set.
    [[nodiscard]] std::int64_t low() const noexcept { return intervals_.front().low; }

    [[nodiscard]] std::int64_t high() const noexcept { return intervals_.back().high; }

    [[nodiscard]] IntegerSet complement() const;
    [[nodiscard]] IntegerSet intersect(const IntegerSet& other) const;
    [[nodiscard]] IntegerSet unite(const IntegerSet& other) const;

    /// The members of this set that are not in the other one.
    [[nodiscard]] IntegerSet minus(const IntegerSet& other) const { return intersect(other.complement()); }

    [[nodiscard]] bool contains(std::int64_t value) const noexcept;
    [[nodiscard]] bool isSubsetOf(const IntegerSet& other) const noexcept;
    [[nodiscard]] bool intersects(const IntegerSet& other) const noexcept;

    /// Comparisons with constants whose And describes the set: its bounds and one for each integer missing between
    /// them.
    [[nodiscard]] std::size_t comparisons() const noexcept;
    /// The integers missing between the bounds, in order.
    [[nodiscard]] std::vector<std::int64_t> holes() const;

    bool operator==(const IntegerSet&) const = default;

private:
    /// Whether the intervals are sorted and neither touch nor are empty.
    [[nodiscard]] bool isSound() const noexcept;

    Intervals intervals_;
};

} // namespace VT
