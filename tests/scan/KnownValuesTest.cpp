// Comparisons of one symbol: sets of its values say what the decider says.
#include "base/scan/facts/KnownValues.hpp"
#include "base/decide/Decider.hpp"
#include "parser/SymbolicExprParser.hpp"

#include <gtest/gtest.h>
#include <random>

namespace VT::Testing {
namespace {

TEST(KnownValues, AgreeWithTheDecider) {
    std::mt19937 random(3);
    const auto below = [&](std::size_t bound) {
        return std::uniform_int_distribution<std::size_t>(0, bound - 1)(random);
    };
    const char* const forms[] = {"A", "!A", "A == ", "A != ", "A < ", "A <= ", "A > ", "A >= ", "! ! (A > ", "!(A == "};
    const auto comparison = [&] {
        const std::string form = forms[below(std::size(forms))];
        if (!form.ends_with(' '))
            return form;
        return form + std::to_string(below(7)) + (form.find('(') == std::string::npos ? "" : ")");
    };
    std::size_t counts[4] = {0, 0, 0, 0};
    SymbolicExprTable table;
    table.addBoolSymbols();
    SymbolicExprParser parser(table, true, true);
    Decider decider(table, {.keywordsInForce = false});
    KnownValues values(table);
    for (int i = 0; i < 400; ++i) {
        std::vector<SymbolicExprId> facts;
        for (std::size_t left = below(6); left > 0; --left) { // a chain that grows
            const SymbolicExprId condition = parser(comparison());
            const auto verdict = values.judge(condition, facts);
            ASSERT_TRUE(verdict.has_value());
            ++counts[static_cast<std::size_t>(*verdict)];
            SymbolicExprId known = table.getIdTRUE();
            for (const SymbolicExprId fact : facts)
                known = SymbolicAndExpr(table, known, fact).getId(table);
            const bool canHold = decider.canHold(known).isYes();
            const ValueVerdict expected = !canHold                                     ? ValueVerdict::Contradiction
                                          : decider.disjoint(known, condition).isYes() ? ValueVerdict::Never
                                          : decider.implies(known, condition).isYes()  ? ValueVerdict::Always
                                                                                       : ValueVerdict::Sometimes;
            ASSERT_EQ(*verdict, expected) << i;
            facts.push_back(SymbolicNotExpr(table, condition).getId(table));
        }
    }
    for (const std::size_t count : counts)
        EXPECT_GT(count, 20U);
}

TEST(KnownValues, LeaveOtherQuestions) {
    SymbolicExprTable table;
    table.addBoolSymbols();
    SymbolicExprParser parser(table, true, true);
    KnownValues values(table);
    const std::vector<SymbolicExprId> facts{parser("A > 1")};
    for (const char* const other : {"B > 1", "A > B", "A + 1 > 2", "A > 1 && A > 2", "true", "1 > 2", "A % 2 == 1"})
        EXPECT_FALSE(values.judge(parser(other), facts)) << other;
    EXPECT_EQ(values.judge(parser("A > 0"), facts), ValueVerdict::Always);
    EXPECT_FALSE(values.judge(parser("A > 0"), std::vector{facts[0], parser("B")}));
    EXPECT_EQ(values.judge(parser("1 == A"), facts), ValueVerdict::Never);
}

} // namespace
} // namespace VT::Testing
