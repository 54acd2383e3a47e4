// Confirms witnesses by evaluation where a path restricts arithmetic that the diagrams do not understand.
//
// Method: compute each term from the values of its free unknowns and evaluate the whole question. If that fails, change
// one unknown, then two, to values that the literals suggest (the literals, their neighbours, divisors, sums,
// differences and products) and ask again.
//
// Cost: at most limits::confirmations trials in one question; each costs the nodes of the terms and of the question.
#include "base/core/Limits.hpp"
#include "base/decide/witness/WitnessSearch.hpp"

#include <algorithm>
#include <array>
#include <iterator>
#include <tuple>

namespace VT {

namespace {

/// Looking at a node of a question is that much cheaper than joining an edge of diagrams.
constexpr std::size_t nodesPerStep = 8;

} // namespace

/// Computes the terms from the unknowns that they depend on; false where one has no value of 64 bits.
bool WitnessSearch::computeTerms(std::vector<std::int64_t>& values) {
    for (const Term& term : terms_) {
        std::optional<std::int64_t> value;
        if (term.plan != nullptr) {
            steps_.take(term.plan->size());
            value = term.plan->value([&](Unknown unknown) { return values[numberOf(unknown)]; });
        } else {
            value = computedValue(unknowns_[order_[term.number - 1]],
                                  [&](Unknown unknown) { return values[numberOf(unknown)]; });
        }
        if (!value)
            return false;
        values[term.number] = *value;
    }
    return true;
}

/// The same for numbers of any size; whole numbers alone can be compared.
bool WitnessSearch::computeExactly(std::vector<BigInteger>& values) {
    const auto at = [&](Unknown unknown) -> const BigInteger& { return values[numberOf(unknown)]; };
    for (const Term& term : terms_) {
        const UnknownInfo& info = unknowns_[order_[term.number - 1]];
        if (term.plan != nullptr) {
            steps_.take(term.plan->size());
            const auto value = term.plan->exactValue(at);
            const auto integer = value ? value->integer() : std::nullopt;
            if (!integer)
                return false;
            values[term.number] = *integer;
            continue;
        }
        BigInteger sum = 0;
        for (const LinearPart& part : info.sum)
            sum += part.factor * at(part.unknown);
        if (info.floor != nullptr) {
            sum = info.floor->form.constant;
            for (const WidePart& part : info.floor->form.parts)
                sum += part.factor * at(part.unknown);
            sum = floorDivide(sum, info.floor->divisor);
        }
        values[term.number] = std::move(sum);
    }
    return true;
}

namespace {

std::int64_t differenceOf(std::int64_t a, std::int64_t b) {
    std::int64_t result = 0;
    return __builtin_sub_overflow(a, b, &result) ? (b < 0 ? plusInfinite : minusInfinite) : result;
}

std::int64_t differenceOf(const BigInteger& a, const BigInteger& b) {
    return static_cast<std::int64_t>(
        std::clamp(BigInteger(a - b), BigInteger(minusInfinite), BigInteger(plusInfinite)));
}

} // namespace

/// Whether the question holds; the values are those of all unknowns, terms included.  Comparisons end at small numbers,
/// so a large one may be replaced by another on its side.
template <class Integer>
bool WitnessSearch::holds(const std::vector<Integer>& values) const {
    const Integer zero = 0;
    return question_->holds([&](Level at) {
        const LevelInfo& level = question_->levels()[at];
        const auto valueOf = [&](Unknown unknown) -> const Integer& {
            const Number* number = unknown != noUnknown ? numbers_.find(unknown) : nullptr;
            return number != nullptr ? values[*number] : zero; // what no path depends on has none
        };
        const Integer& plus = valueOf(level.plus);
        const Integer& minus = valueOf(level.minus);
        return level.opposed ? differenceOf(minus, plus) : differenceOf(plus, minus);
    });
}

template bool WitnessSearch::holds<std::int64_t>(const std::vector<std::int64_t>& values) const;

/// Asks the question with the terms computed; the values are in trial_.
bool WitnessSearch::confirm(const std::vector<std::int64_t>& values) {
    trial_ = values;
    isWide_ = false;
    isLarge_ = false;
    if (!computeTerms(trial_))
        return false;
    steps_.take(question_->nodes().size() / nodesPerStep + 1);
    return holds(trial_);
}

/// The same for numbers of any size.  A witness that has no 64 bits is remembered as such.
bool WitnessSearch::confirmExactly(std::vector<BigInteger> values) {
    if (!computeExactly(values))
        return false;
    steps_.take(question_->nodes().size() / nodesPerStep + 1);
    if (!holds(values))
        return false;
    trial_.assign(values.size(), 0);
    for (std::size_t i = 1; i < values.size(); ++i) {
        const bool fits = values[i] >= minusInfinite && values[i] <= plusInfinite;
        isLarge_ = isLarge_ || !fits;
        isWide_ = isWide_ || (!fits && !unknowns_[order_[i - 1]].isComputed());
        trial_[i] = fits ? static_cast<std::int64_t>(values[i]) : 0;
    }
    return true;
}

/// Solves the constraints of the path exactly; terms are unknowns like any other.
std::optional<PathSystem::Values> WitnessSearch::solvePath(bool smallest) {
    pathSystem_.begin();
    for (const PathRange& range : path_)
        pathSystem_.restrict(range.plus, range.minus, range.low, range.high);
    return pathSystem_.solve(numbers_, smallest);
}

/// A solution counts when evaluation confirms it; the values are in trial_ then.
WitnessSearch::SumsOnPath WitnessSearch::solveSums() {
    const auto solution = solvePath(wantsSmallest_);
    if (!solution)
        return SumsOnPath::Unsolvable;
    bool fits = true;
    std::vector<BigInteger> wide(order_.size() + 1);
    std::vector<std::int64_t> values(order_.size() + 1);
    for (const auto& [unknown, value] : *solution) {
        const Number number = numberOf(unknown);
        wide[number] = value;
        const bool isSmall = value >= -limits::formNumber && value <= limits::formNumber;
        fits = fits && isSmall;
        values[number] = isSmall ? static_cast<std::int64_t>(value) : 0;
    }
    if ((fits && confirm(values)) || confirmExactly(std::move(wide)))
        return SumsOnPath::Solved;
    return SumsOnPath::Open;
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
        --triesLeft_;
        for (std::size_t i = 0; i < terms_.size() && confirmed; ++i) {
            const std::int64_t value = values[terms_[i].number];
            confirmed = value >= termRanges_[i].first && value <= termRanges_[i].second;
        }
        for (std::size_t i = 0; i < terms_.size() && confirmed; ++i) {
            const std::int64_t value = values[terms_[i].number];
            restrictSystem(order_[terms_[i].number - 1], noUnknown, value, value);
        }
        confirmed = confirmed && system_.solve(values) && confirm(values);
    }
    system_.shrink(before);
    if (confirmed)
        best_ = trial_;
    return confirmed;
}

