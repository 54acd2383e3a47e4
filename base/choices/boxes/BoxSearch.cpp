// Finds values that boxes leave out, or proves that there are none.
//
// Method: depth first over parts of the region, each with the boxes that meet it.  A box with one side that cuts the
// part leaves only what is beyond that side; values of an atom that no such side has are as good as any, and take away
// all boxes with such sides (unit and pure literals of a clause search).  Otherwise the part is split along a box with
// the fewest such sides (the decomposition of Chan, "Klee's measure problem made easy", 2013, without its weights).
// The boxes that closed a part are remembered; together they cover the region.
// Cost: exponential in the atoms at worst, bounded by steps; a part costs the sides of the boxes that meet it.
#include "base/choices/boxes/BoxSearch.hpp"

#include "base/core/Limits.hpp"

#include <algorithm>
#include <numeric>

namespace VT {

BoxSearch::BoxSearch(BoxPart region, std::span<const Cube* const> boxes)
    : part_(std::move(region)),
      boxes_(boxes),
      lows_(part_.size()),
      highs_(part_.size()),
      isUsed_(boxes.size(), false) {}

bool BoxSearch::meets(const Cube& box) const {
    return std::ranges::all_of(box.constraints(),
                               [&](const Constraint& side) { return side.set.intersects(part_[side.atom]); });
}

/// Narrows the part; false where nothing is left of it.
bool BoxSearch::narrow(Atom atom, IntegerSet values) {
    trail_.emplace_back(atom, std::move(part_[atom]));
    part_[atom] = std::move(values);
    return !part_[atom].empty();
}

void BoxSearch::undo(std::size_t length) {
    for (; trail_.size() > length; trail_.pop_back())
        part_[trail_.back().first] = std::move(trail_.back().second);
}

/// Looks at all boxes that meet the part, and leaves those that one side alone keeps from covering it.
BoxSearch::Outcome BoxSearch::look(std::size_t begin, bool& isNarrowed) {
    std::ranges::fill(lows_, IntegerSet::plusInfinity);
    std::ranges::fill(highs_, IntegerSet::minusInfinity);
    std::size_t fewest = 0;
    std::size_t looks = part_.size();
    for (std::size_t i = begin; i < meeting_.size(); ++i) {
        const Cube& box = *boxes_[meeting_[i]];
        std::size_t cutting = 0;
        const Constraint* last = nullptr;
        for (const Constraint& side : box.constraints()) {
            if (part_[side.atom].isSubsetOf(side.set))
                continue;
            ++cutting;
            last = &side;
            lows_[side.atom] = std::min(lows_[side.atom], side.set.low());
            highs_[side.atom] = std::max(highs_[side.atom], side.set.high());
        }
        looks += box.constraints().size();
        if (cutting == 1 && !part_[last->atom].intersects(last->set)) {
            isNarrowed = true; // it does not meet what is left
        } else if (cutting < 2) {
            isUsed_[meeting_[i]] = true;
            if (cutting == 0 || !narrow(last->atom, part_[last->atom].minus(last->set)))
                return Outcome::Covered;
            isNarrowed = true;
        } else if (fewest == 0 || cutting < fewest) {
            fewest = cutting;
            best_ = meeting_[i];
        }
    }
    take(looks);
    return Outcome::Open;
}

/// Narrows the part to values beyond all sides that cut it.
bool BoxSearch::leaveHulls() {
    bool isNarrowed = false;
    for (Atom atom = 0; atom < part_.size(); ++atom) {
        if (lows_[atom] > highs_[atom])
            continue;
        IntegerSet beyond = part_[atom].minus(IntegerSet(lows_[atom], highs_[atom]));
        isNarrowed = (!beyond.empty() && narrow(atom, std::move(beyond))) || isNarrowed;
    }
    return isNarrowed;
}

/// Narrows the part to values between the sides that cut it.
bool BoxSearch::leaveSides(std::size_t begin) {
    std::vector<std::vector<IntegerSet::Interval>> sides(part_.size());
    std::size_t looks = part_.size();
    for (std::size_t i = begin; i < meeting_.size(); ++i) {
        for (const Constraint& side : boxes_[meeting_[i]]->constraints()) {
            if (!part_[side.atom].isSubsetOf(side.set))
                sides[side.atom].insert(sides[side.atom].end(), side.set.intervals().begin(),
                                        side.set.intervals().end());
        }
        looks += 2 * boxes_[meeting_[i]]->constraints().size();
    }
    take(looks);
    bool isNarrowed = false;
    for (Atom atom = 0; atom < part_.size(); ++atom) {
        if (sides[atom].empty())
            continue;
        IntegerSet between = part_[atom].minus(IntegerSet::of(std::move(sides[atom])));
        isNarrowed = (!between.empty() && narrow(atom, std::move(between))) || isNarrowed;
    }
    return isNarrowed;
}

/// Settles a part, or splits it.
BoxSearch::Outcome BoxSearch::enter(std::size_t begin) {
    for (;;) {
        if (begin == meeting_.size())
            return Outcome::Free;
        if (left_ == 0)
            return Outcome::Open;
        bool isNarrowed = false;
        if (look(begin, isNarrowed) == Outcome::Covered)
            return Outcome::Covered;
        isNarrowed = leaveHulls() || isNarrowed;
        if (!isNarrowed && !leaveSides(begin))
            break;
        const auto first = meeting_.begin() + static_cast<std::ptrdiff_t>(begin);
        meeting_.erase(std::remove_if(first, meeting_.end(), [&](std::uint32_t box) { return !meets(*boxes_[box]); }),
                       meeting_.end());
    }
    split(begin);
    return Outcome::Open;
}

void BoxSearch::split(std::size_t begin) {
    isUsed_[best_] = true;
    Split split{begin, meeting_.size(), trail_.size(), boxes_[best_], {}};
    for (const Constraint& side : split.box->constraints())
        if (!part_[side.atom].isSubsetOf(side.set))
            split.sides.push_back(side.atom);
    open_.push_back(std::move(split));
}

/// Goes to the next piece of the latest split: beyond one side, and within those before it.
bool BoxSearch::nextPiece() {
    Split& top = open_.back();
    undo(top.trail);
    if (top.next == top.sides.size())
        return false;
    for (std::size_t i = 0; i < top.next; ++i)
        narrow(top.sides[i], part_[top.sides[i]].intersect(*top.box->find(top.sides[i])));
    const Atom atom = top.sides[top.next++];
    narrow(atom, part_[atom].minus(*top.box->find(atom)));
    return true;
}

Answer BoxSearch::run(std::uint64_t& steps) {
    left_ = steps;
    meeting_.resize(boxes_.size());
    std::iota(meeting_.begin(), meeting_.end(), 0U);
    std::erase_if(meeting_, [&](std::uint32_t box) { return !meets(*boxes_[box]); });
    take(boxes_.size());
    Outcome outcome = enter(0);
    while (outcome != Outcome::Free && left_ > 0 && !open_.empty()) {
        const std::size_t begin = open_.back().begin;
        const std::size_t end = open_.back().end;
        meeting_.resize(end); // those of the piece before go
        if (!nextPiece()) {
            open_.pop_back();
            outcome = Outcome::Covered;
            continue;
        }
        for (std::size_t i = begin; i < end; ++i)
            if (meets(*boxes_[meeting_[i]]))
                meeting_.push_back(meeting_[i]);
        take(end - begin);
        outcome = enter(end);
    }
    steps = left_;
    if (outcome == Outcome::Free)
        return Answer::Yes;
    if (outcome == Outcome::Open || !open_.empty())
        return Answer::Undecided;
    for (std::uint32_t box = 0; box < isUsed_.size(); ++box)
        if (isUsed_[box])
            covering_.push_back(box);
    return Answer::No;
}

} // namespace VT
