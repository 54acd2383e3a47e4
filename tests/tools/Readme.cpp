// The README shows what the program answers.
#include <array>
#include <cstdio>
#include <filesystem>
#include <fstream>
#include <gtest/gtest.h>
#include <string>
#include <vector>

namespace VT::Testing {
namespace {

struct Example {
    std::string command;
    std::string output;
};

std::vector<Example> examplesOf(const std::filesystem::path& file) {
    std::ifstream stream(file);
    std::vector<Example> examples;
    bool inside = false;
    for (std::string line; std::getline(stream, line);) {
        if (line.starts_with("```"))
            inside = line == "```console";
        else if (inside && line.starts_with("$ "))
            examples.push_back({line.substr(2), {}});
        else if (inside)
            examples.back().output += line + "\n";
    }
    return examples;
}

/// What a shell command writes to both its outputs, without the empty lines at its end.
std::string outputOf(const std::string& command) {
    std::FILE* const pipe = popen(("exec 2>&1; " + command).c_str(), "r");
    std::string output;
    std::array<char, 4096> part{};
    for (std::size_t got = 0; (got = std::fread(part.data(), 1, part.size(), pipe)) > 0;)
        output.append(part.data(), got);
    pclose(pipe);
    return output;
}

std::string withoutEnd(std::string text) {
    text.erase(text.find_last_not_of('\n') + 1);
    return text;
}

TEST(Readme, ShowsWhatTheProgramAnswers) {
    const std::filesystem::path root = std::filesystem::path(VTSYM_TEST_DATA).parent_path().parent_path();
    const std::vector<Example> examples = examplesOf(root / "README.md");
    EXPECT_GT(examples.size(), 10U);
    for (const Example& example : examples) {
        std::string command = example.command;
        const std::size_t run = command.find("./run ");
        ASSERT_NE(run, std::string::npos) << command;
        command.replace(run, 5, VTSYM_PROGRAM);
        EXPECT_EQ(withoutEnd(outputOf("cd '" + root.string() + "' && " + command)), withoutEnd(example.output))
            << example.command;
    }
}

} // namespace
} // namespace VT::Testing
