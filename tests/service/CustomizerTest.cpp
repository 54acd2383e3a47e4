// What a customizer may decide, and what it may not break.
#include "base/simplify/Simplify.hpp"
#include "base/simplify/SimplifyVisitorBlockVariants.hpp"
#include "tests/service/Customizers.hpp"
#include "tests/support/Cases.hpp"

#include <stdexcept>

namespace VT::Testing {
namespace {

/// A customizer's rewrite to the condition of a text, whatever the condition was.
auto rewriteTo(const std::string& text) {
    return [text](SymbolicExprId, SymbolicExprTable&) { return VCService::getInstance().parseC(text); };
}

/// A service with a customizer, which outlives it.
struct Customized : testing::Test {
    Customized() { service->setVCCustomizer(&customizer); }

    TestCustomizer customizer;
    const FreshService service;
};

TEST(Customizer, IsReleasedOnceItsSuccessorIsInPlace) {
    TestCustomizer first;
    TestCustomizer second;
    {
        const FreshService service;
        first.onRelease = [&] { service->simplify(service->parseC("A<A"), true); };
        service->setVCCustomizer(&first);
        service->setVCCustomizer(&first);
        EXPECT_EQ(first.releases, 0);
        service->setVCCustomizer(&second);
        EXPECT_EQ(first.releases, 1);
        EXPECT_EQ(first.rewrites, 0);
        EXPECT_EQ(second.rewrites, 1); // by the call from the release
        service->setVCCustomizer(nullptr);
        EXPECT_EQ(second.releases, 1);
        service->setVCCustomizer(&second);
    }
    EXPECT_EQ(first.releases, 1);
    EXPECT_EQ(second.releases, 2);
}

TEST(Customizer, MayUseTheServiceWhileOneEnds) {
    TestCustomizer customizer;
    std::string answer;
    customizer.onRelease = [&] { answer = VCService::getInstance().simplifyCExprFromCCondition("A>2 && A>5"); };
    {
        const FreshService service;
        service->setVCCustomizer(&customizer);
    }
    EXPECT_EQ(answer, "A>5");
    VCService::clean(); // the one that the release made
}

TEST(Customizer, RewriteCountsWhereItDecides) {
    for (const CaseRow& row : casesOf("service.txt", "rewritten", 4)) {
        for (const bool isQuill : {false, true}) {
            TestCustomizer customizer; // outlives the service
            const FreshService service;
            customizer.onRewrite = rewriteTo(row[1]);
            service->setVCCustomizer(&customizer);
            EXPECT_EQ(service->printCExpr(service->simplify(service->parseC(row[0]), isQuill)), row[2]) << row[1];
            EXPECT_EQ(service->simplifyExpressionWithoutEvalChecks(row[0], false, false), row[3]) << row[1];
        }
    }
}

TEST_F(Customized, RewriteToNoConditionIsNone) {
    for (const SymbolicExprId bad : {invalidId, SymbolicExprId{1} << 40U}) {
        customizer.onRewrite = [bad](SymbolicExprId, SymbolicExprTable&) { return bad; };
        EXPECT_EQ(service->printCExpr(service->simplify(service->parseC("A>=3 && A<=3"), bad == invalidId)), "A==3");
    }
}

TEST_F(Customized, ExceptionsPassAndNothingIsKept) {
    customizer.onRewrite = [](SymbolicExprId, SymbolicExprTable&) -> SymbolicExprId { throw std::domain_error("no"); };
    const VCSymbolicExprId condition = service->parseC("A==1");
    EXPECT_THROW(service->simplify(condition, true), std::domain_error);
    EXPECT_THROW(service->simplifyFromCCondition("A==1"), std::domain_error);
    EXPECT_THROW(service->AND(condition, service->parseC("B"), true), std::domain_error);
    customizer.onRewrite = rewriteTo("true");
    EXPECT_TRUE(service->getBoolean(service->simplify(condition, true).id()));
    EXPECT_TRUE(service->getBoolean(service->simplifyFromCCondition("A==1").id()));
}

TEST(Customizer, CachesKeepTheirAnswersByLanguage) {
    for (const bool caching : {true, false}) {
        TestCustomizer customizer; // outlives the service
        const FreshService service(caching);
        service->setVCCustomizer(&customizer);
        const SymbolicExprId condition = service->parseC("A==1");
        const auto rewritesOf = [&](auto&& call) {
            customizer.rewrites = 0;
            call();
            return customizer.rewrites;
        };
        const int again = caching ? 0 : 1;
        EXPECT_EQ(rewritesOf([&] { service->simplify(condition, true); }), 1);
        EXPECT_EQ(rewritesOf([&] { service->simplify(condition, true); }), again);
        EXPECT_EQ(rewritesOf([&] { service->simplifyFromCCondition("A == 1"); }), 1);
        EXPECT_EQ(rewritesOf([&] { service->simplify(condition, false); }), again);
        EXPECT_EQ(rewritesOf([&] { service->simplifyFromCCondition("A == 1"); }), again);
        // Another customizer does not undo what is known.
        TestCustomizer other;
        other.onRewrite = rewriteTo("true");
        service->setVCCustomizer(&other);
        EXPECT_EQ(service->getBoolean(service->simplify(condition, true).id()), !caching);
        service->setVCCustomizer(nullptr);
    }
}

TEST(Customizer, ConfirmsSelfComparisonsInQuillMode) {
    for (const CaseRow& row : casesOf("service.txt", "self-comparisons", 4))
        for (const bool agrees : {true, false}) {
            SCOPED_TRACE(row[0]);
            TestCustomizer customizer; // outlives the service
            const FreshService service;
            const VCSymbolicExprId condition = service->parseC(row[0]);
            customizer.agrees = agrees;
            service->setVCCustomizer(&customizer);
            EXPECT_EQ(service->printCExpr(service->simplify(condition, false)), row[1]);
            EXPECT_TRUE(customizer.questions.empty());
            EXPECT_EQ(service->printCExpr(service->simplify(condition, true)), row[agrees ? 1 : 2]);
            ASSERT_FALSE(customizer.questions.empty());
            EXPECT_EQ(customizer.questions.front(), std::pair(service->printQExpr(condition), row[3]));
            const FreshService alone;
            EXPECT_EQ(alone->printCExpr(alone->simplify(alone->parseC(row[0]), true)), row[1]);
        }
}

TEST(Customizer, VisitorWithNobodyToAskAnswersTheOtherWayRound) {
    const FreshService service;
    const SymbolicExprSimplify& simplifier = service->simplifier();
    TestCustomizer agreeing;
    for (const CaseRow& row : casesOf("service.txt", "visited", 3)) {
        SymbolicExprSimplifyVisitorBlockVariants visitor(service->table(), true, simplifier.printer(),
                                                         row[1] != "no question",
                                                         row[1] == "agreeing" ? &agreeing : nullptr);
        std::uint64_t passes = 0;
        EXPECT_EQ(service->printCExpr(simplifier.simplify(service->parseC(row[0]), passes, visitor)), row[2]) << row[0];
    }
}

TEST_F(Customized, ReplacesParametersToCompare) {
    customizer.parameters = {{"P", "Q"}, {"Q", "P"}, {"N", 3}, {"true", "Q"}};
    for (const CaseRow& row : casesOf("service.txt", "compared", 3)) {
        const SymbolicExprId a = service->parseC(row[0]), b = service->parseC(row[1]);
        EXPECT_EQ(service->isEqual(a, b) ? "yes" : "no", row[2]) << row[0] << ", " << row[1];
        EXPECT_EQ(VCSymbolicExprId(b) == VCSymbolicExprId(a) ? "yes" : "no", row[2]) << row[0] << ", " << row[1];
    }
    service->setVCCustomizer(nullptr);
    EXPECT_FALSE(service->isEqual(service->parseC("P==N"), service->parseC("P==3")));
}

} // namespace
} // namespace VT::Testing
