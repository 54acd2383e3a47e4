// Judges comparisons of one symbol with constants by sets of its values.
//
// Method: facts hold together for the intersection of their sets.  Neighbours in a chain have all facts but the last in
// common, so that one more set is intersected for each.
// Cost: linear in the facts and in the intervals of the set; from the first fact on where other facts are asked about.
// Relies on: symbols stand for integers without bounds, as decisions of the scanner take them.
#include "base/scan/facts/KnownValues.hpp"

#include <algorithm>

namespace VT {

std::optional<KnownValues::Values> KnownValues::valuesOf(SymbolicExprId condition) const {
    const auto isSymbol = [&](SymbolicExprId id) {
        return table_.get(id)->op() == SymbolicOp::String && id != table_.getIdTRUE() && id != table_.getIdFALSE();
    };
    bool isNegated = false;
    const SymbolicExpr* node = table_.get(condition);
    for (; node->op() == SymbolicOp::Not; node = table_.get(condition)) {
        condition = node->getInput(0);
        isNegated = !isNegated;
    }
    const auto values = [&](SymbolicExprId symbol, const IntegerSet& set) {
        return Values{symbol, isNegated ? set.complement() : set};
    };
    if (isSymbol(condition))
        return values(condition, IntegerSet::allBut(0));
    const SymbolicOp mirrored = operatorInfo(node->op()).mirrored;
    if (mirrored == SymbolicOp::None)
        return std::nullopt;
    const SymbolicExprId left = node->getInput(0);
    const SymbolicExprId right = node->getInput(1);
    const auto compared = [&](SymbolicExprId symbol, SymbolicOp op, SymbolicExprId literal) -> std::optional<Values> {
        const SymbolicExpr* const constant = table_.get(literal);
        if (!isSymbol(symbol) || constant->op() != SymbolicOp::IntValue)
            return std::nullopt;
        return values(symbol, IntegerSet::satisfying(op, static_cast<const SymbolicIntValue&>(*constant).getValue()));
    };
    const auto asWritten = compared(left, node->op(), right);
    return asWritten ? asWritten : compared(right, mirrored, left);
}

std::optional<ValueVerdict> KnownValues::judge(SymbolicExprId condition, std::span<const SymbolicExprId> facts) {
    const std::optional<Values> asked = valuesOf(condition);
    if (!asked)
        return std::nullopt;
    if (asked->symbol != known_.symbol || facts_.size() > facts.size() ||
        !std::equal(facts_.begin(), facts_.end(), facts.begin())) {
        facts_.clear();
        known_ = {asked->symbol, IntegerSet::all()};
    }
    for (const SymbolicExprId fact : facts.subspan(facts_.size())) {
        const std::optional<Values> values = valuesOf(fact);
        if (!values || values->symbol != known_.symbol)
            return std::nullopt;
        known_.set = known_.set.intersect(values->set);
        facts_.push_back(fact);
    }
    return known_.set.empty()                   ? ValueVerdict::Contradiction
           : !known_.set.intersects(asked->set) ? ValueVerdict::Never
           : known_.set.isSubsetOf(asked->set)  ? ValueVerdict::Always
                                                : ValueVerdict::Sometimes;
}

} // namespace VT
