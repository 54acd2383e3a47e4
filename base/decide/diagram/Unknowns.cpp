// Numbers the unknowns of conditions and keeps them in the order of their texts.
//
// Method: order maintenance with labels (Dietz and Sleator, "Two algorithms for maintaining order in a list", 1987): a
// balanced tree finds the place of a new unknown by text, and a 64-bit label between its neighbours makes every later
// comparison one of numbers. When a gap is full, all labels are dealt again.
//
// Cost: one text comparison for each level of the tree when a free unknown is met first, O(1) afterwards; relabelling
// is linear and rare, since gaps begin at 2^32.  Computed unknowns have no place in the order: the texts of nested
// terms would cost the square of their depth.
#include "base/decide/diagram/Unknowns.hpp"

#include "base/core/Check.hpp"
#include "base/core/Limits.hpp"
#include "base/core/Nodes.hpp"
#include "base/util/OrderLabels.hpp"

#include <boost/container_hash/hash.hpp>

#include <algorithm>

namespace VT {

namespace {

/// a - b for bounds that may be infinite: `infinite` where either is.
std::int64_t boundDifference(std::int64_t a, std::int64_t b, std::int64_t infinite) {
    const bool open = a == minusInfinite || a == plusInfinite || b == minusInfinite || b == plusInfinite;
    return open ? infinite : a - b;
}

} // namespace

std::size_t Unknowns::HashOfParts::operator()(const LinearParts& parts) const noexcept {
    std::size_t seed = 0;
    for (const LinearPart& part : parts) {
        boost::hash_combine(seed, part.unknown);
        boost::hash_combine(seed, part.factor);
    }
    return seed;
}

std::size_t Unknowns::HashOfFloor::operator()(const FloorOf& floor) const noexcept {
    std::size_t seed = boost::multiprecision::hash_value(floor.divisor);
    boost::hash_combine(seed, boost::multiprecision::hash_value(floor.form.constant));
    for (const WidePart& part : floor.form.parts) {
        boost::hash_combine(seed, part.unknown);
        boost::hash_combine(seed, boost::multiprecision::hash_value(part.factor));
    }
    return seed;
}

Unknowns::Unknowns(const SymbolicExprTable& table, const SymbolicExprPrinter& printer, std::int64_t low,
                   std::int64_t high)
    : table_(table),
      printer_(printer),
      low_(low),
      high_(high),
      order_(ByText{this}) {}

void Unknowns::clear() {
    order_.clear();
    unknowns_.clear();
    quantities_.clear();
    byNode_.clear();
    sums_.clear();
    floors_.clear();
    differences_.clear();
    simulation_ = noUnknown;
}

int Unknowns::compare(Unknown a, Unknown b) const {
    const UnknownInfo& left = unknowns_[a];
    const UnknownInfo& right = unknowns_[b];
    if (a == b || left.kind != right.kind)
        return static_cast<int>(left.kind) - static_cast<int>(right.kind);
    if (left.kind == UnknownKind::Simulation)
        return 0;
    const SymbolicExpr* leftNode = table_.get(left.node);
    const SymbolicExpr* rightNode = table_.get(right.node);
    if (leftNode->op() == SymbolicOp::String && rightNode->op() == SymbolicOp::String) // mostly: no text is made
        return static_cast<const SymbolicString*>(leftNode)->getName().compare(
            static_cast<const SymbolicString*>(rightNode)->getName());
    if (const int order = printer_.compareUsingCache(left.node, right.node); order != 0)
        return order;
    return left.node < right.node ? -1 : static_cast<int>(left.node > right.node); // copies of NaN
}

/// Bounds of a sum in which floors and what they are floors of cancel out, as in V - 4 * floor(V / 4).
std::pair<std::int64_t, std::int64_t> Unknowns::rangeOf(const LinearParts& parts) const {
    const std::pair unbounded(minusInfinite, plusInfinite);
    const auto isFloor = [&](const auto& part) { return unknowns_[part.unknown].kind == UnknownKind::Floor; };
    if (std::ranges::none_of(parts, isFloor))
        return unbounded;
    int replacedFloors = 0;
    RationalForm rest{LinearForm{parts, 0}};
    RationalForm above; // what the replaced floors may add at most
    RationalForm below;
    while (!rest.isConstant()) {
        // A later floor may be one of an earlier floor.
        const WideForm wide = rest.widened();
        const auto last = std::ranges::find_if(wide.parts.rbegin(), wide.parts.rend(), isFloor);
        if (last == wide.parts.rend() || replacedFloors++ == limits::nestedFloors)
            return unbounded;
        // factor * floor = factor / divisor * (form - remainder), the remainder from 0 to divisor - 1
        const FloorOf& floor = *unknowns_[last->unknown].floor;
        const BigInteger denominator = wide.denominator * floor.divisor;
        const RationalForm own(WideForm{{*last}, 0, wide.denominator});
        const auto form = scale(RationalForm(floor.form), last->factor, denominator);
        const auto remainder = scale(RationalForm(BigInteger(1 - floor.divisor)), last->factor, denominator);
        const auto without = combine(rest, 1, own, -1);
        auto replaced = form && without ? combine(*without, 1, *form, 1) : std::nullopt;
        auto widened = remainder ? combine(last->factor < 0 ? above : below, 1, *remainder, 1) : std::nullopt;
        if (!replaced || !widened)
            return unbounded;
        rest = *std::move(replaced);
        (last->factor < 0 ? above : below) = *std::move(widened);
    }
    const auto bound = [&](const RationalForm& reach, bool up) {
        const WideForm sum = combine(rest, 1, reach, 1).value_or(RationalForm()).widened();
        return up ? floorDivide(sum.constant, sum.denominator)
                  : BigInteger(-floorDivide(BigInteger(-sum.constant), sum.denominator));
    };
    const BigInteger low = bound(below, false);
    const BigInteger high = bound(above, true);
    if (low < -limits::formNumber || high > limits::formNumber)
        return unbounded;
    return {static_cast<std::int64_t>(low), static_cast<std::int64_t>(high)};
}

Unknown Unknowns::add(UnknownInfo info) {
    const auto unknown = static_cast<Unknown>(unknowns_.size());
    info.quantity = static_cast<Quantity>(quantities_.size());
    quantities_.push_back({unknown, noUnknown, info.low, info.high, info.kind});
    unknowns_.push_back(std::move(info));
    if (unknowns_.back().isComputed())
        return unknown;
    const auto at = order_.insert(unknown).first;
    labelInserted(order_.begin(), order_.end(), at,
                  [&](Unknown each) -> std::uint64_t& { return unknowns_[each].label; });
    VTSYM_CHECK(at == order_.begin() || before(*std::prev(at), unknown));
    VTSYM_CHECK(std::next(at) == order_.end() || before(unknown, *std::next(at)));
    return unknown;
}

Unknown Unknowns::simulation() {
    if (simulation_ == noUnknown)
        simulation_ = add({UnknownKind::Simulation, invalidId, {}, 0, 1});
    return simulation_;
}

Unknown Unknowns::free(SymbolicExprId node) {
    if (const Unknown* known = byNode_.find(node); known != nullptr)
        return *known;
    return byNode_.insert(node, add({UnknownKind::Free, node, {}, low_, high_}));
}

Unknown Unknowns::term(SymbolicExprId node, std::int64_t low, std::int64_t high) {
    if (const Unknown* known = byNode_.find(node); known != nullptr)
        return *known;
    return byNode_.insert(node, add({UnknownKind::Term, node, {}, low, high}));
}

std::pair<Unknown, bool> Unknowns::sum(const LinearParts& parts) {
    const bool opposite = parts.front().factor < 0;
    LinearParts canonical(parts);
    if (opposite)
        for (LinearPart& part : canonical)
            part.factor = -part.factor;
    const auto known = sums_.find(canonical);
    if (known != sums_.end())
        return {known->second, opposite};
    const auto [low, high] = rangeOf(canonical);
    const Unknown fresh = add({UnknownKind::Sum, invalidId, canonical, low, high});
    sums_.emplace(std::move(canonical), fresh);
    return {fresh, opposite};
}

Unknown Unknowns::floor(FloorOf meaning) {
    const auto known = floors_.find(meaning);
    if (known != floors_.end())
        return known->second;
    const Unknown fresh = add({UnknownKind::Floor,
                               invalidId,
                               {},
                               minusInfinite,
                               plusInfinite,
                               0,
                               0,
                               std::make_shared<const FloorOf>(meaning)});
    floors_.emplace(std::move(meaning), fresh);
    return fresh;
}

std::pair<Quantity, bool> Unknowns::difference(Unknown a, Unknown b) {
    const bool opposite = a < b;
    const Unknown plus = opposite ? b : a;
    const Unknown minus = opposite ? a : b;
    const auto [at, added] = differences_.try_emplace({plus, minus}, static_cast<Quantity>(quantities_.size()));
    if (added) {
        const UnknownInfo& p = unknowns_[plus];
        const UnknownInfo& m = unknowns_[minus];
        quantities_.push_back(
            {plus, minus, boundDifference(p.low, m.high, minusInfinite), boundDifference(p.high, m.low, plusInfinite)});
    }
    return {at->second, opposite};
}

} // namespace VT
