// The points at which cubes of a cover may differ, as bits.
//
// The bounds of all sets of an atom cut the integers into cells; no set of the cover divides a cell.  Cells of all
// atoms form a grid.  A row of the grid is a word: the cells of the last atom at which the cover holds.
#pragma once

#include "base/core/Limits.hpp"
#include "base/cover/Cover.hpp"

#include <boost/container/small_vector.hpp>

#include <array>
#include <cstdint>
#include <span>

namespace VT {

using Word = std::uint64_t;
using Cells = std::uint64_t; ///< cells of one atom, one bit each

constexpr Cells cellBit(std::size_t cell) noexcept {
    return Cells{1} << cell;
}

/// The cells before one; `cell` is less than 64.
constexpr Cells cellsBefore(std::size_t cell) noexcept {
    return cellBit(cell) - 1;
}

/// An atom and its cells.
class Axis {
public:
    explicit Axis(Atom atom) : atom_(atom) {}

    [[nodiscard]] Atom atom() const noexcept { return atom_; }

    [[nodiscard]] std::size_t cells() const noexcept { return isTruth_ ? 2 : cuts_.size() + 1; }

    [[nodiscard]] Cells all() const noexcept { return cellsBefore(cells()); }

    /// Whether there are two cells only: one integer, and all others.
    [[nodiscard]] bool isTruth() const noexcept { return isTruth_; }

    /// Whether a cell is bounded on both sides.
    [[nodiscard]] bool isBounded(std::size_t cell) const noexcept { return cell > 0 && cell < cuts_.size(); }

    /// The integers in the cells from `first` to before `end`, which are bounded.
    [[nodiscard]] std::int64_t integers(std::size_t first, std::size_t end) const noexcept {
        return cuts_[end - 1].at - cuts_[first - 1].at;
    }

    [[nodiscard]] bool isPoint(std::size_t cell) const noexcept {
        return isBounded(cell) && integers(cell, cell + 1) == 1;
    }

    /// Comparisons that bound a run of cells.
    [[nodiscard]] std::uint32_t bounds(std::size_t first, std::size_t end) const noexcept {
        return end - first == 1 && isPoint(first) ? 1U : std::uint32_t{first > 0} + std::uint32_t{end < cells()};
    }

    /// Whether a run of cells is several points that the cover writes as points.
    [[nodiscard]] bool isPoints(std::size_t first, std::size_t end) const noexcept;

    /// Takes in the bounds of a set; `settle` follows the last one.
    void cut(const IntegerSet& set);
    void settle();

    [[nodiscard]] Cells cellsOf(const IntegerSet& set) const noexcept;
    [[nodiscard]] IntegerSet setOf(Cells cells) const;

private:
    /// Where a cell begins.
    struct Cut {
        std::int64_t at;
        bool isPoint; ///< only points begin or end there
    };

    Atom atom_;
    bool isTruth_ = true;
    boost::container::small_vector<Cut, 16> cuts_; ///< of all cells but the first
};

/// A product of cells, by axis.
struct Box {
    std::array<Cells, limits::coverAtoms> cells;
    std::uint32_t comparisons = 0;
};

/// Cells of a set in one word of it.
inline constexpr std::size_t wordBits = 64;

class Grid {
public:
    using Words = boost::container::small_vector<Word, 64>;

    /// Reads a cover; false where it has more atoms or points than limits::coverPoints allows.
    bool read(const Cover& cover);

    [[nodiscard]] const boost::container::small_vector<Axis, 4>& axes() const noexcept { return axes_; }

    [[nodiscard]] const Axis& inner() const noexcept { return axes_.back(); }

    /// Rows of one cell of an axis other than the inner one.
    [[nodiscard]] std::size_t stride(std::size_t axis) const noexcept { return strides_[axis]; }

    [[nodiscard]] const Words& rows() const noexcept { return rows_; }

    [[nodiscard]] Cube cubeOf(const Box& box) const;
    /// The cells of a cube whose bounds the grid has.
    [[nodiscard]] Box boxOf(const Cube& cube) const;

    /// Words of the points of the grid without gaps between rows.
    [[nodiscard]] std::size_t words() const noexcept;
    /// The points at which the cover holds, and those of a box.
    void points(Word* out) const;
    void points(const Box& box, Word* out) const;

private:
    using Rows = boost::container::small_vector<std::uint32_t, 64>;

    void readAxes(const Cover& cover);
    [[nodiscard]] Rows rowsOf(const Box& box) const;
    void append(std::size_t row, Cells cells, Word* out) const;

    boost::container::small_vector<Axis, 4> axes_; ///< the inner one is the last and has the most cells
    std::array<std::size_t, limits::coverAtoms> strides_{};
    Words rows_;
};

} // namespace VT
