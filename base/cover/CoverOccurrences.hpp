// Which cubes of a cover restrict which atoms.
#pragma once

#include "base/cover/Cover.hpp"

#include <boost/container/small_vector.hpp>

#include <algorithm>
#include <span>

namespace VT {

/// Which cubes restrict an atom, in one list sorted by atom.
class Occurrences {
public:
    using Cubes = std::span<const std::size_t>;

    explicit Occurrences(const Cover& cover) {
        ends_.assign(1, 0);
        for (const Cube& cube : cover) {
            for (const Constraint& c : cube.constraints()) {
                if (c.atom + 1 >= ends_.size())
                    ends_.resize(c.atom + 2, 0);
                ++ends_[c.atom + 1];
            }
        }
        for (std::size_t atom = 1; atom < ends_.size(); ++atom)
            ends_[atom] += ends_[atom - 1];
        cubes_.resize(ends_.back(), boost::container::default_init);
        Places next = ends_;
        for (std::size_t i = 0; i < cover.size(); ++i)
            for (const Constraint& c : cover[i].constraints())
                cubes_[next[c.atom]++] = i;
    }

    [[nodiscard]] Cubes of(Atom atom) const {
        return {cubes_.data() + ends_[atom], ends_[std::size_t{atom} + 1] - ends_[atom]};
    }

    /// The cubes that restrict the rarest atom of a cube; every cube below it is among them.
    [[nodiscard]] Cubes candidatesBelow(const Cube& cube) const {
        const auto rarest =
            std::ranges::min_element(cube.constraints(), {}, [this](const Constraint& c) { return of(c.atom).size(); });
        return of(rarest->atom);
    }

    [[nodiscard]] std::size_t atoms() const noexcept { return ends_.size() - 1; }

private:
    using Places = boost::container::small_vector<std::size_t, 16>;

    Places ends_; ///< where the cubes of each atom begin, and end
    boost::container::small_vector<std::size_t, 32> cubes_;
};

/// Takes the marked cubes away; the others keep their order.
inline void eraseMarked(Cover& cover, const std::vector<bool>& marked) {
    std::size_t kept = 0;
    for (std::size_t i = 0; i < cover.size(); ++i) {
        if (marked[i])
            continue;
        if (kept != i)
            cover[kept] = std::move(cover[i]);
        ++kept;
    }
    cover.resize(kept);
}

/// Whether each cube restricts one atom, and the sets of an atom lie apart and leave some integer out: between two of
/// their intervals an integer is missing, unless both are cubes of one point.  No cube of such a cover holds where the
/// others do, and neither does what any of them gains without a comparison: there is nothing to absorb or to drop.
bool isSumOfSeparateSets(const Cover& cover);

} // namespace VT
