// Makes covers smaller by what several cubes cover together.
//
// Method: a comparison may go where the other cubes cover what the cube gains, and a cube where they cover all of
// it.  Whether cubes cover a cube is decided by splitting it at the bounds of one of them until a single cube covers
// each part (the tautology check of Espresso: Brayton et al., "Logic Minimization Algorithms for VLSI Synthesis",
// 1984).  Cubes that cannot help are left out first: those that need an atom of which some value is out of reach.
// Cost: exponential at worst, bounded by the budget and limits::coverDepth; what is not proven stays.
#include "base/core/Limits.hpp"
#include "base/cover/CoverOccurrences.hpp"

#include <boost/container/flat_map.hpp>

#include <algorithm>
#include <optional>

namespace VT {

namespace {

using Interval = IntegerSet::Interval;

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
    using Cubes = boost::container::small_vector<const Cube*, 16>;
    using Intervals = boost::container::small_vector<Interval, 16>;

    /// What candidates say about each atom within a cube, sorted by atom.
    using Reach = boost::container::small_flat_map<Atom, Intervals, 4>;

    /// Whether the cubes that restrict an atom leave none of its values out.
    bool spans(Atom atom) const {
        Intervals intervals;
        for (const std::size_t i : occurrences_.of(atom)) {
            const IntegerSet& set = *cover_[i].find(atom);
            intervals.insert(intervals.end(), set.intervals().begin(), set.intervals().end());
        }
        return reaches(intervals, {IntegerSet::minusInfinity, IntegerSet::plusInfinity});
    }

    /// The cubes that may help: a cube that restricts an atom of which some value is out of reach helps only where the
    /// atom is restricted already.
    Cubes candidates(const Cube& cube, std::size_t skip) {
        boost::container::small_vector<bool, 32> near(cover_.size(), false);
        for (const std::size_t i : everywhere_)
            near[i] = true;
        for (const Constraint& c : cube.constraints()) {
            if (c.atom >= occurrences_.atoms())
                continue;
            if (!budget_.spend(occurrences_.of(c.atom).size()))
                return {};
            for (const std::size_t i : occurrences_.of(c.atom))
                near[i] = true;
        }
        Cubes result;
        for (std::size_t i = 0; i < near.size(); ++i) {
            if (!near[i] || i == skip || gone_[i])
                continue;
            if (!budget_.spend(1 + cover_[i].constraints().size()))
                return {};
            const bool helps = std::ranges::all_of(cover_[i].constraints(), [&](const Constraint& c) {
                return spanned_[c.atom] || cube.find(c.atom) != nullptr;
            });
            if (helps)
                result.push_back(&cover_[i]);
        }
        return result;
    }

    // NOLINTNEXTLINE(misc-no-recursion): the depth has a bound
    bool search(const Cube& cube, const Cubes& cubes, std::size_t depth) {
        Cubes touching;
        if (depth > limits::coverDepth)
            budget_.steps = 0;
        for (const Cube* other : cubes) {
            if (!budget_.spend(other->constraints().size()))
                return false;
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
    void dropUnhelpful(const Cube& cube, Cubes& cubes) {
        for (bool again = true; again && !cubes.empty();) {
            Reach reach;
            for (const Cube* other : cubes) {
                if (!budget_.spend(other->constraints().size()))
                    return cubes.clear();
                for (const Constraint& c : other->constraints())
                    if (restricts(cube, c))
                        reach[c.atom].insert(reach[c.atom].end(), c.set.intervals().begin(), c.set.intervals().end());
            }
            again = false;
            for (auto& [atom, intervals] : reach) {
                const IntegerSet* within = cube.find(atom);
                const bool isReached =
                    within == nullptr
                        ? reaches(intervals, {IntegerSet::minusInfinity, IntegerSet::plusInfinity})
                        : std::ranges::all_of(within->intervals(), [&, &taken = intervals](const Interval& interval) {
                              return reaches(taken, interval);
                          });
                if (isReached)
                    continue;
                const auto kept = std::remove_if(cubes.begin(), cubes.end(), [&, beyond = atom](const Cube* other) {
                    const IntegerSet* set = other->find(beyond);
                    return set != nullptr && !(within != nullptr && within->isSubsetOf(*set));
                });
                again = again || kept != cubes.end();
                cubes.erase(kept, cubes.end());
            }
        }
    }

    /// Whether some intervals hold all of one between them; sorts them.
    static bool reaches(Intervals& intervals, const Interval& all) {
        std::ranges::sort(intervals);
        std::int64_t next = all.low; // the first integer that is not reached yet
        for (const Interval& interval : intervals) {
            if (interval.low > next)
                return false;
            if (interval.high >= all.high)
                return true;
            next = std::max(next, interval.high + 1);
        }
        return false;
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
    boost::container::small_vector<bool, 32> gone_;
    boost::container::small_vector<bool, 32> spanned_;           ///< by atom
    boost::container::small_vector<std::size_t, 32> everywhere_; ///< cubes that may help anywhere
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
    } else if (!(hull == set) && !hull.isAll()) {
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
    std::optional<CoverSearch> search; // mostly there is nothing to look for
    for (std::size_t i = 0; i < cover.size(); ++i) {
        const Cube::Constraints constraints = cover[i].constraints();
        for (const Constraint& c : constraints) {
            // Only a cube that allows the atom another value can make up for a comparison that goes.
            if (!budget.spend(occurrences.of(c.atom).size()))
                return any;
            const bool helped = std::ranges::any_of(occurrences.of(c.atom), [&](std::size_t j) {
                const IntegerSet* other = j == i ? nullptr : cover[j].find(c.atom);
                return other != nullptr && !other->isSubsetOf(c.set);
            });
            if (!helped)
                continue;
            if (!search)
                search.emplace(cover, budget);
            any = relax(cover, i, c.atom, *search) || any;
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
