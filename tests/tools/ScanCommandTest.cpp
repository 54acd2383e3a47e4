// vtsym scan on directories: every form of its output, and how it ends.
#include "tests/support/JsonSchema.hpp"
#include "tests/tools/Program.hpp"

#include <gmock/gmock.h>

namespace VT::Testing {
namespace {

using ::testing::HasSubstr;
using Json = nlohmann::json;

const Json schema = Json::parse(std::ifstream(VTSYM_TEST_DATA "/sarif-2.1.0.json"));

const std::string source = "#ifdef A\n"
                           "# if  B && /* no */ defined(A)\n"
                           "# elif defined A /* \xC3\xA4 */ && B > \\\n"
                           "   3\n"
                           "# elif 1 && !B\n"
                           "# endif\n"
                           "#else\n"
                           "# ifdef \xC3\xA4 // \xC3\xA4\n"
                           "/* \xC3\xA4 */ # ifdef \xC3\xA4\n"
                           "# endif\n# endif\n"
                           "#endif\n";

TEST(Scan, TellsInEveryForm) {
    const Workplace place;
    place.run("mkdir 'sub dir'; ln -s .. 'sub dir/loop'; ln -s a.c again.c");
    place.write("a.c", source);
    place.write("sub dir/%b.hh", "#if true\n#if X\n#elif X == 1\n#endif\n#endif");
    place.write("sub dir/other.txt", source);
    const ProgramResult compiler = runScript(place, "vtsym scan .");
    EXPECT_EQ(compiler.output,
              "a.c:2: '#if B && defined(A)' can be '#if B', since '#ifdef A' (line 1) holds here\n"
              "a.c:3: '#elif defined A && B > 3' is dead, since '#if B && defined(A)' (line 2) does not hold here\n"
              "a.c:5: '#elif 1 && !B' can be '#elif 1', since '#ifdef A' (line 1) holds and "
              "'#if B && defined(A)' (line 2) does not hold here\n"
              "a.c:9: '#ifdef \xC3\xA4' always holds, since '#ifdef \xC3\xA4' (line 8) holds here\n"
              "sub dir/%b.hh:3: '#elif X == 1' is dead, since '#if X' (line 2) does not hold here\n");
    EXPECT_EQ(compiler.status, 1);
    EXPECT_EQ(compiler.words, "");

    const std::vector<std::string> lines = linesOf(runScript(place, "vtsym scan --json .").output);
    ASSERT_EQ(lines.size(), 5U);
    EXPECT_EQ(lines[0], R"json({"file":"a.c","line":2,"kind":"removable","condition":"B && defined(A)",)json"
                        R"json("proposed":"B","follows":[{"line":1,"text":"#ifdef A"}]})json");
    EXPECT_THAT(lines[1], HasSubstr("\"dead\""));
    EXPECT_THAT(lines[3], HasSubstr("\"always-true\""));
    EXPECT_THAT(lines[4], HasSubstr("\"sub dir/%b.hh\""));

    const Json sarif = Json::parse(runScript(place, "vtsym scan --sarif .").output);
    EXPECT_EQ(schemaErrors(schema, schema, sarif), "");
    const Json& results = sarif["runs"][0]["results"];
    ASSERT_EQ(results.size(), 5U);
    for (const Json& result : results)
        EXPECT_EQ(sarif["runs"][0]["tool"]["driver"]["rules"][result["ruleIndex"].get<std::size_t>()]["id"],
                  result["ruleId"]);
    for (const std::size_t commented : {0U, 1U})
        EXPECT_FALSE(results[commented].contains("fixes")); // a comment would be lost
    const auto& location = results[4]["locations"][0]["physicalLocation"];
    EXPECT_EQ(location["artifactLocation"]["uri"], "sub%20dir/%25b.hh");
    const Json replacement = {
        {"deletedRegion", {{"startLine", 9}, {"startColumn", 11}, {"endLine", 9}, {"endColumn", 18}}},
        {"insertedContent", {{"text", "if 1"}}}};
    EXPECT_EQ(results[3]["fixes"][0]["artifactChanges"][0]["replacements"][0], replacement);
}

TEST(Scan, KeepsToItsTranscript) {
    expectTranscript("program-scan.txt");
}

TEST(Scan, TellsWhatWasNotDone) {
    const Workplace place;
    const auto scan = [&](const std::string& arguments) { return runScript(place, "vtsym scan " + arguments); };
    place.run("printf '\\0\\1' >binary.c; ln -s nowhere gone.c");
    const ProgramResult unread = scan("--sarif gone.c .");
    EXPECT_EQ(unread.status, 2);
    EXPECT_THAT(unread.words, HasSubstr("gone.c: cannot be read: No such file"));
    EXPECT_THAT(unread.words, HasSubstr("binary.c: is not a text"));
    EXPECT_EQ(schemaErrors(schema, schema, Json::parse(unread.output)), "");
    EXPECT_THAT(unread.output, HasSubstr("\"executionSuccessful\":false"));

    std::string hard; // what an included file may define is asked at each branch
    for (int i = 0; i < 48; ++i)
        hard = "#if A>" + std::to_string(48 - i) + "\n#include<a>\n" + hard + "#endif\n";
    place.write("hard.c", hard);
    const ProgramResult givenUp = scan("--sarif hard.c");
    EXPECT_EQ(givenUp.status, 0);
    EXPECT_THAT(givenUp.words, ::testing::MatchesRegex("vtsym: [1-9][0-9]* decisions were given up: .*\n"));
    EXPECT_EQ(schemaErrors(schema, schema, Json::parse(givenUp.output)), "");
    EXPECT_THAT(givenUp.output, HasSubstr("\"level\":\"note\""));
}

} // namespace
} // namespace VT::Testing
