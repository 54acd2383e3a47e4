// What is found in files of all kinds, one line a finding.
#include "base/scan/SourceScan.hpp"

#include <gtest/gtest.h>

namespace VT::Testing {
namespace {

using namespace std::string_literals;

struct File {
    const char* name;
    std::string text;
    std::string found;
    bool isCpp = false;
    bool strictIncludes = false;
};

std::string findings(const File& file) {
    std::string told;
    SourceScanner({.strictIncludes = file.strictIncludes}).scan(file.text, file.isCpp, [&](const BranchFinding& found) {
        const char* const kinds[] = {"dead", "always", "removable"};
        told += std::to_string(found.region.line) + " " + kinds[static_cast<int>(found.kind)] + " " + found.condition;
        if (found.kind == BranchFindingKind::Removable)
            told += " -> " + found.proposed;
        for (const BranchReason& reason : found.reasons)
            told += (reason.holds ? " @" : " !") + std::to_string(reason.region.line);
        told += "\n";
    });
    return told;
}

void expectFound(const std::vector<File>& files) {
    for (const File& file : files)
        EXPECT_EQ(findings(file), file.found) << file.name << "\n" << file.text.substr(0, 2000);
}

/// A chain within one that holds: `inner` is found given `outer`.
std::string within(const std::string& outer, const std::string& inner) {
    return "#if " + outer + "\n#if " + inner + "\n#endif\n#endif\n";
}

TEST(Findings, OfConditionsInTheWordsOfTheirAuthor) {
    expectFound({
        {"elif again", "#ifdef A\n#elif defined A\n#endif", "2 dead defined A !1\n"},
        {"value of what is not defined", "#ifdef X\n#elif X > 0\n#endif\n#if Y\n#ifndef Y\n#endif\n#endif",
         "2 dead X > 0 !1\n5 dead !defined(Y) @4\n"},
        {"else of two opposites", "#if A < 3\n#elif A >= 3\n#else\n#endif", "2 always A >= 3 !1\n3 dead  @2\n"},
        {"spelling stays", within("V >= 0x300", "V > 0x2ffL && (defined Y)"),
         "2 removable V > 0x2ffL && (defined Y) -> defined Y @1\n"},
        {"parentheses as they were",
         "#ifdef A\n#elif (B && C) || (!defined(A) && D)\n#elif E || !defined A && D\n#endif",
         "2 removable (B && C) || (!defined(A) && D) -> (B && C) || D !1\n"
         "3 removable E || !defined A && D -> E !2\n"},
        {"one comparison for a group", within("V >= 2", "V == 2 || V == 3 && W || V <= 2"),
         "2 removable V == 2 || V == 3 && W || V <= 2 -> V == 2 || V == 3 && W @1\n"},
        {"calls and arithmetic with equal text",
         "#if __has_include(<a.h>) && F(1, 2)\n#if F(1,2)\n#elif F(2,1)\n#endif\n#endif\n" +
             within("A*100+B >= 403", "(A * 100 + B) >= 402"),
         "2 always F(1,2) @1\n3 dead F(2,1) @2\n7 always (A * 100 + B) >= 402 @6\n"},
        {"elifdef", "#if A\n#elifdef B\n#elifndef B\n#else\n#endif", "3 always !defined(B) !2\n4 dead  @3\n"},
        {"a guard is no redundant operand", "#if defined(A) && A > 3\n#endif\n#if defined A && A\n#endif", ""},
        {"but one that the context gives is", within("defined(A)", "defined(A) && A > 3"),
         "2 removable defined(A) && A > 3 -> A > 3 @1\n"},
        {"alone", "#if A > 2 && A < 2\n#endif\n#if !defined A || A || defined A\n#endif\n#if B || B\n#endif",
         "1 dead A > 2 && A < 2\n3 always !defined A || A || defined A\n5 removable B || B -> B\n"},
        {"nothing inside what is dead", "#ifdef A\n#ifndef A\n#ifdef B\n#ifdef B\n#endif\n#endif\n#endif\n#endif",
         "2 dead !defined(A) @1\n"},
        {"switches",
         "#if 0\n#ifdef A\n#ifdef A\n#endif\n#endif\n#elif 1\n#else\n#endif\n#if 1 || A\n#elif 0 && B\n#endif", ""},
        {"truth constants", "#if true\n#ifdef A\n#else\n#endif\n#endif\n#ifdef true\n#if true\n#endif\n#endif", "",
         true},
        {"may be anything in C", within("true", "true") + within("!defined(true)", "true"), "2 always true @1\n"},
    });
}

TEST(Findings, NeverGoBeyondWhatEveryBuildHolds) {
    expectFound({
        {"unsigned macros are less than -1", within("A < -1", "A < 0") + within("A > -1", "A >= 0"), ""},
        {"constants that are unsigned", within("A < 0", "A < 5u") + within("A < 5u", "A < 4"), ""},
        {"but equal is equal", within("A == 5u", "A > 4"), "2 always A > 4 @1\n"},
        {"three macros of mixed kinds", within("A < B && B < C", "A < C"), ""},
        {"opposites of two", within("A < B", "B <= A"), "2 dead B <= A @1\n"},
        {"large constants", within("A > 0x100000000", "A > 5") + within("A > 18446744073709551615", "A > 0"), ""},
        {"sums wrap around", within("A + 1 > A", "A > 0") + within("A > 5", "A + 1 > 5"), ""},
        {"lines and counters differ", within("__LINE__ > 1", "__LINE__ > 1") + within("__COUNTER__", "__COUNTER__"),
         ""},
        {"so do levels", within("__INCLUDE_LEVEL__ == 1", "__INCLUDE_LEVEL__ == 1"), ""},
        {"names of one compiler only", within("defined A\\u00e9", "defined A\\u00e9") + within("\u20ac", "\u20ac"), ""},
        {"not understood, but the same", within("A ? B : C", "A ? B : C") + within("A @", "A @ 1"),
         "2 always A ? B : C @1\n"},
        {"constants are computed", within("A >= (1 << 4) + 'a'", "A > 0x70 && B"),
         "2 removable A > 0x70 && B -> B @1\n"},
        {"separators and suffixes",
         within("A >= 1'000uLL - 0b1 + 07z", "A > 1'0") + within("A == 1'000llu", "A > 9'99"),
         "6 always A > 9'99 @5\n"},
    });
}

TEST(Findings, FollowWhatTheFileDoesToMacros) {
    const std::string onTheWay = "#ifndef A\n%\n#ifdef A\n#endif\n#endif\n";
    const auto with = [&](const std::string& line) { return std::string(onTheWay).replace(10, 1, line); };
    expectFound({
        {"guard", with("#define A"), ""},
        {"another", with("#define B"), "3 dead defined(A) @1\n"},
        {"operators", with("f(); __pragma(pop_macro(\"A\"))") + with("_Pragma(\"GCC poison A\")"), ""},
        {"poisoned", with("#pragma GCC poison A"), ""},
        {"options", with("#pragma GCC target(\"avx2\")") + with("_Pragma(\"GCC pop_options\")"), ""},
        {"other pragmas", with("#pragma GCC visibility push(default)") + with("_Pragma(\"once\") // GCC target"),
         "3 dead defined(A) @1\n8 dead defined(A) @6\n"},
        {"by another spelling", with("#undef A\xc2\xa0") + with("#define \\u0041"), ""},
        {"imported",
         with("import <a.h>;") + with("export import \"a//b.h\";") + with("imp\\\nort A;") + with("@import A;"), ""},
        {"not imported", with("import(A);") + with("x import <a.h>"), "3 dead defined(A) @1\n8 dead defined(A) @6\n"},
        {"defined as an operand",
         "#define A (B || C)\n#define D A\n#define E -D\n#define F(x) (x || C)\n#define G(x) F(x)\n" +
             within("D == 1", "D == 2") + within("E < 1", "E > 1") + within("G(1) == 1", "G(1) != 1"),
         "7 dead D == 2 @6\n11 dead E > 1 @10\n15 dead G(1) != 1 @14\n"},
        {"what is defined stays so in an included file", "#if A > 2\n#include <a.h>\n#if A > 1\n#endif\n#endif",
         "3 always A > 1 @1\n"},
        {"but for strict readers", "#if A > 2\n#include <a.h>\n#if A > 1\n#endif\n#endif", "", false, true},
        {"not included in other branches", "#ifndef A\n#include <a.h>\n#elif !defined A\n#endif",
         "3 dead !defined A !1\n", false, true},
        {"but perhaps behind", "#ifndef A\n#if B\n#include <a.h>\n#else\n#endif\n#ifdef A\n#endif\n#endif", ""},
        {"the same for strict readers",
         "#ifdef A\n#ifdef B\n#include <b.h>\n#endif\n#ifdef B\n#else\n#ifndef B\n#endif\n#endif\n#endif",
         "7 always !defined(B) !5\n", false, true},
    });
}

TEST(Findings, SeeTheDirectivesThatAPreprocessorSees) {
    const std::string again = "#ifdef A\n#ifdef A\n#endif\n#endif\n";
    expectFound({
        {"comments",
         "/* #if A\n*/ /**/ # /* x */ ifdef /* y\n */ A // \\\n#else\n#ifdef A /*\n#endif */\n#endif\n#endif",
         "5 always defined(A) @2\n"},
        {"splices", "#de\\\nfine X\n#if\\\ndef A\n#i\\ \nf defi\\\r\nned(A) &\\\n& B\n#endif\n#endif",
         "5 removable defined(A) && B -> B @3\n"},
        {"literals", "\"\\\"#\\\n#endif /*\" '\\'' '\"' \"//\"\n" + again, "4 always defined(A) @3\n"},
        {"prose", "#if 0\nIt's /* here */ that\n#endif\n#error don't /* do\n" + again, "6 always defined(A) @5\n"},
        {"raw strings", "R\"x(\"\n#if A\n#if A)\" )x\" u8R\"(\n#if A\n)\" notR\"(\"\n" + again,
         "7 always defined(A) @6\n"},
        {"no raw string", "R\"(\n" + again, "3 always defined(A) @2\n"},
        {"separators of digits", "1'0 /* ' */\n" + again, "3 always defined(A) @2\n"},
        {"names of headers", "#include <a//b/*c.h>\n" + again, "3 always defined(A) @2\n"},
        {"names of headers that are tested", within("__has_include(<a//b/*c.h>) || A", "__has_include(<a//b/*c.h>)||B"),
         ""},
        {"trigraphs", "?\?=undef A\n" + again, ""},
        {"carriage returns alone", "// \r#undef A\n" + again, ""},
        {"digraphs, form feeds", "%:ifdef A\n\f%\\\n:\vifdef A\n#endif\n#endif", "2 always defined(A) @1\n"},
        {"carriage returns, a mark, NUL", "\xEF\xBB\xBF#ifdef A\r\n\t#\tifdef\0 A\r\n#endif\r\n#endif\r\n"s,
         "2 always defined(A) @1\n"},
        {"words for operators", within("A and not B", "A bitand 1 or B"),
         "2 removable A bitand 1 or B -> A bitand 1 @1\n"},
    });
}

TEST(Findings, OfFilesWithoutFormOrEnd) {
    const auto times = [](std::size_t count, const std::string& text) {
        std::string all;
        for (std::size_t i = 0; i < count; ++i)
            all += text;
        return all;
    };
    std::string chain = "#if X == 0\n";
    for (int i = 1; i < 20'000; ++i)
        chain += "#elif X == " + std::to_string(i) + "\n";
    expectFound({
        {"strays", "#endif\n#else\n#elif A\n#if A\n#else\n#elif A\n#else\n#if A\n#if A\n#endif\n#endif\n#endif\n#endif",
         ""},
        {"no end", "#ifdef A\n#ifdef A", "2 always defined(A) @1\n"},
        {"no condition", "#if\n#if ()\n#ifdef\n#elif\n#ifndef 1\n#", ""},
        {"no expression", within("A +", "A +") + within("(A", "(A") + within("A B", "defined"),
         "2 always A + @1\n6 always (A @5\n"},
        {"comment without end", "#ifdef A\n/*\n#ifdef A\n#endif\n#endif", ""},
        {"nested deeply", times(100'000, "#if A && B\n#undef A\n#define B A\n"), ""},
        {"brackets", "#if " + times(1'000'000, "(") + "A\n#if " + times(1'000'000, "!") + "A\n#endif\n#endif", ""},
        {"a line of 10 MB",
         "#if " + times(1'000'000, "A == 1 && ") + "B\n#endif\n" + times(1'000'000, "R\"(a'\\x ") +
             "\n#if B && B\n#endif",
         "4 removable B && B -> B\n"},
        {"a long chain", chain + "#elif X == 19999\n#else\n#endif", "20001 dead X == 19999 !20000\n"},
    });
}

} // namespace
} // namespace VT::Testing
