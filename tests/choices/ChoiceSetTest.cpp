// Choice sets against brute force: what is dead, hidden, missing, doubled, merged and counted.
#include "base/choices/ChoiceSetChecker.hpp"
#include "base/choices/SmallestRemoval.hpp"
#include "base/core/Table.hpp"
#include "base/decide/Decider.hpp"
#include "base/service/VCService.hpp"
#include "tests/service/Customizers.hpp"
#include "tests/support/generators/RandomCondition.hpp"
#include "tests/support/oracles/Truth.hpp"

#include <algorithm>
#include <array>
#include <bit>
#include <gtest/gtest.h>
#include <random>

namespace VT::Testing {
namespace {

using Pairs = std::vector<std::pair<std::size_t, std::size_t>>;

bool touchesAll(const Pairs& pairs, std::uint64_t removed) {
    return std::ranges::all_of(
        pairs, [&](const auto& pair) { return ((removed >> pair.first | removed >> pair.second) & 1U) != 0; });
}

TEST(SmallestRemoval, IsThatOfAnExhaustiveSearch) {
    std::mt19937_64 random(61);
    for (int round = 0; round < 400; ++round) {
        const std::size_t count = 2 + random() % 9;
        Pairs pairs;
        for (std::size_t i = 0; i < random() % (2 * count); ++i) {
            const std::size_t a = random() % count;
            const std::size_t b = random() % count;
            if (a != b)
                pairs.emplace_back(a, b);
        }
        int fewest = 64;
        for (std::uint64_t mask = 0; mask < std::uint64_t{1} << count; ++mask)
            if (touchesAll(pairs, mask))
                fewest = std::min(fewest, std::popcount(mask));
        const ChoiceRemoval removal = smallestRemoval(pairs);
        std::uint64_t removed = 0;
        for (const std::size_t each : removal.choices)
            removed |= std::uint64_t{1} << each;
        ASSERT_TRUE(removal.isSmallest && touchesAll(pairs, removed));
        ASSERT_EQ(removal.choices.size(), static_cast<std::size_t>(fewest));
        ASSERT_EQ(std::popcount(removed), fewest) << "each once";
    }
    EXPECT_EQ(smallestRemoval(Pairs{{3, 7}, {20, 25}}).choices, (std::vector<std::size_t>{7, 25}));
}

TEST(SmallestRemoval, SaysWhereItIsNotProven) {
    std::mt19937_64 random(62);
    Pairs pairs;
    for (std::size_t i = 0; i < 1000; ++i)
        pairs.emplace_back(random() % 300, 300 + random() % 299);
    for (std::size_t i = 0; i + 1 < 599; i += 2)
        pairs.emplace_back(i, i + 1);
    const ChoiceRemoval removal = smallestRemoval(pairs);
    EXPECT_FALSE(removal.isSmallest);
    EXPECT_TRUE(std::ranges::all_of(pairs, [&](const auto& pair) {
        return std::ranges::binary_search(removal.choices, pair.first) ||
               std::ranges::binary_search(removal.choices, pair.second);
    }));
    EXPECT_LT(removal.choices.size(), 450U);
}

class ChoiceSetChecks : public ::testing::Test {
protected:
    SymbolicExprId parse(const std::string& text) { return service->parseC(text); }

    std::vector<SymbolicExprId> parseAll(const std::vector<std::string>& texts) {
        std::vector<SymbolicExprId> ids;
        for (const std::string& text : texts)
            ids.push_back(parse(text));
        return ids;
    }

    ChoiceSetReport check(const std::string& parent, const std::vector<std::string>& choices,
                          ChoicePolicy policy = ChoicePolicy::Unique, ChoiceSetOptions options = {}) {
        options.reasons = options.merges = true;
        return ChoiceSetChecker(*service, options).check(parse(parent), parseAll(choices), std::nullopt, policy);
    }

    SymbolDomain domain(const std::string& name, int low, int high) {
        return {.symbol = parse(name), .min = low, .max = high};
    }

    std::string texts(std::span<const SymbolicExprId> ids) {
        std::string result;
        for (const SymbolicExprId id : ids)
            result += (result.empty() ? "" : ", ") + service->printCExpr(id);
        return result;
    }

