// The service without a customizer: lifetime, texts in both languages, combinations, queries.
#include "base/VCService.hpp"
#include "base/service/TruthTexts.hpp"
#include "base/simplify/Simplify.hpp"
#include "base/variants/VariantKeywords.hpp"
#include "host/Diagnostics.hpp"
#include "tests/service/Customizers.hpp"

#include <array>
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
    const std::vector<std::array<std::string, 5>> rows{
        // a text, in C and in Quill, simplified in C and in Quill
        {"", "", "", "", ""},
        {"A==1&&A==2", "A==1 && A==2", "A==1 && A==2", "false", "false"},
        {"!(A<3)", "!(A<3)", "~(A<3)", "A>=3", "A>=3"},
        {"F & 4 || x >> 2", "F&4 || x>>2", "bitand(F,4) || bitshift(x,-2)", "F&4 || x>>2",
         "bitand(F,4) || bitshift(x,-2)"},
        {"(sim) && (codegen)", "(sim) && (codegen)", "(sim) && (codegen)", "false", "false"},
    };
    const FreshService service;
    for (const auto& [text, c, quill, simpleC, simpleQuill] : rows) {
        SCOPED_TRACE(text);
        EXPECT_EQ(service->convertExprBetweenQandC(text, false, false), c);
        EXPECT_EQ(service->convertExprBetweenQandC(text, false, true), quill);
        for (int again = 0; again < 2; ++again) {
            EXPECT_EQ(service->simplifyCExprFromCCondition(text), simpleC);
            EXPECT_EQ(service->simplifyQExprFromCCondition(text), simpleQuill);
        }
        EXPECT_EQ(service->simplifyExpressionWithoutEvalChecks(text, false, true), simpleQuill);
        EXPECT_EQ(service->getBoolean(service->simplifyFromCCondition(text).id()), simpleC.empty());
        EXPECT_EQ(VCService::isTRUEOrFALSEString(text), text == "true" || text == "false");
    }
}

TEST(ServiceTexts, PrintTheTreeAsItStandsUnlessAskedToConvert) {
    const FreshService service;
    const VCSymbolicExprId quotient = service->parseC("a/b == bitand(c,4)");
    EXPECT_EQ(service->printQExpr(quotient), "a/b==bitand(c,4)");
    EXPECT_EQ(service->printQExprWithConversion(quotient), "idivide(a,b)==bitand(c,4)");
    EXPECT_EQ(service->printCExprNoConversion(quotient), "a/b==bitand(c,4)");
    EXPECT_EQ(service->printCExpr(quotient), "a/b==(c&4)");
    EXPECT_EQ(service->simplifyExpressionWithoutEvalChecks("bitand(c,4)", false, false), "bitand(c,4)");
}

TEST(ServiceTexts, ThatAreNoConditionAreRefused) {
    const FreshService service;
    const std::size_t nodes = service->table().size();
    for (const char* text : {"a b", " ", "a ==", "1e5", "2147483648", "(sim", "a && \x80"}) {
        SCOPED_TRACE(text);
        EXPECT_THROW(service->parseC(text), HostDiagnostic);
        EXPECT_THROW(service->simplifyFromCCondition(text), HostDiagnostic);
        EXPECT_THROW(service->simplifyCExprFromCCondition(text), HostDiagnostic);
        EXPECT_THROW(service->convertExprBetweenQandC(text, false, true), HostDiagnostic);
    }
    for (const char* text : {"A == ", "A = 1", "1 +", "c{2}", "'text'"})
        EXPECT_THROW(service->parseQ(text), HostDiagnostic) << text;
    EXPECT_EQ(service->table().size(), nodes);
}

TEST(ServiceCombinations, OfConstantsAndConditions) {
    const std::vector<std::array<std::string, 6>> rows{
        // two conditions; both of them, not simplified and simplified; either of them
        {"true", "false", "false", "false", "", ""},
        {"false", "false", "false", "false", "false", "false"},
        {"true", "!(x<1)", "!(x<1)", "x>=1", "", ""},
        {"false", "!(x<1)", "false", "false", "!(x<1)", "x>=1"},
        {"!(x<1)", "false", "false", "false", "!(x<1)", "x>=1"},
        {"x<3", "x>3", "x<3 && x>3", "false", "x<3 || x>3", "x!=3"},
        {"y", "x", "y && x", "x && y", "y || x", "x || y"},
    };
    for (const auto& [textA, textB, both, simpleBoth, either, simpleEither] : rows) {
        SCOPED_TRACE(textA + " with " + textB);
        const FreshService service;
        const VCSymbolicExprId a = service->parseC(textA);
        const VCSymbolicExprId b = service->parseC(textB);
        EXPECT_EQ(service->printCExpr(service->AND(a, b, false)), both);
        EXPECT_EQ(service->printCExpr(service->AND(a, b, true)), simpleBoth);
        EXPECT_EQ(service->printCExpr(service->OR(a, b, false)), either);
        EXPECT_EQ(service->printCExpr(service->OR(a, b, true)), simpleEither);
    }
}

TEST(ServiceCombinations, NegateAtOnceOrInFull) {
    const FreshService service;
    for (const auto& [text, negated, simplified] : std::initializer_list<std::array<const char*, 3>>{
             {"true", "false", "false"},
             {"false", "", ""},
             {"!(x==1)", "!(!(x==1))", "x==1"},
             {"!x", "!(!x)", "!(!x)"}, // a truth value, which x need not be
             {"x==1 && y>2", "!(x==1 && y>2)", "x!=1 || y<=2"}}) {
        EXPECT_EQ(service->printCExpr(service->NOT(service->parseC(text), false)), negated);
        EXPECT_EQ(service->printCExpr(service->NOT(service->parseC(text), true)), simplified);
    }
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

TEST(QuillService, SimplifiesAndPrintsInEitherLanguage) {
    const VCServiceHandle service;
    EXPECT_EQ(service->simplifyQExprFromQCondition("A ~= 1 || A ~= 2"), "");
    EXPECT_EQ(service->simplifyCExprFromQCondition("~(A < 3) && bitand(F, 4) ~= 0"), "A>=3 && (F&4)!=0");
    EXPECT_EQ(service->convertExprBetweenQandC("bitand(F,4)~=0", true, false), "(F&4)!=0");
    EXPECT_EQ(service->simplifyExpressionWithoutEvalChecks("~(A < 3)", true, false), "A>=3");
    EXPECT_EQ(service->simplifyExpressionWithoutEvalChecks("A != 3 && true", false, true), "A~=3");
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
