// The service without a customizer: lifetime, texts in both languages, decisions, combinations, queries.
#include "base/service/SymbolRegistry.hpp"
#include "host/Diagnostics.hpp"
#include "tests/service/Customizers.hpp"
#include "tests/support/Cases.hpp"

#include <boost/algorithm/string.hpp>
#include <gtest/gtest.h>
#include <map>
#include <optional>

namespace VT::Testing {
namespace {

TEST(ServiceLifetime, EndsWithItsLastUser) {
    VCService::clean();
    VCService::clean(); // no service is no error
    TestCustomizer customizer;
    const auto serviceLives = [&] { return customizer.releases == 0; };

    VCService::getInstance().setVCCustomizer(&customizer);
    VCService::clean(); // nobody counted
    EXPECT_FALSE(serviceLives());

    customizer.releases = 0;
    std::optional<VCServiceHandle> first(std::in_place);
    std::optional<VCServiceHandle> second(first);
    (*second)->setVCCustomizer(&customizer);
    first.reset();
    EXPECT_TRUE(serviceLives());
    *second = VCServiceHandle(*second);
    EXPECT_TRUE(serviceLives());
    VCService::clean(); // takes the count of the second user
    EXPECT_FALSE(serviceLives());

    // A handle on a service that is gone does not count down a later one.
    customizer.releases = 0;
    const VCServiceHandle later;
    later->setVCCustomizer(&customizer);
    second.reset();
    EXPECT_TRUE(serviceLives());
}

TEST(ServiceLifetime, BeginsWithConstantsAndKeywords) {
    const FreshService service;
    SymbolicExprTable& table = service->table();
    EXPECT_EQ(table.getIdFALSE(), 0U);
    EXPECT_EQ(table.getIdTRUE(), 1U);
    EXPECT_EQ(table.size(), 4U);
    EXPECT_EQ(service->parseC("(sim)"), 2U);
    EXPECT_EQ(service->parseC("(codegen)"), 3U);
    for (const std::string text : {"true", "false", "", "TRUE", "!A"})
        EXPECT_EQ(VCService::isTRUEOrFALSEString(text), text == "true" || text == "false") << text;
}

TEST(ServiceLifetime, ReadsTheCacheFeatureOnce) {
    TestCustomizer customizer; // outlives the service
    const FreshService service(false);
    cacheSymExprSimplifyResultsFeature().setValue(1);
    service->setVCCustomizer(&customizer);
    for (int i = 0; i < 2; ++i)
        service->simplifyFromCCondition("A==1");
    EXPECT_EQ(customizer.rewrites, 2);
}

using Texts = std::vector<std::string>;

std::string textOf(const std::string& text) {
    return text;
}

std::string textOf(const Texts& texts) {
    return texts.empty() ? "none" : boost::algorithm::join(texts, "; ");
}

std::string textOf(const Decision& decision) {
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
        return textOf(std::invoke(function, service, texts));
    else if constexpr (std::is_invocable_v<decltype(function), VCService&, std::string, std::string>)
        return textOf(std::invoke(function, service, texts.at(0), texts.at(1)));
    else if constexpr (std::is_invocable_v<decltype(function), VCService&, std::string, bool, bool>)
        return textOf(std::invoke(function, service, texts.at(0), texts.at(1) == "Quill", texts.at(2) == "Quill"));
    else if constexpr (std::is_invocable_v<decltype(function), VCService&, std::string>)
        return textOf(std::invoke(function, service, texts.at(0)));
    else
        return textOf(std::invoke(function, service, service.parseC(texts.at(0))));
}

#define CALL(name) std::pair(#name, &answer<&VCService::name>)

/// Every call twice, with and without caches.
TEST(ServiceCalls, AnswerTexts) {
    const auto mapOf = [](auto... calls) {
        return std::map<std::string, std::string (*)(VCService&, const Texts&)>{calls...};
    };
    const auto functions =
        mapOf(CALL(computeUniqueAndOperandsFromCCondition), CALL(computeUniqueAndOperandsFromQCondition),
              CALL(computeUniqueOrOperandsFromCCondition), CALL(computeUniqueOrOperandsFromQCondition),
              CALL(containsFromCConditions), CALL(containsFromQConditions), CALL(convertExprBetweenQandC),
              CALL(coversFromCConditions), CALL(coversFromQConditions), CALL(getImpliedCExprFromCConditions),
              CALL(getImpliedQExprFromQConditions), CALL(impliesFromCConditions), CALL(impliesFromQConditions),
              CALL(isDisjointFromCConditions), CALL(isDisjointFromQConditions), CALL(isEquivalentFromCConditions),
              CALL(isEquivalentFromQConditions), CALL(isTighterThanFromCConditions), CALL(isTighterThanFromQConditions),
              CALL(printCExpr), CALL(printCExprNoConversion), CALL(printQExpr), CALL(printQExprWithConversion),
              CALL(shortestCExprFromCCondition), CALL(shortestCExprFromQCondition), CALL(shortestQExprFromCCondition),
              CALL(shortestQExprFromQCondition), CALL(simplifyCExprFromCCondition), CALL(simplifyCExprFromQCondition),
              CALL(simplifyExpressionWithoutEvalChecks), CALL(simplifyQExprFromCCondition),
              CALL(simplifyQExprFromQCondition));
    for (const bool caching : {false, true}) {
        const FreshService service(caching);
        for (const CaseRow& row : casesOf("service.txt", "calls", 3)) {
            SCOPED_TRACE(row[0] + " of " + row[1]);
            Texts texts;
            boost::algorithm::iter_split(texts, row[1], boost::algorithm::first_finder("; "));
            for (int again = 0; again < 2; ++again)
                try {
                    EXPECT_EQ(functions.at(row[0])(*service, texts), row[2]);
                } catch (const HostDiagnostic&) {
                    EXPECT_EQ("refused", row[2]);
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

/// They are undecided once it is used up; that is not remembered.
TEST(ServiceDecisions, ShareABudget) {
    const FreshService service;
    Budget budget(5000);
    service->shareBudget(&budget);
    const auto ask = [&](std::size_t i) {
        const std::string number = std::to_string(i);
        return service->implies(service->parseC("A<B && B<" + number + " || A==C"), service->parseC("A!=D+" + number));
    };
    std::size_t asked = 0;
    for (; budget.left() > 0; ++asked) {
        ASSERT_LT(asked, 5000U);
        const Decision decision = ask(asked);
        EXPECT_TRUE(decision.isNo() || budget.left() == 0);
    }
    EXPECT_GT(asked, 10U);
    EXPECT_TRUE(ask(0).isNo()) << "an answer of before";
    const VCSymbolicExprId a = service->parseC("A<B && B<C");
    const VCSymbolicExprId b = service->parseC("A<C");
    for (const Decision& decision : {ask(asked), service->implies(a, b), Decision(service->covers({a, b}))}) {
        EXPECT_TRUE(decision.isUndecided());
        EXPECT_EQ(decision.bound, DecisionBound::Steps);
    }
    EXPECT_EQ(service->compare(a, b).kind, RelationKind::Undecided);
    EXPECT_FALSE(service->explainImplies(a, b).isProven);
    service->shareBudget(nullptr);
    EXPECT_TRUE(ask(asked).isNo());
    EXPECT_EQ(service->compare(a, b).kind, RelationKind::Implies);
    EXPECT_TRUE(service->explainImplies(a, b).isProven);
}

TEST(ServiceCombinations, OfConstantsAndConditions) {
    for (const CaseRow& row : casesOf("service.txt", "both and either", 6)) {
        SCOPED_TRACE(row[0] + " with " + row[1]);
        const FreshService service;
        const VCSymbolicExprId a = service->parseC(row[0]);
        const VCSymbolicExprId b = service->parseC(row[1]);
        for (const bool simplify : {false, true}) {
            EXPECT_EQ(service->printCExpr(service->AND(a, b, simplify)), row[simplify ? 3 : 2]);
            EXPECT_EQ(service->printCExpr(service->OR(a, b, simplify)), row[simplify ? 5 : 4]);
        }
    }
    const FreshService service;
    for (const CaseRow& row : casesOf("service.txt", "negated", 3))
        for (const bool simplify : {false, true})
            EXPECT_EQ(service->printCExpr(service->NOT(service->parseC(row[0]), simplify)), row[simplify ? 2 : 1])
                << row[0];
}

TEST(ServiceIds, ThatAreNotOfTheTableAreAnswered) {
    const FreshService service;
    const VCSymbolicExprId x = service->parseC("x");
    for (const SymbolicExprId bad : {invalidId, SymbolicExprId{service->table().size()}, invalidId - 1}) {
        for (const bool flag : {false, true}) {
            EXPECT_EQ(service->AND(bad, x, flag), invalidId);
            EXPECT_EQ(service->AND(service->table().getIdFALSE(), bad, flag), invalidId);
            EXPECT_EQ(service->OR(bad, service->table().getIdTRUE(), flag), invalidId);
            EXPECT_EQ(service->OR(x, bad, flag), invalidId);
            EXPECT_EQ(service->NOT(bad, flag), invalidId);
            EXPECT_EQ(service->simplify(bad, flag), invalidId);
        }
        EXPECT_TRUE(service->isEqual(bad, bad));
        EXPECT_FALSE(service->isEqual(bad, x.id()));
        EXPECT_FALSE(service->getBoolean(bad));
        for (const auto print : {&VCService::printQExpr, &VCService::printQExprWithConversion, &VCService::printCExpr,
                                 &VCService::printCExprNoConversion})
            EXPECT_THROW(((*service).*print)(bad), std::out_of_range);
    }
    EXPECT_EQ(VCSymbolicExprId(), invalidId);
    EXPECT_TRUE(x == x.id() && x.id() == x); // as numbers
    EXPECT_FALSE(x != x.id() || x.id() != x);
}

TEST(ServiceAliases, FirstOneStays) {
    const FreshService service;
    service->addParameterAlias("N", "N_1");
    service->addParameterAlias("N", "N_2");
    EXPECT_EQ(service->getParameterAlias("N"), "N_1");
    const SymbolicExprId expression = service->parseC("N*2 + 1");
    EXPECT_EQ(service->symbolRegistry().registerExpression(nullptr, expression), "dim_N_2a2_2b1");
    EXPECT_EQ(service->table().getAliasForSymbolicIdentifier("dim_N_2a2_2b1"), "(N*2+1)");
}

TEST(QuillService, ListsAndReplacesSymbols) {
    const VCServiceHandle service;
    const VCSymbolicExprId condition = service->parseQ("Mode == 1 && f(Gear) > P.x");
    std::vector<std::string> names;
    service->getSymbolsFromExpression(condition, names, VCSymbolType::Identifier);
    service->getSymbolsFromExpression(condition, names, {VCSymbolType::FunctionName, VCSymbolType::UnboundMember});
    EXPECT_EQ(names, (std::vector<std::string>{"Mode", "Gear", "f", "P.x"}));
    std::vector<VCSymbolicExprId> ids;
    service->getSymbolsFromExpression(condition, ids, VCSymbolType::Identifier);
    EXPECT_EQ(ids.size(), 2U);
    EXPECT_THROW(service->getSymbolsFromExpression(condition, names, static_cast<VCSymbolType>(4)), std::out_of_range);
    const auto swapped = service->replaceSymbolsInExpression(condition, {{"Mode", "Gear"}, {"Gear", "Mode"}});
    EXPECT_EQ(service->printQExpr(swapped), "Gear==1 && f(Mode)>P.x");
    const std::size_t nodes = service->table().size();
    EXPECT_EQ(service->replaceSymbolsInExpression(condition, {{"NotThere", "Nowhere"}}), condition);
    EXPECT_EQ(service->table().size(), nodes);
}

} // namespace
} // namespace VT::Testing
