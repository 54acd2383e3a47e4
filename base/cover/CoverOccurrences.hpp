// Which cubes of a cover restrict which atoms.
#pragma once

#include "base/cover/Cover.hpp"

#include <algorithm>

namespace VT {

/// Which cubes restrict an atom.
class Occurrences {
public:
    explicit Occurrences(const Cover& cover) {
        for (std::size_t i = 0; i < cover.size(); ++i)
            for (const Constraint& c : cover[i].constraints())
                at(c.atom).push_back(i);
    }

    [[nodiscard]] const std::vector<std::size_t>& of(Atom atom) const { return byAtom_[atom]; }

    /// The cubes that restrict the rarest atom of a cube; every cube below it is among them.
    [[nodiscard]] const std::vector<std::size_t>& candidatesBelow(const Cube& cube) const {
        const auto rarest =
            std::ranges::min_element(cube.constraints(), {}, [this](const Constraint& c) { return of(c.atom).size(); });
        return of(rarest->atom);
    }

    [[nodiscard]] std::size_t atoms() const noexcept { return byAtom_.size(); }

private:
    std::vector<std::size_t>& at(Atom atom) {
        if (atom >= byAtom_.size())
            byAtom_.resize(atom + 1);
        return byAtom_[atom];
    }

    std::vector<std::vector<std::size_t>> byAtom_;
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

} // namespace VT
