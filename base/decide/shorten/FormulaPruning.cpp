// Takes what does not count out of a formula, by its truth table, and has it searched for smaller formulas.
//
// The constraints cut the integers of each atom into cells; a formula is evaluated at all points of their grid at
// once, a bit each.  From the outside in it follows where the value of an operand decides that of the formula;
// elsewhere it may be anything (Savoj and Brayton, "The use of observability and external don't cares", 1990).  The
// change that saves most is made first, and the rest is judged anew.
// Cost: the occurrences of operands times the words of a truth table for each change, within limits::coverPoints and
// limits::prunedComparisons.
// Relies on: Grid, FactorSearch.  Atoms count as independent; what depends on each other through more is left to
// proofs.
#include "base/decide/shorten/FormulaPruning.hpp"

#include "base/core/Limits.hpp"

#include <algorithm>

namespace VT {

bool FormulaPruning::readGrid(Formula formula) {
    Cover leaves;
    for (const Formula each : formulas_.below(formula)) {
        if (formulas_.kind(each) != Kind::Leaf)
            continue;
        leaves.emplace_back();
        leaves.back().assign(formulas_.constraint(each).atom, formulas_.constraint(each).set);
    }
    return grid_.read(leaves);
}

const FormulaPruning::Points& FormulaPruning::valueOf(Formula formula) const {
    return values_[static_cast<std::size_t>(std::ranges::lower_bound(below_, formula) - below_.begin())];
}

void FormulaPruning::evaluate(Formula formula) {
    below_ = formulas_.below(formula);
    values_.assign(below_.size(), Points(grid_.words(), 0));
    for (std::size_t i = 0; i < below_.size(); ++i) {
        Points& value = values_[i];
        const Kind kind = formulas_.kind(below_[i]);
        if (kind == Kind::Leaf) {
            const Constraint& constraint = formulas_.constraint(below_[i]);
            Cube cube;
            cube.assign(constraint.atom, constraint.set);
            grid_.points(grid_.boxOf(cube), value.data());
            continue;
        }
        if (kind == Kind::Constant)
            continue;
        bool isFirst = true;
        for (const Formula operand : formulas_.operands(below_[i])) {
            const Points& other = valueOf(operand);
            for (std::size_t word = 0; word < value.size(); ++word) {
                value[word] = isFirst             ? other[word]
                              : kind == Kind::And ? value[word] & other[word]
                                                  : value[word] | other[word];
            }
            isFirst = false;
        }
    }
}

/// Appends the operands of an occurrence: each counts where the chain does and no other operand decides it.
void FormulaPruning::appendOperands(std::size_t parent) {
    const Formula chain = occurrences_[parent].formula;
    const bool isAnd = formulas_.kind(chain) == Kind::And;
    const Formulas::Operands& operands = formulas_.operands(chain);
    for (std::size_t place = 0; place < operands.size(); ++place) {
        Points counts = occurrences_[parent].counts;
        for (std::size_t other = 0; other < operands.size(); ++other) {
            if (other == place)
                continue;
            const Points& value = valueOf(operands[other]);
            for (std::size_t word = 0; word < counts.size(); ++word)
                counts[word] &= isAnd ? value[word] : ~value[word];
        }
        occurrences_.push_back({operands[place], parent, place, std::move(counts)});
    }
}

void FormulaPruning::findOccurrences(Formula formula) {
    occurrences_.clear();
    Points everywhere(grid_.words(), 0);
    grid_.points(grid_.boxOf(Cube()), everywhere.data());
    occurrences_.push_back({formula, 0, 0, std::move(everywhere)});
    for (std::size_t i = 0; i < occurrences_.size(); ++i) // it grows
        if (formulas_.kind(occurrences_[i].formula) == Kind::And || formulas_.kind(occurrences_[i].formula) == Kind::Or)
            appendOperands(i);
}

/// The whole formula with an occurrence replaced.
Formula FormulaPruning::replaced(std::size_t occurrence, Formula by) {
    while (occurrence != 0) {
        const Occurrence& at = occurrences_[occurrence];
        const Formula parent = occurrences_[at.parent].formula;
        Formulas::Operands operands = formulas_.operands(parent);
        operands[at.place] = by;
        by = formulas_.chain(formulas_.kind(parent), operands);
        occurrence = at.parent;
    }
    return by;
}

/// A constraint of fewer comparisons that is the same where it counts.
std::optional<Formula> FormulaPruning::cheaper(const Occurrence& leaf) {
    const Constraint constraint = formulas_.constraint(leaf.formula);
    std::size_t fewest = formulas_.comparisons(leaf.formula);
    if (fewest < 2)
        return std::nullopt;
    const Axis& axis = *std::ranges::find(grid_.axes(), constraint.atom, &Axis::atom);
    Cells inside = 0;
    Cells outside = 0;
    for (std::size_t cell = 0; cell < axis.cells(); ++cell) {
        Cube cube;
        cube.assign(constraint.atom, axis.setOf(cellBit(cell)));
        Points points(grid_.words(), 0);
        grid_.points(grid_.boxOf(cube), points.data());
        bool isCounted = false;
        for (std::size_t word = 0; word < points.size(); ++word)
            isCounted = isCounted || (points[word] & leaf.counts[word]) != 0;
        if (isCounted)
            ((axis.cellsOf(constraint.set) & cellBit(cell)) != 0 ? inside : outside) |= cellBit(cell);
    }
    std::optional<Formula> best;
    const auto consider = [&](Cells cells) {
        if ((inside & ~cells) != 0 || (outside & cells) != 0 || cells == 0 || cells == axis.all())
            return;
        const Constraint candidate{constraint.atom, axis.setOf(cells)};
        const std::size_t count = comparisons_(candidate);
        if (count < fewest) {
            fewest = count;
            best = formulas_.leaf(candidate);
        }
    };
    // Every run of cells, and the constraint's own cells with one run more or less.
    const Cells own = axis.cellsOf(constraint.set);
    for (std::size_t first = 0; first < axis.cells(); ++first) {
        for (std::size_t end = first + 1; end <= axis.cells(); ++end) {
            const Cells run = cellsBefore(end) & ~cellsBefore(first);
            for (const Cells cells : {run, axis.all() & ~run, own | run, own & ~run})
                consider(cells);
        }
    }
    return best;
}

/// What may replace an occurrence.
std::optional<Formula> FormulaPruning::shorterFor(const Occurrence& occurrence) {
    const Points& value = valueOf(occurrence.formula);
    bool mayBeTrue = true;
    bool mayBeFalse = true;
    for (std::size_t word = 0; word < value.size(); ++word) {
        mayBeTrue = mayBeTrue && (occurrence.counts[word] & ~value[word]) == 0;
        mayBeFalse = mayBeFalse && (occurrence.counts[word] & value[word]) == 0;
    }
    if (mayBeTrue || mayBeFalse)
        return mayBeTrue ? Formulas::yes : Formulas::no;
    return formulas_.kind(occurrence.formula) == Kind::Leaf ? cheaper(occurrence) : std::nullopt;
}

std::optional<Formula> FormulaPruning::pruned(Formula formula) {
    if (formulas_.kind(formula) == Kind::Constant)
        return formula;
    if (formulas_.comparisons(formula) > limits::prunedComparisons || !readGrid(formula))
        return std::nullopt;
    for (;;) {
        evaluate(formula);
        findOccurrences(formula);
        Formula best = formula;
        for (std::size_t i = 0; i < occurrences_.size(); ++i) {
            const auto shorter = shorterFor(occurrences_[i]);
            const Formula candidate = shorter ? replaced(i, *shorter) : formula;
            const bool isConstant = formulas_.kind(candidate) == Kind::Constant;
            if (candidate != formula && (isConstant || formulas_.comparisons(candidate) < formulas_.comparisons(best)))
                best = candidate;
            if (isConstant)
                return candidate;
        }
        if (best == formula)
            return formula;
        formula = best;
    }
}

// Smaller formulas.

/// The formula that a search found, operands in the order in which their atoms were met.
Formula FormulaPruning::written(const Factored& items) {
    struct Part {
        Formula formula;
        Atom first; ///< the first atom in it
    };

    boost::container::small_vector<Part, 16> parts;
    for (const FactoredItem& item : items) {
        if (item.kind == FactoredItem::Kind::Comparison) {
            const Axis& axis = grid_.axes()[item.axis];
            parts.push_back({formulas_.leaf({axis.atom(), axis.setOf(item.cells)}), axis.atom()});
            continue;
        }
        Part b = parts.back();
        parts.pop_back();
        Part& a = parts.back();
        if (b.first < a.first)
            std::swap(a, b);
        const Formula operands[] = {a.formula, b.formula};
        a.formula = formulas_.chain(item.kind == FactoredItem::Kind::And ? Kind::And : Kind::Or, operands);
    }
    return parts.back().formula;
}

FormulaPruning::Smaller FormulaPruning::smaller(Formula formula) {
    if (formulas_.kind(formula) == Kind::Constant || formulas_.kind(formula) == Kind::Leaf ||
        formulas_.comparisons(formula) > limits::prunedComparisons || !readGrid(formula))
        return {formula, formulas_.comparisons(formula) == 1};
    evaluate(formula);
    const Points& on = valueOf(formula);
    Points off(grid_.words(), 0);
    grid_.points(grid_.boxOf(Cube()), off.data());
    for (std::size_t word = 0; word < off.size(); ++word)
        off[word] &= ~on[word];
    const FactorAnswer answer = searchFactored(grid_, {on.data(), on.size()}, {off.data(), off.size()},
                                               formulas_.comparisons(formula), limits::factorSteps);
    return {answer.formula ? written(*answer.formula) : formula, answer.isProven};
}

} // namespace VT
