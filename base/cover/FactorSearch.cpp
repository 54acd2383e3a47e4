// Searches for the smallest formula by taking its operands off one after the other.
//
// Method: exact synthesis with don't cares.  A formula is an And of an operand that holds at all points asked for and
// of a smaller formula that fails at the points left, or an Or likewise; operands of one and of two comparisons are
// tried, the number of comparisons grows from a lower bound on.  The bound: two neighbouring cells of an axis that the
// formula must tell apart need a comparison that does.  Operands that leave more to do than another one are passed
// over, and subproblems that failed are remembered.
// Cost: at most the given number of subproblems, each quadratic in the comparisons that the cells allow.
// Relies on: cells that no point tells apart are joined first, so that few points are left (limits::factorPoints).
#include "base/cover/FactorSearch.hpp"

#include "base/core/Limits.hpp"

#include <algorithm>
#include <bit>

namespace VT {

namespace {

/// Comparisons up to which every formula has an operand of one or two at its outermost And or Or.
constexpr std::size_t exactComparisons = 5;

bool bitAt(std::span<const Word> words, std::size_t at) {
    return (words[at / wordBits] >> at % wordBits & 1U) != 0;
}

/// Neighbouring cells of an axis between which no point that counts differs.
struct Group {
    std::size_t first; ///< cell that stands for all of them
    Cells cells;
    bool isPoint;
};

struct GroupedAxis {
    std::size_t axis;
    boost::container::small_vector<Group, 8> groups;
    bool isTruth; ///< two groups: one integer, and all others
};

using GroupedAxes = boost::container::small_vector<GroupedAxis, 4>;

/// Distances between points of neighbouring cells, by axis.
using Strides = boost::container::small_vector<std::size_t, 4>;

Strides pointStrides(const Grid& grid) {
    Strides strides;
    const std::size_t inner = grid.inner().cells();
    for (std::size_t axis = 0; axis + 1 < grid.axes().size(); ++axis)
        strides.push_back(grid.stride(axis) * inner);
    strides.push_back(1);
    return strides;
}

/// The grid without what no point tells apart.
GroupedAxes groupAxes(const Grid& grid, std::span<const Word> on, std::span<const Word> off) {
    const Strides strides = pointStrides(grid);
    const std::size_t points = grid.rows().size() * grid.inner().cells();
    GroupedAxes result;
    for (std::size_t axis = 0; axis < grid.axes().size(); ++axis) {
        const Axis& own = grid.axes()[axis];
        const std::size_t stride = strides[axis];
        const auto isSame = [&](std::size_t a, std::size_t b) { // at all points of two cells
            for (std::size_t begin = 0; begin < points; begin += stride * own.cells()) {
                for (std::size_t i = 0; i < stride; ++i) {
                    const std::size_t x = begin + a * stride + i;
                    const std::size_t y = begin + b * stride + i;
                    if (bitAt(on, x) != bitAt(on, y) || bitAt(off, x) != bitAt(off, y))
                        return false;
                }
            }
            return true;
        };
        GroupedAxis grouped{axis, {}, own.isTruth()};
        for (std::size_t cell = 0; cell < own.cells(); ++cell) {
            if (cell > 0 && isSame(cell - 1, cell)) {
                grouped.groups.back().cells |= cellBit(cell);
                grouped.groups.back().isPoint = false;
            } else {
                grouped.groups.push_back({cell, cellBit(cell), own.isTruth() || own.isPoint(cell)});
            }
        }
        if (grouped.groups.size() == 3 && grouped.groups[1].isPoint && isSame(0, grouped.groups[2].first)) {
            grouped.groups[0].cells |= grouped.groups[2].cells;
            grouped.groups.pop_back();
            grouped.isTruth = true;
        }
        if (grouped.groups.size() > 1)
            result.push_back(std::move(grouped));
    }
    return result;
}

/// A set of points.
template <std::size_t Words>
struct Points {
    std::array<Word, Words> words{};

    bool operator==(const Points&) const = default;

    [[nodiscard]] bool empty() const {
        Word any = 0;
        for (const Word word : words)
            any |= word;
        return any == 0;
    }

    [[nodiscard]] bool isWithin(const Points& other) const { return minus(other).empty(); }

    [[nodiscard]] bool meets(const Points& other) const { return !both(other).empty(); }

    [[nodiscard]] Points both(const Points& other) const {
        Points result;
        for (std::size_t i = 0; i < Words; ++i)
            result.words[i] = words[i] & other.words[i];
        return result;
    }

