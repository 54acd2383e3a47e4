// The search for values that boxes leave out.
#pragma once

#include "base/cover/Cover.hpp"
#include "base/decide/Decision.hpp"

#include <cstdint>
#include <span>
#include <vector>

namespace VT {

/// A set of values for each atom.
using BoxPart = std::vector<IntegerSet>;

/// Looks for a part of a region that no box meets, or proves that boxes cover the region.
class BoxSearch {
public:
    /// Looks at a side of a box that are one step, which so takes about as long as one of a decision.
    static constexpr std::size_t looksPerStep = 16;

    /// `boxes` outlive the search.
    BoxSearch(BoxPart region, std::span<const Cube* const> boxes);

    /// Yes where there is such a part, No where the region is covered, undecided after `steps`, of which it takes away
    /// those that it took: one for a few looks at a side of a box.
    Answer run(std::uint64_t& steps);

    /// After Yes, values of each atom, none of which are in a box.
    [[nodiscard]] const BoxPart& part() const noexcept { return part_; }

    /// After No, positions of boxes that cover the region together, in ascending order.
    [[nodiscard]] const std::vector<std::uint32_t>& covering() const noexcept { return covering_; }

private:
    enum class Outcome : std::uint8_t { Covered, Free, Open };

    struct Split {
        std::size_t begin; ///< of the boxes that meet the part
        std::size_t end;   ///< the same
        std::size_t trail; ///< length at which the part is as it was split
        const Cube* box;   ///< along which it is split
        std::vector<Atom> sides;
        std::size_t next = 0; ///< side beyond which the next piece is
    };

    Outcome enter(std::size_t begin);
    Outcome look(std::size_t begin, bool& isNarrowed);
    bool leaveHulls();
    bool leaveSides(std::size_t begin);
    void split(std::size_t begin);
    bool nextPiece();
    [[nodiscard]] bool meets(const Cube& box) const;
    bool narrow(Atom atom, IntegerSet values);
    void undo(std::size_t length);

    /// Takes a step for some looks at a side.
    void take(std::size_t looks) {
        const std::size_t steps = looks / looksPerStep + 1;
        left_ -= left_ < steps ? left_ : steps;
    }

    BoxPart part_;
    std::span<const Cube* const> boxes_;
    std::vector<std::uint32_t> meeting_; ///< positions of the boxes that meet the parts of all open splits
    std::vector<Split> open_;
    std::vector<std::pair<Atom, IntegerSet>> trail_; ///< what was narrowed, before that
    std::vector<std::int64_t> lows_;                 ///< by atom: the hull of the sides that cut the part
    std::vector<std::int64_t> highs_;                ///< the same
    std::uint32_t best_ = 0;                         ///< the box with the fewest sides that cut the part
    std::vector<bool> isUsed_;                       ///< by box, for the proof
    std::vector<std::uint32_t> covering_;
    std::uint64_t left_ = 0;
};

} // namespace VT
