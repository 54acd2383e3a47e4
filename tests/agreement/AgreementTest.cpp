// All parts of the library agree on what a condition means: the simplifier, the shortener, the evaluator, the decider
// and the printers, each judged by one oracle, over conditions in which anything may stand anywhere.
#include "tests/support/oracles/Agreement.hpp"
#include "tests/support/generators/AnyNode.hpp"

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

/// Holds a condition against everything; `seed` is what makes it again.
void expectAgreement(VCService& service, SymbolicExprId id, SymbolicExprId known, const ConditionWorld& world,
                     std::mt19937_64& random, std::size_t seed) {
    std::vector<Assignment> assignments;
    for (int i = 0; i < 40; ++i)
        assignments.push_back(anyAssignment(random, world));
    try {
        Agreement(service, id, world, assignments).demandAll(known);
    } catch (const Disagreement& disagreement) {
        FAIL() << disagreement.what() << "; seed " << seed;
    }
}

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
                    expectAgreement(*service, id, table.getIdTRUE(), world, random, 31);
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
            expectAgreement(*service, id, known, world, random, done);
            ASSERT_FALSE(HasFatalFailure());
        }
    }
}

} // namespace
} // namespace VT::Testing
