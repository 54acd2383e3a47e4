// Decisions through the service: the operations, their texts, and conditions relative to others.
#include "host/Diagnostics.hpp"
#include "tests/service/Customizers.hpp"
#include "tests/support/Cases.hpp"

#include <boost/algorithm/string.hpp>
#include <gtest/gtest.h>
#include <map>
#include <random>

namespace VT::Testing {
namespace {

using Texts = std::vector<std::string>;

std::string told(const std::string& text) {
    return text;
}

std::string told(const Texts& texts) {
    return texts.empty() ? "none" : boost::algorithm::join(texts, "; ");
}

std::string told(const Decision& decision) {
    static const char* const answers[] = {"no", "yes", "undecided"};
    const std::string answer = answers[static_cast<std::size_t>(decision.answer)];
    if (!decision.witness)
        return answer;
    const std::string witness = VCService::getInstance().printWitness(*decision.witness);
    return answer + (witness.empty() ? ":" : ": ") + witness;
}

/// What a function of the service answers to texts.
template <auto function>
std::string answer(VCService& service, const Texts& texts) {
    if constexpr (std::is_invocable_v<decltype(function), VCService&, Texts>)
        return told(std::invoke(function, service, texts));
    else if constexpr (std::is_invocable_v<decltype(function), VCService&, std::string, std::string>)
        return told(std::invoke(function, service, texts.at(0), texts.at(1)));
    else if constexpr (std::is_invocable_v<decltype(function), VCService&, std::string, bool, bool>)
        return told(std::invoke(function, service, texts.at(0), texts.at(1) == "Quill", texts.at(2) == "Quill"));
    else if constexpr (std::is_invocable_v<decltype(function), VCService&, std::string>)
        return told(std::invoke(function, service, texts.at(0)));
    else
        return told(std::invoke(function, service, service.parseC(texts.at(0))));
}

TEST(ServiceCalls, AnswerTexts) {
    using S = VCService;
    const std::map<std::string, std::string (*)(VCService&, const Texts&)> functions{
        {"computeUniqueAndOperandsFromCCondition", answer<&S::computeUniqueAndOperandsFromCCondition>},
        {"computeUniqueAndOperandsFromQCondition", answer<&S::computeUniqueAndOperandsFromQCondition>},
        {"computeUniqueOrOperandsFromCCondition", answer<&S::computeUniqueOrOperandsFromCCondition>},
        {"computeUniqueOrOperandsFromQCondition", answer<&S::computeUniqueOrOperandsFromQCondition>},
        {"containsFromQConditions", answer<&S::containsFromQConditions>},
        {"convertExprBetweenQandC", answer<&S::convertExprBetweenQandC>},
        {"coversFromCConditions", answer<&S::coversFromCConditions>},
        {"coversFromQConditions", answer<&S::coversFromQConditions>},
        {"getImpliedCExprFromCConditions", answer<&S::getImpliedCExprFromCConditions>},
        {"getImpliedQExprFromQConditions", answer<&S::getImpliedQExprFromQConditions>},
        {"impliesFromCConditions", answer<&S::impliesFromCConditions>},
        {"impliesFromQConditions", answer<&S::impliesFromQConditions>},
        {"isDisjointFromQConditions", answer<&S::isDisjointFromQConditions>},
        {"isEquivalentFromQConditions", answer<&S::isEquivalentFromQConditions>},
        {"isTighterThanFromQConditions", answer<&S::isTighterThanFromQConditions>},
        {"printCExpr", answer<&S::printCExpr>},
        {"printCExprNoConversion", answer<&S::printCExprNoConversion>},
        {"printQExpr", answer<&S::printQExpr>},
        {"printQExprWithConversion", answer<&S::printQExprWithConversion>},
        {"shortestCExprFromCCondition", answer<&S::shortestCExprFromCCondition>},
        {"shortestCExprFromQCondition", answer<&S::shortestCExprFromQCondition>},
        {"shortestQExprFromCCondition", answer<&S::shortestQExprFromCCondition>},
        {"shortestQExprFromQCondition", answer<&S::shortestQExprFromQCondition>},
        {"simplifyCExprFromQCondition", answer<&S::simplifyCExprFromQCondition>},
        {"simplifyExpressionWithoutEvalChecks", answer<&S::simplifyExpressionWithoutEvalChecks>},
        {"simplifyQExprFromQCondition", answer<&S::simplifyQExprFromQCondition>},
    };
    const FreshService service;
    for (const CaseRow& row : casesOf("service.txt", "calls", 3)) {
        SCOPED_TRACE(row[0] + " of " + row[1]);
        Texts texts;
        boost::algorithm::iter_split(texts, row[1], boost::algorithm::first_finder("; "));
        try {
            EXPECT_EQ(functions.at(row[0])(*service, texts), row[2]);
        } catch (const HostDiagnostic&) {
            EXPECT_EQ("refused", row[2]);
        }
    }
}

TEST(ServiceDecisions, OfPairs) {
    for (const CaseRow& row : casesOf("service.txt", "pairs", 6)) {
        const std::string &a = row[0], &b = row[1];
        SCOPED_TRACE(a + " with " + b);
        for (const bool caching : {false, true}) {
            const FreshService service(caching);
            VCService& s = VCService::getInstance();
            for (int again = 0; again < 2; ++again) {
                EXPECT_EQ(told(s.impliesFromCConditions(a, b)), row[2]);
                EXPECT_EQ(told(s.containsFromCConditions(b, a)), row[2]);
                EXPECT_EQ(told(s.isEquivalentFromCConditions(a, b)), row[3]);
                EXPECT_EQ(told(s.isEquivalentFromCConditions(b, a)), row[3]);
                EXPECT_EQ(told(s.isDisjointFromCConditions(a, b)), row[4]);
                EXPECT_EQ(told(s.isTighterThanFromCConditions(a, b)), row[5]);
                const Relation relation = s.compare(s.parseC(a), s.parseC(b));
                EXPECT_EQ(relation.kind == RelationKind::Equivalent, row[3] == "yes");
                EXPECT_EQ(relation.onlyA.isNo(), row[2] == "yes");
            }
        }
    }
}

TEST(ServiceDecisions, OfSetsAndOfWhatIsNoCondition) {
    const FreshService service;
    const VCSymbolicExprId a = service->parseC("A>1");
    const VCSymbolicExprId b = service->parseC("A<5");
    EXPECT_EQ(service->isDisjoint({a, b}).members, std::pair(std::size_t{0}, std::size_t{1}));
    for (const SymbolicExprId bad : {invalidId, SymbolicExprId{service->table().size() + 100}}) {
        EXPECT_EQ(service->implies(a, bad).bound, DecisionBound::NoCondition);
        EXPECT_EQ(service->compare(bad, a).bound, DecisionBound::NoCondition);
        EXPECT_EQ(service->covers({a, bad}).bound, DecisionBound::NoCondition);
        EXPECT_EQ(service->getImpliedCondition(bad, a), invalidId);
        EXPECT_TRUE(service->computeUniqueAndOperandsId(bad).empty());
    }
}

TEST(ImpliedConditions, AreShortest) {
    const FreshService service;
    for (const CaseRow& row : casesOf("service.txt", "implied", 3))
        EXPECT_EQ(service->getImpliedCExprFromCConditions(row[0], row[1]), row[2]) << row[0] << " given " << row[1];
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
