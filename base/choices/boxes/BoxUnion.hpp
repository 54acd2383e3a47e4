// A growing union of boxes, asked for a point that it leaves out.
#pragma once

#include "base/choices/boxes/BoxSearch.hpp"
#include "base/cover/Cover.hpp"
#include "base/decide/Decision.hpp"

#include <array>
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
    std::vector<std::uint32_t> covering = {}; ///< after No, boxes that cover the region with the further ones
};

/// Boxes over the same atoms, and whether they cover a region together.
///
/// Boxes are numbered as they are added.  Adding one costs the ends of the sides of a few hundred others at most, and
/// whether a point is in one of n boxes is known after n / 256 looks for each atom.
class BoxUnion {
public:
    explicit BoxUnion(std::size_t atoms);

    /// Adds a box that is not empty.
    void add(const Cube& box);

    /// Looks for a point of a region that is in none of the boxes, nor in `further` ones.  Takes away the steps that it
    /// took, and is undecided after `steps`.
    BoxGap gap(const Cube& region, std::span<const Cube> further, std::uint64_t& steps);

    [[nodiscard]] const std::vector<Cube>& boxes() const noexcept { return boxes_; }

private:
    static constexpr std::size_t blockBoxes = 256;

    /// A bit for each box of a block.
    using Mask = std::array<std::uint64_t, blockBoxes / 64>;

    /// The sides of the boxes of a block for one atom.
    struct Sides {
        std::vector<std::int64_t> cuts{IntegerSet::minusInfinity}; ///< where sides begin, or end before
        std::vector<Mask> holding{Mask{}};                         ///< by cut: boxes with the values from it on
        Mask free{};                                               ///< boxes with all values

        std::size_t cutAt(std::int64_t value);
        [[nodiscard]] const Mask& at(std::int64_t value) const;
    };

    struct Block {
        std::vector<Sides> sides; ///< by atom
        Mask all{};
    };

    const Cube* holderOf(const BoxPoint& point, Atom first, std::span<const Cube> further, std::uint64_t& steps) const;
    [[nodiscard]] std::optional<std::uint32_t> whole(const Cube& region, std::uint64_t& steps) const;
    [[nodiscard]] std::vector<std::uint32_t> meeting(const BoxPart& part, const std::vector<bool>& isLeft,
                                                     std::uint64_t& steps) const;
    BoxGap search(const Cube& region, std::span<const Cube> further, std::uint64_t& steps) const;
    void remember(const BoxPoint& point);

    std::size_t atoms_;
    std::vector<Cube> boxes_;
    std::vector<Block> blocks_;
    std::vector<IntegerSet> hulls_; ///< by atom: around the sides of all boxes; empty where no box has one
    std::vector<BoxPoint> recent_;  ///< points found before, the latest last
};

} // namespace VT
