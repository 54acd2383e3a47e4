// The README shows what the program answers.
#include "tests/tools/Program.hpp"

#include <gtest/gtest.h>

namespace VT::Testing {
namespace {

std::string withoutEnd(std::string text) {
    return text.erase(text.find_last_not_of('\n') + 1);
}

TEST(Readme, ShowsWhatTheProgramAnswers) {
    const std::string root = VTSYM_TEST_DATA "/../..";
    std::vector<std::pair<std::string, std::string>> examples; // commands and what they write
    std::ifstream stream(root + "/README.md");
    bool inside = false;
    for (std::string line; std::getline(stream, line);) {
        if (line.starts_with("```"))
            inside = line == "```console";
        else if (inside && line.starts_with("$ "))
            examples.emplace_back(line.substr(2), "");
        else if (inside)
            examples.back().second += line + "\n";
    }
    EXPECT_GT(examples.size(), 10U);
    for (auto [command, output] : examples) {
        const std::size_t run = command.find("./run ");
        ASSERT_NE(run, std::string::npos) << command;
        command.replace(run, 5, "vtsym");
        const std::string written = runScript(Workplace(), "exec 2>&1; cd '" + root + "'; " + command).output;
        EXPECT_EQ(withoutEnd(written), withoutEnd(output)) << command;
    }
}

} // namespace
} // namespace VT::Testing
