// Sums of products over integer-valued atoms, and how they are made smaller.
//
// An atom is anything whose value a comparison restricts to a set of integers; here it is a number.  A cube is a
// product: one set for each atom that it restricts.  A cover is a sum: it holds where one of its cubes holds.  All
// operations are exact over the unbounded integers, and each that makes a cover smaller keeps what the cover means.
#pragma once

#include "base/integer/IntegerSet.hpp"

#include <cstddef>
#include <optional>
#include <vector>

namespace VT {

using Atom = std::uint32_t;

/// One atom restricted to a set.
struct Constraint {
    Atom atom;
    IntegerSet set;
    bool operator==(const Constraint&) const = default;
};

/// A hash by content, for containers.
std::size_t hash_value(const Constraint& constraint) noexcept;

/// A product of constraints, at most one for each atom, in the order of atoms.  No constraint allows everything or
/// nothing; the product without constraints always holds.
class Cube {
public:
    using Constraints = ShortVector<Constraint, 3>;

    [[nodiscard]] const Constraints& constraints() const noexcept { return constraints_; }

    [[nodiscard]] bool alwaysHolds() const noexcept { return constraints_.empty(); }

    /// The set of an atom, or nullptr where the cube does not restrict it.
    [[nodiscard]] const IntegerSet* find(Atom atom) const noexcept;
    /// Restricts an atom further; false where nothing is left, and the cube is then not to be used.
    bool restrict(Atom atom, const IntegerSet& set);
    /// Restricts by every constraint of another cube.
    bool restrict(const Cube& other);
    /// Sets what an atom is restricted to; all integers take the constraint away.
    void assign(Atom atom, const IntegerSet& set);
    /// Whether the cube holds only where the other one does.
    [[nodiscard]] bool isSubsetOf(const Cube& other) const noexcept;
    [[nodiscard]] bool intersects(const Cube& other) const noexcept;
    /// Comparisons that it takes to write the cube.
    [[nodiscard]] std::size_t comparisons() const noexcept;
    bool operator==(const Cube&) const = default;

private:
    Constraints constraints_;
};

using Cover = std::vector<Cube>;

[[nodiscard]] std::size_t comparisons(const Cover& cover) noexcept;

/// A set written as few products: rays, intervals and sets from which single points are missing.  `sets` are the parts
/// it came from: points among them stay points unless a neighbour takes them in, so that A == 1 || A == 2 stays as it
/// is.
[[nodiscard]] std::vector<IntegerSet> joinSets(const std::vector<IntegerSet>& sets);

/// The cover that holds exactly where the cube does not, one comparison to each cube.
[[nodiscard]] Cover complement(const Cube& cube);

/// The cubes that hold where one of `a` and one of `b` hold.  Sizes are the caller's to bound.
[[nodiscard]] Cover product(const Cover& a, const Cover& b);

/// Steps of the search for what other cubes cover, one for each literal looked at; when they are used up, what was not
/// proven stays.
struct CoverBudget {
    std::size_t steps = 0;

    [[nodiscard]] bool exhausted() const noexcept { return steps == 0; }

    /// Takes steps away; false where none are left.
    bool spend(std::size_t count) noexcept {
        steps -= count < steps ? count : steps;
        return steps != 0;
    }
};

/// What the search through one cover may cost.
[[nodiscard]] CoverBudget searchBudget(const Cover& cover) noexcept;

// Each of these makes a cover smaller, if it can, and reports whether it did.

/// Takes away cubes that hold only where another cube does.
bool absorb(Cover& cover);
/// Joins cubes that differ in one atom.
bool joinCubes(Cover& cover);
/// Takes comparisons away where the other cubes hold in what is gained.
bool dropComparisons(Cover& cover, CoverBudget& budget);
/// Takes away cubes that hold only where the others together do.
bool dropCubes(Cover& cover, CoverBudget& budget);

/// Applies all of these until none makes the cover smaller.  A search that exhausts the budget leaves no trace: the
/// cover is then joined and absorbed only, and the answer is false.
bool reduce(Cover& cover, CoverBudget& budget);
/// The same for a cover that neither joinCubes() nor absorb() makes smaller.
bool reduceJoined(Cover& cover, CoverBudget& budget);

/// Ranges of an atom that a smaller cover may be written with.
enum class Ranges : std::uint8_t {
    Any,
    NotOfPoints ///< A == 1 || A == 2 || A == 3 stays as it is, and so does a single product
};

/// Replaces a cover, in which no cube contains another, by a smallest one if there is one with fewer comparisons: of
/// those with the fewest comparisons one with the fewest cubes.  Whether no cover has fewer comparisons is proven now;
/// where it is not, the cover stays as it was.  Products with more integers missing between two ranges than
/// limits::coverHole are not looked for.
bool minimize(Cover& cover, CoverBudget& budget, Ranges ranges);

/// Whether the cover holds wherever the cube does; false also when the budget is used up.
[[nodiscard]] bool covers(const Cover& cover, const Cube& cube, CoverBudget& budget);

} // namespace VT
