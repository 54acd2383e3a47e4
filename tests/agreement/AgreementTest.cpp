// All parts of the library agree on what a condition means: the simplifier, the shortener, the evaluator, the decider
// and the printers, each judged by one oracle, over conditions in which anything may stand anywhere.
#include "base/VCService.hpp"
#include "base/eval/Eval.hpp"
#include "base/print/CTextObstacles.hpp"
#include "base/transform/QuillConversion.hpp"
#include "host/Diagnostics.hpp"
#include "tests/support/Parsing.hpp"
#include "tests/support/generators/AnyCondition.hpp"
#include "tests/support/generators/AnyNode.hpp"
#include "tests/support/oracles/ExactValue.hpp"

#include <gtest/gtest.h>

#include <cstdlib>

namespace VT::Testing {
namespace {

using Op = SymbolicOp;

/// Conditions of the random test; VTSYM_AGREEMENT_CONDITIONS asks for another number.
std::size_t conditionsAsked() {
    const char* asked = std::getenv("VTSYM_AGREEMENT_CONDITIONS");
    return asked != nullptr ? std::strtoul(asked, nullptr, 10) : 3000;
}

/// One condition, what the library makes of it, and the assignments under which all of that has an exact value.
class Case {
public:
    Case(VCService& library, SymbolicExprId condition, const ConditionWorld& ofWorld, std::mt19937_64& random)
        : service(library),
          table(library.table()),
          id(condition),
          world(ofWorld),
          exact(table, id) {
        for (int i = 0; i < 40; ++i)
            assignments.push_back(anyAssignment(random, world));
    }

    [[nodiscard]] std::string text(SymbolicExprId of) const { return service.printCExprNoConversion(of); }

    enum class Kept : bool { Truth, Value };

    /// Both are as true, or as large, wherever the known condition holds.  A number is a dimension, whose quotients are
    /// exact.
    void expectSame(const char* what, SymbolicExprId other, Kept kept, SymbolicExprId known) const {
        SCOPED_TRACE(std::string(what) + ": " + text(other) + " instead of " + text(id));
        ASSERT_TRUE(table.has(other));
        const Quotients quotients = kept == Kept::Value ? Quotients::ByContext : Quotients::Truncated;
        const ExactValue value(table, id, quotients);
        const ExactValue otherValue(table, other, quotients);
        const ExactValue knownValue(table, known);
        const bool isTruth = kept == Kept::Truth || booleanOps.contains(table.get(id)->op());
        for (const Assignment& assignment : assignments) {
            const auto before = value.under(assignment);
            const auto after = otherValue.under(assignment);
            const auto holds = knownValue.under(assignment);
            if (!before || !after || !holds || !holds->holds())
                continue;
            if (isTruth ? before->holds() != after->holds() : before->real != after->real)
                FAIL() << before->real << " became " << after->real << describe(assignment);
        }
    }

    /// The evaluator computes the exact value.
    void expectEvaluated() const {
        PreparedExpr prepared = [&] {
            try {
                return SymbolicExprEval(table).prepare(id);
            } catch (const VT::HostDiagnostic&) {
                return SymbolicExprEval(table).prepare(table.getIdTRUE()); // calls and the like have no value
            }
        }();
        for (const Assignment& assignment : assignments) {
            const auto value = exact.under(assignment);
            if (!value || prepared.slotCount() == 0)
                continue;
            for (std::size_t slot = 0; slot < prepared.slotCount(); ++slot) {
                const auto bound = assignment.find(text(prepared.symbol(slot)));
                prepared.setInt(slot, bound == assignment.end() ? 0 : static_cast<std::int32_t>(bound->second));
            }
            const SymbolicScalar computed = prepared.run().scalar();
            ASSERT_EQ(computed.toDouble(), value->real) << text(id) << describe(assignment);
            ASSERT_EQ(computed.type() == ScalarType::Double, value->isReal) << text(id);
        }
    }

    /// What the decider proves of the condition, alone and beside the known one, no assignment refutes.
    void expectDecided(SymbolicExprId known) const {
        const ExactValue knownValue(table, known);
        const Decision can = service.canHold(id);
        const Decision must = service.mustHold(id);
        const Relation relation = service.compare(id, known);
        for (const Assignment& assignment : assignments) {
            const auto value = exact.under(assignment);
            const auto other = knownValue.under(assignment);
            if (!value)
                continue;
            const bool a = value->holds();
            ASSERT_FALSE(a ? can.isNo() : must.isYes()) << describe(assignment);
            if (other) {
                const bool b = other->holds();
                ASSERT_FALSE((a && !b && relation.onlyA.isNo()) || (b && !a && relation.onlyB.isNo()) ||
                             (a && b && relation.both.isNo()))
                    << text(known) << describe(assignment);
            }
        }
        expectWitness(can, exact, true);
        expectWitness(must, exact, false);
        expectWitness(relation.onlyA, exact, true);
        expectWitness(relation.onlyA, knownValue, false);
        expectWitness(relation.onlyB, exact, false);
        expectWitness(relation.onlyB, knownValue, true);
        expectWitness(relation.both, exact, true);
        expectWitness(relation.both, knownValue, true);
    }

    /// The decider finds no difference that has an exact value on both sides.
    void expectEquivalent(SymbolicExprId other) const {
        const Decision same = service.isEquivalent(id, other);
        if (const auto assignment = same.isNo() ? assignmentOf(same) : std::nullopt) {
            const auto a = exact.under(*assignment);
            const bool inexact = exact.tookRemainder() && !booleanOps.contains(table.get(id)->op());
            const auto b = ExactValue(table, other).under(*assignment);
            ASSERT_TRUE(!a || !b || inexact || a->holds() == b->holds()) << text(other) << describe(*assignment);
        }
    }

