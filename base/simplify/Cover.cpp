#include "base/simplify/Cover.hpp"

#include "base/core/Hash.hpp"

#include <boost/unordered_map.hpp>

#include <algorithm>
#include <map>
#include <numeric>

namespace VT {

std::size_t hash_value(const Constraint& constraint) noexcept {
    std::uint64_t hash = constraint.atom;
    for (const IntegerSet::Interval& interval : constraint.set.intervals()) {
        hash = hashStep(hash, static_cast<std::uint64_t>(interval.low));
        hash = hashStep(hash, static_cast<std::uint64_t>(interval.high));
    }
    return hash;
}

// Cubes.

namespace {

auto position(auto& constraints, Atom atom) {
    return std::ranges::lower_bound(constraints, atom, {}, &Constraint::atom);
}

} // namespace

const IntegerSet* Cube::find(Atom atom) const noexcept {
    const auto at = position(constraints_, atom);
    return at != constraints_.end() && at->atom == atom ? &at->set : nullptr;
}

bool Cube::restrict(Atom atom, const IntegerSet& set) {
    const auto at = position(constraints_, atom);
    if (at == constraints_.end() || at->atom != atom) {
        if (!set.isAll())
            constraints_.insert(at, {atom, set});
        return !set.empty();
    }
    at->set = at->set.intersect(set);
    return !at->set.empty();
}

bool Cube::restrict(const Cube& other) {
    return std::ranges::all_of(other.constraints_, [this](const Constraint& c) { return restrict(c.atom, c.set); });
}

void Cube::assign(Atom atom, const IntegerSet& set) {
    const auto at = position(constraints_, atom);
    const bool present = at != constraints_.end() && at->atom == atom;
    if (set.isAll()) {
        if (present)
            constraints_.erase(at);
    } else if (present) {
        at->set = set;
    } else {
        constraints_.insert(at, {atom, set});
    }
}

bool Cube::isSubsetOf(const Cube& other) const noexcept {
    if (other.constraints_.size() > constraints_.size())
        return false;
    return std::ranges::all_of(other.constraints_, [this](const Constraint& c) {
        const IntegerSet* mine = find(c.atom);
        return mine != nullptr && mine->isSubsetOf(c.set);
    });
}

bool Cube::intersects(const Cube& other) const noexcept {
    return std::ranges::all_of(other.constraints_, [this](const Constraint& c) {
        const IntegerSet* mine = find(c.atom);
        return mine == nullptr || mine->intersects(c.set);
    });
}

std::size_t Cube::comparisons() const noexcept {
    return std::accumulate(constraints_.begin(), constraints_.end(), std::size_t{0},
                           [](std::size_t sum, const Constraint& c) { return sum + c.set.comparisons(); });
}

std::size_t comparisons(const Cover& cover) noexcept {
    return std::accumulate(cover.begin(), cover.end(), std::size_t{0},
                           [](std::size_t sum, const Cube& cube) { return sum + cube.comparisons(); });
}

// Sets.

namespace {

using Interval = IntegerSet::Interval;

/// An interval of a union, with what it takes to write it and whether it was made of points alone.
struct Piece {
    Interval interval;
    bool points;

