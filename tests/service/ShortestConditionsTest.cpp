// The shortest forms of conditions: by tables, on real conditions, and against brute force.
#include "base/core/Limits.hpp"
#include "base/decide/Decider.hpp"
#include "host/Diagnostics.hpp"
#include "tests/service/Customizers.hpp"
#include "tests/support/Cases.hpp"
#include "tests/support/generators/Corpus.hpp"
#include "tests/support/generators/RandomCondition.hpp"
#include "tests/support/oracles/Truth.hpp"

#include <gtest/gtest.h>

namespace VT::Testing {
namespace {

TEST(ShortestConditions, OfTexts) {
    const FreshService service;
    for (const CaseRow& row : casesOf("service.txt", "shortest", 2)) {
        const std::string result = service->shortestCExprFromCCondition(row[0]);
        EXPECT_EQ(result.empty() ? "true" : result, row[1]) << row[0];
    }
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
