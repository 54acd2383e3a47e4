#include "base/decide/Decision.hpp"

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
    else
        for (const Decision* each : {&relation.onlyA, &relation.onlyB, &relation.both})
            if (each->isUndecided() && relation.bound == DecisionBound::None)
                relation.bound = each->bound;
    return relation;
}

} // namespace VT
