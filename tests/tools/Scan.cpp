// vtsym scan on directories: every form of its output, and how it ends.
#include "tests/support/JsonSchema.hpp"
#include "tests/support/Workplace.hpp"
#include "tests/tools/Program.hpp"

#include <gmock/gmock.h>

#include <filesystem>
#include <fstream>
#include <sstream>

namespace VT::Testing {
namespace {

using ::testing::HasSubstr;
using Json = nlohmann::json;
namespace fs = std::filesystem;

class Scan : public ::testing::Test {
protected:
    Scan() { fs::create_directories(directory_ / "sub dir"); }

    fs::path write(const std::string& name, const std::string& text) { return place_.write(name, text); }

    ProgramResult scan(std::vector<std::string> options = {}) {
        options.insert(options.begin(), "scan");
        options.push_back(directory_.string());
        return runProgram({options, {}, {}, {}});
    }

    Workplace place_;
    fs::path directory_ = fs::path(place_.path("any")).parent_path();
};

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

TEST_F(Scan, TellsInEveryForm) {
    const std::string a = write("a.c", source).string();
    const std::string b = write("sub dir/%b.hh", "#if true\n#if X\n#elif X == 1\n#endif\n#endif").string();
    write("sub dir/other.txt", source);
    fs::create_directory_symlink(directory_, directory_ / "sub dir" / "loop");
    fs::create_symlink(a, directory_ / "again.c");

    const ProgramResult compiler = scan();
    EXPECT_EQ(
        compiler.output,
        a + ":2: '#if B && defined(A)' can be '#if B', since '#ifdef A' (line 1) holds here\n" +                      //
            a + ":3: '#elif defined A && B > 3' is dead, since '#if B && defined(A)' (line 2) does not hold here\n" + //
            a +
            ":5: '#elif 1 && !B' can be '#elif 1', since '#ifdef A' (line 1) holds and "
            "'#if B && defined(A)' (line 2) does not hold here\n" +
            a + ":9: '#ifdef \xC3\xA4' always holds, since '#ifdef \xC3\xA4' (line 8) holds here\n" + //
            b + ":3: '#elif X == 1' is dead, since '#if X' (line 2) does not hold here\n");
    EXPECT_EQ(compiler.status, 1);
    EXPECT_EQ(compiler.words, "");

    std::istringstream lines(scan({"--json"}).output);
    std::vector<Json> objects;
    for (std::string line; std::getline(lines, line);)
        objects.push_back(Json::parse(line));
    ASSERT_EQ(objects.size(), 5U);
    const Json removable = {{"file", a},           {"line", 2},
                            {"kind", "removable"}, {"condition", "B && defined(A)"},
                            {"proposed", "B"},     {"follows", {{{"line", 1}, {"text", "#ifdef A"}}}}};
    EXPECT_EQ(objects[0], removable);
    EXPECT_EQ(objects[1]["kind"], "dead");
    EXPECT_EQ(objects[3]["kind"], "always-true");
    EXPECT_EQ(objects[4]["file"], b);

    const Json sarif = Json::parse(scan({"--sarif"}).output);
    const Json schema = Json::parse(std::ifstream(VTSYM_TEST_DATA "/sarif-2.1.0.json"));
    EXPECT_EQ(schemaErrors(schema, schema, sarif), "");
    const Json& results = sarif["runs"][0]["results"];
    ASSERT_EQ(results.size(), 5U);
    for (const Json& result : results)
        EXPECT_EQ(sarif["runs"][0]["tool"]["driver"]["rules"][result["ruleIndex"].get<std::size_t>()]["id"],
                  result["ruleId"]);
    for (const std::size_t commented : {0U, 1U})
        EXPECT_FALSE(results[commented].contains("fixes")); // a comment would be lost
    const auto& location = results[4]["locations"][0]["physicalLocation"];
    EXPECT_THAT(location["artifactLocation"]["uri"].get<std::string>(), HasSubstr("/sub%20dir/%25b.hh"));
    const Json replacement = {
        {"deletedRegion", {{"startLine", 9}, {"startColumn", 11}, {"endLine", 9}, {"endColumn", 18}}},
        {"insertedContent", {{"text", "if 1"}}}};
    EXPECT_EQ(results[3]["fixes"][0]["artifactChanges"][0]["replacements"][0], replacement);
}

TEST_F(Scan, EndsAsItWent) {
    EXPECT_EQ(scan().status, 2);
    write("binary.c", std::string("\0\1", 2));
    fs::create_symlink("nowhere", directory_ / "gone.c");
    const ProgramResult unread = scan({"--sarif", (directory_ / "gone.c").string()});
    EXPECT_EQ(unread.status, 2);
    EXPECT_THAT(unread.words, HasSubstr("gone.c: cannot be read: No such file"));
    EXPECT_THAT(unread.words, HasSubstr("binary.c: is not a text"));
    const Json schema = Json::parse(std::ifstream(VTSYM_TEST_DATA "/sarif-2.1.0.json"));
    EXPECT_EQ(schemaErrors(schema, schema, Json::parse(unread.output)), "");
    EXPECT_THAT(unread.output, HasSubstr("\"executionSuccessful\":false"));

    write("some.h",
          "#ifndef A\n#include <a.h>\n#ifdef A\n#if B\n#include <b.h>\n#if B == 0\n#endif\n#endif\n#endif\n#endif");
    const ProgramResult some = scan({"--summary"});
    EXPECT_EQ(some.status, 2); // for the binary
    EXPECT_THAT(some.words, HasSubstr("1 files, 4 branches, 1 findings"));
    fs::remove(directory_ / "binary.c");
    EXPECT_EQ(scan().status, 1);
    EXPECT_EQ(scan({"--strict-includes"}).status, 0);
    // Ten pigeons in nine holes.
    std::string condition = "1";
    for (int pigeon = 0; pigeon < 10; ++pigeon) {
        std::string somewhere = "0";
        for (int hole = 0; hole < 9; ++hole) {
            const auto at = [hole](int each) { return "P" + std::to_string(each) + "_" + std::to_string(hole); };
            somewhere += " || " + at(pigeon);
            for (int other = 0; other < pigeon; ++other)
                condition += " && !(" + at(pigeon) + " && " + at(other) + ")";
        }
        condition += " && (" + somewhere + ")";
    }
    const std::string odd = write("odd.c", "#if X\n#if X && B('\xff')\n#endif\n#endif\n").string();
    const std::string unfixed = runProgram({{"scan", "--sarif", odd}, {}, {}, {}}).output;
    EXPECT_THAT(unfixed, HasSubstr("\"removable\",\"ruleIndex\""));
    EXPECT_THAT(unfixed, ::testing::Not(HasSubstr("fixes"))); // which would not be the bytes of the file
    const std::string hard = write("hard.c", "#if " + condition + "\n#endif\n").string();
    const ProgramResult givenUp = runProgram({{"scan", "--sarif", hard}, {}, {}, {}});
    EXPECT_EQ(givenUp.status, 0);
    EXPECT_THAT(givenUp.words, ::testing::MatchesRegex("vtsym: [1-9][0-9]* decisions were given up: .*\n"));
    EXPECT_EQ(schemaErrors(schema, schema, Json::parse(givenUp.output)), "");
    EXPECT_THAT(givenUp.output, HasSubstr("\"level\":\"note\""));
    EXPECT_EQ(runProgram({{"scan"}, {}, {}, {}}).status, 2);
    EXPECT_EQ(scan({"--json", "--sarif"}).status, 2);
}

} // namespace
} // namespace VT::Testing
