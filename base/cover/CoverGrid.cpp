// Reads a cover into a grid of points and writes boxes of points as cubes.
//
// Cost: linear in the cubes times the points, which limits::coverPoints bounds.
// Relies on: no set of the cover divides a cell, because cells end at the bounds of all sets.
#include "base/cover/CoverGrid.hpp"

#include <algorithm>

namespace VT {

// Axes.

void Axis::cut(const IntegerSet& set) {
    const bool isPoint = set.low() == set.high();
    const bool isAllButPoint = set.intervals().size() == 2 && set.comparisons() == 1;
    isTruth_ = isTruth_ && (isPoint || isAllButPoint);
    for (const IntegerSet::Interval& interval : set.intervals()) {
        // Integers that are missing within a set are points.
        if (interval.low != IntegerSet::minusInfinity)
            cuts_.push_back({interval.low, isPoint || interval.low != set.low()});
        if (interval.high != IntegerSet::plusInfinity)
            cuts_.push_back({interval.high + 1, isPoint || interval.high != set.high()});
    }
}

void Axis::settle() {
    std::ranges::sort(cuts_, {}, &Cut::at);
    std::size_t kept = 0;
    for (const Cut& cut : cuts_) {
        if (kept > 0 && cuts_[kept - 1].at == cut.at)
            cuts_[kept - 1].isPoint = cuts_[kept - 1].isPoint && cut.isPoint;
        else
            cuts_[kept++] = cut;
    }
    cuts_.erase(cuts_.begin() + static_cast<std::ptrdiff_t>(kept), cuts_.end());
    isTruth_ = isTruth_ && kept == 2 && cuts_[1].at - cuts_[0].at == 1;
}

bool Axis::isPoints(std::size_t first, std::size_t end) const noexcept {
    if (first == 0 || end > cuts_.size() || end - first < 2 || !cuts_[first - 1].isPoint || !cuts_[end - 1].isPoint)
        return false;
    return integers(first, end) == static_cast<std::int64_t>(end - first);
}

Cells Axis::cellsOf(const IntegerSet& set) const noexcept {
    if (isTruth_)
        return cellBit(set.intervals().size() - 1);
    Cells cells = 0;
    std::size_t cell = 0;
    for (const IntegerSet::Interval& interval : set.intervals()) {
        while (cell < cuts_.size() && cuts_[cell].at <= interval.low)
            ++cell;
        const std::size_t first = cell;
        while (cell < cuts_.size() && cuts_[cell].at <= interval.high)
            ++cell;
        cells |= cellsBefore(cell + 1) & ~cellsBefore(first);
    }
    return cells;
}

IntegerSet Axis::setOf(Cells cells) const {
    const IntegerSet point = IntegerSet::point(cuts_.front().at);
    if (isTruth_)
        return cells == cellBit(0) ? point : point.complement();
    std::vector<IntegerSet::Interval> intervals;
    for (std::size_t cell = 0; cell <= cuts_.size(); ++cell) {
        if ((cells & cellBit(cell)) != 0)
            intervals.push_back({cell == 0 ? IntegerSet::minusInfinity : cuts_[cell - 1].at,
                                 cell == cuts_.size() ? IntegerSet::plusInfinity : cuts_[cell].at - 1});
    }
    return IntegerSet::of(std::move(intervals));
}

// The grid.

void Grid::readAxes(const Cover& cover) {
    for (const Cube& cube : cover) {
        for (const Constraint& constraint : cube.constraints()) {
            auto axis = std::ranges::find(axes_, constraint.atom, &Axis::atom);
            if (axis == axes_.end()) {
                if (axes_.size() == limits::coverAtoms) {
                    axes_.clear();
                    return;
                }
                axes_.emplace_back(constraint.atom);
                axis = axes_.end() - 1;
            }
            axis->cut(constraint.set);
        }
    }
    for (Axis& axis : axes_)
        axis.settle();
    const auto widest = std::ranges::max_element(axes_, {}, &Axis::cells);
    if (widest != axes_.end())
        std::iter_swap(widest, axes_.end() - 1);
}

bool Grid::read(const Cover& cover) {
    axes_.clear();
    readAxes(cover);
    if (axes_.empty() || inner().cells() >= wordBits)
        return false;
    std::size_t rows = 1;
    for (std::size_t axis = axes_.size() - 1; axis-- > 0;) {
        strides_[axis] = rows;
        rows *= axes_[axis].cells();
        if (rows * inner().cells() > limits::coverPoints)
            return false;
    }
    rows_.assign(rows, 0);
    for (const Cube& cube : cover) {
        const Box box = boxOf(cube);
        for (const std::uint32_t row : rowsOf(box))
            rows_[row] |= box.cells[axes_.size() - 1];
    }
    return true;
}

Box Grid::boxOf(const Cube& cube) const {
    Box box{};
    for (std::size_t axis = 0; axis < axes_.size(); ++axis) {
        const IntegerSet* set = cube.find(axes_[axis].atom());
        box.cells[axis] = set == nullptr ? axes_[axis].all() : axes_[axis].cellsOf(*set);
    }
    return box;
}

/// The rows that a box takes part of.
Grid::Rows Grid::rowsOf(const Box& box) const {
    Rows rows{0};
    for (std::size_t axis = 0; axis + 1 < axes_.size(); ++axis) {
        const std::size_t count = rows.size();
        const Cells cells = box.cells[axis];
        const auto first = static_cast<std::size_t>(std::countr_zero(cells));
        for (std::size_t cell = first + 1; cell < axes_[axis].cells(); ++cell) {
            if ((cells & cellBit(cell)) != 0)
                for (std::size_t i = 0; i < count; ++i)
                    rows.push_back(rows[i] + static_cast<std::uint32_t>(cell * strides_[axis]));
        }
        for (std::size_t i = 0; i < count; ++i)
            rows[i] += static_cast<std::uint32_t>(first * strides_[axis]);
    }
    return rows;
}

Cube Grid::cubeOf(const Box& box) const {
    Cube cube;
    for (std::size_t axis = 0; axis < axes_.size(); ++axis)
        if (box.cells[axis] != axes_[axis].all())
            cube.assign(axes_[axis].atom(), axes_[axis].setOf(box.cells[axis]));
    return cube;
}

std::size_t Grid::words() const noexcept {
    return (rows_.size() * inner().cells() + wordBits - 1) / wordBits;
}

void Grid::append(std::size_t row, Cells cells, Word* out) const {
    const std::size_t at = row * inner().cells();
    const std::size_t shift = at % wordBits;
    out[at / wordBits] |= cells << shift;
    if (shift + inner().cells() > wordBits)
        out[at / wordBits + 1] |= cells >> (wordBits - shift);
}

void Grid::points(Word* out) const {
    for (std::size_t row = 0; row < rows_.size(); ++row)
        append(row, rows_[row], out);
}

void Grid::points(const Box& box, Word* out) const {
    for (const std::uint32_t row : rowsOf(box))
        append(row, box.cells[axes_.size() - 1], out);
}

} // namespace VT
