// The smallest And and Or of comparisons that holds at some points of a grid and not at others.
#pragma once

#include "base/cover/CoverGrid.hpp"

#include <boost/container/small_vector.hpp>

#include <optional>
#include <span>

namespace VT {

/// A formula in postfix order: constraints of one comparison each, and what joins the two formulas before it.
struct FactoredItem {
    enum class Kind : std::uint8_t { Comparison, And, Or } kind;
    std::size_t axis; ///< of a comparison
    Cells cells;      ///< that it allows
};

using Factored = boost::container::small_vector<FactoredItem, 16>;

struct FactorAnswer {
    /// The formula found; nothing where there is none within the bound, or none was found.
    std::optional<Factored> formula;
    /// No formula has fewer comparisons: than the one found, or than `bound` where none was found.
    bool isProven;
};

/// Looks for a formula of fewer than `bound` comparisons that holds at the points `on` of a grid and fails at `off`;
/// elsewhere it may do either.  Points are bits as Grid::points() writes them; there are some of both.  The formula has
/// the fewest comparisons of those that the search goes through, which are all formulas of at most 5 and those that
/// have an operand of one or two in each chain.  At most `steps` subproblems are looked at.
FactorAnswer searchFactored(const Grid& grid, std::span<const Word> on, std::span<const Word> off, std::size_t bound,
                            std::size_t steps);

} // namespace VT
