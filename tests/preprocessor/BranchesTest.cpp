// Findings of a scan compared with a real preprocessor under every definition of the macros of a small world.
#include "base/scan/SourceScan.hpp"
#include "base/scan/changes/BranchMeanings.hpp"
#include "base/scan/regions/BuiltCondition.hpp"
#include "base/scan/report/Suppressions.hpp"
#include "tests/preprocessor/Worlds.hpp"

#include <gtest/gtest.h>

#include <map>
#include <random>
#include <set>

namespace VT::Testing {
namespace {

/// What is found with the knowledge of a build is true of every world that agrees with it.
void checkBuild(const RandomSource& source, const RandomSource::Build& build,
                std::map<BranchFindingKind, int>& counts) {
    const std::vector<std::set<int>> worlds = entered(source.text, source.values, build.assumed);
    BuildMacros known;
    bool isTaken = true;
    if (!build.option.empty())
        isTaken = known.define(build.option);
    else if (!build.file.empty())
        known.addFile("macros.h", build.file, false);
    else if (!build.macro.empty())
        isTaken = known.undefine(build.macro);
    ASSERT_TRUE(isTaken);
    SourceScanner scanner;
    ASSERT_TRUE(build.assumed.empty() || !scanner.assume(build.assumed)) << build.assumed;
    SourceFile file{source.text};
    file.configurations = {&known};
    scanner.scan(file, [&](const BranchFinding& finding) {
        ++counts[finding.kind];
        const auto branch =
            std::ranges::find(source.branches, static_cast<std::size_t>(finding.region.line), &Branch::line);
        ASSERT_NE(branch, source.branches.end());
        const int number = static_cast<int>(branch - source.branches.begin());
        for (std::size_t i = 0; i < worlds.size(); ++i) {
            std::size_t digits = i;
            for (const std::string& name : macros) {
                const std::string& value = source.values[digits % source.values.size()];
                if (name == build.macro && value != build.value && !finding.configurations.empty())
                    digits = ~std::size_t{0};
                if (digits == ~std::size_t{0})
                    break;
                digits /= source.values.size();
            }
            if (digits == ~std::size_t{0} || worlds[i].contains(-1))
                continue;
            const bool isIn = worlds[i].contains(number);
            const std::string shown = finding.directive + " with " + build.option + " " + build.file + " and " +
                                      build.assumed + "\n" + source.text;
            ASSERT_FALSE(finding.kind == BranchFindingKind::Dead && isIn) << shown;
            ASSERT_FALSE(finding.proposed == "1" && isReached(*branch, worlds[i]) && !isIn) << shown;
        }
    });
}

std::size_t commentsIn(const std::string& text) {
    std::size_t count = 0;
    for (std::size_t at = 0; (at = text.find("/*", at)) != std::string::npos; ++at)
        ++count;
    return count;
}

void checkSuppressions(const RandomSource& source) {
    std::set<std::uint64_t> expected;
    for (const Branch& branch : source.branches)
        if (branch.isKept)
            expected.insert(branch.line);
    std::set<std::uint64_t> read;
    for (const Suppression& suppression : readSuppressions(source.text)) {
        EXPECT_FALSE(suppression.isMalformed) << suppression.text;
        read.insert(suppression.line.value_or(0));
    }
    EXPECT_EQ(read, expected) << source.text;
}

void check(const RandomSource& source, bool plain, std::map<BranchFindingKind, int>& counts) {
    checkSuppressions(source);
    const std::vector<std::set<int>> worlds = entered(source.text, source.values);
    ASSERT_EQ(worlds.size(), plain ? 343U : 64U);
    std::map<int, BranchFindingKind> found;
    std::vector<BranchFinding> fixes;
    SourceScanner().scan(source.text, false, [&](const BranchFinding& finding) {
        ++counts[finding.kind];
        const auto branch =
            std::ranges::find(source.branches, static_cast<std::size_t>(finding.region.line), &Branch::line);
        ASSERT_NE(branch, source.branches.end());
        const int number = static_cast<int>(branch - source.branches.begin());
        found[number] = finding.proposed == "1" ? BranchFindingKind::AlwaysTrue : finding.kind;
        for (const std::set<int>& world : worlds) {
            const bool isIn = world.contains(number);
            ASSERT_FALSE(finding.kind == BranchFindingKind::Dead && isIn) << finding.directive << "\n" << source.text;
            ASSERT_FALSE(finding.proposed == "1" && isReached(*branch, world) && !isIn) << finding.directive << "\n"
                                                                                        << source.text;
        }
        if (finding.replaced)
            fixes.push_back(finding);
    });
    std::vector<SourceEdit> edits;
    for (const BranchFinding& fix : fixes)
        edits.push_back(fix.edit);
    const std::string mended = withEdits(source.text, edits); // all at once
    EXPECT_EQ(commentsIn(mended), commentsIn(source.text)) << mended;
    SourceScanner().scan(mended, false, [&](const BranchFinding& finding) {
        const std::size_t number = mended.find('@', offsetOf(mended, finding.region.line, finding.region.column));
        const int branch = std::stoi(mended.substr(number + 1));
        EXPECT_TRUE(!finding.replaced || !found.contains(branch)) << finding.directive << "\n"
                                                                  << source.text << "\n"
                                                                  << mended;
    });
    const bool moves = source.text.find("__COUNTER__") != std::string::npos || // changes where something is left out
                       source.text.find("__LINE__") != std::string::npos;
    EXPECT_TRUE(moves || entered(mended, source.values) == worlds) << source.text << "\nis not\n" << mended;
    for (std::size_t i = 0; plain && i < source.branches.size(); ++i) {
        const Branch& branch = source.branches[i];
        const int number = static_cast<int>(i);
        std::size_t lives = 0, reached = 0, in = 0; // worlds
        for (const std::set<int>& world : worlds) {
            lives += branch.parent < 0 || world.contains(branch.parent) ? 1U : 0U;
            reached += isReached(branch, world) ? 1U : 0U;
            in += world.contains(number) ? 1U : 0U;
        }
        const bool isDead = lives > 0 && in == 0;
        const bool always = !branch.isElse && reached > 0 && reached == in; // none is in that is not reached
        const auto is = [&](BranchFindingKind kind) { return found.contains(number) && found[number] == kind; };
        EXPECT_EQ(is(BranchFindingKind::Dead), isDead) << branch.line << "\n" << source.text;
        EXPECT_EQ(is(BranchFindingKind::AlwaysTrue), always) << branch.line << "\n" << source.text;
    }
}

class Branches : public ::testing::TestWithParam<bool> {};

TEST_P(Branches, AreWhatAPreprocessorMakesOfThem) {
    std::mt19937_64 random(GetParam() ? 1 : 2);
    std::map<BranchFindingKind, int> counts;
    for (int i = 0; i < (GetParam() ? 60 : 300) && !HasFailure(); ++i)
        check(RandomSource(random, GetParam()), GetParam(), counts);
    std::cout << "dead " << counts[BranchFindingKind::Dead] << ", always true " << counts[BranchFindingKind::AlwaysTrue]
              << ", removable " << counts[BranchFindingKind::Removable] << "\n";
    for (const auto& [kind, times] : counts)
        EXPECT_GT(times, 10);
}

/// The operands of a reason force a finding, and without any one of them another definition is there.
TEST(ReasonsOfBranches, AreTheFewestOperands) {
    std::mt19937_64 random(5);
    std::size_t asked = 0;
    for (int i = 0; i < 40 && !::testing::Test::HasFailure(); ++i) {
        const RandomSource source(random, true);
        std::string questions;
        std::vector<std::pair<bool, std::string>> expected; // whether the answer is yes for some definition
        const auto ask = [&](const std::vector<std::string>& operands, bool isYes) {
            std::string condition = "1";
            for (const std::string& operand : operands)
                condition += " && (" + operand + ")";
            questions += "#if " + condition + "\n@" + std::to_string(expected.size()) + "\n#endif\n";
            expected.emplace_back(isYes, condition);
        };
        SourceScanner({.why = true}).scan(source.text, false, [&](const BranchFinding& finding) {
            const bool isDead = finding.kind == BranchFindingKind::Dead;
            if ((!isDead && finding.proposed != "1") || finding.condition.empty() || finding.because.empty())
                return;
            EXPECT_TRUE(finding.isMinimal);
            std::vector<std::string> operands = finding.because;
            if (!isDead)
                operands.push_back("!(" + finding.condition + ")");
            ask(operands, false);
            for (std::size_t left = 0; left < finding.because.size(); ++left) {
                std::vector<std::string> others = operands;
                others.erase(others.begin() + static_cast<std::ptrdiff_t>(left));
                ask(others, true);
            }
        });
        std::set<int> answers;
        for (const std::set<int>& world : entered(questions, source.values))
            answers.insert(world.begin(), world.end());
        for (std::size_t question = 0; question < expected.size(); ++question)
            EXPECT_EQ(answers.contains(static_cast<int>(question)), expected[question].first)
                << expected[question].second << "\n"
                << source.text;
        asked += expected.size();
    }
    EXPECT_GT(asked, 500U);
}

TEST(ChangedBranches, AreBuiltInOtherCases) {
    std::mt19937_64 random(4);
    std::size_t reported = 0;
    std::size_t unchanged = 0;
    for (int i = 0; i < 60 && !::testing::Test::HasFailure(); ++i) {
        RandomSource source(random, true);
        const RandomSource::Rewritten fresh = source.rewritten();
        const std::vector<std::set<int>> before = entered(source.text, source.values);
        const std::vector<std::set<int>> after = entered(fresh.text, source.values);
        std::set<int> found;
        for (const ChangedBranch& changed : changedBranches(source.text, fresh.text, false, {fresh.lines})) {
            const std::size_t at = offsetOf(fresh.text, changed.region.line, 1);
            found.insert(std::stoi(fresh.text.substr(fresh.text.find('@', at) + 1)));
        }
        reported += found.size();
        for (std::size_t k = 0; k < source.branches.size(); ++k) {
            const int number = static_cast<int>(k);
            bool differs = false;
            for (std::size_t world = 0; world < before.size(); ++world)
                differs = differs || before[world].contains(number) != after[world].contains(number);
            unchanged += differs ? 0U : 1U;
            bool isReported = false; // or one around it
            for (int each = number; each >= 0; each = source.branches[static_cast<std::size_t>(each)].parent)
                isReported = isReported || found.contains(each);
            EXPECT_TRUE(differs ? isReported : !found.contains(number)) << number << "\n"
                                                                        << source.text << "\nand\n"
                                                                        << fresh.text;
        }
    }
    EXPECT_GT(reported, 30U);
    EXPECT_GT(unchanged, 100U);
}

TEST(BranchesOfBuilds, AreWhatAPreprocessorMakesOfThem) {
    std::mt19937_64 random(3);
    std::map<BranchFindingKind, int> counts;
    for (int i = 0; i < 300 && !::testing::Test::HasFailure(); ++i) {
        RandomSource source(random, false);
        checkBuild(source, source.build(), counts);
    }
    for (const auto& [kind, times] : counts)
        EXPECT_GT(times, 10);
}

INSTANTIATE_TEST_SUITE_P(PlainAndAny, Branches, ::testing::Bool());

/// The condition of a branch, asked at the end of the file, holds where the branch is entered.  Where macros change on
/// the way, it is asked only whether it is always or never so.
TEST(BuiltConditions, AreWhatAPreprocessorMakesOfThem) {
    constexpr int asked = 100'000; // is added to the number of a branch
    std::mt19937_64 random(23);
    std::size_t conditions = 0;
    std::size_t constants = 0;
    for (int file = 0; file < 60; ++file) {
        const bool isPlain = file % 2 == 0;
        RandomSource source(random, isPlain);
        const ConditionalRegions regions(source.text);
        std::string text = source.text;
        std::map<int, std::string> built;
        for (std::size_t i = 0; i < source.branches.size(); ++i) {
            const std::uint32_t region = regions.onLine(source.branches[i].line);
            if (region == ConditionalRegions::none)
                continue;
            const std::string condition = builtCondition(source.text, false, regions, region).condition;
            ASSERT_TRUE(!isPlain || !condition.empty()) << source.text << "branch " << i;
            const bool isConstant = condition == "0" || condition == "1";
            if (condition.empty() || (!isPlain && !isConstant))
                continue;
            ++(isConstant ? constants : conditions);
            built[static_cast<int>(i)] = condition;
            text += "#if " + condition + "\n@" + std::to_string(asked + static_cast<int>(i)) + "\n#endif\n";
        }
        for (const std::set<int>& entered : entered(text, source.values))
            for (const auto& [branch, condition] : built)
                ASSERT_EQ(entered.contains(branch), entered.contains(asked + branch))
                    << source.text << "branch " << branch << ": " << condition;
    }
    EXPECT_GT(conditions, 100U);
    EXPECT_GT(constants, 30U);
}

} // namespace
} // namespace VT::Testing