    /// What is printed in a language and has no obstacle there is read back with the same meaning.
    void expectReadBack() const {
        if (findCTextObstacles(table, id, CTextUse::Program).empty())
            expectSame("C text", service.parseC(service.printCExprNoConversion(id)), Kept::Value, table.getIdTRUE());
        if (world.reals) // Quill writes 2.0 as 2, which is an integer again
            return;
        const std::string quill = service.printQExprWithConversion(id);
        expectSame(quill.c_str(), SymbolicExprQ2C(table)(service.parseQ(quill)), Kept::Value, table.getIdTRUE());
    }

    void expectAgreement(SymbolicExprId known) const {
        SCOPED_TRACE(text(id));
        const SymbolicExprId simple = service.simplify(id, false).id();
        expectSame("simplified", simple, Kept::Value, table.getIdTRUE());
        ASSERT_EQ(service.simplify(simple, false).id(), simple) << text(id);
        expectEquivalent(simple);
        const SymbolicExprId shortest = service.shortestCondition(id, false).id();
        expectSame("shortest", shortest, Kept::Value, table.getIdTRUE());
        if (shortest != table.getIdFALSE()) { // which may be the longer word
            ASSERT_LE(service.printCExpr(shortest).size(), service.printCExpr(id).size()) << text(shortest);
        }
        expectSame("given", service.getImpliedCondition(id, known).id(), Kept::Truth, known);
        expectEvaluated();
        expectDecided(known);
        expectReadBack();
    }

    VCService& service;
    SymbolicExprTable& table;
    SymbolicExprId id;
    const ConditionWorld& world;
    ExactValue exact;
    std::vector<Assignment> assignments;

private:
    /// The assignment of a witness; nothing where it chooses the value of a call, which is not free here.
    [[nodiscard]] std::optional<Assignment> assignmentOf(const Decision& decision) const {
        Assignment assignment{{"(sim)", 0}, {"(codegen)", 1}};
        for (const UnknownValue& unknown : decision.witness.value_or(Witness())) {
            if (table.get(unknown.unknown)->op() != Op::String)
                return std::nullopt;
            assignment[text(unknown.unknown)] = unknown.value;
            if (text(unknown.unknown) == "(sim)")
                assignment["(codegen)"] = unknown.value == 0 ? 1 : 0;
        }
        return assignment;
    }

    void expectWitness(const Decision& decision, const ExactValue& of, bool wanted) const {
        const auto assignment = decision.witness ? assignmentOf(decision) : std::nullopt;
        if (const auto value = assignment ? of.under(*assignment) : std::nullopt) {
            ASSERT_EQ(value->holds(), wanted) << text(id) << " has no witness" << describe(*assignment);
        }
    }

    [[nodiscard]] std::string describe(const Assignment& assignment) const {
        std::string all = " under";
        for (const auto& [name, value] : assignment)
            all += " " + name + "=" + std::to_string(value);
        return all;
    }
};

/// Every operator as each operand of every other, the rest of the operands from a small stock, as a number, as a truth
/// and compared.
TEST(Agreement, OnEveryOperatorInEveryOperandOfEveryOther) {
    const VCServiceHandle service;
    SymbolicExprTable& table = service->table();
    const Trees tree{table};
    ConditionWorld world{{"m", "Z"}};
    std::mt19937_64 random(31);
    const auto fill = [&](Op op, std::size_t position, SymbolicExprId id) {
        const SymbolicExprId other = anyLeaf(table, random, world);
        return operandCount(op) == 1 ? tree(op, id) : position == 0 ? tree(op, id, other) : tree(op, other, id);
    };
    for (const Op op : valueOperators())
        ASSERT_TRUE(computed(op, 6, 3)) << "the oracle does not know " << operatorInfo(op).name;
    for (const Op outer : valueOperators())
        for (const Op inner : valueOperators())
            for (std::size_t position = 0; position < operandCount(outer); ++position)
                for (int round = 0; round < 3; ++round) {
                    world.reals = random() % 2 == 0;
                    const SymbolicExprId part = fill(inner, random() % 2, anyLeaf(table, random, world));
                    SymbolicExprId id = fill(outer, position, part);
                    if (round > 0)
                        id = tree(round == 1 ? Op::Equal : Op::And, id, anyLeaf(table, random, world));
                    service->setSolver(random() % 50 == 0); // which takes longer than everything else
                    Case(*service, id, world, random).expectAgreement(table.getIdTRUE());
                    ASSERT_FALSE(HasFatalFailure());
                }
}

TEST(Agreement, OnRandomGraphs) {
    const std::size_t conditions = conditionsAsked();
    for (std::size_t done = 0; done < conditions;) {
        const VCServiceHandle service; // a fresh one now and then
        for (int i = 0; i < 200 && done < conditions; ++i, ++done) {
            std::mt19937_64 random(done);
            const ConditionWorld world{.reals = done % 2 == 0, .calls = done % 3 == 0};
            const SymbolicExprId id = anyCondition(service->table(), random, 1 + done % 14, world);
            const SymbolicExprId known = anyCondition(service->table(), random, 1 + done % 4, world);
            service->setSolver(done % 50 == 0);
            Case(*service, id, world, random).expectAgreement(known);
            ASSERT_FALSE(HasFatalFailure()) << "seed " << done;
        }
    }
}

} // namespace
} // namespace VT::Testing
