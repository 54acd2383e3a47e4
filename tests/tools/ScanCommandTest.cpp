// vtsym scan on directories: every form of its output, and how it ends.
#include "tests/support/Cases.hpp"
#include "tests/support/JsonSchema.hpp"
#include "tests/support/generators/Pigeons.hpp"
#include "tests/tools/Program.hpp"

#include <gmock/gmock.h>

namespace VT::Testing {
namespace {

using ::testing::HasSubstr;
using Json = nlohmann::json;

const Json schema = Json::parse(std::ifstream(VTSYM_TEST_DATA "/sarif-2.1.0.json"));

const std::string source = casesOf("scan-findings.txt", "source", 1).front().front();

/// The findings themselves are in the transcript.
TEST(Scan, WritesSarif) {
    const TemporaryFolder place;
    place.run("mkdir 'sub dir'");
    place.write("a.c", source);
    place.write("sub dir/%b.hh", "#if true\n#if X\n#elif X == 1\n#endif\n#endif");
    const Json sarif = Json::parse(runScript(place, "vtsym scan --sarif .").out);
    EXPECT_EQ(schemaErrors(schema, schema, sarif), "");
    const Json& results = sarif["runs"][0]["results"];
    ASSERT_EQ(results.size(), 5U);
    for (const Json& result : results)
        EXPECT_EQ(sarif["runs"][0]["tool"]["driver"]["rules"][result["ruleIndex"].get<std::size_t>()]["id"],
                  result["ruleId"]);
    const auto& location = results[4]["locations"][0]["physicalLocation"];
    EXPECT_EQ(location["artifactLocation"]["uri"], "sub%20dir/%25b.hh");
    const Json replacement = {
        {"deletedRegion", {{"startLine", 9}, {"startColumn", 11}, {"endLine", 9}, {"endColumn", 18}}},
        {"insertedContent", {{"text", "if 1"}}}};
    EXPECT_EQ(results[3]["fixes"][0]["artifactChanges"][0]["replacements"][0], replacement);
}

TEST(Scan, KeepsToItsTranscript) {
    expectTranscript("program-scan.txt", {{"a", source}});
}

TEST(Scan, ReportsWhatWasNotDone) {
    const TemporaryFolder place;
    const auto scan = [&](const std::string& arguments) { return runScript(place, "vtsym scan " + arguments); };
    place.run("printf '\\0\\1' >binary.c; ln -s nowhere gone.c");
    const ProgramResult unread = scan("--sarif gone.c .");
    EXPECT_EQ(unread.status, 2);
    EXPECT_THAT(unread.err, HasSubstr("gone.c: cannot be read: No such file"));
    EXPECT_THAT(unread.err, HasSubstr("binary.c: is not a text"));
    EXPECT_EQ(schemaErrors(schema, schema, Json::parse(unread.out)), "");
    EXPECT_THAT(unread.out, HasSubstr("\"executionSuccessful\":false"));

    const std::string hard = "#if " + pigeons(9) + "\n#endif\n";
    place.write("hard.c", hard);
    const ProgramResult givenUp = scan("--sarif hard.c");
    EXPECT_EQ(givenUp.status, 0);
    EXPECT_THAT(givenUp.err, ::testing::MatchesRegex("vtsym: [1-9][0-9]* decisions were given up: .*\n"));
    EXPECT_EQ(schemaErrors(schema, schema, Json::parse(givenUp.out)), "");
    EXPECT_THAT(givenUp.out, HasSubstr("\"level\":\"note\""));
}

} // namespace
} // namespace VT::Testing
