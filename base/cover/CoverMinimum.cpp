// Finds a smallest cover and proves it.
//
// Method: two-level minimisation over integer intervals.  The points that differ for the cover form a grid.  All prime
// boxes in it are listed, and a branch-and-bound set cover picks among them: boxes that alone hold a point are taken,
// boxes that another one makes needless are dropped, and where neither helps, the boxes of one point are tried in turn
// (Coudert, "Two-level logic minimization: an overview", 1994).  A cover in which the sets of each atom are nested is
// smallest without a search: its cubes are prime, and each has a point of its own.
// Cost: exponential in the number of atoms, within limits::coverPoints, limits::coverBoxes and the budget.
// Relies on: CoverGrid, PrimeBoxes; a set costs IntegerSet::comparisons().
#include "base/core/Check.hpp"
#include "base/core/Limits.hpp"
#include "base/cover/PrimeBoxes.hpp"

#include <algorithm>
#include <limits>

namespace VT {

namespace {

/// What a cover costs: comparisons weigh most, cubes decide between equal ones.
using Cost = std::uint64_t;

Cost costOf(std::size_t comparisons, std::size_t cubes = 1) {
    return (Cost{comparisons} << 32U) + cubes;
}

/// Picks boxes that hold all points between them, at the lowest cost.
class SetCover {
public:
    using Points = boost::container::small_vector<Word, 16>;
    using Boxes = boost::container::small_vector<std::uint16_t, 32>;

    SetCover(const Grid& grid, const PrimeBoxes::Boxes& boxes, CoverBudget& budget)
        : words_(grid.words()),
          boxes_(boxes),
          budget_(budget),
          sets_(boxes.size() * words_, 0) {
        for (std::size_t i = 0; i < boxes.size(); ++i)
            grid.points(boxes[i], &sets_[i * words_]);
    }

    /// Finds a cover that costs less than `bound`; whether there is one.  Nothing is proven where the budget is
    /// exhausted.
    bool find(const Points& points, Cost bound) {
        bound_ = bound;
        Boxes candidates;
        for (std::size_t i = 0; i < boxes_.size(); ++i)
            candidates.push_back(static_cast<std::uint16_t>(i));
        search(points, candidates, 0);
        return bound_ < bound;
    }

    [[nodiscard]] const Boxes& best() const noexcept { return best_; }

private:
    /// The points in at least one, two and three boxes.
    struct Counts {
        Points once, twice, thrice;
    };

    void search(Points open, Boxes candidates, Cost cost);
    bool branchPoint(const Points& open, const Counts& counts, std::size_t& word, Word& point) const;
    [[nodiscard]] Counts count(const Points& open, const Boxes& candidates) const;
    bool takeEssential(Points& open, const Counts& counts, Boxes& candidates, Cost& cost);
    bool dropDominated(const Points& open, Boxes& candidates) const;
    void dropEmpty(const Points& open, Boxes& candidates) const;
    [[nodiscard]] bool isDominated(std::uint16_t box, std::uint16_t by, const Points& open) const;

    [[nodiscard]] const Word* set(std::uint16_t box) const { return &sets_[box * words_]; }

    [[nodiscard]] bool meets(std::uint16_t box, const Points& points) const {
        for (std::size_t i = 0; i < words_; ++i)
            if ((set(box)[i] & points[i]) != 0)
                return true;
        return false;
    }

    void take(std::uint16_t box, Points& open) const {
        for (std::size_t i = 0; i < words_; ++i)
            open[i] &= ~set(box)[i];
    }

    [[nodiscard]] Cost cost(std::uint16_t box) const { return costOf(boxes_[box].comparisons); }

