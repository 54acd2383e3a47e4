// The README and the pages of docs/ show what the program answers, and their links lead to files.
#include "tests/tools/Program.hpp"

#include <filesystem>
#include <gtest/gtest.h>
#include <regex>

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
    EXPECT_GT(examples.size(), 25U);
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

TEST(Documentation, NamesTheLicenceOfEveryDependency) {
    std::ostringstream licences;
    licences << std::ifstream(root / "THIRD-PARTY.md").rdbuf();
    for (const fs::directory_entry& list : fs::directory_iterator(root / "cmake/packages")) {
        std::ifstream stream(list.path());
        for (std::string package; std::getline(stream, package);)
            if (!package.empty() && !package.starts_with('#'))
                EXPECT_NE(licences.str().find("`" + package + "`"), std::string::npos) << package;
    }
}

} // namespace
} // namespace VT::Testing
