// Growing files: what deciding costs, counted in steps, and that it depends on nothing but the file.
#include "base/core/Limits.hpp"
#include "base/scan/SourceScan.hpp"
#include "tests/support/generators/Pigeons.hpp"

#include <gtest/gtest.h>

namespace VT::Testing {
namespace {

struct Outcome {
    std::size_t found = 0;
    std::size_t quoted = 0; ///< bytes of reasons
    std::uint64_t branches = 0, undecided = 0, steps = 0;
};

Outcome scan(SourceScanner& scanner, const std::string& text) {
    const SourceScanCounts before = scanner.counts();
    Outcome outcome;
    scanner.scan(text, false, [&](const BranchFinding& finding) {
        ++outcome.found;
        for (const BranchReason& reason : finding.reasons)
            outcome.quoted += reason.directive.size();
    });
    const SourceScanCounts after = scanner.counts();
    outcome.branches = after.branches - before.branches;
    outcome.undecided = after.undecided - before.undecided;
    outcome.steps = after.steps - before.steps;
    return outcome;
}

/// A text n times, each % a number: the first of them 0, or n - 1 for &.
std::string repeated(const std::string& text, std::size_t n) {
    std::string all;
    for (std::size_t i = 0; i < n; ++i) {
        for (const char c : text) {
            if (c == '%' || c == '&')
                all += std::to_string(c == '%' ? i : n - 1 - i);
            else
                all += c;
        }
    }
    return all;
}

TEST(Growth, IsLinear) {
    struct Family {
        const char* first;
        const char* each;
        std::uint64_t steps; ///< for a branch, at most
        bool givesUp = false;
    };

    const Family families[] = {
        {"", "#define M% %\n#undef N%\n", 0},
        {"", "#ifdef M%\n#ifdef M%\n#endif\n#endif\n", 40},
        {"#ifdef Z\n", "#ifdef M&\n#ifdef M&\n#endif\n#endif\n", 40},
        {"", "#if X > 4294967296% || X < %\n#elif X > %\n#endif\n", 800},
        {"#if X == -1\n", "#elif X == %\n", 8000},
        {"#if X == -1\n", "#elif X > % && Y < %\n", 8000},
        {"#if X\n", "#elif M%\n", 0},
        {"", "#if M > %\n", 8000},
        {"", "#if M\n", 2000},
        {"", "#include <a%.h>\n#if A > %\n", limits::scanStepsPerBranch, true},
        {"", "#ifndef A\n#include <a%.h>\n#endif\n", 0},
        {"", "#define M N%\n#if M == 1\n#if M == 2\n#endif\n#endif\n", 50},
        {"", "#define M% M&\n#if M% < 1 && M% > 1\n#endif\n", 50},
        {"", "#if A% < B%\n#if B% <= A%\n#endif\n#endif\n", 50},
        {"", "#if F(%) + % > 3\n#elif F(%)+% <= 3\n#endif\n", 60},
        {"#if A0", "+A% < B", 0},
        {"#if A0", " < A%", 0},
        {"#if A0", "\\\n", 0},
        {"", "import <a%.h>;\n_Pragma(\"x%\")\n??\n", 0},
    };
    for (const Family& family : families) {
        for (const std::size_t n : {500U, 1000U, 2000U}) {
            SourceScanner scanner;
            const Outcome outcome = scan(scanner, family.first + repeated(family.each, n));
            const std::uint64_t fixed = family.givesUp ? limits::scanSteps + limits::branchSteps : 0;
            EXPECT_LE(outcome.steps, fixed + family.steps * outcome.branches) << family.each << " " << n;
            EXPECT_EQ(outcome.undecided != 0, family.givesUp) << family.each << " " << n;
        }
    }
}

TEST(Growth, HardConditionsOfOneKilobyteAreGivenUpInTime) {
    std::string pairs;
    std::string comparisons;
    const auto name = [](std::size_t at) { return std::string(1, "ABCDEFGHIJKLMNOPabcdefghijklmnop"[at % 32]); };
    for (std::size_t i = 0; i < 10; ++i)
        for (std::size_t k = 0; k < 16; ++k) {
            const std::string end = k == 15 ? "\n" : "";
            pairs += (k == 0 ? "#if " : "||") + name(k) + "&&" + name(k * 3 + 16 + i) + end;
            comparisons += k == 0 ? "#if " : k % 2 == 0 ? "||" : "&&";
            comparisons += name(k * 5) + "<" + name(k * 7 + i) + end;
        }
    for (const std::string& text : {pairs, comparisons, "#if " + pigeons(9) + "\n#endif\n"}) {
        SourceScanner fresh;
        const Outcome alone = scan(fresh, text);
        EXPECT_LE(alone.steps, limits::scanSteps + limits::branchSteps + 48 * limits::scanStepsPerBranch);
        EXPECT_GT(alone.undecided, 0U) << text;
        SourceScanner used;
        scan(used, "#if A && B\n#if A\n#endif\n#endif\n" + text.substr(0, text.size() / 2));
        for (int again = 0; again < 2; ++again) {
            const Outcome later = scan(used, text);
            EXPECT_EQ(later.found, alone.found) << text;
            EXPECT_EQ(later.undecided, alone.undecided) << text;
            EXPECT_EQ(later.steps, alone.steps) << text;
        }
    }
}

TEST(Growth, ReasonsAreCut) {
    SourceScanner scanner;
    const std::string name(100'000, 'x');
    const Outcome always = scan(scanner, "#if " + name + " || !" + name + "\n" + repeated("#elif A%\n", 1000));
    EXPECT_EQ(always.found, 1001U);
    EXPECT_LE(always.quoted, 1001 * (limits::quotedBytes + 3));
    const Outcome nested = scan(scanner, "#if A && " + name + "\n" + repeated("#if A\n", 1000));
    EXPECT_EQ(nested.found, 1000U);
    EXPECT_LE(nested.quoted, 1000 * (limits::quotedBytes + 3));
}

} // namespace
} // namespace VT::Testing
