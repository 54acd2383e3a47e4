// vtsym scan in projects: settings, baselines, fixes, states of a repository, and what services take.
#include "base/core/Limits.hpp"
#include "tests/support/JsonSchema.hpp"
#include "tests/tools/Program.hpp"

#include <gmock/gmock.h>
#include <random>
#include <regex>
#include <set>

namespace VT::Testing {
namespace {

using Json = nlohmann::json;

TEST(ScanProjects, KeepToTheirTranscript) {
    expectTranscript("program-scan-projects.txt");
}

/// Chains of conditions with comments, splices and line ends of both kinds.
class Sources {
public:
    std::string next() {
        const std::string end = below(3) == 0 ? "\r\n" : "\n";
        std::string text;
        for (std::size_t i = below(30); i > 0; --i)
            text += chain(3) + "\n";
        if (below(3) == 0)
            text += "int last;";
        std::string ended;
        for (const char c : text)
            ended += c == '\n' ? end : std::string(1, c);
        return ended;
    }

private:
    std::size_t below(std::size_t bound) { return std::uniform_int_distribution<std::size_t>(0, bound - 1)(random_); }

    std::string oneOf(const std::vector<std::string>& texts) { return texts[below(texts.size())]; }

    std::string condition() {
        std::string text = oneOf({"A", "defined(B)", "C > 2", "(A == 1)", "!A"});
        for (std::size_t i = below(4); i > 0; --i)
            text +=
                oneOf({" && ", " || ", " && \\\n    ", " /* a */ && ", "&&/* b\n */", " && /* c */ \\\n /* d */ "}) +
                oneOf({"A", "defined B", "C>1", "(A || C)", "!defined(A)"});
        return text;
    }

    std::string chain(std::size_t depth) {
        if (depth == 0 || below(3) == 0)
            return oneOf({"", "int x;", "/* text */", "\nint y;\n\n\n\n\n"});
        std::string text =
            oneOf({"#if ", " # if ", "#if /* e */ "}) + condition() + oneOf({"", " // f", " /* g */"}) + "\n";
        if (below(4) == 0)
            text = oneOf({"#ifdef A", "#ifndef /* h */ B // i", "# ifdef B"}) + "\n";
        text += chain(depth - 1) + "\n";
        if (below(2) == 0)
            text += "#elif " + condition() + "\n" + chain(depth - 1) + "\n";
        if (below(3) == 0)
            text += "#else\n" + chain(depth - 1) + "\n";
        return text + "#endif";
    }

