#include "tests/support/oracles/Agreement.hpp"

#include "base/eval/Eval.hpp"
#include "base/print/CTextObstacles.hpp"
#include "base/transform/QuillConversion.hpp"
#include "host/Diagnostics.hpp"

namespace VT::Testing {

namespace {

std::string shown(const Assignment& assignment) {
    std::string all = " under";
    for (const auto& [name, value] : assignment)
        all += " " + name + "=" + std::to_string(value);
    return all;
}

} // namespace

Agreement::Agreement(VCService& library, SymbolicExprId condition, const ConditionWorld& world,
                     std::vector<Assignment> assignments)
    : service_(library),
      table_(library.table()),
      id_(condition),
      world_(world),
      exact_(table_, id_),
      assignments_(std::move(assignments)) {}

/// The words are made only where they are needed: the text of a shared graph may be long.
template <class Words>
void Agreement::demand(bool met, Words words) const {
    if (!met)
        throw Disagreement(text(id_) + ": " + words());
}

/// Both are as true, or as large, wherever the known condition holds.  A number is a dimension, whose quotients are
/// exact.
void Agreement::demandSame(const char* what, SymbolicExprId other, Kept kept, SymbolicExprId known) const {
    demand(table_.has(other), [&] { return std::string(std::string(what) + " is no condition"); });
    const Quotients quotients = kept == Kept::Value ? Quotients::ByContext : Quotients::Truncated;
    const ExactValue value(table_, id_, quotients);
    const ExactValue otherValue(table_, other, quotients);
    const ExactValue knownValue(table_, known);
    const bool isTruth = kept == Kept::Truth || booleanOps.contains(table_.get(id_)->op());
    for (const Assignment& assignment : assignments_) {
        const auto before = value.under(assignment);
        const auto after = otherValue.under(assignment);
        const auto holds = knownValue.under(assignment);
        if (!before || !after || !holds || !holds->holds())
            continue;
        demand(isTruth ? before->holds() == after->holds() : before->real == after->real, [&] {
            return std::string(std::string(what) + " is " + text(other) + ", " + std::to_string(after->real) +
                               " instead of " + std::to_string(before->real) + shown(assignment));
        });
    }
}

/// The decider finds no difference that has an exact value on both sides.
void Agreement::demandEquivalent(SymbolicExprId other) const {
    const Decision same = service_.isEquivalent(id_, other);
    if (const auto assignment = same.isNo() ? assignmentOf(same) : std::nullopt) {
        const auto a = exact_.under(*assignment);
        const bool inexact = exact_.tookRemainder() && !booleanOps.contains(table_.get(id_)->op());
        const auto b = ExactValue(table_, other).under(*assignment);
        demand(!a || !b || inexact || a->holds() == b->holds(),
               [&] { return std::string("differs from " + text(other) + shown(*assignment)); });
    }
}

void Agreement::demandSimplified() const {
    const SymbolicExprId simple = service_.simplify(id_, false).id();
    demandSame("simplified", simple, Kept::Value, table_.getIdTRUE());
    const SymbolicExprId again = service_.simplify(simple, false).id();
    demand(again == simple,
           [&] { return std::string("simplified again is " + text(again) + ", before " + text(simple)); });
    demandEquivalent(simple);
}

void Agreement::demandShortest() const {
    const SymbolicExprId shortest = service_.shortestCondition(id_, false).id();
    demandSame("shortest", shortest, Kept::Value, table_.getIdTRUE());
    // "false" may be the longer word.
    demand(shortest == table_.getIdFALSE() || service_.printCExpr(shortest).size() <= service_.printCExpr(id_).size(),
           [&] { return std::string("shortest is longer: " + text(shortest)); });
}

void Agreement::demandGiven(SymbolicExprId known) const {
    demandSame("given", service_.getImpliedCondition(id_, known).id(), Kept::Truth, known);
}

void Agreement::demandEvaluated() const {
    std::optional<PreparedExpr> prepared;
    try {
        prepared = SymbolicExprEval(table_).prepare(id_);
    } catch (const HostDiagnostic&) {
        return; // calls and the like have no value
    }
    if (prepared->slotCount() == 0)
        return;
    for (const Assignment& assignment : assignments_) {
        const auto value = exact_.under(assignment);
        if (!value)
            continue;
        for (std::size_t slot = 0; slot < prepared->slotCount(); ++slot) {
            const auto bound = assignment.find(text(prepared->symbol(slot)));
            prepared->setInt(slot, bound == assignment.end() ? 0 : static_cast<std::int32_t>(bound->second));
        }
        const SymbolicScalar computed = prepared->run().scalar();
        demand(computed.toDouble() == value->real && (computed.type() == ScalarType::Double) == value->isReal, [&] {
            return std::string("is evaluated to " + std::to_string(computed.toDouble()) + " instead of " +
                               std::to_string(value->real) + shown(assignment));
        });
    }
}

void Agreement::demandDecided(SymbolicExprId known) const {
    const ExactValue knownValue(table_, known);
    const Decision can = service_.canHold(id_);
    const Decision must = service_.mustHold(id_);
    const Relation relation = service_.compare(id_, known);
    for (const Assignment& assignment : assignments_) {
        const auto value = exact_.under(assignment);
        const auto other = knownValue.under(assignment);
        if (!value)
            continue;
        const bool a = value->holds();
        demand(a ? !can.isNo() : !must.isYes(), [&] { return std::string("is decided wrongly" + shown(assignment)); });
        const bool b = other && other->holds();
        demand(!other || !((a && !b && relation.onlyA.isNo()) || (b && !a && relation.onlyB.isNo()) ||
                           (a && b && relation.both.isNo())),
               [&] { return std::string("is compared wrongly with " + text(known) + shown(assignment)); });
    }
    demandWitness(can, exact_, true);
    demandWitness(must, exact_, false);
    demandWitness(relation.onlyA, exact_, true);
    demandWitness(relation.onlyA, knownValue, false);
    demandWitness(relation.onlyB, exact_, false);
    demandWitness(relation.onlyB, knownValue, true);
    demandWitness(relation.both, exact_, true);
    demandWitness(relation.both, knownValue, true);
}

void Agreement::demandReadBack(bool inQuill) const {
    if (!inQuill) {
        if (findCTextObstacles(table_, id_, CTextUse::Program).empty())
            demandSame("C text", service_.parseC(service_.printCExprNoConversion(id_)), Kept::Value,
                       table_.getIdTRUE());
        return;
    }
    if (world_.reals) // Quill writes 2.0 as 2, which is an integer again
        return;
    const std::string quill = service_.printQExprWithConversion(id_);
    demandSame(quill.c_str(), SymbolicExprQ2C(table_)(service_.parseQ(quill)), Kept::Value, table_.getIdTRUE());
}

void Agreement::demandAll(SymbolicExprId known) const {
    demandSimplified();
    demandShortest();
    demandGiven(known);
    demandEvaluated();
    demandDecided(known);
    demandReadBack(false);
    demandReadBack(true);
}

/// The assignment of a witness; nothing where it chooses the value of a call, which is not free here.
std::optional<Assignment> Agreement::assignmentOf(const Decision& decision) const {
    Assignment assignment{{"(sim)", 0}, {"(codegen)", 1}};
    for (const UnknownValue& unknown : decision.witness.value_or(Witness())) {
        if (table_.get(unknown.unknown)->op() != SymbolicOp::String)
            return std::nullopt;
        assignment[text(unknown.unknown)] = unknown.value;
        if (text(unknown.unknown) == "(sim)")
            assignment["(codegen)"] = unknown.value == 0 ? 1 : 0;
    }
    return assignment;
}

void Agreement::demandWitness(const Decision& decision, const ExactValue& of, bool wanted) const {
    const auto assignment = decision.witness ? assignmentOf(decision) : std::nullopt;
    if (const auto value = assignment ? of.under(*assignment) : std::nullopt)
        demand(value->holds() == wanted, [&] { return std::string("a witness is wrong:" + shown(*assignment)); });
}

} // namespace VT::Testing
