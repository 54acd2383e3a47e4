// Makes Ands and simplifies them while they are made.
//
// Method: operands are gathered with marks, nested Ands taken apart; comparisons of one quantity are intersected in
// pairs; then each Or is looked at with the marks of the others (unit resolution, one level deep), a bounded number of
// times, where bounds of two unknowns bound their difference.  Nodes are found by open addressing.
#include "base/decide/circuit/Circuit.hpp"

#include "base/core/Check.hpp"
#include "base/util/Hash.hpp"

#include <algorithm>

namespace VT {

namespace {

constexpr std::size_t firstIndexSlots = 256;

/// How often the Ors of an And are looked at again after one of them left a single operand.
constexpr int resolutions = 3;

std::size_t slotOfHash(std::uint64_t hash, std::size_t slots) noexcept {
    return static_cast<std::size_t>(hash >> 32U) & (slots - 1);
}

template <class Value>
std::uint64_t hashValues(Quantity quantity, std::span<const Value> values) {
    std::uint64_t hash = hashStep(0, quantity);
    for (const Value value : values)
        hash = hashStep(hash, static_cast<std::uint64_t>(value));
    return hash;
}

} // namespace

Circuit::Circuit(const Unknowns& unknowns, Steps& steps) : unknowns_(unknowns), steps_(steps) {
    clear();
}

void Circuit::clear() {
    nodes_.assign(1, {noQuantity, 0, 0});
    ends_.clear();
    operands_.clear();
    index_.assign(firstIndexSlots, 0);
    marks_.assign(1, {});
    byQuantity_.clear();
    gathering_ = 0;
}

// Nodes.

std::uint64_t Circuit::hashOf(const Node& node) const {
    if (node.quantity != noQuantity)
        return hashValues(node.quantity, std::span(ends_.data() + node.first, node.count));
    return hashValues(node.quantity, std::span(operands_.data() + node.first, node.count));
}

void Circuit::growIndex() {
    std::vector<std::uint32_t> grown(index_.size() * 2, 0);
    for (std::uint32_t number = 1; number < nodes_.size(); ++number) {
        std::size_t at = slotOfHash(hashOf(nodes_[number]), grown.size());
        while (grown[at] != 0)
            at = (at + 1) & (grown.size() - 1);
        grown[at] = number;
    }
    index_.swap(grown);
}

template <class Values, class Value>
Gate Circuit::intern(Quantity quantity, std::span<const Value> values, Values& stored) {
    steps_.take(values.size());
    if ((nodes_.size() + 1) * 2 > index_.size())
        growIndex();
    std::size_t at = slotOfHash(hashValues(quantity, values), index_.size());
    for (; index_[at] != 0; at = (at + 1) & (index_.size() - 1), ++probes_) {
        const Node& node = nodes_[index_[at]];
        if (node.quantity == quantity && node.count == values.size() &&
            std::equal(values.begin(), values.end(), stored.begin() + node.first))
            return index_[at] * 2;
    }
    const auto number = static_cast<std::uint32_t>(nodes_.size());
    const auto first = static_cast<std::uint32_t>(stored.size());
    stored.insert(stored.end(), values.begin(), values.end());
    nodes_.push_back({quantity, first, static_cast<std::uint32_t>(values.size())});
    marks_.emplace_back();
    index_[at] = number;
    return number * 2;
}

Gate Circuit::comparison(Quantity quantity, const Range& range) {
    if (range.ends.empty())
        return range.start ? always : never;
    const Gate node = intern(quantity, std::span<const std::int64_t>(range.ends), ends_);
    return range.start ? node : opposite(node);
}

Gate Circuit::andOf(std::span<const Gate> operands) {
    if (operands.size() < 2)
        return operands.empty() ? always : operands.front();
    return intern(noQuantity, operands, operands_);
}

Gate Circuit::nested(Gate a, Gate b) {
    if (a == never || b == never || a == opposite(b))
        return never;
    if (a == b || b == always)
        return a;
    if (a == always)
        return b;
    const Gate pair[] = {a, b};
    return andOf(pair);
}

// Comparisons.

Gate Circuit::between(Quantity quantity, std::int64_t low, std::int64_t high) {
    const QuantityInfo& info = unknowns_.quantity(quantity);
    if (low > high || low > info.high || high < info.low)
        return never;
    scratch_.ends.clear();
    scratch_.start = low <= info.low;
    if (low > info.low)
        scratch_.ends.push_back(low - 1);
    if (high < info.high)
        scratch_.ends.push_back(high);
    return comparison(quantity, scratch_);
}

std::pair<std::int64_t, std::int64_t> Circuit::range(Gate truth) const {
    const QuantityInfo& info = unknowns_.quantity(quantity(truth));
    const std::span<const std::int64_t> sides = ends(truth);
    const bool holdsAtEnd = holdsAtStart(truth) == (sides.size() % 2 == 0);
    return {holdsAtStart(truth) ? info.low : sides.front() + 1, holdsAtEnd ? info.high : sides.back()};
}

void Circuit::assign(Range& range, Gate truth) const {
    range.start = holdsAtStart(truth);
    range.ends.assign(ends(truth).begin(), ends(truth).end());
}

void Circuit::intersect(Range& range, const Range& other, Range& scratch) {
    scratch.ends.clear();
    scratch.start = range.start && other.start;
    bool here = range.start;
    bool there = other.start;
    bool in = scratch.start;
    std::size_t i = 0;
    std::size_t j = 0;
    while (i < range.ends.size() || j < other.ends.size()) {
        const bool fromHere = j == other.ends.size() || (i < range.ends.size() && range.ends[i] <= other.ends[j]);
        const std::int64_t end = fromHere ? range.ends[i] : other.ends[j];
        if (i < range.ends.size() && range.ends[i] == end) {
            here = !here;
            ++i;
        }
        if (j < other.ends.size() && other.ends[j] == end) {
            there = !there;
            ++j;
        }
        if ((here && there) != in) {
            in = !in;
            scratch.ends.push_back(end);
        }
    }
    std::swap(range.start, scratch.start);
    range.ends.swap(scratch.ends);
}

// And.

Gate Circuit::all(std::span<const Gate> truths) {
    if (++gathering_ == 0) {
        std::ranges::fill(marks_, Mark{});
        std::ranges::fill(byQuantity_, Mark{});
        gathering_ = 1;
    }
    gathered_.clear();
    further_.clear();
    for (const Gate truth : truths)
        if (!gather(truth))
            return never;
    bool foundUnit = true;
    for (int round = 0; foundUnit && round < resolutions; ++round)
        if (!joinComparisons() || !resolveOrs(foundUnit))
            return never;
    if (!joinComparisons())
        return never;
    std::erase(gathered_, always);
    return andOf(gathered_);
}

Gate Circuit::any(std::span<const Gate> truths) {
    std::vector<Gate> opposites(truths.size());
    std::ranges::transform(truths, opposites.begin(), opposite);
    return opposite(all(opposites));
}

/// Adds an operand; false where the And cannot hold.
bool Circuit::gather(Gate truth) {
    bool possible = truth != never;
    if (isAnd(truth) && (truth & 1U) == 0) {
        const std::size_t count = operands(truth).size();
        for (std::size_t i = 0; i < count && possible; ++i)
            gatherOne(operands(truth)[i], possible);
    } else if (possible) {
        gatherOne(truth, possible);
    }
    return possible;
}

void Circuit::gatherOne(Gate truth, bool& possible) {
    steps_.take();
    if (truth == always)
        return;
    Mark& mark = marks_[truth >> 1U];
    if (mark.gathering == gathering_) {
        possible = mark.value == (truth & 1U);
        return;
    }
    mark = {gathering_, truth & 1U};
    if (isComparison(truth)) {
        const Quantity compared = quantity(truth);
        if (compared >= byQuantity_.size())
            byQuantity_.resize(compared + 1);
        Mark& position = byQuantity_[compared];
        if (position.gathering == gathering_) {
            further_.emplace_back(position.value, truth);
            return;
        }
        position = {gathering_, static_cast<std::uint32_t>(gathered_.size())};
    }
    gathered_.push_back(truth);
}

/// Puts one comparison in the place of all of a quantity; false where they contradict each other.
bool Circuit::joinComparisons() {
    std::ranges::stable_sort(further_, {}, &std::pair<std::uint32_t, Gate>::first);
    for (std::size_t i = 0; i < further_.size();) {
        const std::uint32_t position = further_[i].first;
        const Quantity compared = quantity(further_[i].second);
        std::size_t count = 0;
        const auto add = [&](Gate truth) {
            if (count == ranges_.size())
                ranges_.emplace_back();
            assign(ranges_[count++], truth);
        };
        if (gathered_[position] != always)
            add(gathered_[position]);
        for (; i < further_.size() && further_[i].first == position; ++i)
            add(further_[i].second);
        for (; count > 1; count = (count + 1) / 2) { // neighbours first, so that long rows cost n log n
            for (std::size_t at = 0; at < count; at += 2) {
                std::swap(ranges_[at / 2], ranges_[at]);
                if (at + 1 < count)
                    intersect(ranges_[at / 2], ranges_[at + 1], scratch_);
                steps_.take(ranges_[at / 2].ends.size() + 1);
            }
        }
        const Gate joined = comparison(compared, ranges_[0]);
        if (joined == never)
            return false;
        gathered_[position] = joined;
        if (joined != always)
            marks_[joined >> 1U] = {gathering_, joined & 1U};
    }
    further_.clear();
    return true;
}

/// The gathered comparison of a quantity; `always` where there is none.
Gate Circuit::gatheredAbout(Quantity quantity) const {
    const bool isThere = quantity < byQuantity_.size() && byQuantity_[quantity].gathering == gathering_;
    return isThere ? gathered_[byQuantity_[quantity].value] : always;
}

/// The least and the greatest value that the gathered comparison of an unknown leaves it.
std::pair<std::int64_t, std::int64_t> Circuit::gatheredRange(Unknown unknown) const {
    const Quantity own = unknowns_[unknown].quantity;
    const Gate truth = gatheredAbout(own);
    if (truth != always)
        return range(truth);
    const QuantityInfo& info = unknowns_.quantity(own);
    return {info.low, info.high};
}

/// What the gathered comparisons of two unknowns say about one of their difference.
Circuit::Known Circuit::knownOfDifference(Gate truth) const {
    const QuantityInfo& info = unknowns_.quantity(quantity(truth));
    if (!info.isDifference())
        return Known::Open;
    const auto [plusLow, plusHigh] = gatheredRange(info.plus);
    const auto [minusLow, minusHigh] = gatheredRange(info.minus);
    const bool isBelow = plusLow != minusInfinite && minusHigh != plusInfinite; // bounded from below
    const bool isAbove = plusHigh != plusInfinite && minusLow != minusInfinite;
    const std::span<const std::int64_t> sides = ends(truth);
    const auto first = isBelow ? std::ranges::lower_bound(sides, plusLow - minusHigh) : sides.begin();
    if (first != sides.end() && !(isAbove && *first >= plusHigh - minusLow))
        return Known::Open;
    return holdsAtStart(truth) == ((first - sides.begin()) % 2 == 0) ? Known::True : Known::False;
}

/// What the gathered operands say about another condition.
Circuit::Known Circuit::knownOf(Gate truth) const {
    const Mark& mark = marks_[truth >> 1U];
    if (mark.gathering == gathering_)
        return mark.value == (truth & 1U) ? Known::True : Known::False;
    if (!isComparison(truth))
        return Known::Open;
    const Gate other = gatheredAbout(quantity(truth));
    if (other == always)
        return knownOfDifference(truth);
    bool here = holdsAtStart(truth);
    bool there = holdsAtStart(other);
    bool inside = there && here;
    bool outside = there && !here;
    const std::span<const std::int64_t> a = ends(truth);
    const std::span<const std::int64_t> b = ends(other);
    for (std::size_t i = 0, j = 0; (i < a.size() || j < b.size()) && !(inside && outside);) {
        const std::int64_t end = j == b.size() || (i < a.size() && a[i] <= b[j]) ? a[i] : b[j];
        if (i < a.size() && a[i] == end) {
            here = !here;
            ++i;
        }
        if (j < b.size() && b[j] == end) {
            there = !there;
            ++j;
        }
        inside = inside || (there && here);
        outside = outside || (there && !here);
    }
    return inside && outside ? Known::Open : inside ? Known::True : Known::False;
}

/// Takes from each Or the operands that cannot hold, and each Or away that holds; false where one cannot hold.
bool Circuit::resolveOrs(bool& foundUnit) {
    foundUnit = false;
    const std::size_t count = gathered_.size();
    for (std::size_t at = 0; at < count; ++at) {
        const Gate truth = gathered_[at];
        if (!isAnd(truth))
            continue;
        rest_.clear();
        bool fails = false; // an operand of the And below
        for (const Gate operand : operands(truth)) {
            steps_.take();
            const Known known = knownOf(operand);
            fails = known == Known::False;
            if (fails)
                break;
            if (known == Known::Open)
                rest_.push_back(operand);
        }
        if (fails) {
            gathered_[at] = always;
            continue;
        }
        if (rest_.size() == operands(truth).size())
            continue;
        if (rest_.empty())
            return false;
        const Gate reduced = opposite(andOf(rest_));
        gathered_[at] = always;
        foundUnit = foundUnit || rest_.size() == 1;
        if (!gather(reduced))
            return false;
    }
    return true;
}

} // namespace VT
