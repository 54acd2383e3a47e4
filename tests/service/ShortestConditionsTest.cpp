// The shortest forms of conditions, everywhere and where others hold: by tables, on real conditions, and against brute
// force.
#include "base/core/Limits.hpp"
#include "base/core/Make.hpp"
#include "base/core/Nodes.hpp"
#include "base/decide/Decider.hpp"
#include "base/decide/external/SolverPlugin.hpp"
#include "tests/service/Customizers.hpp"
#include "tests/support/Cases.hpp"
#include "tests/support/Parsing.hpp"
#include "tests/support/Times.hpp"
#include "tests/support/generators/Corpus.hpp"
#include "tests/support/generators/RandomCondition.hpp"
#include "tests/support/oracles/Truth.hpp"

#include <boost/algorithm/string/replace.hpp>
#include <gtest/gtest.h>

#include <functional>
#include <unordered_set>

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

/// Real conditions and random ones, some of operators that Quill writes as calls.
std::vector<std::string> someConditions() {
    std::vector<std::string> lines;
    std::mt19937_64 random(30);
    const ConditionShape calls{.symbols = {"(F & 4)", "n % 2", "a / b", "(F << 1)", "A", "B"}, .truthValues = true};
    while (lines.size() < 2000)
        lines.push_back(lines.size() < 600
                            ? randomCondition(random, 1 + random() % 4, calls)
                            : randomCondition(random, 1 + random() % 9, {.symbolPairs = true, .truthValues = true}));
    for (const CorpusFile& file : corpusFiles)
        std::ranges::copy(corpusLines(file.name), std::back_inserter(lines));
    return lines;
}

/// Judges by a decider of its own; what has no longer normal form has no more comparisons than that.  What is known is
/// the condition before.
TEST(ShortestConditions, AreEqualAndNoLongerInTheirLanguage) {
    const FreshService service;
    SymbolicExprTable& table = service->table();
    Decider judge(table, {.solver = &SolverPlugin::installed()}); // which the service may ask, too
    std::size_t shorter = 0;
    std::size_t shorterGiven = 0;
    SymbolicExprId previous = table.getIdTRUE();
    for (const std::string& line : someConditions()) {
        const ParseAnswer read = parse(table, line);
        if (read.error)
            continue; // a text that is no condition
        for (const bool isQuill : {false, true}) {
            const auto inLanguage = [&](SymbolicExprId id) {
                return isQuill ? service->parseQ(service->printQExprWithConversion(id)) : id;
            };
            const auto lengthOf = [&](SymbolicExprId id) { // TRUE and FALSE are the shortest of all
                return id == table.getIdFALSE() ? 0
                                                : (isQuill ? service->printQExpr(id) : service->printCExpr(id)).size();
            };
            const SymbolicExprId given = inLanguage(read.id);
            const SymbolicExprId shortest = service->shortestCondition(given, isQuill).id();
            const SymbolicExprId left = service->getImpliedCondition(given, inLanguage(previous), isQuill).id();
            const std::size_t length = lengthOf(given);
            ASSERT_LE(lengthOf(shortest), length) << line << " became " << service->printCExpr(shortest);
            ASSERT_LE(lengthOf(left), length)
                << line << " became " << service->printCExpr(left) << " given " << service->printCExpr(previous);
            ASSERT_TRUE(shortest == given || judge.equivalent(shortest, given).isYes() ||
                        !booleanOps.contains(table.get(given)->op()))
                << line << " became " << service->printCExpr(shortest);
            const SymbolicExprId normal = service->simplify(given, isQuill).id();
            if (lengthOf(normal) <= length) {
                ASSERT_LE(countComparisons(table, shortest), countComparisons(table, normal)) << line;
            }
            shorter += lengthOf(shortest) < length ? 1U : 0U;
            shorterGiven += lengthOf(left) < length ? 1U : 0U;
        }
        previous = read.id;
    }
    EXPECT_GT(shorter, 1500U);
    EXPECT_GT(shorterGiven, 5000U);
}

/// Visits a condition with one operand of its And, Or and Not replaced by a constant, each in turn, until `visit` is
/// false.
void forEachPruned(SymbolicExprTable& table, SymbolicExprId root, const std::function<bool(SymbolicExprId)>& visit) {
    struct Place {
        SymbolicExprId id;
        std::size_t parent; ///< its own place for the root
        std::size_t side;
    };

    std::vector<Place> places{{root, 0, 0}};
    for (std::size_t i = 0; i < places.size(); ++i) { // it grows
        const SymbolicExpr& node = *table.get(places[i].id);
        if (node.op() == SymbolicOp::And || node.op() == SymbolicOp::Or || node.op() == SymbolicOp::Not)
            for (std::size_t side = 0; side < node.getNumInputs(); ++side)
                places.push_back({node.getInput(side), i, side});
    }
    for (std::size_t i = 1; i < places.size(); ++i) {
        for (SymbolicExprId by : {table.getIdTRUE(), table.getIdFALSE()}) {
            for (std::size_t at = i; at != 0; at = places[at].parent) {
                const SymbolicExpr& parent = *table.get(places[places[at].parent].id);
                const std::size_t side = places[at].side;
                by = parent.op() == SymbolicOp::Not
                         ? SymbolicNotExpr(table, by).getId(table)
                         : makeBinary(table, parent.op(), side == 0 ? by : parent.getInput(0),
                                      side == 1 ? by : parent.getInput(1));
            }
            if (!visit(by))
                return;
        }
    }
}