/// The values that the path leaves to each term, for which the ranges of the system are at hand.
void WitnessSearch::findTermRanges() {
    termRanges_.clear();
    for (const Term& term : terms_) {
        std::int64_t low = std::max(system_.low(term.number), -limits::formNumber);
        std::int64_t high = std::min(system_.high(term.number), limits::formNumber);
        if (isOpposed(order_[term.number - 1]))
            std::tie(low, high) = std::pair(-high, -low);
        termRanges_.emplace_back(low, high);
    }
}

/// Tries other values for one, then for two of the unknowns that terms are computed from: around the solution, and
/// around the same with 1 in the place of 0, since nothing can be divided by that.
bool WitnessSearch::confirmNear(const std::vector<std::int64_t>& solution) {
    const std::vector<std::int64_t> all = candidates(solution);
    std::vector<std::vector<std::int64_t>> possible; // for each unknown, within its bounds
    system_.findRanges();
    findTermRanges();
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
    const std::size_t kept = triesLeft_ / 2; // for other paths
    base_ = zeros;
    for (std::size_t i = movable_.size(); i-- > 1;) { // what one sum gains another may have to lose
        for (std::size_t j = i; j-- > 0;) {
            for (const std::int64_t value : possible[j])
                if (triesLeft_ > kept && confirmWith(std::array{Change(j, value), Change(i, -value)}))
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
                            if (triesLeft_ <= kept)
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
