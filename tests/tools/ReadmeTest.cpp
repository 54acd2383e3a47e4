// The README and the pages of docs/ show what the program answers, their links lead to files, and every message that a
// user may meet has a paragraph.
#include "tests/tools/Program.hpp"

#include <filesystem>
#include <gtest/gtest.h>
#include <regex>
#include <sstream>

namespace VT::Testing {
namespace {

namespace fs = std::filesystem;

const fs::path root = VTSYM_TEST_DATA "/../..";

std::vector<fs::path> pages() {
    std::vector<fs::path> pages{root / "README.md", root / "CONTRIBUTING.md", root / "THIRD-PARTY.md"};
    for (const fs::directory_entry& entry : fs::recursive_directory_iterator(root / "docs"))
        if (entry.path().extension() == ".md")
            pages.push_back(entry.path());
    return pages;
}

std::string withoutEnd(std::string text) {
    return text.erase(text.find_last_not_of('\n') + 1);
}

TEST(Documentation, ShowsWhatTheProgramAnswers) {
    std::vector<std::pair<std::string, std::string>> examples; // commands and what they write
    for (const fs::path& page : pages()) {
        std::ifstream stream(page);
        bool inside = false;
        for (std::string line; std::getline(stream, line);) {
            if (line.starts_with("```"))
                inside = line == "```console";
            else if (inside && line.starts_with("$ "))
                examples.emplace_back(line.substr(2), "");
            else if (inside)
                examples.back().second += line + "\n";
        }
    }
    EXPECT_GT(examples.size(), 90U);
    for (auto [command, output] : examples) {
        if (const std::size_t run = command.find("./run "); run != std::string::npos)
            command.replace(run, 5, "vtsym");
        const std::string written =
            runScript(TemporaryFolder(), "exec 2>&1; cd '" + root.string() + "'; " + command).out;
        EXPECT_EQ(withoutEnd(written), withoutEnd(output)) << command;
    }
}

TEST(Documentation, LinksToFilesThatExist) {
    const std::regex link(R"(\]\(([^)#:]+)[^):]*\))");
    std::size_t links = 0;
    for (const fs::path& page : pages()) {
        std::ifstream stream(page);
        for (std::string line; std::getline(stream, line);)
            for (std::sregex_iterator match(line.begin(), line.end(), link), end; match != end; ++match, ++links)
                EXPECT_TRUE(fs::exists(page.parent_path() / (*match)[1].str())) << page << ": " << line;
    }
    EXPECT_GT(links, 10U);
}

std::string readAll(const fs::path& path) {
    std::ostringstream text;
    text << std::ifstream(path).rdbuf();
    return text.str();
}

/// The names that a pattern captures in a text.
Strings namesIn(const std::string& text, const std::regex& pattern) {
    Strings names;
    for (std::sregex_iterator match(text.begin(), text.end(), pattern), end; match != end; ++match)
        names.push_back((*match)[1]);
    return names;
}

TEST(Documentation, ExplainsEveryMessageFindingAndWarning) {
    Strings subjects{
#define VTSYM_MESSAGE(id, ...) id,
#include "host/Messages.def"
#undef VTSYM_MESSAGE
    };
    const auto add = [&](const Strings& more, std::size_t least) {
        EXPECT_GE(more.size(), least);
        subjects.insert(subjects.end(), more.begin(), more.end());
    };
    const std::regex rule(R"re("id":"([a-z-]+)")re");
    add(namesIn(runProgram({"scan", "--sarif", (root / "examples/radio.h").string()}).out, rule), 3);
    add(namesIn(runProgram({"check", "--sarif", (root / "examples/model.json").string()}).out, rule), 6);
    std::string obstacles = readAll(root / "base/print/CTextObstacles.hpp");
    obstacles.erase(0, obstacles.find("enum class CTextObstacle"));
    obstacles.erase(obstacles.find("};"));
    add(namesIn(obstacles, std::regex(R"((\w+), +///<)")), 9);

    const std::string page = readAll(root / "docs/messages.md");
    for (const std::string& subject : subjects) { // the paragraph follows a heading and says something
        const std::size_t at = page.find("\n\n`" + subject + "`: ");
        ASSERT_NE(at, std::string::npos) << subject;
        EXPECT_EQ(page.substr(page.rfind('\n', at - 1) + 1, 4), "### ") << subject;
        EXPECT_GT(page.find("\n\n", at + 2) - at, subject.size() + 40) << subject;
    }
}

TEST(Documentation, NamesTheLicenceOfEveryDependency) {
    const std::string licences = readAll(root / "THIRD-PARTY.md");
    for (const fs::directory_entry& list : fs::directory_iterator(root / "cmake/packages"))
        for (const std::string& package : linesOf(readAll(list.path()))) {
            const bool isPackage = !package.empty() && !package.starts_with('#');
            EXPECT_TRUE(!isPackage || licences.find("`" + package + "`") != std::string::npos) << package;
        }
}

} // namespace
} // namespace VT::Testing
