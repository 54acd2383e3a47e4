// Decisions through the service: the operations, their texts, and conditions relative to others.
#include "host/Diagnostics.hpp"
#include "tests/service/Customizers.hpp"

#include <array>
#include <gmock/gmock.h>
#include <random>

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
        {"A<B && B<C && A<C", "B<D", "A<B && B<C"},
        {"A==1 || B", "true", "A==1 || B"},
        {"A*B>3 && A*B>2", "C", "A*B>3"},
    };
    const FreshService service;
    for (const auto& [condition, known, result] : rows)
        EXPECT_EQ(service->getImpliedCExprFromCConditions(condition, known), result) << condition << " given " << known;
    EXPECT_EQ(service->getImpliedQExprFromQConditions("A ~= 1 && B", "B | C & B"), "A~=1");
    EXPECT_THROW(service->getImpliedCExprFromCConditions("A &&", "B"), HostDiagnostic);
}

TEST(ImpliedConditions, AreNoLongerThanTheGivenOneInTheirLanguage) {
    std::mt19937_64 random(30);
    const FreshService service;
    const auto term = [&] {
        const char* const terms[] = {"bitand(F,4)", "rem(n,2)", "idivide(a,b)", "bitshift(F,1)", "A", "B"};
        const char* const operators[] = {"==", "~=", "<", ">="};
        return std::string(terms[random() % 6]) + operators[random() % 4] + std::to_string(random() % 4);
    };
    std::size_t shorter = 0;
    for (int round = 0; round < 600; ++round) {
        const bool isQuill = round % 2 == 0;
        const char* const joints[] = {" && ", " || "};
        const VCSymbolicExprId given =
            service->parseQ("(" + term() + joints[random() % 2] + term() + ")" + joints[random() % 2] + term());
        const auto print = [&](const VCSymbolicExprId& id) {
            return isQuill ? service->printQExpr(id) : service->printCExpr(id);
        };
        for (const std::string& known : {term(), std::string("true")}) {
            const VCSymbolicExprId result = service->getImpliedCondition(given, service->parseQ(known), isQuill);
            shorter += print(result).size() < print(given).size() ? 1U : 0U;
            if (result != service->table().getIdFALSE()) {
                ASSERT_LE(print(result).size(), print(given).size()) << print(given) << " given " << known;
            }
        }
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

} // namespace
} // namespace VT::Testing
