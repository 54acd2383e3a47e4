// Conditions in both languages meet in the same nodes.
#include "base/VCService.hpp"
#include "tests/support/RandomCondition.hpp"

#include <gtest/gtest.h>
#include <map>
#include <rapidcheck/gtest.h>

namespace VT::Testing {
namespace {

TEST(QuillService, ConvertsBothWays) {
    const VCServiceHandle service;
    for (const auto& [quill, c] : std::map<std::string, std::string>{{"bitand(F,4)~=0", "(F&4)!=0"},
                                                                     {"bitshift(a,-3)", "a>>3"},
                                                                     {"rem(idivide(a,b),2)==1", "a/b%2==1"},
                                                                     {"bitxor(a,bitor(b,bitcmp(c)))", "a^(b|~c)"},
                                                                     {"~A || B && C~=1", "!A || B && C!=1"},
                                                                     {"f(A,2)<=P.x", "f(A,2)<=P.x"},
                                                                     {"(sim) && A", "(sim) && A"}}) {
        EXPECT_EQ(service->parseQ(quill), service->parseC(c));
        EXPECT_EQ(service->convertExprBetweenQandC(quill, true, false), c);
        EXPECT_EQ(service->convertExprBetweenQandC(c, false, true), quill);
    }
}

TEST(QuillService, SimplifiesAndPrintsInEitherLanguage) {
    const VCServiceHandle service;
    EXPECT_EQ(service->simplifyQExprFromQCondition("A == 1 && A == 2"), "false");
    EXPECT_EQ(service->simplifyQExprFromQCondition("A ~= 1 || A ~= 2"), "");
    EXPECT_EQ(service->simplifyCExprFromQCondition("~(A < 3) && bitand(F, 4) ~= 0"), "A>=3 && (F&4)!=0");
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
    EXPECT_EQ(service->printQExpr(service->replaceSymbolsInExpression(service->parseC("A"), {{"A", "B"}})), "B");
    const std::size_t nodes = service->table().size();
    EXPECT_EQ(service->replaceSymbolsInExpression(condition, {{"NotThere", "Nowhere"}}), condition);
    EXPECT_EQ(service->table().size(), nodes);
}

RC_GTEST_PROP(QuillService, ReadsWhatCReads, ()) {
    const VCServiceHandle service;
    std::mt19937_64 random(*rc::gen::arbitrary<std::uint64_t>());
    ConditionShape shape;
    shape.lowest = 0; // a sign belongs to a literal in C alone
    shape.symbolPairs = shape.truthValues = true;
    const std::string c = randomCondition(random, 1 + random() % 8, shape);
    std::string quill;
    for (std::size_t i = 0; i < c.size(); ++i)
        quill += c[i] == '!' ? '~' : c[i];
    RC_ASSERT(service->parseQ(quill) == service->parseC(c));
    RC_ASSERT(service->simplifyFromQCondition(quill).id() == service->simplifyFromCCondition(c).id());
    RC_ASSERT(service->parseQ(service->printQExpr(service->parseC(c))) == service->parseC(c));
}

} // namespace
} // namespace VT::Testing
