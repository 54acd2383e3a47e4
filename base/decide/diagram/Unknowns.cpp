// Numbers the unknowns of conditions and keeps them in the order of their texts.
//
// Method: order maintenance with labels (Dietz and Sleator, "Two algorithms for maintaining order in a list", 1987): a
// balanced tree finds the place of a new unknown by text, and a 64-bit label between its neighbours makes every later
// comparison one of numbers. When a gap is full, all labels are dealt again.
//
// Cost: one text comparison for each level of the tree when an unknown is met first, O(1) afterwards; relabelling is
// linear and rare, since gaps begin at 2^32.
#include "base/decide/diagram/Unknowns.hpp"

#include "base/core/Check.hpp"
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
    differences_.clear();
    simulation_ = noUnknown;
}

int Unknowns::compare(Unknown a, Unknown b) const {
    const UnknownInfo& left = unknowns_[a];
    const UnknownInfo& right = unknowns_[b];
    if (a == b || left.kind != right.kind)
        return static_cast<int>(left.kind) - static_cast<int>(right.kind);
    if (left.kind == UnknownKind::Sum)
        return compareSums(left.sum, right.sum);
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

LinearParts Unknowns::byText(const LinearParts& parts) const {
    LinearParts sorted(parts);
    std::ranges::sort(sorted, {}, [&](const LinearPart& part) { return unknowns_[part.unknown].label; });
    return sorted;
}

int Unknowns::compareSums(const LinearParts& a, const LinearParts& b) const {
    const LinearParts left = byText(a);
    const LinearParts right = byText(b);
    for (std::size_t i = 0; i < std::min(left.size(), right.size()); ++i) {
        if (left[i].unknown != right[i].unknown)
            return before(left[i].unknown, right[i].unknown) ? -1 : 1;
        if (left[i].factor != right[i].factor)
            return left[i].factor < right[i].factor ? -1 : 1;
    }
    return static_cast<int>(left.size() > right.size()) - static_cast<int>(left.size() < right.size());
}

Unknown Unknowns::add(UnknownInfo info) {
    const auto unknown = static_cast<Unknown>(unknowns_.size());
    info.quantity = static_cast<Quantity>(quantities_.size());
    quantities_.push_back({unknown, noUnknown, info.low, info.high});
    unknowns_.push_back(std::move(info));
    const auto at = order_.insert(unknown).first;
    labelInserted(order_.begin(), order_.end(), at,
                  [&](Unknown each) -> std::uint64_t& { return unknowns_[each].label; });
    VTSYM_CHECK(at == order_.begin() || before(*std::prev(at), unknown));
    VTSYM_CHECK(std::next(at) == order_.end() || before(unknown, *std::next(at)));
    return unknown;
}

Unknown Unknowns::simulation() {
    if (simulation_ == noUnknown)
        simulation_ = add({UnknownKind::Simulation, invalidId, {}, 0, 1, 0, 0, 0});
    return simulation_;
}

Unknown Unknowns::free(SymbolicExprId node) {
    if (const Unknown* known = byNode_.find(node); known != nullptr)
        return *known;
    return byNode_.insert(node, add({UnknownKind::Free, node, {}, low_, high_, 0, 0, 0}));
}

Unknown Unknowns::term(SymbolicExprId node, std::int64_t low, std::int64_t high) {
    if (const Unknown* known = byNode_.find(node); known != nullptr)
        return *known;
    return byNode_.insert(node, add({UnknownKind::Term, node, {}, low, high, 0, 0, 0}));
}

std::pair<Unknown, bool> Unknowns::sum(const LinearParts& parts) {
    const auto first =
        std::ranges::min_element(parts, {}, [&](const LinearPart& part) { return unknowns_[part.unknown].label; });
    const bool opposite = first->factor < 0;
    LinearParts canonical(parts);
    if (opposite)
        for (LinearPart& part : canonical)
            part.factor = -part.factor;
    const auto known = sums_.find(canonical);
    if (known != sums_.end())
        return {known->second, opposite};
    const Unknown fresh = add({UnknownKind::Sum, invalidId, canonical, minusInfinite, plusInfinite, 0, 0, 0});
    sums_.emplace(std::move(canonical), fresh);
    return {fresh, opposite};
}

std::pair<Quantity, bool> Unknowns::difference(Unknown a, Unknown b) {
    const bool opposite = before(a, b);
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
