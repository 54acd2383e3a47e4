// The service without a customizer: lifetime, texts, combinations, queries.
#include "base/service/TruthTexts.hpp"
#include "base/simplify/Simplify.hpp"
#include "base/variants/VariantKeywords.hpp"
#include "host/Diagnostics.hpp"
#include "tests/service/Customizers.hpp"

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
    struct Row {
        const char* text;
        const char* c; // converted
        const char* quill;
        const char* simpleC; // simplified
        const char* simpleQuill;
    };

    constexpr Row rows[] = {
        {"", "", "", "", ""},
        {"true", "", "", "", ""},
        {"false", "false", "false", "false", "false"},
        {"True", "True", "True", "True", "True"},
        {"A==1&&A==2", "A==1 && A==2", "A==1 && A==2", "false", "false"},
        {"A == 1 || A != 1", "A==1 || A!=1", "A==1 || A~=1", "", ""},
        {"!(A<3)", "!(A<3)", "~(A<3)", "A>=3", "A>=3"},
        {"a / b == 1", "a/b==1", "idivide(a,b)==1", "a/b==1", "idivide(a,b)==1"},
        {"(a/b)%c", "a/b%c", "rem(idivide(a,b),c)", "a/b%c", "rem(idivide(a,b),c)"},
        {"rem(n, 2) == 1", "n%2==1", "rem(n,2)==1", "n%2==1", "rem(n,2)==1"},
        {"F & 4 || x >> 2", "F&4 || x>>2", "bitand(F,4) || bitshift(x,-2)", "F&4 || x>>2",
         "bitand(F,4) || bitshift(x,-2)"},
        {"(sim) && (codegen)", "(sim) && (codegen)", "(sim) && (codegen)", "false", "false"},
    };
    const FreshService service;
    for (const Row& row : rows) {
        SCOPED_TRACE(row.text);
        EXPECT_EQ(service->convertExprBetweenQandC(row.text, false, false), row.c);
        EXPECT_EQ(service->convertExprBetweenQandC(row.text, false, true), row.quill);
        for (int again = 0; again < 2; ++again) {
            EXPECT_EQ(service->simplifyCExprFromCCondition(row.text), row.simpleC);
            EXPECT_EQ(service->simplifyQExprFromCCondition(row.text), row.simpleQuill);
        }
        EXPECT_EQ(service->simplifyExpressionWithoutEvalChecks(row.text, false, true), row.simpleQuill);
        EXPECT_EQ(service->getBoolean(service->simplifyFromCCondition(row.text).id()), *row.simpleC == '\0');
        EXPECT_EQ(VCService::isTRUEOrFALSEString(row.text),
                  std::string(row.text) == "true" || std::string(row.text) == "false");
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
    struct Row {
        const char* a;
        const char* b;
        const char* conjunction; // not simplified, then simplified
        const char* simpleConjunction;
        const char* disjunction;
        const char* simpleDisjunction;
    };

    constexpr Row rows[] = {
        {"true", "true", "", "", "", ""},
        {"true", "false", "false", "false", "", ""},
        {"false", "true", "false", "false", "", ""},
        {"false", "false", "false", "false", "false", "false"},
        {"true", "!(x<1)", "!(x<1)", "x>=1", "", ""},
        {"!(x<1)", "true", "!(x<1)", "x>=1", "", ""},
        {"false", "!(x<1)", "false", "false", "!(x<1)", "x>=1"},
        {"!(x<1)", "false", "false", "false", "!(x<1)", "x>=1"},
        {"x==1", "x==2", "x==1 && x==2", "false", "x==1 || x==2", "x==1 || x==2"},
        {"x<3", "x>3", "x<3 && x>3", "false", "x<3 || x>3", "x!=3"},
        {"y", "x", "y && x", "x && y", "y || x", "x || y"},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(std::string(row.a) + " with " + row.b);
        const FreshService service;
        const VCSymbolicExprId a = service->parseC(row.a);
        const VCSymbolicExprId b = service->parseC(row.b);
        EXPECT_EQ(service->printCExpr(service->AND(a, b, false)), row.conjunction);
        EXPECT_EQ(service->printCExpr(service->AND(a, b, true)), row.simpleConjunction);
        EXPECT_EQ(service->printCExpr(service->OR(a, b, false)), row.disjunction);
        EXPECT_EQ(service->printCExpr(service->OR(a, b, true)), row.simpleDisjunction);
    }
}

TEST(ServiceCombinations, NegateAtOnceOrInFull) {
    const FreshService service;
    const auto negated = [&](const char* text, bool simplify) {
        return service->printCExpr(service->NOT(service->parseC(text), simplify));
    };
    EXPECT_EQ(negated("true", false), "false");
    EXPECT_EQ(negated("false", false), "");
    EXPECT_EQ(negated("!(x==1)", false), "!(!(x==1))");
    EXPECT_EQ(negated("!(x==1)", true), "x==1");
    EXPECT_EQ(negated("!x", true), "!(!x)"); // a truth value, which x need not be
    EXPECT_EQ(negated("x==1 && y>2", true), "x!=1 || y<=2");
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
}

TEST(ServiceIds, CompareByMeaningOrAsNumbers) {
    TestCustomizer customizer; // outlives the service
    const FreshService service;
    customizer.parameters = {{"N", 1}};
    const VCSymbolicExprId n = service->parseC("N");
    const VCSymbolicExprId one = service->parseC("1");
    const VCSymbolicExprId alwaysTrue = service->parseC("true");
    EXPECT_FALSE(n == one);
    service->setVCCustomizer(&customizer);
    EXPECT_TRUE(n == one);
    EXPECT_FALSE(n != one);
    EXPECT_FALSE(n == service->parseC("M"));
    EXPECT_TRUE(alwaysTrue == service->parseC("true"));
    EXPECT_TRUE(n == n.id() && n.id() == n); // numbers
    EXPECT_TRUE(n != one.id() && one.id() != n);
}

TEST(ServiceAliases, FirstOneStays) {
    const FreshService service;
    EXPECT_EQ(service->getParameterAlias("N"), "");
    service->addParameterAlias("N", "N_1");
    service->addParameterAlias("N", "N_2");
    EXPECT_EQ(service->getParameterAlias("N"), "N_1");
    EXPECT_EQ(service->getParameterAlias("n"), "");
    EXPECT_EQ(service->printCExpr(service->parseC("N")), "N");
}

} // namespace
} // namespace VT::Testing
