// A growing union of boxes, asked for a point that it leaves out.
#pragma once

#include "base/cover/Cover.hpp"
#include "base/decide/Decision.hpp"

#include <cstdint>
#include <optional>
#include <span>
#include <vector>

namespace VT {

/// One value for each atom; the extreme 64-bit values stand for values beyond all bounds.
using BoxPoint = std::vector<std::int64_t>;

/// Whether a point is in a box.
[[nodiscard]] bool contains(const Cube& box, const BoxPoint& point) noexcept;

/// What the search for a point came to.
struct BoxGap {
    Answer answer = Answer::Undecided; ///< Yes where there is a point, No where every one is covered
    BoxPoint point = {};
};

/// Boxes over the same atoms, and whether they cover a region together.
class BoxUnion {
public:
    explicit BoxUnion(std::size_t atoms);

    /// Adds a box that is not empty.
    void add(const Cube& box);

    /// Looks for a point of a region that is in none of the boxes, nor in `further` ones.  Undecided after `steps`
    /// comparisons of a box with a part of the region, of which it takes away those that it made.
    BoxGap gap(const Cube& region, std::span<const Cube> further, std::uint64_t& steps);

    [[nodiscard]] std::size_t size() const noexcept { return boxes_.size(); }

private:
    struct Split;

    [[nodiscard]] const Cube* coverOf(const BoxPoint& point, Atom first, std::span<const Cube> further,
                                      std::uint64_t& steps);
    static bool leave(const Cube& box, const Cube& region, std::size_t turn, BoxPoint& point);
    [[nodiscard]] BoxPoint nearest(const Cube& region, const BoxPoint& point) const;
    BoxGap search(const Cube& region, std::span<const Cube> further, std::uint64_t& steps);
    void remember(const BoxPoint& point);

    std::size_t atoms_;
    std::vector<Cube> boxes_;
    std::vector<std::vector<std::int64_t>> lows_;  ///< by atom, then box: the ends of its values
    std::vector<std::vector<std::int64_t>> highs_; ///< the same
    std::vector<std::uint32_t> left_;              ///< boxes that may hold a point
    std::vector<BoxPoint> recent_;                 ///< points found before, the latest last
};

} // namespace VT
