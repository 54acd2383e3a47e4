// Names the relation of two conditions from the three answers that determine it.
#include "base/decide/Decision.hpp"

#include <algorithm>

namespace VT {

Relation Relation::of(Decision onlyA, Decision onlyB, Decision both) {
    Relation relation{RelationKind::Undecided, DecisionBound::None, std::move(onlyA), std::move(onlyB),
                      std::move(both)};
    const bool emptyA = relation.onlyA.isNo();
    const bool emptyB = relation.onlyB.isNo();
    if (emptyA && emptyB)
        relation.kind = RelationKind::Equivalent;
    else if (relation.both.isNo() && (relation.onlyA.isYes() || relation.onlyB.isYes()))
        relation.kind = RelationKind::Disjoint;
    else if (relation.both.isYes() && emptyA && relation.onlyB.isYes())
        relation.kind = RelationKind::Implies;
    else if (relation.both.isYes() && emptyB && relation.onlyA.isYes())
        relation.kind = RelationKind::ImpliedBy;
    else if (relation.both.isYes() && relation.onlyA.isYes() && relation.onlyB.isYes())
        relation.kind = RelationKind::Overlaps;
    if (relation.kind == RelationKind::Undecided) {
        const auto undecided = {&relation.onlyA, &relation.onlyB, &relation.both};
        const auto first = std::ranges::find_if(undecided, &Decision::isUndecided);
        if (first != undecided.end())
            relation.bound = (*first)->bound;
    }
    return relation;
}

} // namespace VT
