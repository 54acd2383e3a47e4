// The manual page and the completions of shells: each real shell is asked what it completes.
#include "tests/support/Cases.hpp"
#include "tests/tools/Program.hpp"

#include <algorithm>
#include <gmock/gmock.h>
#include <regex>
#include <set>

namespace VT::Testing {
namespace {

using ::testing::HasSubstr;

constexpr const char* file = "completions.txt";

/// Completes the line in $1, as bash splits it.
constexpr const char* inBash = R"(compopt() { :; }
. ./completion.bash
typed=${1//=/ = }
COMP_WORDS=($typed)
[[ $1 == *' ' || $1 == *= ]] && COMP_WORDS+=('')
COMP_CWORD=$((${#COMP_WORDS[@]} - 1))
_vtsym
printf '%s\n' "${COMPREPLY[@]}"
)";

class Shells : public ::testing::Test {
protected:
    Shells() {
        place_.write("src/a.c", "");
        place_.write("model.json", "{}");
        place_.write("bash.sh", inBash);
        for (const std::string shell : {"bash", "zsh", "fish"}) {
            const ProgramResult written = runProgram({"completion", shell});
            EXPECT_EQ(written.status, 0);
            place_.write("completion." + shell, written.out);
        }
    }

    /// The words that a shell offers, sorted.
    std::string offered(const std::string& shell, const std::string& typed) {
        const std::string command =
            shell == "bash" ? "bash --norc ./bash.sh '" + typed + "'"
                            : "HOME=$PWD fish --no-config -c 'source completion.fish; complete -C \"" + typed + "\"'";
        const ProgramResult result = runScript(place_, command + " | cut -f 1 | sed 's:/$::' | LC_ALL=C sort -u");
        EXPECT_EQ(result.err, "");
        std::string words;
        for (const std::string& line : linesOf(result.out))
            words += (words.empty() ? "" : " ") + line;
        return words;
    }

    TemporaryFolder place_;
};

TEST_F(Shells, OfferWhatFits) {
    for (const CaseRow& row : casesOf(file, "words", 2)) {
        EXPECT_EQ(offered("bash", row[0]), row[1]) << row[0];
        EXPECT_EQ(offered("fish", row[0]), row[1]) << row[0];
    }
    for (const CaseRow& row : casesOf(file, "bash", 2))
        EXPECT_EQ(offered("bash", row[0]), row[1]) << row[0];
}

TEST_F(Shells, CompleteALineOfZsh) {
    std::string typed = "autoload -U compinit; compinit -u -D; . ./completion.zsh; vtsym() { echo \"<$*>\" }\n";
    std::set<std::string> expected;
    for (const CaseRow& row : casesOf(file, "zsh", 2)) {
        typed += row[0] + "\t\n";
        expected.insert(row[1]);
    }
    const std::string shown = runOnTerminal(place_, "zsh -f -i", typed + "exit\n", {"TERM=dumb", "PS1="}).out;
    for (const std::string& line : expected)
        EXPECT_THAT(shown, HasSubstr("\n<" + line + ">"));
}

/// The names that the help of a command begins its lines with: its options, or the commands of the program.
std::set<std::string> namesInHelp(const std::string& help) {
    const std::regex line("\n  ((?:-[A-Za-z],?)?(?:--[a-z-]+)?|[a-z]+)(?= )");
    std::set<std::string> names;
    for (std::sregex_iterator match(help.begin(), help.end(), line), end; match != end; ++match) {
        std::string name = (*match)[1].str();
        if (const std::size_t comma = name.find(','); comma != std::string::npos) {
            names.insert(name.substr(0, comma));
            name.erase(0, comma + 1);
        }
        if (!name.empty() && name != "vtsym")
            names.insert(name);
    }
    return names;
}

TEST_F(Shells, KnowEveryOptionOfTheHelpAsTheManualPageDoes) {
    const std::string page = runScript(place_, "vtsym man >page && mandoc -T utf8 -O width=200 page | col -b").out;
    std::size_t options = 0;
    Strings commands{""};
    for (const std::string& name : namesInHelp(runProgram({"--help"}).out))
        if (!name.starts_with('-'))
            commands.push_back(name);
    EXPECT_GT(commands.size(), 10U);
    for (const std::string& command : commands) {
        const std::string help = runScript(place_, "vtsym " + command + " --help").out;
        for (const std::string& name : namesInHelp(help.substr(0, help.find("\n\n", help.find("Options:"))))) {
            const std::string typed = "vtsym " + command + (command.empty() ? "" : " ") + name;
            EXPECT_THAT(" " + offered("bash", typed) + " ", HasSubstr(" " + name + " ")) << typed;
            EXPECT_THAT(page, HasSubstr(name));
            ++options;
        }
        EXPECT_THAT(page, HasSubstr("\n   " + command));
    }
    EXPECT_GT(options, 60U);
}

TEST_F(Shells, ReadTheirScriptsWithoutComplaint) {
    const ProgramResult result =
        runScript(place_, "for s in bash zsh fish; do $s -n completion.$s; done\n"
                          // lines of the help are as long as they are, and the page has no date
                          "vtsym man >page; mandoc -T lint page | grep -v -e STYLE -e 'missing date'");
    EXPECT_EQ(result.out + result.err, "");
}

/// The examples of every command's help: what they name is there, and none of them is refused.
TEST(Help, ShowsExamplesThatRun) {
    const TemporaryFolder place;
    const std::string conditions = "A && B\nMode==1 || A>2\n";
    for (const char* name : {"conditions.txt", "expressions.txt", "dimensions.txt"})
        place.write(name, std::string(name) == "dimensions.txt" ? "N*2\n" : conditions);
    place.write("pairs.txt", "A>2\tA>1\n");
    place.write("model.json", R"({"blocks": [{"name": "b", "condition": "A && !A"}]})");
    place.write("src/a.c", "#if A\n#if A\n#endif\n#endif\n");
    place.write("include/a.h", "");
    place.write("build/compile_commands.json", R"([{"directory": "/", "file": "a.c", "command": "cc -c a.c"}])");
    runScript(place, "git init -q -b main && git -c user.name=a -c user.email=a commit -q --allow-empty -m a");
    std::size_t examples = 0;
    for (const std::string& command : namesInHelp(runProgram({"--help"}).out)) {
        if (command.starts_with('-'))
            continue;
        const std::string help = runProgram({command, "--help"}).out;
        const std::string list = help.substr(std::min(help.find("\nExamples:\n"), help.size()));
        std::size_t own = 0;
        for (const std::string& line : linesOf(list)) {
            if (!line.starts_with("  "))
                continue;
            const ProgramResult result = runScript(place, "jq() { cat; }; dot() { cat; }; " + line);
            EXPECT_LE(result.status, 1) << line << "\n" << result.err;
            EXPECT_EQ(result.err, "") << line;
            EXPECT_THAT(line, HasSubstr("vtsym " + command));
            ++own;
        }
        EXPECT_GE(own, 2U) << command;
        examples += own;
    }
    EXPECT_GT(examples, 30U);
}

} // namespace
} // namespace VT::Testing