/// Judged by a decider of its own, on real and on random conditions.
TEST(ShortestConditions, HaveNoOperandThatDoesNotCount) {
    std::vector<std::string> texts;
    for (const CorpusFile& file : corpusFiles)
        for (std::string& line : corpusLines(file.name))
            texts.push_back(std::move(line));
    std::mt19937_64 random(37);
    const ConditionShape plain{.symbols = {"A", "B", "C", "D", "E"}};
    const ConditionShape mixed{.symbols = {"A", "B", "C", "D"}, .symbolPairs = true, .truthValues = true};
    for (std::size_t round = 0; round < 2000; ++round)
        texts.push_back(randomCondition(random, 3 + round % 19, round % 4 == 0 ? mixed : plain));
    const FreshService service;
    SymbolicExprTable& table = service->table();
    Decider judge(table);
    std::size_t judged = 0;
    std::unordered_set<SymbolicExprId> seen;
    for (const std::string& text : texts) {
        SymbolicExprId condition = invalidId;
        try {
            condition = service->parseC(text);
        } catch (const HostDiagnostic&) {
            continue; // a text that is no condition
        }
        const SymbolicExprId shortest = service->shortestCondition(condition, false).id();
        if (!booleanOps.contains(table.get(shortest)->op()) || countComparisons(table, shortest) > 40 ||
            !seen.insert(shortest).second)
            continue;
        forEachPruned(table, shortest, [&](SymbolicExprId pruned) {
            ++judged;
            const bool isEqual = judge.equivalent(pruned, shortest).isYes();
            EXPECT_FALSE(isEqual) << text << " became " << service->printCExpr(shortest) << " and not "
                                  << service->printCExpr(pruned);
            return !isEqual;
        });
    }
    EXPECT_GT(judged, 50000U);
}

TEST(ShortestConditions, OfAnyLength) {
    const FreshService service;
    for (const std::size_t operands : {limits::shortenComparisons, limits::shortenComparisons + 1}) {
        std::string distinct = "A0";
        for (std::size_t i = 1; i < operands; ++i)
            distinct += " && A" + std::to_string(i);
        EXPECT_EQ(service->shortestCExprFromCCondition("A" + times(operands - 1, " && A")), "A");
        EXPECT_EQ(service->shortestCExprFromCCondition(distinct), distinct);
    }
}

/// Below 1 KB, and hard: no text takes more than its budgets.
TEST(ShortestConditions, OfHostileTextsStayWithinTheirBudgets) {
    using boost::algorithm::replace_all_copy;
    const FreshService service;
    for (const CaseRow& row : casesOf("service.txt", "hard", 4)) {
        const std::size_t count = std::stoul(row[0]);
        std::string text;
        for (std::size_t i = 0; i < count; ++i) {
            const std::string part = replace_all_copy(row[2], "@", std::to_string(i + 2));
            text += (i == 0 ? "" : row[1]) +
                    replace_all_copy(part, "$", std::to_string((i + 2) * std::stoul("0" + row[3]) % count));
        }
        ASSERT_LT(text.size(), 1024U);
        const std::size_t nodes = service->table().size();
        const VCSymbolicExprId condition = service->parseC(text);
        service->shortestCondition(condition, false);
        service->getImpliedCondition(condition, service->parseC("A2>B3 && (C || !D) && A3*B4==7"));
        EXPECT_LT(service->table().size() - nodes, 8 * limits::impliedNodes) << text;
    }
}

TEST(ImpliedConditions, OfManyOperandsLoseWhatTheKnownOneDecides) {
    const FreshService service;
    for (const std::size_t operands : {260U, 600U, 1000U}) {
        std::string kept;
        for (std::size_t i = 0; i + 3 < operands; ++i)
            kept += (i == 0 ? "S" : " && S") + std::to_string(i) + (i % 2 == 0 ? "" : ">=0");
        const std::string condition = "S7>2 && " + kept + " && K && (X || Y || Z)";
        const std::string known = "K && S7>4 && (X || Y)";
        EXPECT_EQ(service->getImpliedCExprFromCConditions(condition, known),
                  boost::replace_first_copy(kept, " && S7>=0", ""));
        EXPECT_EQ(service->getImpliedCExprFromCConditions(condition, condition), "");
    }
}

} // namespace
} // namespace VT::Testing
