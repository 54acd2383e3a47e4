// Writes constraints as comparisons.
//
// A set of k intervals is cut into runs of neighbours; a run is written as its bounds without the integers missing
// between, and the set as an Or of its runs.  The cheapest cut is found by dynamic programming in k^2 steps.
#include "base/decide/shorten/ComparedTerms.hpp"

#include "base/core/Limits.hpp"
#include "base/core/Make.hpp"
#include "base/core/Nodes.hpp"

#include <algorithm>
#include <cstdlib>

namespace VT {

namespace {

constexpr std::int64_t minusInfinity = IntegerSet::minusInfinity;
constexpr std::int64_t plusInfinity = IntegerSet::plusInfinity;

/// Comparisons weigh most; among cuts with as many of them, those that the condition does not write itself.
constexpr std::size_t comparisonCost = 1U << 10U;

/// Whether an integer can be written; the smallest one of 32 bits is the opposite of none.
bool isLiteral(std::int64_t value) {
    return fitsInt(value) && fitsInt(-value);
}

bool isBounded(const IntegerSet::Interval& interval) {
    return interval.low != minusInfinity && interval.high != plusInfinity;
}

/// The integers between two neighbouring intervals.
std::int64_t gap(const IntegerSet::Interval& a, const IntegerSet::Interval& b) {
    return b.low - a.high - 1;
}

} // namespace

// What it takes.

SymbolicExprId ComparedTerms::known(Atom atom, const IntegerSet& set) const {
    const auto form = known_.find(Constraint{atom, set});
    return form == known_.end() ? invalidId : form->second;
}

/// 0 for a set that the condition compares the atom with, or whose complement it does; 1 otherwise.
std::size_t ComparedTerms::unseen(Atom atom, const IntegerSet& set) const {
    return known(atom, set) != invalidId || known(atom, set.complement()) != invalidId ? 0 : 1;
}

/// Whether an interval is written by its bounds; otherwise it is one point or two of them.
bool ComparedTerms::isRange(Atom atom, const IntegerSet::Interval& interval) const {
    if (!isBounded(interval))
        return true;
    if (interval.high - interval.low != 1)
        return interval.high != interval.low;
    return unseen(atom, {interval.low, plusInfinity}) == 0 && unseen(atom, {minusInfinity, interval.high}) == 0;
}

std::size_t ComparedTerms::cost(Atom atom, const IntegerSet::Interval& interval) const {
    if (interval.low == interval.high)
        return comparisonCost + unseen(atom, IntegerSet::point(interval.low));
    if (!isRange(atom, interval))
        return 2 * comparisonCost + unseen(atom, IntegerSet::point(interval.low)) +
               unseen(atom, IntegerSet::point(interval.high));
    std::size_t sum = 0;
    if (interval.low != minusInfinity)
        sum += comparisonCost + unseen(atom, {interval.low, plusInfinity});
    if (interval.high != plusInfinity)
        sum += comparisonCost + unseen(atom, {minusInfinity, interval.high});
    return sum;
}

/// For each interval the best cut of what ends with it.
ComparedTerms::Runs ComparedTerms::runs(const Constraint& constraint) const {
    const auto& [atom, set] = constraint;
    const IntegerSet::Intervals& intervals = set.intervals();
    Runs best;
    for (std::size_t last = 0; last < intervals.size(); ++last) {
        std::size_t inner = 0; // of the integers missing in the run
        best.push_back({last, (last > 0 ? best[last - 1].cost : 0) + cost(atom, intervals[last])});
        for (std::size_t first = last; first-- > 0 && last < limits::writtenIntervals;) {
            const std::int64_t missing = gap(intervals[first], intervals[first + 1]);
            if (missing > 2)
                break;
            for (std::int64_t hole = intervals[first].high + 1; hole < intervals[first + 1].low; ++hole)
                inner += comparisonCost + unseen(atom, IntegerSet::point(hole));
            const IntegerSet::Interval hull{intervals[first].low, intervals[last].high};
            const bool open = hull.low == minusInfinity && hull.high == plusInfinity;
            const std::size_t sum = (first > 0 ? best[first - 1].cost : 0) + inner + (open ? 0 : cost(atom, hull));
            if (sum < best[last].cost)
                best[last] = {first, sum};
        }
    }
    return best;
}

std::size_t ComparedTerms::comparisons(const Constraint& constraint) const {
    if (constraint.set.intervals().size() == 1) {
        const IntegerSet::Interval& interval = constraint.set.intervals().front();
        return isBounded(interval) && interval.low != interval.high ? 2 : 1;
    }
    if (constraint.set.intervals().size() == 2 && constraint.set.comparisons() == 1)
        return 1;
    return runs(constraint).back().cost / comparisonCost;
}

// The comparisons.

WrittenSet ComparedTerms::write(const Constraint& constraint) {
    const IntegerSet& set = constraint.set;
    WrittenSet out;
    if (set.comparisons() == 1) {
        append(constraint.atom, set, out);
        return out;
    }
    const Runs best = runs(constraint);
    std::vector<std::pair<std::size_t, std::size_t>> parts; // first and last interval
    for (std::size_t end = best.size(); end > 0; end = best[end - 1].first)
        parts.emplace_back(best[end - 1].first, end - 1);
    std::ranges::reverse(parts);
    for (const auto& [first, last] : parts) {
        WrittenSet run;
        if (!writeRun(constraint, first, last, run))
            return {};
        if (parts.size() == 1)
            return run;
        out.op = SymbolicOp::Or;
        if (run.op == SymbolicOp::And) {
            SymbolicExprId product = run.operands.front();
            for (std::size_t i = 1; i < run.operands.size(); ++i)
                product = SymbolicAndExpr(table_, product, run.operands[i]).getId(table_);
            run.operands.assign(1, product);
        }
        out.operands.insert(out.operands.end(), run.operands.begin(), run.operands.end());
    }
    return out;
}

/// Appends the comparison of a set that takes one.
bool ComparedTerms::append(Atom atom, const IntegerSet& set, WrittenSet& out) {
    const SymbolicExprId comparison = literal(atom, set);
    if (comparison != invalidId)
        out.operands.push_back(comparison);
    return comparison != invalidId;
}

bool ComparedTerms::writeRun(const Constraint& constraint, std::size_t first, std::size_t last, WrittenSet& out) {
    const auto& [atom, set] = constraint;
    const IntegerSet::Intervals& intervals = set.intervals();
    const IntegerSet::Interval hull{intervals[first].low, intervals[last].high};
    bool complete = true;
    if (!isRange(atom, hull) && first == last) {
        for (std::int64_t value = hull.low; value <= hull.high; ++value)
            complete = append(atom, IntegerSet::point(value), out) && complete;
        out.op = out.operands.size() > 1 ? SymbolicOp::Or : SymbolicOp::None;
        return complete;
    }
    if (hull.low != minusInfinity)
        complete = append(atom, {hull.low, plusInfinity}, out);
    if (hull.high != plusInfinity)
        complete = append(atom, {minusInfinity, hull.high}, out) && complete;
    for (std::size_t i = first; i < last; ++i)
        for (std::int64_t hole = intervals[i].high + 1; hole < intervals[i + 1].low; ++hole)
            complete = append(atom, IntegerSet::allBut(hole), out) && complete;
    out.op = out.operands.size() > 1 ? SymbolicOp::And : SymbolicOp::None;
    return complete;
}

/// A set that takes one comparison: as the condition writes it, as the opposite of what it writes, or anew.
SymbolicExprId ComparedTerms::literal(Atom atom, const IntegerSet& set) {
    if (const SymbolicExprId form = known(atom, set); form != invalidId)
        return form;
    const SymbolicExprId opposite = known(atom, set.complement());
    const bool isTruth = entries_[atom].parts.empty();
    if (opposite == invalidId)
        return isTruth ? invalidId : compose(atom, set, false);
    const SymbolicExpr& node = *table_.get(opposite);
    if (comparisonOps.contains(node.op()) && !isTruth)
        return makeBinary(table_, operatorInfo(node.op()).negated, node.getInput(0), node.getInput(1));
    const SymbolicExprId negated = SymbolicNotExpr(table_, opposite).getId(table_);
    const SymbolicExprId composed = isTruth ? invalidId : compose(atom, set, false);
    return composed != invalidId && printer_.textLength(composed) < printer_.textLength(negated) ? composed : negated;
}

/// The comparison of an atom, anew; the invalid identifier where a number is no literal.  Bounds are written as >= and
/// <=, as > and < where that is asked for or only those have a literal, and each part of a sum on the side where it is
/// positive.
SymbolicExprId ComparedTerms::compose(Atom atom, const IntegerSet& set, bool strict) {
    const LinearParts& parts = entries_[atom].parts;
    const bool difference = std::ranges::any_of(parts, [](const LinearPart& part) { return part.factor < 0; });
    SymbolicOp op = SymbolicOp::NotEqual;
    std::int64_t right = 0;
    if (set.low() == set.high()) {
        op = SymbolicOp::Equal;
        right = set.low();
    } else if (set.intervals().size() == 2) {
        right = set.intervals().front().high + 1;
    } else {
        const bool upward = set.low() != minusInfinity;
        const std::int64_t bound = upward ? set.low() : set.high();
        const std::int64_t beyond = upward ? bound - 1 : bound + 1;
        strict = (difference && (bound == 0 || beyond == 0)) ? beyond == 0
                                                             : isLiteral(beyond) && (strict || !isLiteral(bound));
        right = strict ? beyond : bound;
        op = upward ? (strict ? SymbolicOp::GreaterThan : SymbolicOp::GreaterThanEqual)
                    : (strict ? SymbolicOp::LessThan : SymbolicOp::LessThanEqual);
    }
    if (!isLiteral(right))
        return invalidId;
    // With a part on the right, a negative constant is added on the left.
    const bool moves = difference && right < 0;
    const SymbolicExprId left = side(parts, 1, moves ? -right : 0);
    const SymbolicExprId other = side(parts, -1, moves ? 0 : right);
    return left == invalidId || other == invalidId ? invalidId : makeBinary(table_, op, left, other);
}

/// The sum of the parts with a sign and of a constant, which is written where it is not 0, or alone.
SymbolicExprId ComparedTerms::side(const LinearParts& parts, std::int64_t sign, std::int64_t constant) {
    SymbolicExprId sum = invalidId;
    for (const LinearPart& part : parts) {
        const std::int64_t factor = part.factor * sign;
        if (factor < 0)
            continue;
        if (!fitsInt(factor))
            return invalidId;
        SymbolicExprId term = unknowns_[part.unknown].node;
        if (factor != 1)
            term = SymbolicMultiplyExpr(table_, SymbolicIntValue(table_, static_cast<int>(factor)), term).getId(table_);
        sum = sum == invalidId ? term : SymbolicPlusExpr(table_, sum, term).getId(table_);
    }
    if (sum != invalidId && constant == 0)
        return sum;
    const SymbolicExprId value = SymbolicIntValue(table_, static_cast<int>(constant)).getId(table_);
    return sum == invalidId ? value : SymbolicPlusExpr(table_, sum, value).getId(table_);
}

} // namespace VT
