// Confirms witnesses by evaluation where a path restricts arithmetic that the diagrams do not understand.
//
// Method: compute each term from the values of its free unknowns and follow the whole diagram. If that fails, change
// one unknown, then two, to values that the literals suggest (the literals, their neighbours, divisors, sums,
// differences and products) and ask again.
//
// Cost: at most limits::confirmations trials in one question; each costs the nodes of the terms and one path.
#include "base/decide/solver/LinearSolver.hpp"
#include "base/decide/witness/WitnessSearch.hpp"

#include <algorithm>
#include <array>
#include <iterator>

namespace VT {

/// Computes the terms from the unknowns that they depend on; false where one has no value.
bool WitnessSearch::computeTerms(std::vector<std::int64_t>& values) {
    for (const Term& term : terms_) {
        std::optional<std::int64_t> value = 0;
        if (term.plan != nullptr) {
            steps_.take(term.plan->size());
            value = term.plan->value([&](Unknown unknown) { return values[numberOf(unknown)]; });
        } else {
            for (const LinearPart& part : unknowns_[order_[term.number - 1]].sum) {
                std::int64_t product = 0;
                std::int64_t sum = 0;
                if (__builtin_mul_overflow(part.factor, values[numberOf(part.unknown)], &product) ||
                    __builtin_add_overflow(*value, product, &sum)) {
                    value.reset();
                    break;
                }
                value = sum;
            }
        }
        if (!value || !isWithinBound(*value))
            return false;
        values[term.number] = *value;
    }
    return true;
}

/// Follows the whole diagram from its root; the values are those of all unknowns, terms included.
WitnessSearch::Followed WitnessSearch::follow(const std::vector<std::int64_t>& values) const {
    Followed path{root_, 0};
    while (path.end > never) {
        ++path.edges;
        const QuantityInfo& info = unknowns_.quantity(diagrams_.quantity(path.end));
        std::int64_t value = values[numberOf(info.plus)];
        if (info.isDifference() && __builtin_sub_overflow(value, values[numberOf(info.minus)], &value))
            return {never, path.edges};
        path.end = diagrams_.edge(path.end, diagrams_.edgeOf(path.end, value)).child;
    }
    return path;
}

/// Asks the whole diagram with the terms computed; the values are in trial_.
bool WitnessSearch::confirm(const std::vector<std::int64_t>& values) {
    trial_ = values;
    if (!computeTerms(trial_))
        return false;
    const Followed path = follow(trial_);
    steps_.take(path.edges);
    return path.end == always;
}

/// Whether a sum lies on this path where the ranges of its parts do not reach.
bool WitnessSearch::isExcluded() {
    system_.findRanges();
    for (const Term& term : terms_) {
        const UnknownInfo& info = unknowns_[order_[term.number - 1]];
        if (info.kind != UnknownKind::Sum)
            continue;
        bool openLow = false;
        bool openHigh = false;
        std::int64_t low = 0;
        std::int64_t high = 0;
        for (const LinearPart& part : info.sum) {
            std::int64_t atLow = system_.low(numberOf(part.unknown));
            std::int64_t atHigh = system_.high(numberOf(part.unknown));
            if (part.factor < 0)
                std::swap(atLow, atHigh);
            const auto add = [&](std::int64_t bound, std::int64_t& sum, bool& open) {
                std::int64_t product = 0;
                open = open || bound == minusInfinite || bound == plusInfinite ||
                       __builtin_mul_overflow(part.factor, bound, &product) ||
                       __builtin_add_overflow(sum, product, &sum);
            };
            add(atLow, low, openLow);
            add(atHigh, high, openHigh);
        }
        if ((!openLow && low > system_.high(term.number)) || (!openHigh && high < system_.low(term.number)))
            return true;
    }
    return false;
}

/// Solves the bounds of the path together with the sums that it restricts, exactly; terms are unknowns like any other.
/// A solution counts when evaluation confirms it; the values are in trial_ then.
WitnessSearch::SumsOnPath WitnessSearch::solveSums() {
    if (std::ranges::none_of(terms_, [](const Term& term) { return term.plan == nullptr; }))
        return SumsOnPath::Open;
    using Compared = LinearConstraint::Relation;
    const std::size_t variables = order_.size(); // by number - 1
    std::vector<LinearConstraint> constraints;
    for (const DifferenceSystem::Bound& bound : system_.bounds()) { // x - y <= most
        constraints.push_back({std::vector<BigInteger>(variables), bound.most, Compared::NotNegative});
        if (bound.x != 0)
            constraints.back().factors[bound.x - 1] -= 1;
        if (bound.y != 0)
            constraints.back().factors[bound.y - 1] += 1;
    }
    for (const Term& term : terms_) {
        if (term.plan != nullptr)
            continue;
        constraints.push_back({std::vector<BigInteger>(variables), 0, Compared::Zero});
        constraints.back().factors[term.number - 1] = -1;
        for (const LinearPart& part : unknowns_[order_[term.number - 1]].sum)
            constraints.back().factors[numberOf(part.unknown) - 1] += part.factor;
    }
    const auto solution = LinearSolver(steps_).solveSmallest(constraints, variables);
    if (!solution)
        return SumsOnPath::Unsolvable;
    std::vector<std::int64_t> values(variables + 1);
    for (std::size_t i = 0; i < variables; ++i) {
        if (abs((*solution)[i]) > largestNumber)
            return SumsOnPath::Open;
        values[i + 1] = static_cast<std::int64_t>((*solution)[i]);
    }
    return confirm(values) ? SumsOnPath::Solved : SumsOnPath::Open;
}

/// Values that the literals of the path and of the terms suggest, and small ones; smallest first.
std::vector<std::int64_t> WitnessSearch::candidates(const std::vector<std::int64_t>& solution) const {
    constexpr std::int64_t small = 8;
    constexpr std::size_t fewest = 24; // literals that are combined with each other
    constexpr std::size_t most = 512;
    std::vector<std::int64_t> literals(solution);
    for (const DifferenceSystem::Bound& bound : system_.bounds())
        literals.push_back(bound.most);
    for (const Term& term : terms_)
        if (term.plan != nullptr)
            literals.insert(literals.end(), term.plan->constants().begin(), term.plan->constants().end());
    const auto tidy = [](std::vector<std::int64_t>& values) {
        std::ranges::sort(values, isSmaller);
        values.erase(std::unique(values.begin(), values.end()), values.end());
    };
    tidy(literals);
    std::vector<std::int64_t> values;
    for (std::int64_t i = 0; i <= small; ++i)
        values.insert(values.end(), {i, -i});
    const auto suggest = [&](std::int64_t value) {
        if (isWithinBound(value))
            values.insert(values.end(), {value, value - 1, value + 1, -value, -value - 1, 1 - value});
    };
    for (const std::int64_t literal : literals) {
        suggest(literal);
        for (std::int64_t divisor = 2; divisor <= 64 && divisor <= std::abs(literal); ++divisor)
            if (literal % divisor == 0)
                values.insert(values.end(), {divisor, literal / divisor, -literal / divisor});
    }
    for (std::size_t i = 0; i < std::min(literals.size(), fewest); ++i) {
        for (std::size_t j = 0; j < i; ++j) {
            suggest(literals[i] + literals[j]);
            suggest(literals[i] - literals[j]);
            std::int64_t product = 0;
            if (!__builtin_mul_overflow(literals[i], literals[j], &product))
                suggest(product);
        }
    }
    tidy(values);
    values.resize(std::min(values.size(), most));
    return values;
}

/// Gives the unknowns that terms are computed from their values, with some of them changed; the terms follow, the
/// others get the smallest values that go with them.  Asks for confirmation.
bool WitnessSearch::confirmWith(std::span<const Change> changes) {
    if (triesLeft_ == 0)
        return false;
    --triesLeft_;
    const std::size_t before = system_.size();
    for (const auto& [at, value] : changes)
        base_[at].second = value;
    std::vector<std::int64_t> values(order_.size() + 1);
    for (const auto& [number, value] : base_) {
        values[number] = value;
        system_.restrict(number, 0, value, value);
    }
    bool confirmed = computeTerms(values);
    if (confirmed) {
        for (const Term& term : terms_)
            system_.restrict(term.number, 0, values[term.number], values[term.number]);
        confirmed = system_.solve(values) && confirm(values);
    }
    system_.shrink(before);
    if (confirmed)
        best_ = trial_;
    return confirmed;
}

/// Tries other values for one, then for two of the unknowns that terms are computed from: around the solution, and
/// around the same with 1 in the place of 0, since nothing can be divided by that.
bool WitnessSearch::confirmNear(const std::vector<std::int64_t>& solution) {
    const std::vector<std::int64_t> all = candidates(solution);
    std::vector<std::vector<std::int64_t>> possible; // for each unknown, within its bounds
    system_.findRanges();
    for (const Number number : movable_) {
        possible.emplace_back();
        std::ranges::copy_if(all, std::back_inserter(possible.back()), [&](std::int64_t value) {
            return value >= system_.low(number) && value <= system_.high(number);
        });
    }
    using Base = std::vector<std::pair<Number, std::int64_t>>;
    Base zeros;
    Base ones;
    for (const Number number : movable_) {
        if (!isWithinBound(solution[number]))
            return false;
        zeros.emplace_back(number, solution[number]);
        const bool replaced = solution[number] == 0 && system_.low(number) <= 1 && system_.high(number) >= 1;
        ones.emplace_back(number, replaced ? 1 : solution[number]);
    }
    // From the last unknown on, so that the first ones stay small.
    for (const Base& base : {zeros, ones}) {
        for (std::size_t i = movable_.size(); i-- > 0;) {
            for (const std::int64_t value : possible[i]) {
                base_ = base;
                if (confirmWith(std::array{Change(i, value)}))
                    return true;
            }
        }
    }
    base_ = zeros;
    for (std::size_t i = movable_.size(); i-- > 1;) { // what one sum gains another may have to lose
        for (std::size_t j = i; j-- > 0;) {
            for (const std::int64_t value : possible[j])
                if (confirmWith(std::array{Change(j, value), Change(i, -value)}))
                    return true;
            base_ = zeros;
        }
    }
    for (std::size_t reach = 8; reach < 4 * all.size(); reach *= 4) { // near values for all pairs first
        for (const Base& base : {zeros, ones}) {
            for (std::size_t i = movable_.size(); i-- > 1;) {
                for (std::size_t j = i; j-- > 0;) {
                    for (std::size_t a = 0; a < std::min(reach, possible[j].size()); ++a) {
                        for (std::size_t b = 0; b < std::min(reach, possible[i].size()); ++b) {
                            if (triesLeft_ == 0)
                                return false;
                            base_ = base;
                            if (confirmWith(std::array{Change(j, possible[j][a]), Change(i, possible[i][b])}))
                                return true;
                        }
                    }
                }
            }
        }
    }
    return false;
}

} // namespace VT