    [[nodiscard]] std::size_t comparisons() const {
        const IntegerSet set(interval.low, interval.high);
        return points ? static_cast<std::size_t>(interval.high - interval.low) + 1 : set.comparisons();
    }
};

std::vector<Piece> pieces(const std::vector<IntegerSet>& sets) {
    std::vector<Interval> all;
    std::vector<Interval> wide; // what is more than a point
    for (const IntegerSet& set : sets) {
        all.insert(all.end(), set.intervals().begin(), set.intervals().end());
        for (const Interval& interval : set.intervals())
            if (interval.low != interval.high || set.intervals().size() > 1)
                wide.push_back(interval);
    }
    std::ranges::sort(wide);
    std::vector<Piece> result;
    auto next = wide.begin();
    const IntegerSet whole = IntegerSet::of(std::move(all));
    for (const Interval& interval : whole.intervals()) {
        while (next != wide.end() && next->low < interval.low)
            ++next;
        const bool points = next == wide.end() || next->low > interval.high;
        result.push_back({interval, points});
    }
    return result;
}

void appendPiece(const Piece& piece, std::vector<IntegerSet>& out) {
    if (!piece.points) {
        out.emplace_back(piece.interval.low, piece.interval.high);
        return;
    }
    for (std::int64_t value = piece.interval.low; value <= piece.interval.high; ++value)
        out.push_back(IntegerSet::point(value));
}

} // namespace

std::vector<IntegerSet> joinSets(const std::vector<IntegerSet>& sets) {
    const std::vector<Piece> parts = pieces(sets);
    std::vector<IntegerSet> result;
    for (std::size_t first = 0; first < parts.size();) {
        // A run of pieces with single points missing between them may be shorter as one product.
        std::size_t end = first + 1;
        while (end < parts.size() && parts[end].interval.low - parts[end - 1].interval.high == 2)
            ++end;
        std::size_t separate = 0;
        bool points = true;
        std::vector<Interval> run;
        for (std::size_t i = first; i < end; ++i) {
            separate += parts[i].comparisons();
            points = points && parts[i].points;
            run.push_back(parts[i].interval);
        }
        IntegerSet joined = IntegerSet::of(run);
        if (end - first > 1 && !points && joined.comparisons() < separate)
            result.push_back(std::move(joined));
        else
            for (std::size_t i = first; i < end; ++i)
                appendPiece(parts[i], result);
        first = end;
    }
    return result;
}

Cover complement(const Cube& cube) {
    Cover result;
    for (const Constraint& constraint : cube.constraints()) {
        for (const IntegerSet& set : joinSets({constraint.set.complement()})) {
            result.emplace_back();
            result.back().assign(constraint.atom, set);
        }
    }
    return result;
}

Cover product(const Cover& a, const Cover& b) {
    Cover result;
    for (const Cube& x : a) {
        for (const Cube& y : b) {
            Cube both = x;
            if (both.restrict(y))
                result.push_back(std::move(both));
        }
    }
    return result;
}

// Making covers smaller.

namespace {

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

void eraseMarked(Cover& cover, const std::vector<bool>& marked) {
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

} // namespace

bool absorb(Cover& cover) {
    const auto always = std::ranges::find_if(cover, &Cube::alwaysHolds);
    if (always != cover.end()) {
        const bool smaller = cover.size() > 1;
        cover.assign(1, Cube());
        return smaller;
    }
    const Occurrences occurrences(cover);
    std::vector<bool> absorbed(cover.size(), false);
    bool any = false;
    for (std::size_t i = 0; i < cover.size(); ++i) {
        if (absorbed[i])
            continue;
        for (const std::size_t j : occurrences.candidatesBelow(cover[i])) {
            if (j != i && !absorbed[j] && cover[j].isSubsetOf(cover[i]))
                any = absorbed[j] = true;
        }
    }
    if (any)
        eraseMarked(cover, absorbed);
    return any;
}

namespace {

/// The sum of a cube's hashes, from which the hash of the cube without one constraint is a subtraction.
std::uint64_t hashOf(const Cube& cube) {
    std::uint64_t sum = 0;
    for (const Constraint& constraint : cube.constraints())
        sum += hash_value(constraint);
    return sum;
}

/// Joins the cubes of a group, which are equal but for one atom.  Tells whether they became fewer or shorter.
bool joinGroup(Cover& cover, const std::vector<std::size_t>& group, Atom atom, std::vector<bool>& gone,
               std::vector<std::uint64_t>& hashes) {
    std::vector<IntegerSet> sets;
    std::size_t comparisonsBefore = 0;
    for (const std::size_t i : group) {
        sets.push_back(*cover[i].find(atom));
        comparisonsBefore += cover[i].comparisons();
    }
    const std::vector<IntegerSet> joined = joinSets(sets);
    if (joined.size() > sets.size())
        return false;
    std::vector<Cube> cubes;
    std::size_t comparisonsAfter = 0;
    for (const IntegerSet& set : joined) {
        cubes.push_back(cover[group.front()]);
        cubes.back().assign(atom, set);
        comparisonsAfter += cubes.back().comparisons();
    }
    if (joined.size() == sets.size() && comparisonsAfter >= comparisonsBefore)
        return false;
    for (std::size_t i = 0; i < group.size(); ++i) {
        if (i < cubes.size()) {
            cover[group[i]] = std::move(cubes[i]);
            hashes[group[i]] = hashOf(cover[group[i]]);
        } else {
            gone[group[i]] = true;
        }
    }
    return true;
}

bool equalButFor(const Cube& a, const Cube& b, Atom atom) {
    return std::ranges::equal(a.constraints(), b.constraints(), [atom](const Constraint& x, const Constraint& y) {
        return x.atom == y.atom && (x.atom == atom || x.set == y.set);
    });
}

/// Of the cubes that restrict an atom, those that say the same but for it, in groups of two and more.
std::vector<std::vector<std::size_t>> groupsButFor(const Cover& cover, Atom atom,
                                                   const std::vector<std::size_t>& members,
                                                   const std::vector<bool>& gone,
                                                   const std::vector<std::uint64_t>& hashes) {
    std::vector<std::vector<std::size_t>> groups;
    boost::unordered_map<std::uint64_t, std::size_t> byHash;
    for (const std::size_t i : members) {
        const IntegerSet* set = gone[i] ? nullptr : cover[i].find(atom);
        if (set == nullptr)
            continue;
        const auto [at, added] = byHash.try_emplace(hashes[i] - hash_value(Constraint{atom, *set}), groups.size());
        if (added)
            groups.emplace_back();
        std::vector<std::size_t>& group = groups[at->second];
        if (group.empty() || equalButFor(cover[group.front()], cover[i], atom))
            group.push_back(i);
    }
    std::erase_if(groups, [](const auto& group) { return group.size() < 2; });
    return groups;
}

} // namespace

bool joinCubes(Cover& cover) {
    if (cover.size() < 2)
        return false;
    const Occurrences occurrences(cover);
    std::vector<bool> gone(cover.size(), false);
    std::vector<std::uint64_t> hashes;
    for (const Cube& cube : cover)
        hashes.push_back(hashOf(cube));
    bool any = false;
    for (Atom atom = 0; atom < occurrences.atoms(); ++atom) {
        if (occurrences.of(atom).size() < 2)
            continue;
        for (const std::vector<std::size_t>& group : groupsButFor(cover, atom, occurrences.of(atom), gone, hashes))
            any = joinGroup(cover, group, atom, gone, hashes) || any;
    }
    if (any)
        eraseMarked(cover, gone);
    return any;
}

namespace {

/// The search for whether cubes cover a cube.  Splits the cube until one of them covers a part alone.
class CoverSearch {
public:
    CoverSearch(const Cover& cover, CoverBudget& budget)
        : cover_(cover),
          occurrences_(cover),
          gone_(cover.size(), false),
          budget_(budget) {
        for (Atom atom = 0; atom < occurrences_.atoms(); ++atom)
            spanned_.push_back(spans(atom));
        for (std::size_t i = 0; i < cover.size(); ++i)
            if (std::ranges::all_of(cover[i].constraints(), [this](const Constraint& c) { return spanned_[c.atom]; }))
                everywhere_.push_back(i);
    }

