// A cache changes how long a scan takes, and nothing else.
#include "tests/support/Cases.hpp"
#include "tests/tools/Program.hpp"

#include <gmock/gmock.h>
#include <random>

namespace VT::Testing {
namespace {

using ::testing::HasSubstr;

constexpr const char* source =
    "#if VERSION > 2 && defined(CRC)\n#if VERSION > 1 && MODE\n#endif\n#elif VERSION > 3\n#endif\n"
    "/* vtsym: keep, until the next version */\n#if A > 1 && A > 0\n#endif\n";

/// A project of some files, and what a scan of it is to write.
class CachedProject {
public:
    CachedProject() {
        place_.write("src/a.c", source);
        place_.write("src/b.hpp", std::string("#ifdef X\n#ifndef X\n#endif\n#endif\n") + source);
        place_.write("src/clean.c", "int x;\n");
        place_.write("config.h", "#define VERSION 4\n");
        place_.write("rules.assume", "MODE > 1\n");
        place_.write("compile_commands.json",
                     R"([{"directory": ".", "file": "src/a.c", "command": "cc -DCRC -include config.h src/a.c"}])");
    }

    const TemporaryFolder& place() const { return place_; }

    ProgramResult scan(const std::string& options) const {
        return runScript(place_, "vtsym scan --summary " + options + " src");
    }

    /// Expects a scan with the cache to write what one without it does; twice, the second time from the cache.
    void expectSame(const std::string& options) const {
        const ProgramResult fresh = scan(options);
        for (int i = 0; i < 2; ++i) {
            const ProgramResult cached = scan("--cache cache " + options);
            EXPECT_EQ(cached.out, fresh.out) << options;
            EXPECT_EQ(cached.err, fresh.err) << options;
            EXPECT_EQ(cached.status, fresh.status) << options;
        }
    }

    /// Whether the last scan had to write the cache.
    bool grows(const std::string& options) const {
        const std::string before = place_.read("cache/findings.vtsym");
        scan("--cache cache " + options);
        return place_.read("cache/findings.vtsym") != before;
    }

private:
    TemporaryFolder place_;
};

constexpr const char* builds = "--compile-commands compile_commands.json --assume rules.assume";

TEST(ScanCache, ChangesNoByte) {
    const CachedProject project;
    for (const char* const options :
         {"", "--json --why --kinds all", "--sarif", "-D VERSION=3 -U MODE", "--imacros config.h", "--severity warning",
          "--strict-includes", builds, "--fix --dry-run", "--configuration one=rules.assume --why"})
        project.expectSame(options);
}

TEST(ScanCache, KnowsEverythingThatFindingsDependOn) {
    const CachedProject project;
    const std::string options = std::string(builds) + " --imacros own.h";
    project.place().write("own.h", "#define B 1\n");
    project.expectSame(options);
    EXPECT_FALSE(project.grows(options));
    const std::pair<const char*, const char*> changes[] = {
        {"src/a.c", "#if A\n#if A\n#endif\n#endif\n"},
        {"config.h", "#define VERSION 1\n"},
        {"own.h", "#define B 2\n"},
        {"rules.assume", "MODE > 2\n"},
        {"compile_commands.json", R"([{"directory": ".", "file": "src/a.c", "command": "cc -DMODE src/a.c"}])"},
        {".vtsym.toml", "[scan]\nwhy = true\n"},
    };
    for (const auto& [file, content] : changes) {
        project.place().write(file, content);
        EXPECT_TRUE(project.grows(options)) << file;
        project.expectSame(options);
        EXPECT_FALSE(project.grows(options)) << file;
    }
    project.place().run("rm config.h");
    project.expectSame(options);
    project.place().run("mv src/b.hpp src/b.h"); // which is C then
    EXPECT_TRUE(project.grows(options));
    project.expectSame(options);
}

TEST(ScanCache, IsWrittenAnewWhereItIsDamaged) {
    const CachedProject project;
    const ProgramResult fresh = project.scan("");
    project.scan("--cache cache");
    const std::string whole = project.place().read("cache/findings.vtsym");
    ASSERT_GT(whole.size(), 500U);
    std::mt19937 random(5);
    for (int i = 0; i < 40; ++i) {
        std::string damaged = whole;
        if (i == 0)
            damaged = "not a cache\n";
        else if (i % 3 == 0)
            damaged.resize(random() % whole.size());
        else
            damaged[random() % whole.size()] ^= static_cast<char>(1 + random() % 255);
        project.place().write("cache/findings.vtsym", damaged);
        const ProgramResult cached = project.scan("--cache cache");
        EXPECT_EQ(cached.out, fresh.out);
        EXPECT_EQ(cached.err,
                  "vtsym: the cache cache/findings.vtsym is damaged, or of another program; it is written anew\n" +
                      fresh.err);
        EXPECT_EQ(cached.status, fresh.status);
        EXPECT_EQ(project.scan("--cache cache").err, fresh.err);
        EXPECT_EQ(project.place().read("cache/findings.vtsym"), whole);
    }
}

TEST(ScanCache, IsSharedByScansAtOnce) {
    const CachedProject project;
    for (int i = 0; i < 30; ++i)
        project.place().write("src/more" + std::to_string(i) + ".c",
                              source + std::string(static_cast<std::size_t>(i), '\n'));
    const ProgramResult fresh = project.scan("");
    const ProgramResult both = runScript(project.place(), "for i in 1 2 3 4; do\n"
                                                          "  for k in 1 2 3; do\n"
                                                          "    vtsym scan --summary --cache cache src >out$k 2>&1 &\n"
                                                          "  done\n"
                                                          "  wait\n"
                                                          "  cat out1 out2 out3\n"
                                                          "  touch src/new$i.txt; test $i = 2 && rm cache/*\n"
                                                          "done");
    std::string expected;
    for (int i = 0; i < 12; ++i)
        expected += fresh.out + fresh.err;
    EXPECT_EQ(both.out, expected);
    EXPECT_FALSE(project.grows(""));
}

TEST(ScanCache, ThatCannotBeUsedIsReported) {
    const CachedProject project;
    const ProgramResult fresh = project.scan("");
    const ProgramResult blocked = project.scan("--cache config.h");
    EXPECT_EQ(blocked.out, fresh.out);
    EXPECT_EQ(blocked.status, fresh.status);
    EXPECT_THAT(blocked.err, HasSubstr("vtsym: the cache config.h cannot be made: "));
    project.place().run("mkdir -p odd/findings.vtsym");
    EXPECT_THAT(project.scan("--cache odd").err, HasSubstr("vtsym: the cache odd/findings.vtsym is a folder"));
}

} // namespace
} // namespace VT::Testing