    FreshService service;
};

TEST_F(ChoiceSetChecks, AgreeWithBruteForceUnderEveryPolicy) {
    std::mt19937_64 random(63);
    const ConditionShape shape{.symbols = {"A", "B"}, .lowest = 0, .highest = 3, .symbolPairs = true};
    std::array<std::size_t, 5> seen{}; ///< dead, hidden, gaps, merges, removals
    for (int round = 0; round < 240; ++round) {
        const auto policy = static_cast<ChoicePolicy>(round % 3);
        const std::string parentText =
            "A + B < 99 && " + (random() % 2 == 0 ? "true" : randomCondition(random, 1, shape)); // has both names
        const SymbolicExprId parent = parse(parentText);
        std::vector<std::string> given;
        for (std::size_t i = 0; i < 2 + random() % 4; ++i)
            given.push_back(randomCondition(random, 1 + random() % 2, shape));
        const std::vector<SymbolicExprId> choices = parseAll(given);
        const ChoiceSetReport report =
            check(parentText, given, policy, {.domains = {domain("A", -1, 4), domain("B", 0, 3)}});
        ASSERT_TRUE(report.undecided.empty());

        std::vector<std::uint64_t> active(choices.size(), 0);
        std::vector<std::uint64_t> holding(choices.size(), 0);
        std::uint64_t around = 0;
        std::uint64_t gap = 0;
        Pairs overlaps;
        const auto holdsFor = [&](SymbolicExprId id, const Assignment& values) {
            return holds(service->table(), id, values);
        };
        const auto missing = std::ranges::find(report.findings, ChoiceFault::Missing, &ChoiceFinding::fault);
        for (int a = -1; a <= 4; ++a)
            for (int b = 0; b <= 3; ++b) {
                const Assignment values{{"A", a}, {"B", b}};
                if (!holdsFor(parent, values))
                    continue;
                ++around;
                std::vector<std::size_t> on;
                for (std::size_t i = 0; i < choices.size(); ++i)
                    if (holdsFor(choices[i], values))
                        on.push_back(i);
                gap += on.empty() ? 1U : 0U;
                for (std::size_t i = 0; i < on.size(); ++i) {
                    ++holding[on[i]];
                    active[on[i]] += policy != ChoicePolicy::First || i == 0 ? 1U : 0U;
                    for (std::size_t j = i + 1; j < on.size(); ++j)
                        overlaps.emplace_back(on[i], on[j]);
                }
                if (missing != report.findings.end()) {
                    ASSERT_EQ(holdsFor(missing->proposed, values), on.empty()) << texts({{missing->proposed}});
                }
                for (const ChoiceMerge& merge : report.merges) {
                    const bool any = std::ranges::any_of(
                        merge.choices, [&](std::size_t each) { return std::ranges::find(on, each) != on.end(); });
                    ASSERT_EQ(holdsFor(merge.merged, values), any) << texts({{merge.merged}});
                }
            }
        ASSERT_EQ(report.parentNeverHolds, around == 0);
        if (around == 0)
            continue;
        ASSERT_EQ(missing != report.findings.end(), gap != 0);
        ASSERT_EQ(report.parentAssignments, around);
        for (std::size_t i = 0; i < choices.size(); ++i) {
            ASSERT_EQ(report.assignments[i], active[i]);
            const auto dead = std::ranges::find_if(report.findings, [&](const ChoiceFinding& finding) {
                return finding.fault == ChoiceFault::Dead && finding.choice == i;
            });
            ASSERT_EQ(dead != report.findings.end(), active[i] == 0);
            if (dead == report.findings.end())
                continue;
            ASSERT_EQ(dead->hiddenBy.empty(), holding[i] == 0);
            ASSERT_TRUE(dead->reasons.isProven && dead->reasons.isMinimal);
            ++seen[dead->hiddenBy.empty() ? 0 : 1];
            // Those that hide it do so, and none of them is needless.
            for (std::size_t left = 0; left <= dead->hiddenBy.size(); ++left) {
                std::string only =
                    "(" + parentText + ") && A >= -1 && A <= 4 && B >= 0 && B <= 3 && (" + given[i] + ")";
                for (std::size_t j = 0; j < dead->hiddenBy.size(); ++j)
                    if (j + 1 != left)
                        only += " && !(" + given[dead->hiddenBy[j]] + ")";
                ASSERT_EQ(service->canHold(parse(only)).isYes(), left != 0) << only;
            }
        }
        std::ranges::sort(overlaps);
        overlaps.erase(std::unique(overlaps.begin(), overlaps.end()), overlaps.end());
        ASSERT_EQ(std::ranges::count(report.findings, ChoiceFault::Overlap, &ChoiceFinding::fault),
                  policy == ChoicePolicy::Unique ? std::ssize(overlaps) : 0);
        ASSERT_TRUE(report.removal.isSmallest);
        ASSERT_EQ(report.removal.choices.empty(), overlaps.empty() || policy != ChoicePolicy::Unique);
        seen[2] += gap != 0 ? 1U : 0U;
        seen[3] += report.merges.size();
        seen[4] += report.removal.choices.size();
    }
    for (const std::size_t each : seen)
        EXPECT_GT(each, 10U);
}

TEST_F(ChoiceSetChecks, FindEveryOperandThatCanGo) {
    std::mt19937_64 random(65);
    const ConditionShape shape{.symbols = {"A", "B"}, .lowest = 0, .highest = 3};
    std::size_t redundant = 0;
    std::size_t ordinary = 0;
    for (int round = 0; round < 300; ++round) {
        const std::string parent = randomCondition(random, 1 + random() % 2, shape);
        std::vector<std::string> operands;
        for (std::size_t i = 0; i < 2 + random() % 2; ++i)
            operands.push_back("(" + randomCondition(random, 1, shape) + ")");
        const auto without = [&](std::size_t left) {
            std::string text = "true";
            for (std::size_t i = 0; i < operands.size(); ++i)
                text += i == left ? "" : " && " + operands[i];
            return text;
        };
        const std::string whole = without(operands.size());
        const ChoiceSetReport report = check(parent, {whole.substr(8)});
        const auto count = [&](const std::string& condition) {
            std::size_t holding = 0;
            const SymbolicExprId id = parse("(" + parent + ") && " + condition);
            forEachAssignment(shape.symbols, -1, 4, [&](const Assignment& values) {
                holding += holds(service->table(), id, values) ? 1U : 0U;
            });
            return holding;
        };
        const std::size_t active = count(whole);
        if (report.parentNeverHolds || active == 0 || active == count("true"))
            continue;
        bool canGo = false;
        for (std::size_t i = 0; i < operands.size(); ++i)
            canGo = canGo || count(without(i)) == active;
        const bool isFound = std::ranges::count(report.findings, ChoiceFault::Redundant, &ChoiceFinding::fault) > 0;
        ASSERT_TRUE(isFound || !canGo) << parent << ": " << whole;
        (isFound ? redundant : ordinary) += 1;
    }
    EXPECT_GT(redundant, 40U);
    EXPECT_GT(ordinary, 40U);
}

TEST_F(ChoiceSetChecks, SayWhatClosesAGapAndWhatCanBeMerged) {
    const auto proposed = [&](const std::string& parent, const std::vector<std::string>& choices) {
        const ChoiceSetReport report = check(parent, choices);
        const auto missing = std::ranges::find(report.findings, ChoiceFault::Missing, &ChoiceFinding::fault);
        return missing == report.findings.end() ? "no gap" : texts({{missing->proposed}});
    };
    EXPECT_EQ(proposed("true", {"A>0", "A<0"}), "A==0");
    EXPECT_EQ(proposed("POWER>0", {"FUEL==1", "FUEL==2 && POWER<=90", "FUEL>2"}), "FUEL==2 && POWER>90 || FUEL<=0");
    EXPECT_EQ(proposed("A>2", {"A>1"}), "no gap");
    const auto merged = [&](const std::vector<std::string>& choices, ChoicePolicy policy = ChoicePolicy::Unique) {
        std::string result;
        for (const ChoiceMerge& merge : check("true", choices, policy).merges) {
            for (const std::size_t each : merge.choices)
                result += std::to_string(each) + " ";
            result += texts({{merge.merged}}) + "; ";
        }
        return result;
    };
    EXPECT_EQ(merged({"A==1 && B>2", "C", "B<=2 && A==1"}), "0 2 A==1; ");
    EXPECT_EQ(merged({"A==1 && B>2", "C", "B<=2 && A==1"}, ChoicePolicy::First), "");
    EXPECT_EQ(merged({"A==3", "A==1", "A==2", "A==5"}), "0 1 2 A>=1 && A<=3; ");
    EXPECT_EQ(merged({"A==1 && B==1", "A==2 && B==2"}), "");
}

TEST_F(ChoiceSetChecks, CountBeyondWhatCanBeEnumerated) {
    const std::vector<SymbolDomain> domains{domain("A", -2000000000, 2000000000), domain("B", 0, 999999),
                                            domain("C", 1, 3)};
    const auto count = [&](const std::string& choice) {
        return check("true", {choice, "A + B == C"}, ChoicePolicy::Unique, {.domains = domains}).assignments[0];
    };
    EXPECT_EQ(count("A > 0 && B == 7"), std::uint64_t{2000000000} * 3);
    EXPECT_EQ(count("B < 10 || C == 2"), std::uint64_t{4000000001} * (10 * 3 + 999990));
    EXPECT_EQ(count("A + C == 1"), std::nullopt) << "each value of A by itself";
    EXPECT_EQ(count("f(C) == 1"), std::nullopt);
    EXPECT_EQ(count("D == 1"), std::nullopt) << "no values";
    EXPECT_TRUE(check("true", {"A"}).assignments.empty());
}

TEST_F(ChoiceSetChecks, KnowTheirReasonsAndWhatTheServiceAssumes) {
    const auto reasons = [&](const ChoiceSetReport& report) {
        std::string result;
        for (const ChoiceFinding& finding : report.findings)
            result += texts(finding.reasons.operands) + "; ";
        return result;
    };
    EXPECT_EQ(reasons(check("X && Gear>2 && Y", {"Sport && Gear<=1", "Gear>1 && Sport", "Gear!=7 || !Sport"})),
              "Gear>2, Gear<=1; Gear>2; ; ");
    ASSERT_TRUE(service->assumeFromCCondition("F >= 1 && F <= 3 && G == 2"));
    const ChoiceSetReport report = check("true", {"F==1", "F==2", "F>2", "F==9"});
    ASSERT_EQ(report.findings.size(), 1U);
    EXPECT_EQ(reasons(report), "F<=3, F==9; ");
}

TEST_F(ChoiceSetChecks, KnowTheBoundsOfNames) {
    const std::vector<std::string> choices{"A<2147483647", "A==2147483647", "A>2147483647"};
    for (const bool bits32 : {false, true}) {
        const ChoiceSetReport report = check("true", choices, ChoicePolicy::First, {.bits32 = bits32});
        EXPECT_TRUE(report.undecided.empty());
        ASSERT_EQ(std::ranges::count(report.findings, ChoiceFault::Dead, &ChoiceFinding::fault), bits32 ? 1 : 0);
        if (bits32) {
            const auto dead = std::ranges::find(report.findings, ChoiceFault::Dead, &ChoiceFinding::fault);
            EXPECT_EQ(dead->choice, 2U);
            EXPECT_FALSE(dead->isHidden);
        }
        EXPECT_EQ(std::ranges::count(report.findings, ChoiceFault::Missing, &ChoiceFinding::fault), 0);
    }
}

TEST_F(ChoiceSetChecks, OfManyOverlappingChoicesUnderFirst) {
    std::mt19937_64 random(66);
    const auto anyName = [&] { return "N" + std::to_string(random() % 6); };
    const auto less = [&] { return anyName() + " < " + anyName() + " + " + std::to_string(random() % 100); };
    const auto sum = [&] { return anyName() + " + " + anyName() + " == " + std::to_string(random() % 60); };
    // Products of ranges, exclusions, and sums of products, of which thousands hide each other; differences and sums.
    for (int shape = 0; shape < 5; ++shape) {
        std::vector<std::string> choices;
        for (int i = 0; i < (shape < 3 ? 1500 : 200); ++i) {
            std::string text = shape == 3   ? less() + " && " + less()
                               : shape == 4 ? sum() + " && " + anyName() + " == " + std::to_string(random() % 9)
                                            : "";
            for (std::size_t name = 0; name < 6; ++name) {
                const std::string value = std::to_string(random() % 40);
                const std::string symbol = "N" + std::to_string(name);
                if (shape == 0 && random() % 3 == 0)
                    text += (text.empty() ? "" : " && ") + symbol + " >= " + value + " && " + symbol + " <= " + value +
                            std::to_string(random() % 10);
                else if (shape == 1)
                    text += (text.empty() ? "" : " && ") + symbol + " != " + value;
                else if (shape == 2)
                    text += (name == 0 ? "" : name % 2 == 0 ? " || " : " && ") + symbol + " == " + value;
            }
            choices.push_back(text.empty() ? "N0 == -1" : text);
        }
        const std::vector<SymbolicExprId> ids = parseAll(choices);
        const ChoiceSetReport report =
            ChoiceSetChecker(*service).check(parse("true"), ids, std::nullopt, ChoicePolicy::First);
        EXPECT_TRUE(report.undecided.empty()) << shape << ": " << report.undecided.size();
        std::vector<bool> isDead(ids.size(), false);
        Decider decider(service->table());
        for (const ChoiceFinding& finding : report.findings) {
            if (finding.fault != ChoiceFault::Dead)
                continue;
            isDead[finding.choice] = true;
            if (!finding.isHidden) {
                ASSERT_TRUE(decider.canHold(ids[finding.choice]).isNo()) << choices[finding.choice];
                continue;
            }
            ASSERT_FALSE(finding.hiddenBy.empty());
            ASSERT_LT(finding.hiddenBy.back(), finding.choice);
            std::string hiding;
            for (const std::size_t choice : finding.hiddenBy)
                hiding += (hiding.empty() ? "(" : " || (") + choices[choice] + ")";
            ASSERT_FALSE(decider.implies(ids[finding.choice], parse(hiding)).isNo());
        }
        // A sample is decided without boxes.
        for (std::size_t i = 0; i < 60; ++i) {
            std::string left = "(" + choices[i] + ")";
            for (std::size_t before = 0; before < i; ++before)
                left += " && !(" + choices[before] + ")";
            const Decision active = decider.canHold(parse(left));
            if (!active.isUndecided()) {
                ASSERT_EQ(active.isNo(), isDead[i]) << left;
            }
        }
        // Every value that some choice has, an active one has.
        for (int sample = 0; sample < 200; ++sample) {
            Witness values;
            for (int name = 0; name < 6; ++name)
                values.push_back({parse("N" + std::to_string(name)), static_cast<std::int64_t>(random() % 50)});
            const auto holds = [&](SymbolicExprId id) { return decider.holds(id, values) == true; };
            const auto first = std::ranges::find_if(ids, holds);
            ASSERT_TRUE(first == ids.end() || !isDead[static_cast<std::size_t>(first - ids.begin())]);
        }
    }
}

TEST_F(ChoiceSetChecks, OfFiveThousandChoices) {
    std::vector<std::string> choices;
    for (int i = 0; i < 5000; ++i) {
        std::string text;
        int rest = i;
        for (int name = 0; name < 7; ++name, rest /= 4)
            text += (name == 0 ? "N" : " && N") + std::to_string(name) + " == " + std::to_string(rest % 4);
        choices.push_back(std::move(text));
    }
    std::vector<SymbolDomain> domains;
    for (int name = 0; name < 7; ++name)
        domains.push_back(domain("N" + std::to_string(name), 0, 3));
    for (const ChoicePolicy policy : {ChoicePolicy::Unique, ChoicePolicy::First}) {
        const ChoiceSetReport report = ChoiceSetChecker(*service, {.domains = domains})
                                           .check(parse("true"), parseAll(choices), std::nullopt, policy);
        ASSERT_TRUE(report.undecided.empty());
        ASSERT_EQ(report.findings.size(), 1U);
        EXPECT_EQ(report.findings[0].fault, ChoiceFault::Missing);
        EXPECT_EQ(report.parentAssignments, 16384U);
        EXPECT_EQ(report.assignments[4999], 1U);
    }
}

} // namespace
} // namespace VT::Testing
