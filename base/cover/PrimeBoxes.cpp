// Lists the prime boxes of a grid: axis by axis, every run of cells whose rows have points in common.
//
// A run may leave bounded cells out, at one comparison for each integer in them.  A run that could take a neighbour
// in at no cost is passed over; the boxes that are left are compared with each other.
// Cost: exponential in the number of axes; every word looked at is a step of the budget.
#include "base/cover/PrimeBoxes.hpp"

#include "base/core/Limits.hpp"

#include <algorithm>
#include <bit>

namespace VT {

namespace {

bool isSubset(const Word* a, const Word* b, std::size_t words) {
    for (std::size_t i = 0; i < words; ++i)
        if ((a[i] & ~b[i]) != 0)
            return false;
    return true;
}

bool isEmpty(const Word* words, std::size_t count) {
    return std::all_of(words, words + count, [](Word word) { return word == 0; });
}

} // namespace

bool PrimeBoxes::list(std::uint32_t most) {
    most_ = most;
    boxes_.clear();
    visit(0, grid_.rows().data(), 0);
    return !budget_.exhausted() && boxes_.size() <= limits::coverBoxes;
}

/// Adds the box at hand, unless one of those listed makes it needless.
void PrimeBoxes::offer(Cells inner, std::uint32_t comparisons) {
    const std::size_t axes = grid_.axes().size();
    if (comparisons > most_ || boxes_.size() > limits::coverBoxes || !budget_.spend(boxes_.size()))
        return;
    box_.cells[axes - 1] = inner;
    box_.comparisons = comparisons;
    const auto isWithin = [axes](const Box& a, const Box& b) { return isSubset(a.cells.data(), b.cells.data(), axes); };
    for (const Box& other : boxes_)
        if (other.comparisons <= comparisons && isWithin(box_, other))
            return;
    const auto isNeedless = [&](const Box& other) { return other.comparisons >= comparisons && isWithin(other, box_); };
    boxes_.erase(std::remove_if(boxes_.begin(), boxes_.end(), isNeedless), boxes_.end());
    boxes_.push_back(box_);
}

// NOLINTNEXTLINE(misc-no-recursion): as deep as there are axes
void PrimeBoxes::visit(std::size_t axis, const Word* rows, std::uint32_t comparisons) {
    if (comparisons > most_ || budget_.exhausted())
        return;
    if (axis + 1 == grid_.axes().size())
        return visitInner(*rows, comparisons);
    if (grid_.axes()[axis].isTruth())
        return visitTruth(axis, rows, comparisons);
    for (std::size_t first = 0; first < grid_.axes()[axis].cells(); ++first)
        extend({axis, first, first, 0, 0}, rows, nullptr, comparisons);
}

// NOLINTNEXTLINE(misc-no-recursion): as deep as there are axes
void PrimeBoxes::visitTruth(std::size_t axis, const Word* rows, std::uint32_t comparisons) {
    const std::size_t stride = grid_.stride(axis);
    const Word* const sides[] = {rows, rows + stride};
    if (!budget_.spend(stride))
        return;
    for (const std::size_t side : {0U, 1U}) {
        if (isSubset(sides[side], sides[1 - side], stride))
            continue;
        box_.cells[axis] = cellBit(side);
        visit(axis + 1, sides[side], comparisons + 1);
    }
    Grid::Words both(stride, boost::container::default_init);
    for (std::size_t i = 0; i < stride; ++i)
        both[i] = sides[0][i] & sides[1][i];
    box_.cells[axis] = grid_.axes()[axis].all();
    if (!isEmpty(both.data(), stride))
        visit(axis + 1, both.data(), comparisons);
}

/// Decides the next cell of a run: in, or left out.
// NOLINTNEXTLINE(misc-no-recursion): as deep as there are cells
void PrimeBoxes::extend(const Run& run, const Word* rows, const Word* taken, std::uint32_t comparisons) {
    const Axis& axis = grid_.axes()[run.axis];
    const std::size_t stride = grid_.stride(run.axis);
    if (run.next == axis.cells() || comparisons + run.holes > most_ || !budget_.spend(stride))
        return;
    const Word* const own = rows + run.next * stride;
    Grid::Words both(own, own + stride);
    if (taken != nullptr)
        for (std::size_t i = 0; i < stride; ++i)
            both[i] &= taken[i];
    if (!isEmpty(both.data(), stride)) {
        const Run with{run.axis, run.first, run.next + 1, run.cells | cellBit(run.next), run.holes};
        take(with, rows, both.data(), comparisons);
        extend(with, rows, both.data(), comparisons);
    }
    if (taken == nullptr || !axis.isBounded(run.next) || isSubset(taken, both.data(), stride))
        return;
    const std::int64_t missing = axis.integers(run.next, run.next + 1);
    if (missing <= limits::coverHole)
        extend({run.axis, run.first, run.next + 1, run.cells, run.holes + static_cast<std::uint32_t>(missing)}, rows,
               taken, comparisons);
}

/// Goes on to the next axis with a run, unless a wider one is as good.
// NOLINTNEXTLINE(misc-no-recursion): as deep as there are axes
void PrimeBoxes::take(const Run& run, const Word* rows, const Word* both, std::uint32_t comparisons) {
    const Axis& axis = grid_.axes()[run.axis];
    const std::size_t stride = grid_.stride(run.axis);
    const std::uint32_t bounds = axis.bounds(run.first, run.next);
    const auto isAsGood = [&](std::size_t first, std::size_t end, std::size_t added) {
        return axis.bounds(first, end) <= bounds && isSubset(both, rows + added * stride, stride) &&
               !(pointsStay_ && axis.isPoints(first, end));
    };
    if ((run.first > 0 && isAsGood(run.first - 1, run.next, run.first - 1)) ||
        (run.next < axis.cells() && isAsGood(run.first, run.next + 1, run.next)) ||
        (pointsStay_ && axis.isPoints(run.first, run.next)))
        return;
    box_.cells[run.axis] = run.cells;
    visit(run.axis + 1, both, comparisons + bounds + run.holes);
}

/// Offers a run of the inner axis, which may have holes; where that is points, the ranges in it that are not.
void PrimeBoxes::offerRun(std::size_t first, std::size_t end, Cells cells, std::uint32_t comparisons) {
    const Axis& axis = grid_.inner();
    if (!pointsStay_ || !axis.isPoints(first, end))
        return offer(cells, comparisons + axis.bounds(first, end));
    for (std::size_t from = first; from < end; ++from) {
        for (std::size_t to = from + 2; to <= end; ++to)
            if (!axis.isPoints(from, to) && (cells & cellBit(from)) != 0 && (cells & cellBit(to - 1)) != 0)
                offer(cells & cellsBefore(to) & ~cellsBefore(from), comparisons + axis.bounds(from, to));
    }
}

/// The runs of the inner axis within some cells: those as wide as can be, the joined ones, and points, which take fewer
/// comparisons.
void PrimeBoxes::visitInner(Cells allowed, std::uint32_t comparisons) {
    const Axis& axis = grid_.inner();
    if (axis.isTruth())
        return offer(allowed, comparisons + (allowed == axis.all() ? 0 : 1));
    for (Cells left = allowed; left != 0;) {
        const auto first = static_cast<std::size_t>(std::countr_zero(left));
        auto end = first + static_cast<std::size_t>(std::countr_one(left >> first));
        Cells cells = cellsBefore(end) & ~cellsBefore(first);
        left &= ~cells;
        offerRun(first, end, cells, comparisons);
        if (axis.bounds(first, end) > 1) {
            for (std::size_t cell = first; cell < end; ++cell)
                if (axis.isPoint(cell))
                    offerRun(cell, cell + 1, cellBit(cell), comparisons);
        }
        std::uint32_t holes = 0;
        for (Cells rest = left; rest != 0;) {
            const auto next = static_cast<std::size_t>(std::countr_zero(rest));
            const std::int64_t missing = axis.integers(end, next);
            if (missing > limits::coverHole)
                break;
            holes += static_cast<std::uint32_t>(missing);
            end = next + static_cast<std::size_t>(std::countr_one(rest >> next));
            const Cells more = cellsBefore(end) & ~cellsBefore(next);
            rest &= ~more;
            cells |= more;
            offerRun(first, end, cells, comparisons + holes);
        }
    }
}

} // namespace VT
