// What a customizer may decide, and what it may not break.
#include "base/simplify/Simplify.hpp"
#include "base/simplify/SimplifyVisitorBlockVariants.hpp"
#include "tests/service/Customizers.hpp"

#include <array>
#include <tuple>

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
    const std::vector<std::array<std::string, 4>> rows{
        // condition, rewritten, result, and past the customizer
        {"A==1", "true", "", "A==1"},         {"A==1", "B==1 && B==2", "false", "A==1"},
        {"A==1", "B==1 || B!=1", "", "A==1"}, {"A==1", "B==1", "A==1", "A==1"},
        {"A>2 && A>5", "B", "A>5", "A>5"},    {"true", "false", "", ""},
        {"false", "true", "false", "false"},
    };
    for (const auto& [condition, rewritten, result, unasked] : rows) {
        for (const bool isQuill : {false, true}) {
            TestCustomizer customizer; // outlives the service
            const FreshService service;
            customizer.onRewrite = rewriteTo(rewritten);
            service->setVCCustomizer(&customizer);
            EXPECT_EQ(service->printCExpr(service->simplify(service->parseC(condition), isQuill)), result) << rewritten;
            EXPECT_EQ(service->simplifyExpressionWithoutEvalChecks(condition, false, false), unasked) << rewritten;
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
    for (const std::string op : {"<", "==", ">=", "!=", ">", "<="})
        for (const bool agrees : {true, false}) {
            TestCustomizer customizer; // outlives the service
            const FreshService service;
            const VCSymbolicExprId condition = service->parseC("P" + op + "P");
            const auto simplified = [&](bool isQuill) {
                return service->printCExpr(service->simplify(condition, isQuill));
            };
            const bool truth = op.ends_with('=') && op != "!=";
            const std::string agreed = truth ? "" : "false", refused = truth ? "false" : "";
            SCOPED_TRACE(op);
            customizer.agrees = agrees;
            service->setVCCustomizer(&customizer);
            EXPECT_EQ(simplified(false), agreed);
            EXPECT_TRUE(customizer.questions.empty());
            EXPECT_EQ(simplified(true), agrees ? agreed : refused);
            ASSERT_FALSE(customizer.questions.empty());
            EXPECT_EQ(customizer.questions.front().first, service->printQExpr(condition));
            EXPECT_EQ(customizer.questions.front().second, truth ? "true" : "false");
            const FreshService alone;
            EXPECT_EQ(alone->printCExpr(alone->simplify(alone->parseC("P" + op + "P"), true)), agreed);
        }
}

TEST(Customizer, VisitorWithNobodyToAskAnswersTheOtherWayRound) {
    const FreshService service;
    const SymbolicExprSimplify& simplifier = service->simplifier();
    const auto simplified = [&](const char* text, bool ask, VCCustomizer* customizer) {
        SymbolicExprSimplifyVisitorBlockVariants visitor(service->table(), true, simplifier.printer(), ask, customizer);
        std::uint64_t passes = 0;
        return service->printCExpr(simplifier.simplify(service->parseC(text), passes, visitor));
    };
    TestCustomizer agreeing;
    EXPECT_EQ(simplified("P==P", true, nullptr), "false");
    EXPECT_EQ(simplified("P<P", true, nullptr), "");
    EXPECT_EQ(simplified("P==P", false, nullptr), "");
    EXPECT_EQ(simplified("P==P", true, &agreeing), "");
    EXPECT_EQ(simplified("P<P || P>2 && P>3", true, &agreeing), "P>3");
}

TEST_F(Customized, ReplacesParametersToCompare) {
    customizer.parameters = {{"P", "Q"}, {"Q", "P"}, {"N", 3}, {"true", "Q"}};
    const std::vector<std::tuple<const char*, const char*, bool>> cases{
        {"P==1", "Q==1", false},      {"P", "P && P", true},        {"P==N", "P==3", true},
        {"P>N", "!(P<=3)", true},     {"f(N)==Q", "f(3)==Q", true}, {"N==3", "true", true},
        {"N==4", "false", true},      {"true", "Q", false},         {"N", "3", true},
        {"f(N)==Q", "f(3)==P", false}};
    for (const auto& [a, b, equal] : cases) {
        EXPECT_EQ(service->isEqual(service->parseC(a), service->parseC(b)), equal) << a << ", " << b;
        EXPECT_EQ(VCSymbolicExprId(service->parseC(b)) == VCSymbolicExprId(service->parseC(a)), equal)
            << a << ", " << b;
    }
    service->setVCCustomizer(nullptr);
    EXPECT_FALSE(service->isEqual(service->parseC("P==N"), service->parseC("P==3")));
}

} // namespace
} // namespace VT::Testing
