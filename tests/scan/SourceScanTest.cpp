// What is found in files of all kinds, one line a finding.
#include "base/scan/SourceScan.hpp"
#include "base/core/Limits.hpp"
#include "tests/support/Cases.hpp"

#include <gtest/gtest.h>

namespace VT::Testing {
namespace {

/// A finding as a line.
std::string lineOf(const BranchFinding& found) {
    const char* const kinds[] = {"dead", "always", "removable", "spelled-out"};
    std::string line =
        std::to_string(found.region.line) + " " + kinds[static_cast<int>(found.kind)] + " " + found.condition;
    if (found.proposed != "0" && found.proposed != "1" && !found.proposed.empty())
        line += " -> " + found.proposed;
    for (const BranchReason& reason : found.reasons)
        line += (reason.kind == BranchReasonKind::Absence ? " ~"
                 : reason.holds                           ? " @"
                                                          : " !") +
                (reason.kind == BranchReasonKind::Directive ? std::to_string(reason.region.line) : reason.directive);
    for (const std::string& operand : found.redundant)
        line += " without " + operand;
    for (std::size_t i = 0; i < found.because.size(); ++i)
        line += (i == 0 ? " because " : ", ") + found.because[i];
    for (const std::size_t configuration : found.configurations)
        line += " #" + std::to_string(configuration + 1);
    if (found.cause == BranchCause::Absence)
        line += " absent";
    if (!found.witness.empty())
        line += " but #" + std::to_string(found.witnessOf + 1) + " with " + found.witness;
    return line;
}

/// The findings, one a line.
std::string findings(SourceScanner scanner, const SourceFile& file) {
    std::string report;
    scanner.scan(file, [&](const BranchFinding& found) { report += (report.empty() ? "" : "\n") + lineOf(found); });
    return report;
}

std::string findings(const std::string& text, const std::string& kind = {}) {
    return findings(SourceScanner({.strictIncludes = kind == "strict", .why = kind == "why"}), {text, kind == "C++"});
}

TEST(Findings, AreAsListed) {
    for (const CaseRow& row : casesOf("scan-findings.txt", "findings", 4))
        EXPECT_EQ(findings(row[1], row[3]), row[2]) << row[0] << "\n" << row[1];
}

/// Words of a list, each after the blank before it.
std::vector<std::string> wordsOf(const std::string& list, const std::string& separator) {
    std::vector<std::string> words;
    for (std::size_t at = 0; at <= list.size();) {
        const std::size_t end = std::min(list.find(separator, at), list.size());
        words.push_back(list.substr(at, end - at));
        at = end + separator.size();
    }
    return words;
}

/// The findings of a copy that is asked for what all configurations have in common.
std::string commonOf(SourceScanner scanner, const SourceFile& file) {
    scanner.reportCommonOnly(true);
    return findings(std::move(scanner), file);
}

/// The findings of a copy, without those that hold in some configurations alone.
std::string withoutOthers(SourceScanner scanner, const SourceFile& file, std::size_t configurations) {
    std::string report;
    scanner.scan(file, [&](const BranchFinding& found) {
        if (found.configurations.empty() || found.configurations.size() == configurations)
            report += (report.empty() ? "" : "\n") + lineOf(found);
    });
    return report;
}

TEST(Findings, OfBuilds) {
    for (const CaseRow& row : casesOf("scan-builds.txt", "builds", 4)) {
        SourceScanner scanner({.why = true});
        std::vector<BuildMacros> builds;
        std::size_t alternatives = 0;
        for (const std::string& configuration : wordsOf(row[1], " | ")) {
            builds.emplace_back();
            for (const std::string& option : wordsOf(configuration, "; ")) {
                if (option.starts_with("-D"))
                    EXPECT_TRUE(builds.back().define(option.substr(2))) << option;
                else if (option.starts_with("-U"))
                    EXPECT_TRUE(builds.back().undefine(option.substr(2))) << option;
                else if (option.starts_with("assume "))
                    EXPECT_EQ(scanner.assume(option.substr(7)), std::nullopt) << option;
                else if (option == "or" && ++alternatives > 0)
                    scanner.beginAlternative();
                else
                    builds.back().addFile("c.h", option, true);
            }
        }
        SourceFile file{row[2], true};
        for (const BuildMacros& build : builds)
            if (!build.empty())
                file.configurations.push_back(&build);
        const std::size_t configurations =
            std::max<std::size_t>(alternatives, 1) * std::max<std::size_t>(file.configurations.size(), 1);
        EXPECT_EQ(commonOf(scanner, file), withoutOthers(scanner, file, configurations)) << row[0] << "\n" << row[2];
        EXPECT_EQ(findings(std::move(scanner), file), row[3]) << row[0] << "\n" << row[2];
    }
}

TEST(Findings, OfMacrosThatGrow) {
    BuildMacros build;
    const auto name = [](int i) { return "A" + std::to_string(i); };
    EXPECT_TRUE(build.define("A0=1"));
    for (int i = 1; i < 60; ++i)
        EXPECT_TRUE(build.define(name(i) + "=(" + name(i - 1) + "+" + name(i - 1) + ")"));
    SourceFile file{"#if A5 == 32\n#elif A59 == 0\n#endif", true};
    file.configurations = {&build};
    EXPECT_EQ(findings(SourceScanner(), file).find("1 always A5 == 32"), 0U);
    std::string many;
    for (int i = 0; i < 20'000; ++i)
        many += "#if A59 + " + std::to_string(i) + "\n#endif\n";
    file.text = many;
    EXPECT_EQ(findings(SourceScanner(), file), "");
    EXPECT_FALSE(build.define("1") || build.define("") || build.undefine("A B") || build.undefine(""));
}

TEST(Findings, OfManyConfigurationsAndAssumptions) {
    std::vector<BuildMacros> builds(limits::scanConfigurations + 1);
    SourceFile file{"#if N\n#endif"};
    for (std::size_t i = 0; i < builds.size(); ++i) {
        EXPECT_TRUE(builds[i].define("N=" + std::to_string(i + 1)));
        file.configurations.push_back(&builds[i]);
    }
    SourceScanner scanner;
    std::size_t held = 0;
    scanner.scan(file, [&](const BranchFinding& found) { held += found.configurations.size(); });
    EXPECT_EQ(held, limits::scanConfigurations);
    EXPECT_EQ(scanner.counts().leftOut, 1U);

    // A file is given up as soon as its configurations have nothing in common.
    file.text = "#if N > 2 && A\n#endif\n#if N > 2 && B\n#endif";
    SourceScanner all;
    EXPECT_NE(findings(all, file), "");
    SourceScanner few(all);
    few.reportCommonOnly(true);
    few.scan(file, [](const BranchFinding& found) { ADD_FAILURE() << lineOf(found); });
    all.scan(file, [](const BranchFinding&) {});
    EXPECT_LT(4 * few.counts().steps, all.counts().steps);

    const auto isFound = [](std::size_t links) { // A0 || !A1, A1 || !A2, ...
        SourceScanner chained;
        for (std::size_t i = 0; i < links; ++i)
            EXPECT_EQ(chained.assume("A" + std::to_string(i) + " || !A" + std::to_string(i + 1)), std::nullopt);
        const std::string text = "#if A" + std::to_string(links) + "\n#if A0\n#endif\n#endif";
        return !findings(std::move(chained), {text}).empty();
    };
    EXPECT_TRUE(isFound(limits::relatedAssumptions));
    EXPECT_FALSE(isFound(3 * limits::relatedAssumptions));
}

TEST(Findings, OfLongFiles) {
    const auto times = [](std::size_t count, const std::string& text) {
        std::string all;
        for (std::size_t i = 0; i < count; ++i)
            all += text;
        return all;
    };
    std::string chain = "#if X == 0\n";
    for (int i = 1; i < 20'000; ++i)
        chain += "#elif X == " + std::to_string(i) + "\n";
    EXPECT_EQ(findings(times(100'000, "#if A && B\n#undef A\n#define B A\n")), "") << "nested deeply";
    EXPECT_EQ(findings("#if " + times(1'000'000, "(") + "A\n#if " + times(1'000'000, "!") + "A\n#endif\n#endif"), "")
        << "brackets";
    EXPECT_EQ(findings("#if " + times(1'000'000, "A == 1 && ") + "B\n#endif\n" + times(1'000'000, "R\"(a'\\x ") +
                       "\n#if B && B\n#endif"),
              "4 removable B && B -> B")
        << "a line of 10 MB";
    EXPECT_EQ(findings(chain + "#elif X == 19999\n#else\n#endif"), "20001 dead X == 19999 !20000") << "a long chain";
}

} // namespace
} // namespace VT::Testing