    std::size_t words_;
    const PrimeBoxes::Boxes& boxes_;
    CoverBudget& budget_;
    boost::container::small_vector<Word, 128> sets_; ///< the points of each box
    Boxes chosen_, best_;
    Cost bound_ = 0;
};

SetCover::Counts SetCover::count(const Points& open, const Boxes& candidates) const {
    Counts counts{Points(words_, 0), Points(words_, 0), Points(words_, 0)};
    for (const std::uint16_t box : candidates) {
        for (std::size_t i = 0; i < words_; ++i) {
            const Word held = set(box)[i] & open[i];
            counts.thrice[i] |= counts.twice[i] & held;
            counts.twice[i] |= counts.once[i] & held;
            counts.once[i] |= held;
        }
    }
    return counts;
}

/// Takes the boxes that alone hold some point.
bool SetCover::takeEssential(Points& open, const Counts& counts, Boxes& candidates, Cost& cost) {
    Points alone(words_, 0);
    for (std::size_t i = 0; i < words_; ++i)
        alone[i] = counts.once[i] & ~counts.twice[i];
    bool any = false;
    for (const std::uint16_t box : candidates) {
        if (!meets(box, alone))
            continue;
        any = true;
        chosen_.push_back(box);
        cost += this->cost(box);
        take(box, open);
    }
    if (any)
        dropEmpty(open, candidates);
    return any;
}

void SetCover::dropEmpty(const Points& open, Boxes& candidates) const {
    candidates.erase(
        std::remove_if(candidates.begin(), candidates.end(), [&](std::uint16_t box) { return !meets(box, open); }),
        candidates.end());
}

bool SetCover::isDominated(std::uint16_t box, std::uint16_t by, const Points& open) const {
    if (box == by || cost(by) > cost(box))
        return false;
    bool isEqual = cost(by) == cost(box);
    for (std::size_t i = 0; i < words_; ++i) {
        const Word own = set(box)[i] & open[i];
        const Word other = set(by)[i] & open[i];
        if ((own & ~other) != 0)
            return false;
        isEqual = isEqual && own == other;
    }
    return !isEqual || by < box; // of equal ones the first stays
}

bool SetCover::dropDominated(const Points& open, Boxes& candidates) const {
    Boxes kept;
    for (const std::uint16_t box : candidates)
        if (std::ranges::none_of(candidates, [&](std::uint16_t by) { return isDominated(box, by, open); }))
            kept.push_back(box);
    const bool any = kept.size() < candidates.size();
    candidates = std::move(kept);
    return any;
}

/// A point that few boxes hold.
bool SetCover::branchPoint(const Points& open, const Counts& counts, std::size_t& word, Word& point) const {
    for (const bool inTwo : {true, false}) {
        for (word = 0; word < words_; ++word) {
            const Word among = inTwo ? counts.twice[word] & ~counts.thrice[word] : open[word];
            point = among & (~among + 1);
            if (point != 0)
                return true;
        }
    }
    return false;
}

// NOLINTNEXTLINE(misc-no-recursion): as deep as there are boxes
void SetCover::search(Points open, Boxes candidates, Cost cost) {
    const std::size_t depth = chosen_.size();
    std::size_t word = 0;
    Word point = 0;
    while (cost < bound_ && budget_.spend(candidates.size() * words_)) {
        const Counts counts = count(open, candidates);
        if (!std::equal(open.begin(), open.end(), counts.once.begin()))
            break; // a point is in no box that is left
        if (takeEssential(open, counts, candidates, cost))
            continue;
        if (!budget_.spend(candidates.size() * candidates.size()) || dropDominated(open, candidates))
            continue;
        if (!branchPoint(open, counts, word, point)) {
            bound_ = cost;
            best_ = chosen_;
            break;
        }
        Boxes holding;
        for (const std::uint16_t box : candidates)
            if ((set(box)[word] & point) != 0)
                holding.push_back(box);
        for (const std::uint16_t box : holding) {
            // A box that was tried is not tried again with the others.
            candidates.erase(std::remove(candidates.begin(), candidates.end(), box), candidates.end());
            Points rest = open;
            take(box, rest);
            Boxes others = candidates;
            dropEmpty(rest, others);
            chosen_.push_back(box);
            search(std::move(rest), std::move(others), cost + this->cost(box));
            chosen_.pop_back();
        }
        break;
    }
    chosen_.resize(depth);
}

/// Sets that one atom is restricted to, in the order in which they were met.
struct AtomSets {
    Atom atom;
    boost::container::small_vector<const IntegerSet*, 4> sets;

    /// Whether the sets stay nested with one more.
    bool nests(const IntegerSet& set) {
        for (const IntegerSet* other : sets) {
            if (*other == set)
                return true;
            // Points of a range may be cheaper than the range where a part of it is taken.
            const bool isCheap = other->comparisons() == 1 && set.comparisons() == 1;
            if (!isCheap || !(set.isSubsetOf(*other) || other->isSubsetOf(set)))
                return false;
        }
        sets.push_back(&set);
        return set.intervals().size() == 1 || set.comparisons() == 1;
    }
};

/// Whether the sets of each atom are nested: a cover in which no cube contains another is then smallest.
bool isNested(const Cover& cover) {
    boost::container::small_vector<AtomSets, 8> atoms;
    for (const Cube& cube : cover) {
        for (const Constraint& constraint : cube.constraints()) {
            auto at = std::ranges::find(atoms, constraint.atom, &AtomSets::atom);
            if (at == atoms.end()) {
                if (atoms.size() == limits::nestedAtoms)
                    return false;
                at = atoms.insert(at, {constraint.atom, {}});
            }
            if (!at->nests(constraint.set))
                return false;
        }
    }
    return true;
}

/// Whether a product is smallest without a search.  Several products in its place restrict each of its atoms at least
/// twice between them.
bool isSmallest(const Cube& cube) {
    return std::ranges::all_of(cube.constraints(), [](const Constraint& c) { return c.set.comparisons() <= 2; });
}

} // namespace

bool minimize(Cover& cover, CoverBudget& budget, Ranges ranges) {
    if (cover.empty() || isNested(cover) || (cover.size() == 1 && isSmallest(cover.front())))
        return true;
    if (cover.size() == 1 && ranges == Ranges::NotOfPoints)
        return false;
    Grid grid;
    if (!grid.read(cover))
        return false;
    PrimeBoxes primes(grid, budget, ranges == Ranges::NotOfPoints);
    if (!primes.list(static_cast<std::uint32_t>(comparisons(cover))))
        return false;
    SetCover::Points points(grid.words(), 0);
    grid.points(points.data());
    SetCover search(grid, primes.boxes(), budget);
    const bool isFound = search.find(points, costOf(comparisons(cover), 0));
    if (budget.exhausted())
        return false;
    if (isFound) {
        Cover smaller;
        SetCover::Points held(grid.words(), 0);
        for (const std::uint16_t box : search.best()) {
            smaller.push_back(grid.cubeOf(primes.boxes()[box]));
            grid.points(primes.boxes()[box], held.data());
        }
        VTSYM_CHECK(held == points);
        cover = std::move(smaller);
    }
    return true;
}

} // namespace VT