    [[nodiscard]] Points either(const Points& other) const {
        Points result;
        for (std::size_t i = 0; i < Words; ++i)
            result.words[i] = words[i] | other.words[i];
        return result;
    }

    [[nodiscard]] Points minus(const Points& other) const {
        Points result;
        for (std::size_t i = 0; i < Words; ++i)
            result.words[i] = words[i] & ~other.words[i];
        return result;
    }

    /// Each point moved up; none leaves the set.
    [[nodiscard]] Points shifted(std::size_t by) const {
        Points result;
        const std::size_t whole = by / wordBits;
        const std::size_t rest = by % wordBits;
        for (std::size_t i = Words; i-- > whole;) {
            result.words[i] = words[i - whole] << rest;
            if (rest != 0 && i > whole)
                result.words[i] |= words[i - whole - 1] >> (wordBits - rest);
        }
        return result;
    }

    void add(std::size_t point) { words[point / wordBits] |= Word{1} << point % wordBits; }

    [[nodiscard]] std::size_t hash() const {
        std::uint64_t hash = 0;
        for (const Word word : words)
            hash = (hash ^ word) * 0x9E3779B97F4A7C15U;
        return hash ^ hash >> 32U;
    }
};

template <std::size_t Words>
class FactorSearch {
public:
    using Set = Points<Words>;

    FactorSearch(const Grid& grid, const GroupedAxes& axes, std::span<const Word> on, std::span<const Word> off,
                 std::size_t steps)
        : steps_(steps) {
        readPoints(grid, axes, on, off);
        readComparisons(axes);
    }

    FactorAnswer run(std::size_t bound) {
        const std::size_t lowest = fewest(on_, off_);
        for (std::size_t count = std::max<std::size_t>(lowest, 1); count < bound; ++count) {
            const bool isExact = count <= lowest || count - 1 <= exactComparisons;
            if (find(on_, off_, count))
                return {std::move(result_), isExact};
            if (steps_ == 0)
                return {std::nullopt, false};
        }
        return {std::nullopt, bound <= lowest || bound - 1 <= exactComparisons};
    }

private:
    struct Comparison {
        Set points;
        std::size_t axis;
        Cells cells;
    };

    /// Two groups that follow each other.
    struct Cut {
        Set before;         ///< points of the first one
        std::size_t stride; ///< to those of the second one
        bool endsPoint;     ///< the first one is an integer between this cut and the one before
    };

    /// An operand that may be taken off.
    struct Operand {
        const Comparison* a;
        const Comparison* b; ///< nullptr for one comparison
        Set left;            ///< what is to be done without it
    };

    using Operands = boost::container::small_vector<Operand, 16>;

    struct Failure {
        Set on, off;
        std::size_t count = 0;
    };

    void readPoints(const Grid& grid, const GroupedAxes& axes, std::span<const Word> on, std::span<const Word> off);
    void readComparisons(const GroupedAxes& axes);
    [[nodiscard]] std::size_t fewest(const Set& on, const Set& off) const;
    bool find(const Set& on, const Set& off, std::size_t count); // NOLINT(misc-no-recursion): `count` falls
    bool findOne(const Set& on, const Set& off);
    bool findTwo(const Set& on, const Set& off, const Operands& ands, const Operands& ors);
    // NOLINTNEXTLINE(misc-no-recursion): `count` falls
    bool takeOff(const Set& on, const Set& off, std::size_t count, const Operand& operand, bool isAnd);
    static void keep(Operands& operands, const Operand& operand);
    void collectSingle(const Set& on, const Set& off, Operands& ands, Operands& ors) const;
    void collectPairs(const Set& on, const Set& off, Operands& ands, Operands& ors) const;

    void push(const Comparison& comparison) {
        result_.push_back({FactoredItem::Kind::Comparison, comparison.axis, comparison.cells});
    }

    void push(FactoredItem::Kind kind) { result_.push_back({kind, 0, 0}); }

