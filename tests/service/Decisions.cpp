// Decisions through the service: the operations, their texts, and conditions relative to others.
#include "host/Diagnostics.hpp"
#include "tests/service/Customizers.hpp"
#include "tests/support/FlagSetting.hpp"
#include "tests/support/RandomCondition.hpp"
#include "tests/support/Truth.hpp"

#include <array>
#include <gmock/gmock.h>

namespace VT::Testing {
namespace {

std::string told(VCService& service, const Decision& decision) {
    static const char* const answers[] = {"no", "yes", "undecided"};
    const std::string answer = answers[static_cast<std::size_t>(decision.answer)];
    return decision.witness ? answer + ": " + service.printWitness(*decision.witness) : answer;
}

TEST(ServiceDecisions, OfPairs) {
    const std::vector<std::array<std::string, 6>> rows{
        // two conditions; implied, equivalent, disjoint, tighter
        {"A<B && B<C", "A<C", "yes", "no: A=0, B=0, C=1", "no: A=0, B=1, C=2", "yes: A=0, B=0, C=1"},
        {"false", "true", "yes", "no: ", "yes", "yes: "},
        {"", "A", "no: A=0", "no: A=0", "no: A=1", "no: A=0"},
        // Operators that Quill writes as calls.
        {"rem(n,2)==1", "n%2!=0", "yes", "no: n=-1", "no: n=1", "yes: n=-1"},
        {"(sim)", "!(codegen)", "yes", "yes", "no: (codegen)=0, (sim)=1", "no"},
    };
    for (const auto& [a, b, implies, equivalent, disjoint, tighter] : rows) {
        SCOPED_TRACE(a + " with " + b);
        for (const bool caching : {false, true}) {
            const FreshService service(caching);
            VCService& s = VCService::getInstance();
            for (int again = 0; again < 2; ++again) {
                EXPECT_EQ(told(s, s.impliesFromCConditions(a, b)), implies);
                EXPECT_EQ(told(s, s.containsFromCConditions(b, a)), implies);
                EXPECT_EQ(told(s, s.isEquivalentFromCConditions(a, b)), equivalent);
                EXPECT_EQ(told(s, s.isEquivalentFromCConditions(b, a)), equivalent);
                EXPECT_EQ(told(s, s.isDisjointFromCConditions(a, b)), disjoint);
                EXPECT_EQ(told(s, s.isTighterThanFromCConditions(a, b)), tighter);
                const Relation relation = s.compare(s.parseC(a), s.parseC(b));
                EXPECT_EQ(relation.kind == RelationKind::Equivalent, equivalent == "yes");
                EXPECT_EQ(relation.onlyA.isNo(), implies == "yes");
            }
        }
    }
}

TEST(ServiceDecisions, OfQuillTextsAndSets) {
    const FreshService service;
    EXPECT_TRUE(service->impliesFromQConditions("A ~= 1 && A > 0", "A >= 2").isYes());
    EXPECT_TRUE(service->isEquivalentFromQConditions("rem(n,2) == 0", "~rem(n,2)").isYes());
    EXPECT_TRUE(service->isDisjointFromQConditions("A", "~A").isYes());
    EXPECT_TRUE(service->containsFromQConditions("A | B", "B").isYes());
    EXPECT_TRUE(service->isTighterThanFromQConditions("A == 1", "A").isYes());
    EXPECT_TRUE(service->coversFromQConditions({"A < 3", "A == 3", "A > 3"}).isYes());
    const SetDecision gap = service->coversFromCConditions({"A < 3", "A > 3"});
    EXPECT_EQ(told(VCService::getInstance(), gap), "no: A=3");
    const VCSymbolicExprId a = service->parseC("A>1");
    const VCSymbolicExprId b = service->parseC("A<5");
    EXPECT_EQ(service->isDisjoint({a, b}).members, std::pair(std::size_t{0}, std::size_t{1}));
    EXPECT_THROW(service->impliesFromCConditions("A", "B ="), HostDiagnostic);
    EXPECT_THROW(service->coversFromQConditions({"A", "B &&"}), HostDiagnostic);
    for (const SymbolicExprId bad : {invalidId, SymbolicExprId{service->table().size() + 100}}) {
        EXPECT_EQ(service->implies(a, bad).bound, DecisionBound::NoCondition);
        EXPECT_EQ(service->compare(bad, a).bound, DecisionBound::NoCondition);
        EXPECT_EQ(service->covers({a, bad}).bound, DecisionBound::NoCondition);
        EXPECT_EQ(service->getImpliedCondition(bad, a), invalidId);
        EXPECT_TRUE(service->computeUniqueAndOperandsId(bad).empty());
    }
}

TEST(ServiceDecisions, FollowTheKeywordFlagAtTheTimeOfTheCall) {
    const FreshService service;
    const VCSymbolicExprId sim = service->parseC("(sim)");
    const VCSymbolicExprId codegen = service->parseC("(codegen)");
    EXPECT_TRUE(service->isDisjoint(sim, codegen).isYes());
    {
        const FlagSetting off(*VTFEAT_VariantKeywordsSimCodegen, 0);
        EXPECT_TRUE(service->isDisjoint(sim, codegen).isNo());
    }
    EXPECT_TRUE(service->isDisjoint(sim, codegen).isYes());
}

TEST(ServiceSums, OfProducts) {
    using testing::ElementsAre;
    using testing::IsEmpty;
    const FreshService service;
    EXPECT_THAT(service->computeUniqueOrOperandsFromCCondition("c && (b==1 || A<2) || b==1 && c"),
                ElementsAre("A<2 && c", "b==1 && c"));
    EXPECT_THAT(service->computeUniqueAndOperandsFromCCondition("b && A!=1 && b"), ElementsAre("A!=1", "b"));
    EXPECT_THAT(service->computeUniqueAndOperandsFromQCondition("b && A~=1"), ElementsAre("A~=1", "b"));
    EXPECT_THAT(service->computeUniqueOrOperandsFromQCondition("b && A~=1"), ElementsAre("A~=1 && b"));
    EXPECT_THAT(service->computeUniqueOrOperandsFromCCondition("A<1 && A>1"), IsEmpty());
    EXPECT_THAT(service->computeUniqueAndOperandsFromCCondition("A<1 || A>=1"), IsEmpty());
    EXPECT_THAT(service->computeUniqueOrOperandsFromCCondition("true"), ElementsAre(""));
    EXPECT_THAT(service->computeUniqueAndOperandsFromCCondition("false"), ElementsAre("false"));
}

TEST(ImpliedConditions, AreShortest) {
    const std::vector<std::array<std::string, 3>> rows{
        // a condition, what is known, what is left
        {"A", "A>3", ""},
        {"B", "A && !A", ""},
        {"A && (B || C)", "A && !C", "B"},
        {"A==1 || A==2 || A==3", "A>0", "A<=3"},
        {"(A || B) && (A || C)", "!A || B", "A || B && C"},
        {"A>0 && B>0 && C>0", "A>2 && B==C", "B>0"},
        {"A<B && B<C && A<C", "B<D", "A<B && B<C"},
        {"A", "B", "A"},
        {"A==1 || B", "true", "A==1 || B"},
        {"A*B>3 && A*B>2", "C", "A*B>3"},
    };
    const FreshService service;
    for (const auto& [condition, known, result] : rows)
        EXPECT_EQ(service->getImpliedCExprFromCConditions(condition, known), result) << condition << " given " << known;
    EXPECT_EQ(service->getImpliedQExprFromQConditions("A ~= 1 && B", "B | C & B"), "A~=1");
    EXPECT_THROW(service->getImpliedCExprFromCConditions("A &&", "B"), HostDiagnostic);
}

TEST(ImpliedConditions, EqualTheGivenOneWhereTheKnownOneHolds) {
    std::mt19937_64 random(30);
    const ConditionShape shape{.symbols = {"A", "B"}, .symbolPairs = true, .truthValues = true};
    std::size_t shorter = 0;
    for (int round = 0; round < 400; ++round) {
        const FreshService service;
        const std::string condition = randomCondition(random, 1 + random() % 6, shape);
        const std::string known = randomCondition(random, 1 + random() % 3, shape);
        const VCSymbolicExprId given = service->parseC(condition);
        const VCSymbolicExprId context = service->parseC(known);
        const VCSymbolicExprId result = service->getImpliedCondition(given, context);
        const std::string text = service->printCExpr(result);
        if (result != service->table().getIdFALSE()) {
            ASSERT_LE(text.size(), service->printCExpr(given).size());
            ASSERT_LE(service->printQExpr(result).size(), service->printQExpr(given).size());
        }
        shorter += text.size() < service->printCExpr(given).size() ? 1U : 0U;
        forEachAssignment(shape.symbols, -5, 6, [&](const Assignment& assignment) {
            if (!holds(service->table(), context.id(), assignment))
                return;
            ASSERT_EQ(holds(service->table(), result.id(), assignment), holds(service->table(), given.id(), assignment))
                << condition << " given " << known << " became " << text;
        });
    }
    EXPECT_GT(shorter, 200U);
}

TEST(ImpliedConditions, OfManyOperandsLoseWhatTheKnownOneDecides) {
    const FreshService service;
    for (const std::size_t operands : {260U, 600U, 1000U}) {
        std::string kept;
        for (std::size_t i = 0; i + 3 < operands; ++i)
            kept += (i == 0 ? "S" : " && S") + std::to_string(i) + (i % 2 == 0 ? "" : ">=0");
        const std::string condition = "S7>2 && " + kept + " && K && (X || Y || Z)";
        const std::string known = "K && S7>4 && (X || Y)";
        std::string left = kept;
        left.replace(left.find(" && S7>=0"), 9, "");
        EXPECT_EQ(service->getImpliedCExprFromCConditions(condition, known), left);
        EXPECT_EQ(service->getImpliedCExprFromCConditions(condition, condition), "");
    }
}

TEST(ImpliedConditions, AreMeasuredInTheirLanguage) {
    std::mt19937_64 random(33);
    const FreshService service;
    const auto term = [&] {
        const char* const terms[] = {"bitand(F,4)", "rem(n,2)", "idivide(a,b)", "bitshift(F,1)", "A", "B"};
        const char* const operators[] = {"==", "~=", "<", ">="};
        return std::string(terms[random() % 6]) + operators[random() % 4] + std::to_string(random() % 4);
    };
    for (int round = 0; round < 300; ++round) {
        const char* const joints[] = {" && ", " || "};
        const std::string condition =
            "(" + term() + joints[random() % 2] + term() + ")" + joints[random() % 2] + term();
        const VCSymbolicExprId given = service->parseQ(condition);
        for (const std::string& known : {term(), std::string("true")}) {
            const VCSymbolicExprId result = service->getImpliedCondition(given, service->parseQ(known), true);
            if (result == service->table().getIdFALSE())
                continue;
            ASSERT_LE(service->printQExpr(result).size(), service->printQExpr(given).size())
                << condition << " given " << known;
        }
    }
}

} // namespace
} // namespace VT::Testing
