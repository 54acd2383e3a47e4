// Finds a point of a region that boxes leave out, or proves that they cover it.
//
// Method: points found before and corners of the region are tried first, each against the ends of all boxes, which lie
// in memory atom by atom; a point that a box holds moves out of it a few times.  Then the region is split along a box
// with the fewest sides inside of it, depth first, with those boxes that still meet each part (the decomposition of
// Chan, "Klee's measure problem made easy", 2013, without its weights). Cost: a few comparisons for each box where a
// point is left out; exponential in the atoms at worst, bounded by steps.
#include "base/choices/BoxUnion.hpp"

#include "base/core/Limits.hpp"

#include <algorithm>

namespace VT {

namespace {

const IntegerSet everything = IntegerSet::all();

const IntegerSet& sideOf(const Cube& box, Atom atom) {
    const IntegerSet* const side = box.find(atom);
    return side != nullptr ? *side : everything;
}

/// The member of a set that is nearest to a value.
std::int64_t nearestIn(const IntegerSet& set, std::int64_t value) {
    std::int64_t below = set.low();
    for (const auto& [low, high] : set.intervals()) {
        if (value < low)
            return value <= below || static_cast<std::uint64_t>(low) - static_cast<std::uint64_t>(value) <=
                                         static_cast<std::uint64_t>(value) - static_cast<std::uint64_t>(below)
                       ? low
                       : below;
        if (value <= high)
            return value;
        below = high;
    }
    return below;
}

} // namespace

bool contains(const Cube& box, const BoxPoint& point) noexcept {
    return std::ranges::all_of(box.constraints(),
                               [&](const Constraint& side) { return side.set.contains(point[side.atom]); });
}

BoxUnion::BoxUnion(std::size_t atoms) : atoms_(atoms), lows_(atoms), highs_(atoms) {}

void BoxUnion::add(const Cube& box) {
    boxes_.push_back(box);
    for (Atom atom = 0; atom < atoms_; ++atom) {
        const IntegerSet& side = sideOf(box, atom);
        lows_[atom].push_back(side.low());
        highs_[atom].push_back(side.high());
    }
}

/// A box that a point is in, or nullptr; `first` is the atom that is compared first.
const Cube* BoxUnion::coverOf(const BoxPoint& point, Atom first, std::span<const Cube> further, std::uint64_t& steps) {
    for (const Cube& box : further)
        if (contains(box, point))
            return &box;
    left_.clear();
    if (atoms_ > 0) {
        left_.resize(boxes_.size());
        std::size_t left = 0;
        for (std::uint32_t i = 0; i < boxes_.size(); ++i) {
            left_[left] = i;
            left += static_cast<std::size_t>(lows_[first][i] <= point[first] && point[first] <= highs_[first][i]);
        }
        left_.resize(left);
    }
    steps -= std::min<std::uint64_t>(steps, 1 + boxes_.size() / 256 + left_.size() / 32);
    const auto isIn = [&](std::uint32_t box) {
        for (Atom atom = 0; atom < atoms_; ++atom)
            if (point[atom] < lows_[atom][box] || point[atom] > highs_[atom][box])
                return false;
        return contains(boxes_[box], point);
    };
    const auto found = std::ranges::find_if(left_, isIn);
    if (atoms_ == 0)
        return boxes_.empty() ? nullptr : boxes_.data();
    return found == left_.end() ? nullptr : &boxes_[*found];
}

/// Moves a point out of a box, within a region; false where it cannot be left.  `turn` varies the side.
bool BoxUnion::leave(const Cube& box, const Cube& region, std::size_t turn, BoxPoint& point) {
    const auto& sides = box.constraints();
    for (std::size_t i = 0; i < sides.size(); ++i) {
        const Constraint& side = sides[(turn + i) % sides.size()];
        const IntegerSet* const within = region.find(side.atom);
        const IntegerSet outside = within != nullptr ? within->minus(side.set) : side.set.complement();
        if (outside.empty())
            continue;
        point[side.atom] = nearestIn(outside, turn % 2 == 0 ? point[side.atom] : point[side.atom] < 0 ? 1 : -1);
        return true;
    }
    return false;
}

BoxPoint BoxUnion::nearest(const Cube& region, const BoxPoint& point) const {
    BoxPoint result = point;
    for (const Constraint& side : region.constraints())
        result[side.atom] = nearestIn(side.set, point[side.atom]);
    return result;
}

void BoxUnion::remember(const BoxPoint& point) {
    std::erase(recent_, point);
    if (recent_.size() == limits::recentPoints)
        recent_.erase(recent_.begin());
    recent_.push_back(point);
}

BoxGap BoxUnion::gap(const Cube& region, std::span<const Cube> further, std::uint64_t& steps) {
    std::vector<BoxPoint> guesses(recent_.rbegin(), recent_.rend());
    guesses.emplace_back(atoms_, IntegerSet::minusInfinity);
    guesses.emplace_back(atoms_, IntegerSet::plusInfinity);
    // The atom whose values are fewest is the most likely to tell a point from a box.
    Atom first = 0;
    std::uint64_t fewest = ~std::uint64_t{0};
    for (const Constraint& side : region.constraints()) {
        const auto size = static_cast<std::uint64_t>(side.set.high()) - static_cast<std::uint64_t>(side.set.low());
        if (size < fewest) {
            fewest = size;
            first = side.atom;
        }
    }
    for (const BoxPoint& guess : guesses) {
        BoxPoint point = nearest(region, guess);
        for (std::size_t turn = 0; turn < limits::boxMoves; ++turn) {
            if (steps == 0)
                return {};
            const Cube* const cover = coverOf(point, first, further, steps);
            if (cover == nullptr) {
                remember(point);
                return {Answer::Yes, point};
            }
            if (!leave(*cover, region, turn, point))
                break;
        }
    }
    BoxGap found = search(region, further, steps);
    if (found.answer == Answer::Yes)
        remember(found.point);
    return found;
}

/// A part of the region that is split along a box.
struct BoxUnion::Split {
    std::size_t begin;                  ///< of the boxes that meet it
    const Cube* box;                    ///< along which it is split
    std::vector<Atom> sides;            ///< of the box that end inside of the part
    std::size_t next = 0;               ///< side beyond which the next piece is
    std::vector<Constraint> whole = {}; ///< what the sides before it were
};

BoxGap BoxUnion::search(const Cube& region, std::span<const Cube> further, std::uint64_t& steps) {
    std::vector<IntegerSet> part(atoms_, everything);
    for (const Constraint& side : region.constraints())
        part[side.atom] = side.set;
    std::vector<const Cube*> meeting; // the boxes of all open splits
    std::vector<Split> open;
    const auto meets = [&](const Cube& box) {
        return std::ranges::all_of(box.constraints(),
                                   [&](const Constraint& side) { return side.set.intersects(part[side.atom]); });
    };
    const auto openSides = [&](const Cube& box) {
        return std::ranges::count_if(box.constraints(),
                                     [&](const Constraint& side) { return !part[side.atom].isSubsetOf(side.set); });
    };
    // Chooses a box to split the part along; whether none meets it.
    const auto enter = [&](std::size_t begin) {
        if (begin == meeting.size())
            return true;
        const Cube* best = nullptr;
        std::ptrdiff_t fewest = 0;
        for (std::size_t i = begin; i < meeting.size() && (best == nullptr || fewest > 0); ++i) {
            const std::ptrdiff_t sides = openSides(*meeting[i]);
            if (best == nullptr || sides < fewest) {
                best = meeting[i];
                fewest = sides;
            }
        }
        steps -= std::min<std::uint64_t>(steps, meeting.size() - begin);
        Split split{begin, best, {}};
        for (const Constraint& side : best->constraints())
            if (!part[side.atom].isSubsetOf(side.set))
                split.sides.push_back(side.atom);
        open.push_back(std::move(split));
        return false;
    };
    for (const Cube& box : boxes_)
        if (meets(box))
            meeting.push_back(&box);
    for (const Cube& box : further)
        if (meets(box))
            meeting.push_back(&box);
    steps -= std::min<std::uint64_t>(steps, boxes_.size() / 4 + 1);
    bool isFree = enter(0);
    while (!isFree && !open.empty()) {
        if (steps == 0)
            return {};
        Split& top = open.back();
        if (!top.whole.empty()) { // back from a piece: the next ones are inside of its side
            Constraint& last = top.whole.back();
            part[last.atom] = last.set.intersect(*top.box->find(last.atom));
        }
        if (top.next == top.sides.size()) {
            for (const Constraint& side : top.whole)
                part[side.atom] = side.set;
            meeting.resize(top.begin);
            open.pop_back();
            continue;
        }
        const Atom atom = top.sides[top.next++];
        top.whole.push_back({atom, part[atom]});
        part[atom] = part[atom].minus(*top.box->find(atom));
        const std::size_t begin = top.begin;
        const std::size_t end = meeting.size();
        for (std::size_t i = begin; i < end; ++i)
            if (meets(*meeting[i]))
                meeting.push_back(meeting[i]);
        steps -= std::min<std::uint64_t>(steps, end - begin);
        isFree = enter(end);
    }
    if (!isFree)
        return {Answer::No, {}};
    BoxPoint point(atoms_, 0);
    for (Atom atom = 0; atom < atoms_; ++atom)
        point[atom] = nearestIn(part[atom], 0);
    return {Answer::Yes, std::move(point)};
}

} // namespace VT