    std::size_t steps_;
    Set on_, off_;
    boost::container::small_vector<Comparison, 32> comparisons_;
    boost::container::small_vector<Cut, 16> cuts_;
    boost::container::small_vector<std::pair<std::size_t, Set>, 16> groups_; ///< axis and points
    Factored result_;
    std::array<Failure, limits::factorFailures> failures_;
};

template <std::size_t Words>
void FactorSearch<Words>::readPoints(const Grid& grid, const GroupedAxes& axes, std::span<const Word> on,
                                     std::span<const Word> off) {
    const Strides strides = pointStrides(grid);
    // The place of each point in the grid, the first axis fastest.
    boost::container::small_vector<std::size_t, wordBits * Words> places{0};
    for (const GroupedAxis& axis : axes) {
        const std::size_t count = places.size();
        for (std::size_t group = 1; group < axis.groups.size(); ++group)
            for (std::size_t i = 0; i < count; ++i)
                places.push_back(places[i] + axis.groups[group].first * strides[axis.axis]);
        for (std::size_t i = 0; i < count; ++i)
            places[i] += axis.groups[0].first * strides[axis.axis];
    }
    for (std::size_t i = 0; i < places.size(); ++i) {
        if (bitAt(on, places[i]))
            on_.add(i);
        if (bitAt(off, places[i]))
            off_.add(i);
    }
    std::size_t stride = 1;
    for (const GroupedAxis& axis : axes) {
        const std::size_t first = groups_.size();
        for (std::size_t group = 0; group < axis.groups.size(); ++group)
            groups_.emplace_back(axis.axis, Set());
        for (std::size_t i = 0; i < places.size(); ++i)
            groups_[first + i / stride % axis.groups.size()].second.add(i);
        for (std::size_t group = 0; group + 1 < axis.groups.size(); ++group)
            cuts_.push_back({groups_[first + group].second, stride, group > 0 && axis.groups[group].isPoint});
        stride *= axis.groups.size();
    }
}

template <std::size_t Words>
void FactorSearch<Words>::readComparisons(const GroupedAxes& axes) {
    std::size_t first = 0; // of the axis in groups_
    for (const GroupedAxis& axis : axes) {
        Set everywhere;
        Cells all = 0;
        for (std::size_t i = 0; i < axis.groups.size(); ++i) {
            everywhere = everywhere.either(groups_[first + i].second);
            all |= axis.groups[i].cells;
        }
        const auto add = [&](const Set& points, Cells cells) {
            comparisons_.push_back({points, axis.axis, cells});
            comparisons_.push_back({everywhere.minus(points), axis.axis, all & ~cells});
        };
        Set below;
        Cells cells = 0;
        for (std::size_t i = 0; i + 1 < axis.groups.size(); ++i) {
            below = below.either(groups_[first + i].second);
            cells |= axis.groups[i].cells;
            add(below, cells);
            if (i > 0 && axis.groups[i].isPoint)
                add(groups_[first + i].second, axis.groups[i].cells);
        }
        first += axis.groups.size();
    }
}

/// No formula for these points has fewer comparisons.
template <std::size_t Words>
std::size_t FactorSearch<Words>::fewest(const Set& on, const Set& off) const {
    std::size_t count = 0;
    bool mayEnd = false; // a comparison with the integer after the cut before is counted
    for (const Cut& cut : cuts_) {
        const bool isNeeded =
            on.both(cut.before).shifted(cut.stride).meets(off) || off.both(cut.before).shifted(cut.stride).meets(on);
        const bool isCounted = isNeeded && !(mayEnd && cut.endsPoint);
        count += isCounted ? 1 : 0;
        mayEnd = isCounted;
    }
    return count;
}

/// Adds an operand, unless another one leaves no more to do.
template <std::size_t Words>
void FactorSearch<Words>::keep(Operands& operands, const Operand& operand) {
    for (const Operand& other : operands)
        if (other.left.isWithin(operand.left))
            return;
    const auto isNeedless = [&](const Operand& other) { return operand.left.isWithin(other.left); };
    operands.erase(std::remove_if(operands.begin(), operands.end(), isNeedless), operands.end());
    operands.push_back(operand);
}

template <std::size_t Words>
void FactorSearch<Words>::collectSingle(const Set& on, const Set& off, Operands& ands, Operands& ors) const {
    for (const Comparison& each : comparisons_) {
        if (on.isWithin(each.points)) {
            if (const Set left = off.both(each.points); left != off)
                keep(ands, {&each, nullptr, left});
        } else if (!off.meets(each.points)) {
            if (const Set left = on.minus(each.points); left != on)
                keep(ors, {&each, nullptr, left});
        }
    }
}

template <std::size_t Words>
void FactorSearch<Words>::collectPairs(const Set& on, const Set& off, Operands& ands, Operands& ors) const {
    for (std::size_t i = 0; i < comparisons_.size(); ++i) {
        const Comparison& a = comparisons_[i];
        const Set without = on.minus(a.points);
        const Set within = off.both(a.points);
        for (std::size_t j = i + 1; j < comparisons_.size(); ++j) {
            const Comparison& b = comparisons_[j];
            if (without.isWithin(b.points))
                if (const Set left = off.both(a.points.either(b.points)); left != off)
                    keep(ands, {&a, &b, left});
            if (!within.meets(b.points))
                if (const Set left = on.minus(a.points.both(b.points)); left != on)
                    keep(ors, {&a, &b, left});
        }
    }
}

template <std::size_t Words>
bool FactorSearch<Words>::findOne(const Set& on, const Set& off) {
    for (const Comparison& each : comparisons_) {
        if (on.isWithin(each.points) && !off.meets(each.points)) {
            push(each);
            return true;
        }
    }
    return false;
}

template <std::size_t Words>
bool FactorSearch<Words>::findTwo(const Set& on, const Set& off, const Operands& ands, const Operands& ors) {
    const auto findPair = [&](const Operands& operands, const Set& all, FactoredItem::Kind kind) {
        for (std::size_t i = 0; i < operands.size(); ++i) {
            for (std::size_t j = i + 1; j < operands.size(); ++j) {
                if (operands[i].left.both(operands[j].left).meets(all))
                    continue;
                push(*operands[i].a);
                push(*operands[j].a);
                push(kind);
                return true;
            }
        }
        return false;
    };
    return findPair(ands, off, FactoredItem::Kind::And) || findPair(ors, on, FactoredItem::Kind::Or);
}

/// Looks for the rest of a formula without one operand.
template <std::size_t Words>
// NOLINTNEXTLINE(misc-no-recursion): as deep as there are comparisons
bool FactorSearch<Words>::takeOff(const Set& on, const Set& off, std::size_t count, const Operand& operand,
                                  bool isAnd) {
    using Kind = FactoredItem::Kind;
    const std::size_t own = operand.b == nullptr ? 1 : 2;
    if (!(isAnd ? find(on, operand.left, count - own) : find(operand.left, off, count - own)))
        return false;
    push(*operand.a);
    if (operand.b != nullptr) {
        push(*operand.b);
        push(isAnd ? Kind::Or : Kind::And);
    }
    push(isAnd ? Kind::And : Kind::Or);
    return true;
}

/// Appends a formula of at most `count` comparisons to the result.
template <std::size_t Words>
// NOLINTNEXTLINE(misc-no-recursion): as deep as there are comparisons
bool FactorSearch<Words>::find(const Set& on, const Set& off, std::size_t count) {
    if (steps_ == 0)
        return false;
    --steps_;
    if (fewest(on, off) > count)
        return false;
    if (findOne(on, off))
        return true;
    if (count < 2)
        return false;
    Failure& failure = failures_[(on.hash() + 3 * off.hash()) % failures_.size()];
    if (failure.count >= count && failure.on == on && failure.off == off)
        return false;
    Operands ands;
    Operands ors;
    collectSingle(on, off, ands, ors);
    bool isFound = findTwo(on, off, ands, ors);
    if (count > 2) {
        for (std::size_t i = 0; i < ands.size() && !isFound; ++i)
            isFound = takeOff(on, off, count, ands[i], true);
        for (std::size_t i = 0; i < ors.size() && !isFound; ++i)
            isFound = takeOff(on, off, count, ors[i], false);
    }
    if (count > 3 && !isFound) {
        collectPairs(on, off, ands, ors);
        for (std::size_t i = 0; i < ands.size() && !isFound; ++i)
            isFound = ands[i].b != nullptr && takeOff(on, off, count, ands[i], true);
        for (std::size_t i = 0; i < ors.size() && !isFound; ++i)
            isFound = ors[i].b != nullptr && takeOff(on, off, count, ors[i], false);
    }
    if (!isFound && steps_ > 0)
        failure = {on, off, count};
    return isFound;
}

} // namespace

FactorAnswer searchFactored(const Grid& grid, std::span<const Word> on, std::span<const Word> off, std::size_t bound,
                            std::size_t steps) {
    const GroupedAxes axes = groupAxes(grid, on, off);
    std::size_t points = 1;
    for (const GroupedAxis& axis : axes)
        points = std::min(points * axis.groups.size(), limits::factorPoints + 1);
    if (points > limits::factorPoints)
        return {std::nullopt, false};
    if (points <= wordBits)
        return FactorSearch<1>(grid, axes, on, off, steps).run(bound);
    return FactorSearch<limits::factorPoints / wordBits>(grid, axes, on, off, steps).run(bound);
}

} // namespace VT
