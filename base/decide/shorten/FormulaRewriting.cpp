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

/// A constraint by what is known of its atom: decided, or as few comparisons as will do.
Formula FormulaRewriting::relaxed(Formula leaf) {
    const Constraint constraint = formulas_.constraint(leaf);
    if (constraint.atom >= known_.size() || !known_[constraint.atom])
        return leaf;
    const IntegerSet& range = *known_[constraint.atom];
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

/// Takes the operand out that saves most comparisons, until none is in two operands of the chain.
Formula FormulaRewriting::withCommonOperand(Kind kind, const Formulas::Operands& operands) {
    Formulas::Operands rest = operands;
    const Kind inner = Formulas::opposite(kind);
    for (;;) {
        boost::unordered_map<Formula, std::size_t> count;
        std::vector<Formula> order;
        for (const Formula operand : rest) {
            if (formulas_.kind(operand) != inner)
                continue;
            for (const Formula each : formulas_.operands(operand))
                if (count[each]++ == 0)
                    order.push_back(each);
        }
        std::size_t most = 0;
        Formula common = Formulas::no;
        for (const Formula each : order) {
            const std::size_t saved = (count[each] - 1) * formulas_.comparisons(each);
            if (saved > most) {
                most = saved;
                common = each;
            }
        }
        if (most == 0 || !takeWork(order.size()))
            return formulas_.chain(kind, rest);
        Formulas::Operands next;
        Formulas::Operands quotient;
        std::optional<std::size_t> place;
        bool isFirst = false; // in the operand that it was met in
        for (const Formula operand : rest) {
            const bool has =
                formulas_.kind(operand) == inner &&
                std::ranges::find(formulas_.operands(operand), common) != formulas_.operands(operand).end();
            if (!has) {
                next.push_back(operand);
                continue;
            }
            if (!place) {
                place = next.size();
                next.push_back(common);
                isFirst = formulas_.operands(operand).front() == common;
            }
            Formulas::Operands left = formulas_.operands(operand);
            left.erase(std::remove(left.begin(), left.end(), common), left.end());
            quotient.push_back(formulas_.chain(inner, left));
        }
        const Formula left = formulas_.chain(kind, quotient);
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
