// Shortens formulas by algebra: constraints judged by those around them, common parts taken out, smallest sums.
//
// Factoring takes out the operand, or the single comparison of a constraint, that saves most, again and again (literal
// factoring: Brayton, "Factoring logic functions", 1987).  The same code serves And and Or: an operand of an Or is
// relaxed where the common part fails, one of an And where it holds.
// Cost: bounded by limits::shortenWork, limits::factorRounds and limits::shortenProducts.
// Relies on: Formulas for one number for each formula, base/cover for smallest sums.
#include "base/decide/shorten/FormulaRewriting.hpp"

#include <algorithm>
#include <utility>

namespace VT {

/// Takes work from the budget; false where there is not enough left.
bool FormulaRewriting::takeWork(std::size_t amount) {
    const bool enough = amount <= workLeft_;
    workLeft_ -= enough ? amount : workLeft_;
    return enough;
}

// In context.

void FormulaRewriting::assume(const Constraint& constraint, bool holds) {
    if (constraint.atom >= known_.size())
        known_.resize(constraint.atom + 1);
    Range& range = known_[constraint.atom];
    trail_.emplace_back(constraint.atom, range);
    IntegerSet set = holds ? constraint.set : constraint.set.complement();
    range = range ? range->intersect(set) : std::move(set);
}

/// A constraint by what is known of its atom.
Formula FormulaRewriting::relaxed(Formula leaf) {
    const Atom atom = formulas_.constraint(leaf).atom;
    return atom < known_.size() && known_[atom] ? within(leaf, *known_[atom]) : leaf;
}

/// A constraint where its atom is in a range: decided, or as few comparisons as will do.
Formula FormulaRewriting::within(Formula leaf, const IntegerSet& range) {
    const Constraint constraint = formulas_.constraint(leaf);
    const IntegerSet inside = constraint.set.intersect(range);
    if (inside.empty())
        return Formulas::no;
    if (range.isSubsetOf(constraint.set))
        return Formulas::yes;
    if (formulas_.comparisons(leaf) == 1 || range.intervals().size() > limits::writtenIntervals)
        return leaf;
    // What is out of the range may be in the set or not.
    const IntegerSet outside = range.complement();
    Constraint best = constraint;
    std::size_t fewest = formulas_.comparisons(leaf);
    const auto consider = [&](IntegerSet set) {
        Constraint candidate{constraint.atom, std::move(set)};
        if (const std::size_t count = comparisons_(candidate); count < fewest) {
            fewest = count;
            best = std::move(candidate);
        }
    };
    consider(inside);
    consider(inside.unite(outside));
    for (const IntegerSet::Interval& interval : outside.intervals()) {
        consider(inside.unite({interval.low, interval.high}));
        consider(inside.unite(outside.minus({interval.low, interval.high})));
    }
    return formulas_.leaf(best);
}

void FormulaRewriting::enter(Formula chain) {
    frames_.push_back({chain, 0, trail_.size(), results_.size()});
    const bool isAnd = formulas_.kind(chain) == Kind::And;
    for (const Formula operand : formulas_.operands(chain))
        if (formulas_.kind(operand) == Kind::Leaf)
            assume(formulas_.constraint(operand), isAnd);
}

/// Ends a chain whose operands' results are on the stack.  Its own constraints are judged by what is known around it.
Formula FormulaRewriting::leave(const Frame& frame) {
    while (trail_.size() > frame.facts) {
        known_[trail_.back().first] = std::move(trail_.back().second);
        trail_.pop_back();
    }
    Formulas::Operands parts;
    std::size_t at = frame.done;
    const Formulas::Operands operands = formulas_.operands(frame.chain);
    for (const Formula operand : operands)
        parts.push_back(formulas_.kind(operand) == Kind::Leaf ? relaxed(operand) : results_[at++]);
    results_.resize(frame.done);
    return formulas_.chain(formulas_.kind(frame.chain), parts);
}

Formula FormulaRewriting::inContext(Formula formula, const AtomFacts& facts) {
    known_.clear();
    trail_.clear();
    frames_.clear();
    results_.clear();
    for (const auto& [atom, set] : facts)
        assume({atom, set}, true);
    if (formulas_.kind(formula) == Kind::Leaf)
        return relaxed(formula);
    if (formulas_.kind(formula) == Kind::Constant || !takeWork(formulas_.comparisons(formula)))
        return formula;
    enter(formula);
    while (!frames_.empty()) {
        Frame& frame = frames_.back();
        const Formulas::Operands& operands = formulas_.operands(frame.chain);
        while (frame.next < operands.size() && formulas_.kind(operands[frame.next]) == Kind::Leaf)
            ++frame.next;
        if (frame.next < operands.size()) {
            enter(operands[frame.next++]);
            continue;
        }
        const Frame done = frame;
        frames_.pop_back();
        results_.push_back(leave(done));
    }
    return results_.back();
}

// Factoring.

/// Single comparisons that a constraint is an And (or an Or) of with others, where it takes several.
void FormulaRewriting::appendParts(Kind chain, Formula leaf, std::vector<Formula>& out) {
    if (formulas_.comparisons(leaf) < 2)
        return;
    const Constraint constraint = formulas_.constraint(leaf);
    // The parts of an Or are what the parts of the opposite And are not.
    const IntegerSet set = chain == Kind::And ? constraint.set : constraint.set.complement();
    const auto append = [&](const IntegerSet& part) {
        if (!part.isAll())
            out.push_back(formulas_.leaf({constraint.atom, chain == Kind::And ? part : part.complement()}));
    };
    append({set.low(), IntegerSet::plusInfinity});
    append({IntegerSet::minusInfinity, set.high()});
    for (std::size_t i = 1; i < set.intervals().size(); ++i) {
        const IntegerSet::Interval hole{set.intervals()[i - 1].high + 1, set.intervals()[i].low - 1};
        if (hole.low == hole.high)
            append(IntegerSet::allBut(hole.low));
    }
}

/// What is left of a chain's operands where a common one is taken out; nothing where it is not one of them, or part of
/// one.
std::optional<FormulaRewriting::Quotient> FormulaRewriting::without(Formula chain, Formula common) {
    const Kind kind = formulas_.kind(chain);
    const Formulas::Operands& operands = formulas_.operands(chain);
    if (const auto same = std::ranges::find(operands, common); same != operands.end())
        return Quotient{static_cast<std::size_t>(same - operands.begin()),
                        kind == Kind::And ? Formulas::yes : Formulas::no, formulas_.comparisons(common)};
    if (formulas_.kind(common) != Kind::Leaf)
        return std::nullopt;
    const Constraint part = formulas_.constraint(common);
    const auto own = std::ranges::find_if(operands, [&](Formula each) {
        return formulas_.kind(each) == Kind::Leaf && formulas_.constraint(each).atom == part.atom;
    });
    if (own == operands.end())
        return std::nullopt;
    const IntegerSet& set = formulas_.constraint(*own).set;
    if (kind == Kind::And ? !set.isSubsetOf(part.set) : !part.set.isSubsetOf(set))
        return std::nullopt;
    const Formula left = within(*own, kind == Kind::And ? part.set : part.set.complement());
    const std::uint32_t saved =
        formulas_.comparisons(*own) - std::min(formulas_.comparisons(*own), formulas_.comparisons(left));
    return saved == 0 ? std::nullopt
                      : std::optional(Quotient{static_cast<std::size_t>(own - operands.begin()), left, saved});
}

/// Comparisons that are saved where a part is taken out of a chain's operands, but for its own.
std::size_t FormulaRewriting::savedBy(Formula common, Kind inner, const Formulas::Operands& operands) {
    std::size_t saved = 0;
    for (const Formula operand : operands) {
        if (formulas_.kind(operand) == inner)
            if (const auto quotient = without(operand, common))
                saved += quotient->saved;
    }
    return saved;
}

/// The operand that saves most comparisons where it is taken out of a chain's operands; FALSE where none saves any.
Formula FormulaRewriting::bestCommonOperand(Kind kind, const Formulas::Operands& operands) {
    const Kind inner = Formulas::opposite(kind);
    if (std::ranges::count(operands, inner, [&](Formula each) { return formulas_.kind(each); }) < 2)
        return Formulas::no;
    boost::unordered_map<Formula, std::size_t> saved;
    std::vector<Formula> order;
    const auto add = [&](Formula common, std::size_t comparisons) {
        std::size_t& sum = saved[common];
        if (sum == 0)
            order.push_back(common);
        sum += comparisons;
    };
    for (const Formula operand : operands) {
        if (formulas_.kind(operand) == inner)
            for (const Formula each : formulas_.operands(operand))
                add(each, formulas_.comparisons(each));
    }
    if (!takeWork(order.size()))
        return Formulas::no;
    if (order.size() <= limits::factoredParts) {
        std::vector<Formula> parts;
        for (const Formula each : order)
            if (formulas_.kind(each) == Kind::Leaf)
                appendParts(inner, each, parts);
        for (const Formula part : parts)
            if (saved[part] == 0)
                add(part, 1);
        for (const Formula common : order)
            if (formulas_.kind(common) == Kind::Leaf && takeWork(operands.size()))
                saved[common] = savedBy(common, inner, operands);
    }
    std::size_t most = 0;
    Formula best = Formulas::no;
    for (const Formula common : order) {
        if (saved[common] > most + formulas_.comparisons(common)) {
            most = saved[common] - formulas_.comparisons(common);
            best = common;
        }
    }
    return best;
}

/// Takes the operand out that saves most comparisons, until none is in two operands of the chain.
Formula FormulaRewriting::withCommonOperand(Kind kind, const Formulas::Operands& operands) {
    Formulas::Operands rest = operands;
    const Kind inner = Formulas::opposite(kind);
    for (;;) {
        const Formula common = bestCommonOperand(kind, rest);
        if (common == Formulas::no)
            return formulas_.chain(kind, rest);
        Formulas::Operands next;
        Formulas::Operands quotients;
        std::optional<std::size_t> place;
        bool isFirst = false; // in the operand that it was met in
        for (const Formula operand : rest) {
            const auto quotient = formulas_.kind(operand) == inner ? without(operand, common) : std::nullopt;
            if (!quotient) {
                next.push_back(operand);
                continue;
            }
            if (!place) {
                place = next.size();
                next.push_back(common);
                isFirst = quotient->place == 0;
            }
            Formulas::Operands left = formulas_.operands(operand);
            left[quotient->place] = quotient->left;
            quotients.push_back(formulas_.chain(inner, left));
        }
        const Formula left = formulas_.chain(kind, quotients);
        next[*place] =
            formulas_.chain(inner, isFirst ? Formulas::Operands{common, left} : Formulas::Operands{left, common});
        rest.swap(next);
    }
}

Formula FormulaRewriting::factoredOnce(Formula formula) {
    const std::vector<Formula> all = formulas_.below(formula);
    std::vector<Formula> result(all.size());
    const auto resultOf = [&](Formula each) {
        return result[static_cast<std::size_t>(std::ranges::lower_bound(all, each) - all.begin())];
    };
    for (std::size_t i = 0; i < all.size(); ++i) {
        const Kind kind = formulas_.kind(all[i]);
        result[i] = all[i];
        if (kind != Kind::And && kind != Kind::Or)
            continue;
        Formulas::Operands parts = formulas_.operands(all[i]);
        std::ranges::transform(parts, parts.begin(), resultOf);
        const Formula chain = formulas_.chain(kind, parts);
        const Kind now = formulas_.kind(chain);
        result[i] = now == Kind::And || now == Kind::Or
                        ? withCommonOperand(now, Formulas::Operands(formulas_.operands(chain)))
                        : chain;
    }
    return result.back();
}

Formula FormulaRewriting::factored(Formula formula) {
    for (std::size_t round = 0; round < limits::factorRounds; ++round) {
        const Formula next = factoredOnce(formula);
        if (next == formula)
            break;
        formula = next;
    }
    return formula;
}

// Sums of products.

std::optional<Cover> FormulaRewriting::coverOf(Formula formula) {
    const std::vector<Formula> all = formulas_.below(formula);
    std::vector<Cover> covers(all.size());
    const auto coverAt = [&](Formula each) -> const Cover& {
        return covers[static_cast<std::size_t>(std::ranges::lower_bound(all, each) - all.begin())];
    };
    for (std::size_t i = 0; i < all.size(); ++i) {
        Cover& cover = covers[i];
        switch (formulas_.kind(all[i])) {
        case Kind::Constant:
            if (all[i] == Formulas::yes)
                cover.emplace_back();
            break;
        case Kind::Leaf:
            cover.emplace_back();
            cover.back().assign(formulas_.constraint(all[i]).atom, formulas_.constraint(all[i]).set);
            break;
        case Kind::Or:
            for (const Formula operand : formulas_.operands(all[i]))
                cover.insert(cover.end(), coverAt(operand).begin(), coverAt(operand).end());
            break;
        case Kind::And:
            cover.emplace_back();
            for (const Formula operand : formulas_.operands(all[i])) {
                const Cover& factor = coverAt(operand);
                if (cover.size() * factor.size() > 2 * limits::shortenProducts ||
                    !takeWork(cover.size() * factor.size()))
                    return std::nullopt;
                cover = product(cover, factor);
                if (cover.size() > 1)
                    absorb(cover);
            }
            break;
        }
        if (cover.size() > limits::shortenProducts || !takeWork(cover.size()))
            return std::nullopt;
    }
    return std::move(covers.back());
}

std::optional<Formula> FormulaRewriting::minimalSum(Formula formula) {
    std::optional<Cover> cover = coverOf(formula);
    if (!cover || !takeWork(limits::shortenCoverSteps / 4))
        return std::nullopt;
    CoverBudget budget{limits::shortenCoverSteps};
    while (joinCubes(*cover) || absorb(*cover) || dropComparisons(*cover, budget) || dropCubes(*cover, budget))
        continue;
    CoverBudget exact{limits::coverSteps};
    minimize(*cover, exact, Ranges::Any);
    Formulas::Operands products;
    for (const Cube& cube : *cover) {
        Formulas::Operands factors;
        for (const Constraint& constraint : cube.constraints())
            factors.push_back(formulas_.leaf(constraint));
        products.push_back(formulas_.chain(Kind::And, factors));
    }
    return formulas_.chain(Kind::Or, products);
}

} // namespace VT
