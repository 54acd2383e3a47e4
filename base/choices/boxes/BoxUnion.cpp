// Finds a point of a region that boxes leave out, or proves that they cover it.
//
// Method: boxes are kept in blocks with an index for each atom: the values at which a side begins or ends, and between
// them a bit for each box that has them.  The boxes that hold a point are the And of a few masks.  Points found before
// and some corners of the region are tried first, then whether one box covers it; a point that a box holds moves out of
// it a few times.  Otherwise BoxSearch decides, with the boxes that meet the region; where a value beyond all sides of
// an atom is in the region, boxes with such a side need no look. Cost: a few looks for each block where a point is left
// out; exponential in the atoms at worst, bounded by steps.
#include "base/choices/boxes/BoxUnion.hpp"

#include "base/core/Limits.hpp"
#include "base/util/Hash.hpp"

#include <algorithm>
#include <bit>

namespace VT {

namespace {

/// The member of a set that is nearest to a value.
std::int64_t nearestIn(const IntegerSet& set, std::int64_t value) {
    std::int64_t below = set.low();
    for (const auto& [low, high] : set.intervals()) {
        if (value < low) {
            return value <= below || static_cast<std::uint64_t>(low) - static_cast<std::uint64_t>(value) <=
                                         static_cast<std::uint64_t>(value) - static_cast<std::uint64_t>(below)
                       ? low
                       : below;
        }
        if (value <= high)
            return value;
        below = high;
    }
    return below;
}

BoxPoint nearest(const Cube& region, BoxPoint point) {
    for (const Constraint& side : region.constraints())
        point[side.atom] = nearestIn(side.set, point[side.atom]);
    return point;
}

/// Moves a point out of a box, within a region; false where it cannot be left.  `turn` varies the side.
bool leave(const Cube& box, const Cube& region, std::size_t turn, BoxPoint& point) {
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

/// A corner of a region; `turn` picks the ends.
BoxPoint cornerOf(const Cube& region, std::size_t atoms, std::uint64_t turn) {
    BoxPoint point(atoms);
    for (Atom atom = 0; atom < atoms; ++atom) {
        const bool isHigh = hashStep(turn, atom) >> 63U != 0;
        const IntegerSet* const side = region.find(atom);
        const IntegerSet set = side != nullptr ? *side : IntegerSet::all();
        point[atom] = isHigh ? set.high() : set.low();
    }
    return point;
}

/// The atom whose values in a region are fewest: the most likely to tell a point from a box.
Atom narrowest(const Cube& region) {
    Atom first = 0;
    std::uint64_t fewest = ~std::uint64_t{0};
    for (const Constraint& side : region.constraints()) {
        const auto size = static_cast<std::uint64_t>(side.set.high()) - static_cast<std::uint64_t>(side.set.low());
        if (size < fewest) {
            fewest = size;
            first = side.atom;
        }
    }
    return first;
}

/// The interval around two sets, of which the first may be empty.
IntegerSet hullOf(const IntegerSet& a, const IntegerSet& b) {
    return a.empty() ? IntegerSet(b.low(), b.high())
                     : IntegerSet(std::min(a.low(), b.low()), std::max(a.high(), b.high()));
}

/// Takes away the boxes that are not in another mask; whether some are left.
template <class Mask>
bool keep(Mask& mask, const Mask& others, const Mask& free) {
    std::uint64_t any = 0;
    for (std::size_t i = 0; i < mask.size(); ++i)
        any |= mask[i] &= others[i] | free[i];
    return any != 0;
}

template <class Mask>
std::size_t firstOf(const Mask& mask) {
    std::size_t word = 0;
    while (mask[word] == 0)
        ++word;
    return word * 64 + static_cast<std::size_t>(std::countr_zero(mask[word]));
}

void take(std::uint64_t& steps, std::uint64_t taken) {
    steps -= std::min(steps, taken);
}

} // namespace

bool contains(const Cube& box, const BoxPoint& point) noexcept {
    return std::ranges::all_of(box.constraints(),
                               [&](const Constraint& side) { return side.set.contains(point[side.atom]); });
}

BoxUnion::BoxUnion(std::size_t atoms) : atoms_(atoms), hulls_(atoms) {}

/// The position of a cut, which is made where there is none.
std::size_t BoxUnion::Sides::cutAt(std::int64_t value) {
    const auto after = std::ranges::upper_bound(cuts, value);
    const auto position = static_cast<std::size_t>(after - cuts.begin());
    if (*(after - 1) == value)
        return position - 1;
    const Mask before = holding[position - 1];
    cuts.insert(after, value);
    holding.insert(holding.begin() + static_cast<std::ptrdiff_t>(position), before);
    return position;
}

const BoxUnion::Mask& BoxUnion::Sides::at(std::int64_t value) const {
    return holding[static_cast<std::size_t>(std::ranges::upper_bound(cuts, value) - cuts.begin()) - 1];
}

void BoxUnion::add(const Cube& box) {
    const std::size_t bit = boxes_.size() % blockBoxes;
    if (bit == 0)
        blocks_.push_back({std::vector<Sides>(atoms_)});
    Block& block = blocks_.back();
    const auto mark = [bit](Mask& mask) { mask[bit / 64] |= std::uint64_t{1} << bit % 64; };
    for (Atom atom = 0; atom < atoms_; ++atom) {
        Sides& sides = block.sides[atom];
        const IntegerSet* const set = box.find(atom);
        if (set == nullptr) {
            mark(sides.free);
            continue;
        }
        for (const auto& [low, high] : set->intervals()) {
            const std::size_t begin = sides.cutAt(low);
            const std::size_t end = high == IntegerSet::plusInfinity ? sides.cuts.size() : sides.cutAt(high + 1);
            for (std::size_t i = begin; i < end; ++i)
                mark(sides.holding[i]);
        }
        hulls_[atom] = hullOf(hulls_[atom], *set);
    }
    mark(block.all);
    boxes_.push_back(box);
}

/// A box that a point is in, or nullptr; `first` is the atom that is looked at first.
const Cube* BoxUnion::holderOf(const BoxPoint& point, Atom first, std::span<const Cube> further,
                               std::uint64_t& steps) const {
    for (const Cube& box : further)
        if (contains(box, point))
            return &box;
    std::uint64_t looks = BoxSearch::looksPerStep;
    const Cube* found = nullptr;
    for (std::size_t i = 0; i < blocks_.size() && found == nullptr; ++i) {
        Mask mask = blocks_[i].all;
        bool isLeft = true;
        for (Atom next = 0; next < atoms_ && isLeft; ++next, ++looks) {
            const Atom atom = next == 0 ? first : next == first ? 0 : next;
            const Sides& sides = blocks_[i].sides[atom];
            isLeft = keep(mask, sides.at(point[atom]), sides.free);
        }
        if (isLeft)
            found = &boxes_[i * blockBoxes + firstOf(mask)];
    }
    take(steps, looks / BoxSearch::looksPerStep);
    return found;
}

/// A box that covers a region.
std::optional<std::uint32_t> BoxUnion::whole(const Cube& region, std::uint64_t& steps) const {
    std::uint64_t looks = BoxSearch::looksPerStep;
    std::optional<std::uint32_t> found;
    for (std::size_t i = 0; i < blocks_.size() && !found; ++i) {
        Mask mask = blocks_[i].all;
        bool isLeft = true;
        auto side = region.constraints().begin();
        for (Atom atom = 0; atom < atoms_ && isLeft; ++atom, ++looks) {
            const Sides& sides = blocks_[i].sides[atom];
            if (side == region.constraints().end() || side->atom != atom) {
                isLeft = keep(mask, sides.free, sides.free);
                continue;
            }
            for (const auto& [low, high] : side->set.intervals()) {
                for (auto at = std::ranges::upper_bound(sides.cuts, low) - 1;
                     at != sides.cuts.end() && *at <= high && isLeft; ++at, ++looks)
                    isLeft = keep(mask, sides.holding[static_cast<std::size_t>(at - sides.cuts.begin())], sides.free);
            }
            ++side;
        }
        if (isLeft)
            found = static_cast<std::uint32_t>(i * blockBoxes + firstOf(mask));
    }
    take(steps, looks / BoxSearch::looksPerStep);
    return found;
}

/// The boxes that meet a part, but for those with a side of an atom that is to be left.
std::vector<std::uint32_t> BoxUnion::meeting(const BoxPart& part, const std::vector<bool>& isLeft,
                                             std::uint64_t& steps) const {
    std::vector<std::uint32_t> result;
    std::uint64_t looks = BoxSearch::looksPerStep;
    for (std::size_t i = 0; i < blocks_.size(); ++i) {
        Mask mask = blocks_[i].all;
        for (Atom atom = 0; atom < atoms_; ++atom, ++looks) {
            const Sides& sides = blocks_[i].sides[atom];
            if (isLeft[atom]) {
                keep(mask, sides.free, sides.free);
                continue;
            }
            if (part[atom].isAll())
                continue;
            Mask some = sides.free;
            for (const auto& [low, high] : part[atom].intervals()) {
                for (auto at = std::ranges::upper_bound(sides.cuts, low) - 1; at != sides.cuts.end() && *at <= high;
                     ++at, ++looks)
                    for (std::size_t word = 0; word < some.size(); ++word)
                        some[word] |= sides.holding[static_cast<std::size_t>(at - sides.cuts.begin())][word];
            }
            keep(mask, some, some);
        }
        for (std::size_t word = 0; word < mask.size(); ++word) {
            for (std::uint64_t bits = mask[word]; bits != 0; bits &= bits - 1)
                result.push_back(static_cast<std::uint32_t>(i * blockBoxes + word * 64 +
                                                            static_cast<std::size_t>(std::countr_zero(bits))));
        }
    }
    take(steps, looks / BoxSearch::looksPerStep + result.size());
    return result;
}

void BoxUnion::remember(const BoxPoint& point) {
    std::erase(recent_, point);
    if (recent_.size() == limits::recentPoints)
        recent_.erase(recent_.begin());
    recent_.push_back(point);
}

BoxGap BoxUnion::gap(const Cube& region, std::span<const Cube> further, std::uint64_t& steps) {
    const Atom first = narrowest(region);
    std::vector<BoxPoint> guesses{BoxPoint(atoms_, 0)};
    guesses.insert(guesses.end(), recent_.rbegin(), recent_.rend());
    guesses.emplace_back(atoms_, IntegerSet::minusInfinity);
    guesses.emplace_back(atoms_, IntegerSet::plusInfinity);
    for (std::size_t guess = 0; guess < guesses.size(); ++guess) {
        BoxPoint point = nearest(region, std::move(guesses[guess]));
        const bool isCorner = guess + 2 >= guesses.size();
        for (std::size_t turn = 0; turn < (isCorner ? limits::boxMoves : 1); ++turn) {
            if (steps == 0)
                return {};
            const Cube* const holder = holderOf(point, first, further, steps);
            if (holder == nullptr) {
                remember(point);
                return {Answer::Yes, std::move(point)};
            }
            if (isCorner && !leave(*holder, region, turn, point))
                break;
        }
        if (guess > 0)
            continue;
        if (const auto cover = whole(region, steps))
            return {Answer::No, {}, {*cover}};
    }
    for (std::uint64_t turn = 0; turn < limits::boxCorners && steps > 0; ++turn) {
        BoxPoint point = cornerOf(region, atoms_, turn);
        if (holderOf(point, first, further, steps) == nullptr)
            return {Answer::Yes, std::move(point)};
    }
    BoxGap found = search(region, further, steps);
    if (found.answer == Answer::Yes)
        remember(found.point);
    return found;
}

BoxGap BoxUnion::search(const Cube& region, std::span<const Cube> further, std::uint64_t& steps) const {
    BoxPart part(atoms_, IntegerSet::all());
    for (const Constraint& side : region.constraints())
        part[side.atom] = side.set;
    std::vector<IntegerSet> hulls = hulls_;
    for (const Cube& box : further)
        for (const Constraint& side : box.constraints())
            hulls[side.atom] = hullOf(hulls[side.atom], side.set);
    std::vector<bool> isLeft(atoms_, false);
    for (Atom atom = 0; atom < atoms_; ++atom) {
        if (hulls[atom].empty())
            continue;
        IntegerSet beyond = part[atom].minus(hulls[atom]);
        isLeft[atom] = !beyond.empty();
        if (isLeft[atom])
            part[atom] = std::move(beyond);
    }
    std::vector<std::uint32_t> positions = meeting(part, isLeft, steps);
    const bool areFew = positions.size() <= limits::boxesAtOnce;
    if (!areFew)
        positions.clear();
    std::vector<const Cube*> boxes;
    for (const Cube& box : further)
        boxes.push_back(&box);
    for (const std::uint32_t position : positions)
        boxes.push_back(&boxes_[position]);
    BoxGap gap;
    for (;;) {
        BoxSearch search(part, boxes);
        gap.answer = search.run(steps);
        for (const std::uint32_t box : search.covering())
            if (box >= further.size())
                gap.covering.push_back(positions[box - further.size()]);
        if (gap.answer != Answer::Yes)
            break;
        // Of many boxes those are added that hold what the others leave.
        const std::size_t before = positions.size();
        for (const std::int64_t aim : {std::int64_t{0}, IntegerSet::minusInfinity, IntegerSet::plusInfinity}) {
            gap.point.clear();
            for (const IntegerSet& values : search.part())
                gap.point.push_back(nearestIn(values, aim));
            const Cube* const holder = areFew ? nullptr : holderOf(gap.point, narrowest(region), {}, steps);
            if (holder == nullptr)
                return gap;
            const auto position = static_cast<std::uint32_t>(holder - boxes_.data());
            if (std::find(positions.begin() + static_cast<std::ptrdiff_t>(before), positions.end(), position) ==
                positions.end()) {
                positions.push_back(position);
                boxes.push_back(holder);
            }
        }
    }
    return gap;
}

} // namespace VT
