// What is found in files of all kinds, one line a finding.
#include "base/scan/SourceScan.hpp"
#include "tests/support/Cases.hpp"

#include <gtest/gtest.h>

namespace VT::Testing {
namespace {

/// The findings, one a line.
std::string findings(const std::string& text, const std::string& kind = {}) {
    std::string report;
    const auto tell = [&](const BranchFinding& found) {
        const char* const kinds[] = {"dead", "always", "removable"};
        report += report.empty() ? "" : "\n";
        report += std::to_string(found.region.line) + " " + kinds[static_cast<int>(found.kind)] + " " + found.condition;
        if (found.kind == BranchFindingKind::Removable)
            report += " -> " + found.proposed;
        for (const BranchReason& reason : found.reasons)
            report += (reason.holds ? " @" : " !") + std::to_string(reason.region.line);
    };
    SourceScanner({.strictIncludes = kind == "strict"}).scan(text, kind == "C++", tell);
    return report;
}

TEST(Findings, AreAsListed) {
    for (const CaseRow& row : casesOf("scan-findings.txt", "findings", 4))
        EXPECT_EQ(findings(row[1], row[3]), row[2]) << row[0] << "\n" << row[1];
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
