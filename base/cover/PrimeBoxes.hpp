// The boxes that a smallest cover is made of.
#pragma once

#include "base/cover/CoverGrid.hpp"

#include <vector>

namespace VT {

/// Lists the boxes within the points of a grid that no box of as few comparisons contains.
class PrimeBoxes {
public:
    using Boxes = boost::container::small_vector<Box, 16>;

    /// Where `pointsStay`, several points of an axis that the cover writes as points are not taken for a range.
    PrimeBoxes(const Grid& grid, CoverBudget& budget, bool pointsStay)
        : grid_(grid),
          budget_(budget),
          pointsStay_(pointsStay) {}

    /// Boxes of at most so many comparisons; the list is not complete where the budget is exhausted or there are more
    /// than limits::coverBoxes, and the answer is then false.
    bool list(std::uint32_t most);

    [[nodiscard]] const Boxes& boxes() const noexcept { return boxes_; }

private:
    /// Cells of an axis that are taken in from left to right.
    struct Run {
        std::size_t axis;
        std::size_t first;
        std::size_t next;    ///< the cell that is decided next
        Cells cells;         ///< taken in
        std::uint32_t holes; ///< integers left out between them
    };

    void visit(std::size_t axis, const Word* rows, std::uint32_t comparisons);
    void visitTruth(std::size_t axis, const Word* rows, std::uint32_t comparisons);
    void visitInner(Cells allowed, std::uint32_t comparisons);
    void extend(const Run& run, const Word* rows, const Word* taken, std::uint32_t comparisons);
    void take(const Run& run, const Word* rows, const Word* both, std::uint32_t comparisons);
    void offerRun(std::size_t first, std::size_t end, Cells cells, std::uint32_t comparisons);
    void offer(Cells inner, std::uint32_t comparisons);

    const Grid& grid_;
    CoverBudget& budget_;
    bool pointsStay_;
    std::uint32_t most_ = 0;
    Box box_{};
    Boxes boxes_;
};

} // namespace VT