    /// Whether the cubes but for one cover a cube.
    bool covers(const Cube& cube, std::size_t skip) { return search(cube, candidates(cube, skip), 0); }

    /// Leaves a cube out of further searches.
    void remove(std::size_t index) { gone_[index] = true; }

private:
    static constexpr std::size_t depthBound = 200;

    /// What candidates say about each atom within a cube: the union of their sets there.
    using Reach = std::map<Atom, std::vector<IntegerSet::Interval>>;

    /// Whether the cubes that restrict an atom leave none of its values out.
    bool spans(Atom atom) const {
        std::vector<Interval> intervals;
        for (const std::size_t i : occurrences_.of(atom)) {
            const IntegerSet& set = *cover_[i].find(atom);
            intervals.insert(intervals.end(), set.intervals().begin(), set.intervals().end());
        }
        return IntegerSet::of(std::move(intervals)).isAll();
    }

    /// The cubes that may help: a cube that restricts an atom of which some value is out of reach helps only where the
    /// atom is restricted already.
    std::vector<const Cube*> candidates(const Cube& cube, std::size_t skip) const {
        std::vector<std::size_t> indices = everywhere_;
        for (const Constraint& c : cube.constraints())
            if (c.atom < occurrences_.atoms())
                indices.insert(indices.end(), occurrences_.of(c.atom).begin(), occurrences_.of(c.atom).end());
        std::ranges::sort(indices);
        indices.erase(std::ranges::unique(indices).begin(), indices.end());
        std::vector<const Cube*> result;
        for (const std::size_t i : indices) {
            const bool helps = std::ranges::all_of(cover_[i].constraints(), [&](const Constraint& c) {
                return spanned_[c.atom] || cube.find(c.atom) != nullptr;
            });
            if (i != skip && !gone_[i] && helps)
                result.push_back(&cover_[i]);
        }
        return result;
    }

    bool search(const Cube& cube, const std::vector<const Cube*>& cubes, std::size_t depth) {
        std::vector<const Cube*> touching;
        for (const Cube* other : cubes) {
            if (budget_.steps == 0 || depth > depthBound)
                return false;
            --budget_.steps;
            if (cube.isSubsetOf(*other))
                return true;
            if (cube.intersects(*other))
                touching.push_back(other);
        }
        dropUnhelpful(cube, touching);
        if (touching.empty())
            return false;
        const auto [atom, part] = split(cube, *touching.front());
        Cube half = cube;
        half.restrict(atom, part);
        if (!search(half, touching, depth + 1))
            return false;
        half = cube;
        half.restrict(atom, part.complement());
        return search(half, touching, depth + 1);
    }

