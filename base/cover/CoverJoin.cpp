// Makes covers smaller by comparing cubes with each other.
//
// Absorption looks for a cube below another among those that restrict the rarest atom of the wider one.  Joining
// groups cubes that are equal but for one atom: the hash of a cube is the sum of its constraints' hashes, so that
// leaving one out is a subtraction.  Sums of sets of single atoms, which most long ones are, are sorted and compared
// with their neighbours.
// Cost: linear in the literals where cubes share few atoms, quadratic in the cubes at worst.
#include "base/cover/CoverOccurrences.hpp"

#include <boost/unordered_map.hpp>

#include <algorithm>

namespace VT {

bool isSumOfSeparateSets(const Cover& cover) {
    struct Part {
        Atom atom;
        IntegerSet::Interval interval;
        bool isPoint;                                  ///< and all of its cube
        auto operator<=>(const Part&) const = default; // NOLINT(modernize-use-nullptr): no pointer here
    };

    boost::container::small_vector<Part, 32> parts;
    for (const Cube& cube : cover) {
        if (cube.constraints().size() != 1)
            return false;
        const auto& [atom, set] = cube.constraints().front();
        const bool isPoint = set.intervals().size() == 1 && set.low() == set.high();
        for (const IntegerSet::Interval& interval : set.intervals())
            parts.push_back({atom, interval, isPoint});
    }
    std::ranges::sort(parts);
    // A lone set leaves an integer out, because a cube never allows everything.
    const auto meet = [](const Part& a, const Part& b) {
        if (a.atom != b.atom)
            return false;
        const bool isBelow = a.interval.high < b.interval.low; // and finite
        return !isBelow || (a.interval.high + 1 == b.interval.low && !(a.isPoint && b.isPoint));
    };
    return std::ranges::adjacent_find(parts, meet) == parts.end();
}

bool absorb(Cover& cover) {
    const auto always = std::ranges::find_if(cover, &Cube::alwaysHolds);
    if (always != cover.end()) {
        const bool smaller = cover.size() > 1;
        cover.assign(1, Cube());
        return smaller;
    }
    if (isSumOfSeparateSets(cover))
        return false;
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

/// Joins the cubes of a group, which are equal but for one atom.  Returns whether they became fewer or shorter.
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
std::vector<std::vector<std::size_t>> groupsButFor(const Cover& cover, Atom atom, Occurrences::Cubes members,
                                                   const std::vector<bool>& gone,
                                                   const std::vector<std::uint64_t>& hashes) {
    boost::container::small_vector<std::pair<std::uint64_t, std::size_t>, 32> rest; // hash of the other constraints
    for (const std::size_t i : members)
        if (const IntegerSet* set = gone[i] ? nullptr : cover[i].find(atom))
            rest.emplace_back(hashes[i] - hash_value(Constraint{atom, *set}), i);
    // Mostly there is no group.
    auto sorted = rest;
    std::ranges::sort(sorted);
    const auto isSame = [](const auto& a, const auto& b) { return a.first == b.first; };
    std::vector<std::vector<std::size_t>> groups;
    if (std::ranges::adjacent_find(sorted, isSame) == sorted.end())
        return groups;
    boost::unordered_map<std::uint64_t, std::size_t> byHash;
    for (const auto& [hash, i] : rest) {
        const auto [at, added] = byHash.try_emplace(hash, groups.size());
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

} // namespace VT
