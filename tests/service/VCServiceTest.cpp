// The service without a customizer: lifetime, texts in both languages, combinations, queries.
#include "host/Diagnostics.hpp"
#include "tests/service/Customizers.hpp"
#include "tests/support/Cases.hpp"

#include <gtest/gtest.h>
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

TEST(ServiceTexts, AreReadAndPrinted) {
    const FreshService service;
    for (const CaseRow& row : casesOf("service.txt", "texts", 5)) {
        const std::string& text = row[0];
        SCOPED_TRACE(text);
        EXPECT_EQ(service->convertExprBetweenQandC(text, false, false), row[1]);
        EXPECT_EQ(service->convertExprBetweenQandC(text, false, true), row[2]);
        for (int again = 0; again < 2; ++again) {
            EXPECT_EQ(service->simplifyCExprFromCCondition(text), row[3]);
            EXPECT_EQ(service->simplifyQExprFromCCondition(text), row[4]);
        }
        EXPECT_EQ(service->simplifyExpressionWithoutEvalChecks(text, false, true), row[4]);
        EXPECT_EQ(service->getBoolean(service->simplifyFromCCondition(text).id()), row[3].empty());
        EXPECT_EQ(VCService::isTRUEOrFALSEString(text), text == "true" || text == "false");
    }
}

TEST(ServiceTexts, ThatAreNoConditionAreRefused) {
    const FreshService service;
    const std::size_t nodes = service->table().size();
    for (const CaseRow& row : casesOf("service.txt", "refused", 2)) {
        const std::string& text = row[1];
        SCOPED_TRACE(text);
        if (row[0] == "Quill") {
            EXPECT_THROW(service->parseQ(text), HostDiagnostic);
            continue;
        }
        EXPECT_THROW(service->parseC(text), HostDiagnostic);
        EXPECT_THROW(service->simplifyFromCCondition(text), HostDiagnostic);
        EXPECT_THROW(service->simplifyCExprFromCCondition(text), HostDiagnostic);
        EXPECT_THROW(service->convertExprBetweenQandC(text, false, true), HostDiagnostic);
    }
    EXPECT_EQ(service->table().size(), nodes);
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
        EXPECT_THROW(service->printQExpr(bad), std::out_of_range);
        EXPECT_THROW(service->printQExprWithConversion(bad), std::out_of_range);
        EXPECT_THROW(service->printCExpr(bad), std::out_of_range);
        EXPECT_THROW(service->printCExprNoConversion(bad), std::out_of_range);
    }
    EXPECT_EQ(VCSymbolicExprId(), invalidId);
    EXPECT_TRUE(x == x.id() && x.id() == x); // as numbers
    EXPECT_FALSE(x != x.id() || x.id() != x);
}

TEST(ServiceAliases, FirstOneStays) {
    const FreshService service;
    EXPECT_EQ(service->getParameterAlias("N"), "");
    service->addParameterAlias("N", "N_1");
    service->addParameterAlias("N", "N_2");
    EXPECT_EQ(service->getParameterAlias("N"), "N_1");
    EXPECT_EQ(service->getParameterAlias("n"), "");
    service->addParameterAlias("M", "-5");
    EXPECT_EQ(service->getParameterAlias("M"), "(-5)");
    EXPECT_EQ(service->printCExpr(service->parseC("N")), "N");
}

TEST(QuillService, ReadsConstants) {
    const VCServiceHandle service;
    for (const char* const constant : {"", "true"})
        EXPECT_EQ(service->parseQ(constant), service->table().getIdTRUE());
    EXPECT_EQ(service->parseQ("false"), service->table().getIdFALSE());
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