    std::mt19937_64 random_{7};
};

TEST(ScanProjects, FixesArePatchesThatGitApplies) {
    const TemporaryFolder place;
    Sources sources;
    place.run("mkdir -p fixed/d patched");
    for (int i = 0; i < 60; ++i)
        place.write("fixed/" + std::string(i % 2 == 0 ? "" : "d/") + std::to_string(i) + ".h", sources.next());
    const ProgramResult result = runScript(place, R"(cp -r fixed/* patched; cd patched
vtsym scan --fix --dry-run --kinds all . >../patch; git apply --whitespace=nowarn ../patch || exit 3
cd ../fixed; vtsym scan --fix --kinds all . >../left; cd ..; grep -vq "'#else' is dead" left && exit 5
diff -r fixed patched || exit 4
cd fixed; vtsym scan --kinds all . >../again; grep -c '^@@' ../patch)");
    EXPECT_EQ(result.status, 0) << result.out << result.err;
    EXPECT_EQ(place.read("again"), "") << "what was fixed is found again";
    EXPECT_GT(std::stoi(result.out), 100);
}

TEST(ScanProjects, LogsHoldWhatServicesTake) {
    const TemporaryFolder place;
    std::string text;
    for (std::size_t i = 0; i < limits::sarifResults + 10; ++i)
        text += "#if A && A\n#endif\n";
    const std::string dead = "#ifdef B\n#ifndef B\n#endif\n#endif\n";
    place.write("a.c", text + dead + dead);
    const ProgramResult all = runScript(place, "vtsym scan --sarif a.c");
    EXPECT_THAT(all.err, ::testing::HasSubstr("12 of 25012 results are left out"));
    const Json log = Json::parse(all.out);
    const Json& results = log["runs"][0]["results"];
    ASSERT_EQ(results.size(), limits::sarifResults);
    EXPECT_EQ(results.back()["ruleId"], "dead");
    EXPECT_EQ(log["runs"][0]["invocations"][0]["toolExecutionNotifications"][0]["level"], "note");
    std::set<std::string> fingerprints;
    for (const Json& each : results)
        fingerprints.insert(each["partialFingerprints"]["vtsym/v1"].get<std::string>());
    EXPECT_EQ(fingerprints.size(), results.size());
}

TEST(ScanProjects, LogsAreOfTheirSchema) {
    const TemporaryFolder place;
    place.write("a.c", "#if N > 3 && M\n#elif M // vtsym: keep\n#endif\n");
    place.write("c.h", "#define N 4\n");
    const Json schema = Json::parse(std::ifstream(VTSYM_TEST_DATA "/sarif-2.1.0.json"));
    const Json builds =
        Json::parse(runScript(place, "vtsym scan --sarif --why -imacros c.h -D K --assume 'M > 1 || K == 2' a.c").out);
    EXPECT_EQ(schemaErrors(schema, schema, builds), "");
    const Json& always = builds["runs"][0]["results"][0];
    EXPECT_EQ(always["relatedLocations"][0]["physicalLocation"]["artifactLocation"]["uri"], "c.h");
    EXPECT_EQ(always["properties"]["because"], Json({"#define N 4", "-DK", "M > 1 || K == 2"}));
    const Json states = Json::parse(runScript(place, R"(git init -q; g() { git -c user.name=n -c user.email=e "$@"; }
g add .; g commit -qm 1; printf '#if N\n#if N\n#endif\nint a;\n#endif\n' >a.c; g commit -qam 2
vtsym scan --sarif --diff HEAD~1..)")
                                        .out);
    EXPECT_EQ(schemaErrors(schema, schema, states), "");
    EXPECT_EQ(states["runs"][0]["results"][0]["baselineState"], "new");
}

TEST(ScanProjects, MessagesAreWhatTheProblemMatcherReads) {
    const TemporaryFolder place;
    place.write("a:1.c", "#ifdef A\n#ifdef A // vtsym: keep\n#endif\n#elif X && X\n#endif\n");
    const Json matcher = Json::parse(std::ifstream(VTSYM_TEST_DATA "/../../examples/ci/problem-matcher.json"));
    const Json& pattern = matcher["problemMatcher"][0]["pattern"][0];
    const std::regex expression(pattern["regexp"].get<std::string>());
    const std::vector<std::string> lines = linesOf(runScript(place, "vtsym scan a:1.c").out);
    std::vector<std::string> numbers;
    for (const std::string& line : lines) {
        std::smatch match;
        ASSERT_TRUE(std::regex_match(line, match, expression)) << line;
        EXPECT_EQ(match[pattern["file"].get<std::size_t>()], "a:1.c");
        numbers.push_back(match[pattern["line"].get<std::size_t>()]);
        EXPECT_EQ("a:1.c:" + numbers.back() + ": " + match[pattern["message"].get<std::size_t>()].str(), line);
    }
    EXPECT_THAT(numbers, ::testing::ElementsAre("2", "2", "4"));
    const std::string commit = "git add .; git -c user.name=n -c user.email=e commit -qm 1; ";
    place.write("b.c", "#if B\n#if B\n#endif\n#endif\n#if C\nint c;\n#endif\n#if D\n#if D\n#endif\n#endif\n");
    const ProgramResult compared =
        runScript(place, "git init -q; " + commit +
                             R"(printf '#if E\n#if E\n#endif\n#endif\nint c;\n#if D\n#if D\n#endif\n#endif\n' >b.c; )" +
                             commit + "vtsym scan --diff HEAD~1..HEAD");
    std::vector<std::string> read;
    for (const std::string& line : linesOf(compared.out))
        read.push_back((std::regex_match(line, expression) ? "is read: " : "is not: ") + line.substr(0, 22));
    EXPECT_THAT(read, ::testing::ElementsAre("is read: b.c:2: new: '#if E' al", "is read: b.c:5: no condition in",
                                             "is read: b.c:7: remains: '#if D", "is not: b.c:2: fixed: '#if B' "));
}

TEST(ScanProjects, StepsOfTheWorkflowRun) {
    std::ifstream workflow(VTSYM_TEST_DATA "/../../examples/ci/workflow.yml");
    const std::regex step("^ +(?:- )?run: (.*)$");
    std::string script = R"(git init -q; g() { git -c user.name=n -c user.email=e "$@"; }; export HOME="$PWD"
g add .; g commit -qm 1; printf '#elif B\n#elif B && C\n#endif\n' >>a.c; g commit -qam 2
)";
    std::size_t steps = 0;
    for (std::string line; std::getline(workflow, line);) {
        std::smatch match;
        if (!std::regex_match(line, match, step) || match[1].str().starts_with("apt-get "))
            continue;
        std::string command = match[1];
        command = std::regex_replace(command, std::regex(R"(\$\{\{ \S*base\.sha \}\})"), "$$(git rev-parse HEAD~1)");
        command = std::regex_replace(command, std::regex(R"(\$\{\{ github\.sha \}\})"), "$$(git rev-parse HEAD)");
        script += "(set -e\n" + command + "\n)\necho \"= $?\"\n";
        ++steps;
    }
    ASSERT_EQ(steps, 4U);
    const TemporaryFolder place;
    place.write("a.c", "#ifdef A\n#ifdef A\n#endif\n");
    const ProgramResult result = runScript(place, script);
    EXPECT_EQ(result.out, R"(= 0
::add-matcher::.github/workflows/problem-matcher.json
= 0
= 0
a.c:2: remains: '#ifdef A' always holds, since '#ifdef A' (line 1) holds here
a.c:5: new: '#elif B && C' is dead, since '#elif B' (line 4) does not hold here
= 1
)");
    EXPECT_EQ(result.err, "");
    EXPECT_EQ(Json::parse(place.read("findings.sarif"))["runs"][0]["results"].size(), 2U);
}

} // namespace
} // namespace VT::Testing