    /// Where some value of an atom is out of reach of all cubes that restrict it, the others must cover that slice and
    /// so the whole: those cubes do not help.
    void dropUnhelpful(const Cube& cube, std::vector<const Cube*>& cubes) {
        for (bool again = true; again && !cubes.empty();) {
            Reach reach;
            for (const Cube* other : cubes)
                for (const Constraint& c : other->constraints())
                    if (restricts(cube, c))
                        reach[c.atom].insert(reach[c.atom].end(), c.set.intervals().begin(), c.set.intervals().end());
            again = false;
            for (auto& [atom, intervals] : reach) {
                const IntegerSet reached = IntegerSet::of(std::move(intervals));
                const IntegerSet* within = cube.find(atom);
                if (within != nullptr ? within->isSubsetOf(reached) : reached.isAll())
                    continue;
                const Atom beyond = atom;
                again = std::erase_if(cubes,
                                      [&](const Cube* other) {
                                          const IntegerSet* set = other->find(beyond);
                                          return set != nullptr && restricts(cube, {beyond, *set});
                                      }) > 0 ||
                        again;
            }
        }
    }

    static bool restricts(const Cube& cube, const Constraint& constraint) {
        const IntegerSet* within = cube.find(constraint.atom);
        return within == nullptr || !within->isSubsetOf(constraint.set);
    }

    static Constraint split(const Cube& cube, const Cube& by) {
        return *std::ranges::find_if(by.constraints(), [&](const Constraint& c) { return restricts(cube, c); });
    }

    const Cover& cover_;
    Occurrences occurrences_;
    std::vector<bool> gone_;
    std::vector<bool> spanned_;           ///< by atom
    std::vector<std::size_t> everywhere_; ///< cubes that may help anywhere
    CoverBudget& budget_;
};

/// Larger products with fewer comparisons on one atom, the largest first.
std::vector<IntegerSet> relaxations(const IntegerSet& set) {
    std::vector<IntegerSet> result{IntegerSet::all()};
    if (set.comparisons() < 2)
        return result;
    const IntegerSet hull(set.low(), set.high());
    if (set.low() != IntegerSet::minusInfinity && set.high() != IntegerSet::plusInfinity) {
        result.push_back(set.unite({IntegerSet::minusInfinity, set.low()}));
        result.push_back(set.unite({set.high(), IntegerSet::plusInfinity}));
    } else if (!(hull == set)) {
        result.push_back(set.unite(hull.complement()));
    }
    for (const std::int64_t hole : set.holes())
        result.push_back(set.unite(IntegerSet::point(hole)));
    return result;
}

/// Relaxes one constraint of a cube as far as the other cubes hold in what is gained.
bool relax(Cover& cover, std::size_t index, Atom atom, CoverSearch& search) {
    const IntegerSet set = *cover[index].find(atom);
    for (const IntegerSet& wider : relaxations(set)) {
        Cube gained = cover[index];
        gained.assign(atom, wider.minus(set));
        if (!search.covers(gained, index))
            continue;
        cover[index].assign(atom, wider);
        return true;
    }
    return false;
}

} // namespace

bool covers(const Cover& cover, const Cube& cube, CoverBudget& budget) {
    return CoverSearch(cover, budget).covers(cube, cover.size());
}

bool dropComparisons(Cover& cover, CoverBudget& budget) {
    if (cover.size() < 2)
        return false;
    bool any = false;
    const Occurrences occurrences(cover);
    CoverSearch search(cover, budget);
    for (std::size_t i = 0; i < cover.size(); ++i) {
        const std::vector<Constraint> constraints = cover[i].constraints();
        for (const Constraint& c : constraints) {
            // Only a cube that allows the atom another value can make up for a comparison that goes.
            const bool helped = std::ranges::any_of(occurrences.of(c.atom), [&](std::size_t j) {
                const IntegerSet* other = j == i ? nullptr : cover[j].find(c.atom);
                return other != nullptr && !other->isSubsetOf(c.set);
            });
            if (helped)
                any = relax(cover, i, c.atom, search) || any;
        }
    }
    return any;
}

bool dropCubes(Cover& cover, CoverBudget& budget) {
    if (cover.size() < 3)
        return false;
    CoverSearch search(cover, budget);
    std::vector<bool> covered(cover.size(), false);
    bool any = false;
    for (std::size_t i = cover.size(); i-- > 0;) {
        if (!search.covers(cover[i], i))
            continue;
        search.remove(i);
        any = covered[i] = true;
    }
    if (any)
        eraseMarked(cover, covered);
    return any;
}

} // namespace VT
