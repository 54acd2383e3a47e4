// The shortest forms of conditions: by tables, on real conditions, and against brute force.
#include "base/core/Limits.hpp"
#include "base/decide/Decider.hpp"
#include "host/Diagnostics.hpp"
#include "tests/service/Customizers.hpp"
#include "tests/support/Corpus.hpp"
#include "tests/support/FlagSetting.hpp"
#include "tests/support/RandomCondition.hpp"
#include "tests/support/Truth.hpp"

#include <array>
#include <gmock/gmock.h>

namespace VT::Testing {
namespace {

TEST(ShortestConditions, OfTexts) {
    const std::vector<std::array<std::string, 2>> rows{
        // Structure.
        {"!(A < 3) && (B==1 || B==2) && A >= 3", "A>=3 && (B==1 || B==2)"},
        {"(A||B)&&(C||D)&&(E||F)", "(A || B) && (C || D) && (E || F)"},
        {"A&&C||A&&D||B&&C||B&&D", "(A || B) && (C || D)"},
        {"V>4||V==4&&(M>2||M==2&&P>=1)", "V>4 || V==4 && (M>2 || M==2 && P>=1)"},
        {"MODE==1&&(SPEED>10||FORCE)&&!(GEAR==0||GEAR==1)", "MODE==1 && (SPEED>10 || FORCE) && GEAR!=0 && GEAR!=1"},
        {"A || !A && B", "A || B"},
        {"A&&B||!A&&C||B&&C", "A && B || !A && C"},
        {"(A||B)&&(A||C)&&(A||D)", "A || B && C && D"},
        {"!A && !B && !C && !D", "!(A || B || C || D)"},
        {"X || !(A || B && C)", "X || !(A || B && C)"},
        // Ranges.
        {"A==1||A==2||A==3", "A>=1 && A<=3"},
        {"A==1||A==2", "A==1 || A==2"},
        {"A>=1 && A<=2", "A>=1 && A<=2"},
        {"A!=1 && A!=2 && A!=3 && B", "(A<=0 || A>=4) && B"},
        {"A==1||A==2||A==4||A==5||A==6", "A>=1 && A<=6 && A!=3"},
        {"A>2147483647 || A==2147483647", "A>=2147483647"},
        // Comparisons.
        {"(A==1 && B) != 0.0", "A==1 && B"},
        {"true > (A==1)", "A!=1"},
        {"3-A>0", "A<3"},
        {"3*A<7 && B", "A<3 && B"},
        {"A-B>=1 && B-A<5", "A>B"},
        {"A<2.5", "A<=2"},
        {"(F&4)==2 || n%2==2", "false"},
        {"-5<A", "-5<A"},
        {"2147483647+A>2", "A>-2147483645"},
        {"A*0.5>1 || A*0.5<=1", "A*0.5>1 || A*0.5<=1"},
        {"(sim) && A || (codegen) && A", "A"},
        // Numbers stay numbers.
        {"2+3", "5"},
        {"N*2+1", "N*2+1"},
        {"N+N", "2*N"},
        {"A", "A"},
        {"7", "7"},
    };
    const FreshService service;
    for (const auto& [text, shortest] : rows) {
        const std::string result = service->shortestCExprFromCCondition(text);
        EXPECT_EQ(result.empty() ? "true" : result, shortest) << text;
    }
    EXPECT_EQ(service->shortestQExprFromCCondition("!(a / b != 1) && a % 2 == 1"), "idivide(a,b)==1 && rem(a,2)==1");
    EXPECT_EQ(service->shortestQExprFromQCondition("~(A < 3) | B | B"), "A>=3 | B");
    EXPECT_EQ(service->shortestCExprFromQCondition("bitand(F,4) ~= 0 & ~~A"), "(F&4)!=0 & A");
    EXPECT_THROW(service->shortestCExprFromCCondition("A &&"), HostDiagnostic);
    EXPECT_EQ(service->shortestCondition(invalidId, true), invalidId);
    const FlagSetting off(*VTFEAT_VariantKeywordsSimCodegen, 0);
    EXPECT_EQ(service->shortestCExprFromCCondition("(A || sim) && (A || codegen)"), "A || sim && codegen");
}

TEST(ShortestConditions, DependOnTheUnknownsBounds) {
    const FreshService service;
    EXPECT_EQ(service->shortestCExprFromCCondition("A<=2147483647 && B"), "A<=2147483647 && B");
    service->setDecisions32Bit(true);
    EXPECT_EQ(service->shortestCExprFromCCondition("A<=2147483647 && B"), "B");
}

/// Judges by a decider of its own: no form is longer than its condition, and each is equal to it.
TEST(ShortestConditions, OfRealConditions) {
    const FreshService service;
    SymbolicExprTable& table = service->table();
    Decider judge(table);
    std::size_t shorter = 0;
    for (const CorpusFile& file : corpusFiles) {
        for (const std::string& line : corpusLines(file.name)) {
            SymbolicExprId condition = invalidId;
            try {
                condition = service->parseC(line);
            } catch (const HostDiagnostic&) {
                continue; // a text that is no condition
            }
            for (const bool isQuill : {false, true}) {
                const SymbolicExprId given =
                    isQuill ? service->parseQ(service->printQExprWithConversion(condition)) : condition;
                const VCSymbolicExprId shortest = service->shortestCondition(given, isQuill);
                const std::string before = isQuill ? service->printQExpr(given) : service->printCExpr(given);
                const std::string after = isQuill ? service->printQExpr(shortest) : service->printCExpr(shortest);
                ASSERT_LE(after.size(), before.size()) << line << " became " << after;
                ASSERT_TRUE(shortest == given || judge.equivalent(shortest.id(), given).isYes() ||
                            !booleanOps.contains(table.get(given)->op()))
                    << line << " became " << after;
                shorter += after.size() < before.size() ? 1U : 0U;
            }
        }
    }
    EXPECT_GT(shorter, 300U);
}

TEST(ShortestConditions, EqualRandomConditionsAndStayTheSame) {
    std::mt19937_64 random(31);
    const ConditionShape shape{.symbols = {"A", "B", "C"}, .symbolPairs = true, .truthValues = true};
    std::size_t shorter = 0;
    for (int round = 0; round < 1500; ++round) {
        const FreshService service;
        const VCSymbolicExprId given = service->parseC(randomCondition(random, 1 + random() % 9, shape));
        const std::string before = service->printCExpr(given);
        const VCSymbolicExprId result = service->shortestCondition(given, false);
        const std::string text = service->printCExpr(result);
        const bool isConstant = text.empty() || text == "false";
        ASSERT_LE(isConstant ? 0 : text.size(), before.size()) << before << " became " << text;
        const std::string normal = service->simplifyCExprFromCCondition(before);
        if (normal.size() <= before.size()) {
            ASSERT_LE(countComparisons(service->table(), result.id()),
                      countComparisons(service->table(), service->simplify(given, false).id()))
                << before << " became " << text << " and not " << normal;
        }
        shorter += text.size() < before.size() ? 1U : 0U;
        const Truth truth(service->table(), given.id());
        const Truth shortTruth(service->table(), result.id());
        forEachAssignment(shape.symbols, -4, 5, [&](const Assignment& assignment) {
            ASSERT_EQ(*truth.under(assignment) != 0, *shortTruth.under(assignment) != 0)
                << before << " became " << text;
        });
    }
    EXPECT_GT(shorter, 900U);
}

TEST(ShortestConditions, OfAnyLength) {
    const FreshService service;
    for (const std::size_t operands : {limits::shortenComparisons, limits::shortenComparisons + 1}) {
        std::string again = "A";
        std::string distinct = "A0";
        for (std::size_t i = 1; i < operands; ++i) {
            again += " && A";
            distinct += " && A" + std::to_string(i);
        }
        EXPECT_EQ(service->shortestCExprFromCCondition(again), "A");
        EXPECT_EQ(service->shortestCExprFromCCondition(distinct), distinct);
    }
}

/// Below 1 KB, and hard: no text takes more than its budgets.
TEST(ShortestConditions, OfHostileTextsStayWithinTheirBudgets) {
    const auto join = [](std::size_t count, const std::string& op, auto part) {
        std::string text;
        for (std::size_t i = 0; i < count; ++i)
            text += (i == 0 ? "" : op) + part(i);
        return text;
    };
    const auto number = [](std::size_t i) { return std::to_string(i); };
    const std::vector<std::string> texts{
        join(60, "&&", [&](std::size_t i) { return "(A" + number(i) + "||B" + number(i * 7 % 60) + ")"; }),
        join(50, "||", [&](std::size_t i) { return "A" + number(i) + "*B" + number(i) + "==C" + number(i) + "*D"; }),
        join(80, "&&", [&](std::size_t i) { return "S" + number(i) + "<S" + number(i * 31 % 80); }),
        join(60, "||", [&](std::size_t i) { return "(F&" + number(i + 1) + ")==" + number(i * 5 % 60); }),
        join(12, "&&", [&](std::size_t i) { return "(A" + number(i) + "==1)+(B" + number(i) + "==1)+(C==1)>1"; }),
        join(60, "!=", [&](std::size_t i) { return "(A" + number(i) + "==" + number(i) + ")"; }),
        join(30, "&&",
             [&](std::size_t i) { return "A" + number(i) + "+B" + number(i * 11 % 30) + "+C*3<D-" + number(i); }),
        join(40, "||", [&](std::size_t i) { return "A/" + number(i + 2) + "*B==C%" + number(i + 3) + "&&D"; }),
    };
    const FreshService service;
    for (const std::string& text : texts) {
        ASSERT_LT(text.size(), 1024U);
        const std::size_t nodes = service->table().size();
        const VCSymbolicExprId condition = service->parseC(text);
        service->shortestCondition(condition, false);
        service->getImpliedCondition(condition, service->parseC("A1>B2 && (C || !D) && A3*B4==7"));
        EXPECT_LT(service->table().size() - nodes, 8 * limits::impliedNodes) << text;
    }
}

} // namespace
} // namespace VT::Testing
